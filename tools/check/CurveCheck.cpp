#include "tools/check/CurveCheck.h"

#include "lumenkey/Channels/KFChannel.h"
#include "lumenkey/curves/KFCurve.h"
#include "tools/check/DocumentVocabulary.h"
#include "tools/curve/Keypoint.h"
#include "tools/output/TextForms.h"

#include <utility>

namespace lumenkey::tools {

CurveClass curveClassOf(KFChannelBase* channel) {
    CurveClass made;
    if (channel != nullptr && channel->isValueChannel()) {
        KFCurve& curve = *static_cast<KFChannel&>(*channel).getCurveInterface();
        curve.getAbsoluteMinValueV(&made.limits.low);
        curve.getAbsoluteMaxValueV(&made.limits.high);
        made.hasWrittenLimits = !curve.isCurveBoolean();
        made.derivesTangents = curve.isCurveDeriveTangents();
    }
    return made;
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

std::string faultOfLimit(std::string_view name, double limit, CurveClass const& curve) {
    CurveLimits const none;
    bool const isLeast = name == "min";
    bool const isWritten = curve.hasWrittenLimits && (isLeast ? limit > none.low : limit < none.high);
    double const own = isLeast ? curve.limits.low : curve.limits.high;
    return isWritten || limit == own
               ? ""
               : "'" + std::string(name) + "' is " + shortestText(limit) +
                     ", which isn't kept: it becomes that of the class, " + shortestText(own);
}

std::string faultOfInterpolation(Attributes const& attributes) {
    auto const found = attributes.find("interpolation");
    if (found == attributes.end()) {
        return {};
    }
    std::optional<std::uint64_t> const type = readWhole(found->second);
    if (type > std::numeric_limits<std::uint32_t>::max()) {
        return {}; // told as out of the limits of the attribute
    }
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
    if (!TempusIsNumeric(time)) {
        return "the time of the keypoint is '" + std::string(text) + "', which is no place in time";
    }
    Tempus const before = std::exchange(lastTime, time);
    bool const isBehind = TempusIsNumeric(before) && time < before;
    return isBehind ? "the keypoint lies before the one in front of it" : "";
}

} // namespace lumenkey::tools
