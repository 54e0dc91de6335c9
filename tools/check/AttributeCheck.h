#pragma once

#include "tools/check/CurveCheck.h"

#include <vector>

namespace lumenkey::tools {

struct AttributeFault {
    /// May be empty, where nothing is at fault.
    std::string what;
    /// Whether a reader takes it as it is, or needn't have it.
    bool isKept = false;
};

/// What is at fault with the attributes of an element: unknown ones, texts that can't be read as what they
/// are, numbers out of their limits, and a version that is unknown. `limits` are those of the element's curve
/// or channel; `countsFrames` is for documents below version 5.
std::vector<AttributeFault> faultsOfAttributes(std::string_view element, Attributes const& attributes,
                                               CurveLimits const& limits, bool countsFrames);

} // namespace lumenkey::tools
