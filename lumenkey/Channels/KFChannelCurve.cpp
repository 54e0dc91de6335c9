// The shape switches of a channel's curve, its lock, and its processing nodes.

#include "lumenkey/Channels/KFChannel.h"
#include "lumenkey/Channels/KFChannelImpl.h"
#include "lumenkey/Channels/KFChannelObjectRootBase.h"
#include "lumenkey/Channels/KFCompoundChannel.h"
#include "lumenkey/curves/KFCurve.h"

// --- Spline or constant ---

bool KFChannel::isSpline() const {
    auto const* const used = _impl == nullptr ? nullptr : _impl->getCurve();
    return used != nullptr && used->isSpline();
}

void KFChannel::setIsSpline(bool on) {
    if (KFCompoundChannel* const compound = linkedCompound()) {
        compound->compoundSetIsSpline(this, on, false);
        return;
    }
    if (isLocked(false) || isSpline() == on)
        return;
    Tempus time = kTempusZero;
    if (!on) {
        if (KFChannelObjectRootBase* const root = getChannelRootBase())
            time = root->getCurrentTime(true);
    }
    curveToWrite().setIsSpline(on, time);
}

bool KFChannel::isKeyframable() const {
    auto* const used = _impl == nullptr ? nullptr : _impl->getCurve();
    return used != nullptr && used->isCurveKeyframable();
}

void KFChannel::setKeyframable(bool on, bool) {
    if (isLocked(false) || (isKeyframable() == on && isSpline() == on))
        return;
    curveToWrite().setCurveKeyframable(on);
    setIsSpline(on);
}

bool KFChannel::isAnimated() const {
    bool animated = true;
    curve().isCurveAnimated(&animated);
    return animated;
}

// --- Settings ---

bool KFChannel::isDiscrete() const { return curve().isRoundingInUSpace(); }

void KFChannel::setDiscrete(bool on, bool inPlace) {
    if (isLocked(false) || isDiscrete() == on)
        return;
    if (!inPlace)
        createLocalChannelImplementation();
    curve().setRoundingInUSpace(on);
}

bool KFChannel::isParametric() const { return curve().isCurveParametric(); }

void KFChannel::setParametric(bool on) {
    if (!isLocked(false) && isParametric() != on)
        curveToWrite().setCurveParametric(on);
}

void KFChannel::setShouldCreateTangents(bool on) {
    if (!isLocked(false) && curve().isCurveDeriveTangents() != on)
        curveToWrite().setCurveDeriveTangents(on);
}

// --- Lock ---

void KFChannel::lock(bool on, bool) {
    willBeModified(kModifyState);
    KFChannelBase::lock(on, true);
    if (!on && hasKeypoints(0))
        curveToWrite().lockCurve(false);
}

void KFChannel::lockFromParent(bool on, bool passDown) { lock(on, passDown); }

// --- What the root knows of the curve ---

bool KFChannel::isChannelAffectedByBehaviors(bool selectedOnly) const {
    KFChannelObjectRootBase const* const root = getChannelRootBase();
    return root != nullptr && root->isChannelAffectedByBehaviors(this, selectedOnly);
}

bool KFChannel::isChannelAffectedBySelectedBehaviors() const {
    KFChannelObjectRootBase const* const root = getChannelRootBase();
    return root != nullptr && root->isChannelAffectedBySelectedBehaviors(this);
}

bool KFChannel::isRigged() const {
    KFChannelObjectRootBase* const root = getChannelRootBase();
    return root != nullptr && root->isChannelRigged(this);
}

// --- Processing nodes ---

bool KFChannel::appendCurveProcessingNode(KFCurveNode* node) {
    return curveToWrite().appendCurveProcessingNode(node);
}

bool KFChannel::insertCurveProcessingNode(KFCurveNode* node, KFCurveNode* after) {
    return curveToWrite().insertCurveProcessingNode(node, after);
}

bool KFChannel::deleteCurveProcessingNode(KFCurveNode* node) {
    return curveToWrite().deleteCurveProcessingNode(node);
}

bool KFChannel::removeCurveProcessingNode(KFCurveNode* node) {
    return curveToWrite().removeCurveProcessingNode(node);
}

std::vector<KFCurveNode*> KFChannel::enumerateCurveProcessingNodes() const {
    std::vector<KFCurveNode*> nodes;
    curve().enumerateCurveProcessingNodes(nodes);
    return nodes;
}

unsigned int KFChannel::getNumberOfCurveProcessingNodes() const {
    std::uint32_t count = 0;
    curve().getNumCurveProcessingNodes(&count);
    return count;
}
