#include "tools/check/CurveCheck.h"

#include "lumenkey/Channels/KFChannel.h"
#include "lumenkey/curves/KFCurve.h"
#include "tools/check/DocumentVocabulary.h"
#include "tools/curve/Keypoint.h"
#include "tools/output/TextForms.h"

#include <utility>

namespace lumenkey::tools {

CurveLimits limitsOf(KFChannelBase* channel) {
    CurveLimits limits;
    if (channel != nullptr && channel->isValueChannel()) {
        KFCurve& curve = *static_cast<KFChannel&>(*channel).getCurveInterface();
        curve.getAbsoluteMinValueV(&limits.low);
        curve.getAbsoluteMaxValueV(&limits.high);
    }
    return limits;
}

std::string faultOfNumber(std::string_view text, CurveLimits const& limits) {
    std::optional<double> const value = readNumber(text);
    if (!value) {
        return "'" + std::string(text) + "' is no number";
    }
    if (*value < limits.low || *value > limits.high) {
        return "the value " + shortestText(*value) + " is out of the limits of its curve, " +
               shortestText(limits.low) + " to " + shortestText(limits.high);
    }
    return {};
}

std::string faultOfParts(bool hasTime, bool hasValue) {
    if (!hasValue) {
        return "the keypoint has no value: it is passed over";
    }
    return hasTime ? "" : "the keypoint has no time: it counts as 0";
}

std::string faultOfInterpolation(Attributes const& attributes) {
    auto const found = attributes.find("interpolation");
    if (found == attributes.end()) {
        return {};
    }
    std::optional<std::uint64_t> const type = readWhole(found->second);
    if (!type || interpolationName(static_cast<std::uint32_t>(*type)).starts_with("bezier (")) {
        return "the interpolation '" + std::string(found->second) + "' is unknown: it counts as Bezier";
    }
    return {};
}

std::string faultOfOrder(std::string_view text, bool countsFrames, Tempus& lastTime) {
    Tempus time = readTime(text).value_or(kTempusInvalid);
    if (countsFrames) {
        std::optional<double> const frames = readNumber(text);
        time = frames ? TempusMake(1, 1) * *frames : kTempusInvalid;
    }
    Tempus const before = std::exchange(lastTime, time);
    bool const isBehind = TempusIsNumeric(time) && TempusIsNumeric(before) && time < before;
    return isBehind ? "the keypoint lies before the one in front of it" : "";
}

} // namespace lumenkey::tools
