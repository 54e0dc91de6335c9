#pragma once

#include "lumenkey/foundation/Tempus.h"
#include "lumenkey/splines/KFSpline.h"

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace lumenkey::tools {

/// The end of a handle, seen from its keypoint.
struct KeypointHandle {
    double seconds = 0;
    double value = 0;

    bool isFlat() const { return seconds == 0 && value == 0; }
};

/// A keypoint as a user sees it: handles instead of tangents.
struct Keypoint {
    Tempus time{};
    double value = 0;
    std::uint32_t interpolation = 0;
    bool usesHandles = false;
    KeypointHandle in;
    KeypointHandle out;
    bool enabled = true;
    std::uint32_t flags = 0;
};

/// `handle` is that of a vertex of the spline.
Keypoint readKeypoint(KFSpline& spline, void* handle);

/// In the order of time; of several keypoints at one time the first.
std::vector<void*> keypointHandles(KFSpline& spline);
/// Likewise, with all of them.
std::vector<void*> everyKeypointHandle(KFSpline& spline);

/// Of the first keypoint and the last, disabled ones too.
struct KeypointEnds {
    Tempus first{};
    Tempus last{};
};

/// Nothing without keypoints. `spline` may be null.
std::optional<KeypointEnds> keypointEnds(KFSpline const* spline);

/// The name of a type, such as "linear"; an unknown number draws as Bezier and is called "bezier (99)".
std::string interpolationName(std::uint32_t type);
/// The type with that name, without regard to case, hyphens and blanks; nothing for none.
std::optional<std::uint32_t> interpolationNamed(std::string_view name);
/// All names, with commas between them.
std::string interpolationNames();

} // namespace lumenkey::tools
