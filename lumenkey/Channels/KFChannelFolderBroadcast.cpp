// What a folder passes on to its children, and to which of them.

#include "lumenkey/Channels/KFChannelFolder.h"

using Child = KFChannelBase;

// To every child --------------------------------------------------------------------------------------------

void KFChannelFolder::finishInitializing() {
    KFChannelBase::finishInitializing();
    forEachChild([](Child& child) { child.finishInitializing(); });
}

void KFChannelFolder::setDefaultToCurrentValue() {
    forEachChild([](Child& child) { child.setDefaultToCurrentValue(); });
}

void KFChannelFolder::copyKeyframesFromChannel(Tempus const& t, KFChannelBase* other) {
    forEachChild([&](Child& child) { child.copyKeyframesFromChannel(t, other); });
}

void KFChannelFolder::undoWillReplace() {
    forEachChild([](Child& child) { child.undoWillReplace(); });
}

void KFChannelFolder::undoDidReplace() {
    forEachChild([](Child& child) { child.undoDidReplace(); });
}

void KFChannelFolder::bake(BXTimeRange const& range, Tempus const& step) {
    forEachChild([&](Child& child) { child.bake(range, step); });
}

void KFChannelFolder::simplify(Tempus const& a, Tempus const& b, Tempus const& step, double percent,
                               unsigned int mode1, unsigned int mode2, bool clampToCoarse) {
    forEachChild([&](Child& child) { child.simplify(a, b, step, percent, mode1, mode2, clampToCoarse); });
}

void KFChannelFolder::setExtrapolation(unsigned int mode, unsigned int which) {
    forEachChild([=](Child& child) { child.setExtrapolation(mode, which); });
}

void KFChannelFolder::generateKeys(unsigned int first, unsigned int second) {
    forEachChild([=](Child& child) { child.generateKeys(first, second); });
}

void KFChannelFolder::adjustToFrameDuration(Tempus const& frameDuration) {
    forEachChild([&](Child& child) { child.adjustToFrameDuration(frameDuration); });
}

// To visible children ---------------------------------------------------------------------------------------

void KFChannelFolder::lock(bool on, bool checkAncestors) {
    KFChannelBase::lock(on, true);
    forEachVisibleChild([=](Child& child) { child.lockFromParent(on, checkAncestors); });
}

void KFChannelFolder::lockFromParent(bool on, bool checkAncestors) {
    bool const locks = isLocked(checkAncestors) || on;
    forEachVisibleChild([=](Child& child) { child.lockFromParent(locks, checkAncestors); });
}

void KFChannelFolder::setIsSpline(bool on) {
    forEachVisibleChild([=](Child& child) { child.setIsSpline(on); });
}

void KFChannelFolder::setInterpolation(unsigned int type) {
    forEachVisibleChild([=](Child& child) { child.setInterpolation(type); });
}

void KFChannelFolder::addKeypointAt(Tempus const& t) {
    forEachVisibleChild([&](Child& child) { child.addKeypointAt(t); });
}

void KFChannelFolder::deleteKeypointAt(Tempus const& t) {
    forEachVisibleChild([&](Child& child) { child.deleteKeypointAt(t); });
}

void KFChannelFolder::deleteKeypoints(Tempus const& from, Tempus const& to) {
    forEachVisibleChild([&](Child& child) { child.deleteKeypoints(from, to); });
}

void KFChannelFolder::scaleFadeHandles(double factor) {
    forEachVisibleChild([=](Child& child) { child.scaleFadeHandles(factor); });
}

void KFChannelFolder::keyframesWithChannels(TempusRange range, KeyframesByChannel& out) {
    forEachVisibleChild([&](Child& child) { child.keyframesWithChannels(range, out); });
}

void KFChannelFolder::beginPlayback(Tempus const& t, unsigned int scope, unsigned int mode,
                                    Tempus const& resolution) {
    forEachVisibleChild([&](Child& child) { child.beginPlayback(t, scope, mode, resolution); });
}

void KFChannelFolder::endPlayback(Tempus const& t) {
    forEachVisibleChild([&](Child& child) { child.endPlayback(t); });
}

void KFChannelFolder::beginRecording(Tempus const& t) {
    forEachVisibleChild([&](Child& child) { child.beginRecording(t); });
}

void KFChannelFolder::endRecording(Tempus const& t) {
    forEachVisibleChild([&](Child& child) { child.endRecording(t); });
}

void KFChannelFolder::updateCurrentRecordingTime(Tempus const& t) {
    forEachVisibleChild([&](Child& child) { child.updateCurrentRecordingTime(t); });
}

void KFChannelFolder::registerRecordingCallback(RecordingCallback function, void* context,
                                                bool wantsWrapper) {
    forEachVisibleChild(
        [=](Child& child) { child.registerRecordingCallback(function, context, wantsWrapper); });
}

void KFChannelFolder::unregisterRecordingCallback(RecordingCallback function, void* context) {
    forEachVisibleChild([=](Child& child) { child.unregisterRecordingCallback(function, context); });
}

// By a rule of their own ------------------------------------------------------------------------------------

void KFChannelFolder::setKeyframable(bool on, bool force) {
    forEachChild([=](Child& child) {
        if (force || !child.testFlag(kChannelFlagHidden)) {
            child.setKeyframable(on, force);
        }
    });
}

void KFChannelFolder::retimeKeypoints(double factor, Tempus const& t) {
    forEachChild([&](Child& child) {
        if (!child.testFlag(kChannelFlagNotRetimed)) {
            child.retimeKeypoints(factor, t);
        }
    });
}

void KFChannelFolder::resetToDefault(bool silent) {
    willBeModified(kModifyData);
    forEachChild([=](Child& child) {
        if (!child.testFlag(kChannelFlagKeepOnFolderReset)) {
            child.reset(silent); // so that the host's callback is honoured
        }
    });
}

void KFChannelFolder::resetTimeIndependentFlagIfNeeded(bool downward, bool upward) {
    if (isLocked(true)) {
        return;
    }
    KFChannelFolder* const parent = getParent();
    if (upward && parent != nullptr) {
        parent->resetTimeIndependentFlagIfNeeded(false, true);
    }
    if (downward || (upward && parent == nullptr)) {
        forEachChild([](Child& child) {
            if (child.testFlag(kChannelFlagIsFolder)) {
                static_cast<KFChannelFolder&>(child).resetTimeIndependentFlagIfNeeded(true, false);
            }
        });
    }
}
