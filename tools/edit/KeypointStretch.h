#pragma once

#include "lumenkey/Channels/KFChannel.h"
#include "lumenkey/curves/KFCurve.h"

#include <functional>
#include <string>
#include <vector>

namespace lumenkey::tools {

/// From one time to another, both of them within.
struct TimeSpan {
    Tempus from{};
    Tempus to{};

    bool holds(Tempus const& time) const { return !(time < from) && !(to < time); }
};

/// The handles of the keypoints within, in the order of time.
std::vector<void*> keypointsWithin(KFCurve& curve, TimeSpan const& span);

/// Where the library reshapes a stretch: samples stand at `start + step * i`, all of them before `end`, which
/// lies one step behind the last. The library takes out the keypoints at `end` too; `OutsideKept` sees to it
/// that they stay.
struct SampledStretch {
    SampledStretch(TimeSpan const& span, Tempus const& step);

    /// A stretch of less than a step has nothing to reshape.
    bool isEmpty() const { return !(start < last); }

    Tempus start{};
    Tempus step{};
    /// The last sample.
    Tempus last{};
    Tempus end{};
};

/// While it lives, keypoints that aren't within the span are locked, so that no reshaping changes them.
class OutsideKept {
public:
    OutsideKept(KFCurve& curve, TimeSpan const& span);
    ~OutsideKept();
    OutsideKept(OutsideKept const&) = delete;
    OutsideKept& operator=(OutsideKept const&) = delete;

private:
    KFCurve& _curve;
    std::vector<void*> _locked;
};

/// Where keypoints that were moved can't be: outside the times that there are, or several at one where these
/// are too few. Empty for nowhere.
std::string faultOfTimes(KFCurve& before, KFCurve& after);

/// Takes away those at a time that are neither enabled nor locked. Nothing else of the curve changes.
void deleteDisabledAt(KFCurve& curve, Tempus const& time);

/// Turns linear keypoints within the span into Bezier ones with handles of no length, which draw the same
/// lines.
void makeLinesBezier(KFCurve& curve, TimeSpan const& span);

/// Lets `edit` change the whole curve where the span holds all of its keypoints and none is locked. Else it
/// changes that of a copy with the unlocked keypoints within the span alone; they are then cut out of the
/// channel and those of the copy are pasted over what lies where they come to, but for what is locked, which
/// stays. All come there in their order, also those that share a time, each with its handles. Nothing happens
/// where the span holds no unlocked one, and to a curve whose class takes no keypoints.
void editKeypointsWithin(KFChannel& channel, TimeSpan const& span, std::function<void(KFCurve&)> const& edit);

} // namespace lumenkey::tools
