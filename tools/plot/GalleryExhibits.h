#pragma once

#include "tools/import/MotionChannels.h"

#include <memory>
#include <string>
#include <vector>

namespace lumenkey::tools {

/// A curve that shows one ability of the engine, and the stretch of time to show.
struct GalleryExhibit {
    std::string number;
    std::string title;
    std::unique_ptr<ChannelSpline> curve;
    Tempus from{};
    Tempus to{};
};

/// One for each interpolation type, all over the same keypoints; a number that is no type stands at the end.
std::vector<GalleryExhibit> interpolationExhibits();

/// One for each extrapolation mode, on both sides of the same three keypoints.
std::vector<GalleryExhibit> extrapolationExhibits();

} // namespace lumenkey::tools
