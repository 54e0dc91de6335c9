// The answers of a node that has neither a value nor children.

#include "lumenkey/Channels/KFChannelBase.h"

bool KFChannelBase::isObjectRef() const { return false; }
bool KFChannelBase::isCompoundChannel() const { return false; }
void KFChannelBase::setDefaultToCurrentValue() {}

void KFChannelBase::beginPlayback(Tempus const&, unsigned int, unsigned int, Tempus const&) {}
void KFChannelBase::endPlayback(Tempus const&) {}
void KFChannelBase::beginRecording(Tempus const&) {}
void KFChannelBase::endRecording(Tempus const&) {}
void KFChannelBase::updateCurrentRecordingTime(Tempus const&) {}
void KFChannelBase::registerRecordingCallback(RecordingCallback, void*, bool) {}
void KFChannelBase::unregisterRecordingCallback(RecordingCallback, void*) {}

BXString KFChannelBase::getRangeName() { return BXString(BXStringKey("Channel Over Range Range Name")); }
void KFChannelBase::setRangeName(BXString const&) {}

bool KFChannelBase::allowsDrag(KFChannelBase const*) { return true; }
void KFChannelBase::resetToDefault(bool) {}
void KFChannelBase::lockFromParent(bool, bool) {}
void KFChannelBase::copyKeyframesFromChannel(Tempus const&, KFChannelBase*) {}
void KFChannelBase::setValue(KFChannelBase const&) {}

void KFChannelBase::undoWillReplace() {}
void KFChannelBase::undoDidReplace() {}

void KFChannelBase::bake(BXTimeRange const&, Tempus const&) {}
void KFChannelBase::simplify(Tempus const&, Tempus const&, Tempus const&, double, unsigned int, unsigned int,
                             bool) {}
void KFChannelBase::setExtrapolation(unsigned int, unsigned int) {}
void KFChannelBase::generateKeys(unsigned int, unsigned int) {}

void KFChannelBase::setIsSpline(bool) {}
bool KFChannelBase::isSpline() const { return false; }
bool KFChannelBase::isModified(bool) const { return false; }
void KFChannelBase::setKeyframable(bool, bool) {}
bool KFChannelBase::isKeyframable() const { return true; }

void KFChannelBase::keyframesWithChannels(TempusRange, KeyframesByChannel&) {}

bool KFChannelBase::hasKeypoints(unsigned int) const { return false; }
bool KFChannelBase::hasMoreThanOneKeypoint() const { return false; }
bool KFChannelBase::hasKeypointAt(Tempus const&, unsigned int) const { return false; }
bool KFChannelBase::allHaveKeypointsAt(Tempus const&) const { return false; }
bool KFChannelBase::hasOnlyOneKeypointAt(Tempus const&) const { return false; }
unsigned int KFChannelBase::numberOfKeypointsAt(Tempus const&) const { return 0; }
void KFChannelBase::addKeypointAt(Tempus const&) {}
void KFChannelBase::deleteKeypointAt(Tempus const&) {}
Tempus KFChannelBase::moveKeypointTo(Tempus const&, Tempus const& to, bool, bool) { return to; }
bool KFChannelBase::previousKeypoint(Tempus*, unsigned int) const { return false; }
bool KFChannelBase::nextKeypoint(Tempus*, unsigned int) const { return false; }
void KFChannelBase::retimeKeypoints(double, Tempus const&) {}
void KFChannelBase::adjustToFrameDuration(Tempus const&) {}
void KFChannelBase::setInterpolation(unsigned int) {}
bool KFChannelBase::hasFadeHandles() const { return false; }
void KFChannelBase::scaleFadeHandles(double) {}
void KFChannelBase::deleteKeypoints(Tempus const&, Tempus const&) {}
bool KFChannelBase::shouldIgnoreDynamicIDs() const { return false; }
