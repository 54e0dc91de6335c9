#include "tools/check/KeypointCheck.h"

#include "lumenkey/splines/KFInterpolation.h"
#include "tools/check/DocumentVocabulary.h"
#include "tools/output/TextForms.h"

#include <algorithm>
#include <cmath>

namespace lumenkey::tools {

namespace {

/// Documents leave out what is nearer to its usual value than this.
constexpr double kLeastWritten = 1e-7;

bool isLeftOut(double number, double usual) {
    return number != usual && std::fabs(number - usual) < kLeastWritten;
}

Fault leftOut(std::string_view name, double number, std::string const& usual) {
    return {"'" + std::string(name) + "' is " + shortestText(number) + ", which is kept as " + usual};
}

} // namespace

KeypointCheck::KeypointCheck(Attributes const& attributes, CurveClass const& curve, bool countsFrames,
                             bool takesBias)
    : _takesHandles(curve.derivesTangents || readWhole(attributeOf(attributes, "interpolation")) ==
                                                 std::uint64_t{kKFInterpolationLinearToo}),
      _countsFrames(countsFrames), _isDisabled(readBool(attributeOf(attributes, "enabled")) == false),
      _takesBias(takesBias) {}

bool KeypointCheck::keepsNan(std::string_view part) {
    return part == "value" || part.starts_with("input") || part.starts_with("output");
}

Fault KeypointCheck::faultOfPart(TextPlace const& place, std::string_view name, std::string_view text,
                                 bool canBeRead) {
    bool const wasDisabled = _isDisabled && _hasOutput;
    if (name == "time" || name == "value") {
        Fault const fault = faultOfTimeOrValue(name == "time");
        return canBeRead ? fault : Fault();
    }
    Handle& handle = name.starts_with("input") ? _in : _out;
    if (name == handle.timeName) {
        return canBeRead ? faultOfHandleTime(handle, place, text) : Fault();
    }
    bool const isHandle = name == handle.valueName;
    double const time = isHandle ? std::exchange(handle.time, std::nullopt).value_or(0) : 0;
    double const number = canBeRead ? *readNumberOrNan(text) : 0;
    if (name == _out.valueName && !wasDisabled) {
        endOutput(time, number);
    }
    if (!canBeRead) {
        return {};
    }
    std::string const quoted = "'" + std::string(name) + "'";
    double const usual = name == "bias" ? 1 : 0;
    if (!_hasValue && (isHandle || number != usual)) {
        return {quoted + " stands in front of the value, where it comes too early"};
    }
    bool const isTaken = name == "normal" || (name == "bias" && (_takesBias || number == usual));
    if (wasDisabled && !isTaken) {
        return {quoted + " stands behind the output handle, which disables the keypoint: it is passed over"};
    }
    if (isHandle) {
        return faultOfHandle(name, time, number);
    }
    return isLeftOut(number, usual) ? leftOut(name, number, shortestText(usual)) : Fault();
}

Fault KeypointCheck::faultOfTimeOrValue(bool isTime) {
    bool const hadValue = _hasValue;
    (isTime ? _hasTime : _hasValue) = true;
    if (!hadValue) {
        return {};
    }
    return {isTime ? "the time stands behind the value, where it comes too late"
                   : "a second value makes another keypoint"};
}

Fault KeypointCheck::faultOfHandleTime(Handle& handle, TextPlace const& place, std::string_view text) {
    double const time = *readNumberOrNan(text);
    handle.time = time;
    handle.timePlace = place;
    bool const pointsBack = &handle == &_in ? time > 0 : time < 0;
    return pointsBack && _takesHandles
               ? Fault{"the handle reaches to the wrong side of its keypoint: its time counts as 0"}
               : Fault();
}

Fault KeypointCheck::faultOfHandle(std::string_view name, double time, double value) const {
    if (time == 0 && value == 0) {
        return {};
    }
    if (!_takesHandles) {
        return {"curves of this class have no handles: '" + std::string(name) + "' is passed over"};
    }
    if (isKept(time, value, !_countsFrames)) {
        return {};
    }
    Handle const& handle = name == _in.valueName ? _in : _out;
    return value == 0 ? leftOut(handle.timeName, time, "no handle") : leftOut(name, value, "no handle");
}

void KeypointCheck::endOutput(double time, double value) {
    constexpr double framesInSecond = 1000; // or fewer: the rate of an old document isn't in it
    double const seconds = _countsFrames ? time / framesInSecond : time;
    _hasOutput = _hasValue;
    _keepsOutput = _hasValue && _takesHandles && isKept(std::max(seconds, 0.0), value, true);
}

bool KeypointCheck::isKept(double time, double value, bool isInSeconds) {
    bool const isLong = std::fabs(time) >= kLeastWritten || std::fabs(value) >= kLeastWritten;
    // How short a handle in frames is depends on how long a frame is.
    bool const isKnown = isInSeconds || std::isnan(time) || std::isnan(value);
    return isLong || (!isKnown && (time != 0 || value != 0));
}

std::vector<std::pair<TextPlace, Fault>> KeypointCheck::faultsAtEnd(TextPlace const& place) const {
    std::vector<std::pair<TextPlace, Fault>> faults;
    if (!_hasValue) {
        faults.push_back({place, {"the keypoint has no value: it is passed over"}});
    } else if (!_hasTime) {
        faults.push_back({place, {"the keypoint has no time: it counts as 0", true}});
    }
    if (_isDisabled && _hasValue && !_keepsOutput) {
        faults.push_back({place,
                          {"the keypoint is disabled but " +
                           std::string(!_hasOutput     ? "has no output handle: it comes"
                                       : _countsFrames ? "may keep no output handle: it may come"
                                                       : "keeps no output handle: it comes") +
                           " back enabled"}});
    }
    for (Handle const* const handle : {&_in, &_out}) {
        if (handle->time.value_or(0) != 0) {
            faults.push_back({handle->timePlace,
                              {"no '" + std::string(handle->valueName) + "' stands behind '" +
                               std::string(handle->timeName) + "': it is passed over"}});
        }
    }
    return faults;
}

} // namespace lumenkey::tools
