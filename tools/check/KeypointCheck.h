#pragma once

#include "tools/check/CurveCheck.h"
#include "tools/check/DocumentScanner.h"
#include "tools/check/Fault.h"

#include <optional>
#include <string_view>
#include <utility>
#include <vector>

namespace lumenkey::tools {

/// Looks through the parts of a keypoint in their order, in which a reader acts on them.
class KeypointCheck {
public:
    /// Of a keypoint with these attributes in a curve of this class, which takes the bias of a disabled one
    /// or not.
    KeypointCheck(Attributes const& attributes, CurveClass const& curve, bool countsFrames, bool takesBias);

    /// Of values and handles.
    static bool keepsNan(std::string_view part);

    bool hasValue() const { return _hasValue; }
    bool isSeen() const { return _hasValue && !(_isDisabled && _hasOutput); }

    /// A part of the keypoint that has ended, and whether its text can be read, be it as nan.
    Fault faultOfPart(TextPlace const& place, std::string_view name, std::string_view text, bool canBeRead);
    /// What is at fault with the whole, where it stands.
    std::vector<std::pair<TextPlace, Fault>> faultsAtEnd(TextPlace const& place) const;

private:
    struct Handle {
        std::string_view timeName;
        std::string_view valueName;
        /// Its time, as long as no value has followed.
        std::optional<double> time;
        TextPlace timePlace;
    };

    Fault faultOfTimeOrValue(bool isTime);
    Fault faultOfHandleTime(Handle& handle, TextPlace const& place, std::string_view text);
    Fault faultOfHandle(std::string_view name, double time, double value) const;
    /// The output handle, unless it stands behind one that disabled the keypoint.
    void endOutput(double time, double value);
    /// Of a handle that curves of the class have, unless it is known to be too short.
    static bool isKept(double time, double value, bool isInSeconds);

    bool _takesHandles;
    bool _countsFrames;
    bool _isDisabled;
    bool _takesBias;
    bool _hasTime = false;
    bool _hasValue = false;
    bool _hasOutput = false;
    bool _keepsOutput = false;
    Handle _in{"inputTangentTime", "inputTangentValue", {}, {}};
    Handle _out{"outputTangentTime", "outputTangentValue", {}, {}};
};

} // namespace lumenkey::tools
