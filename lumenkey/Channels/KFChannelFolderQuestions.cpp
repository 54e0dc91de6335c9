// What a folder answers for its children together.

#include "lumenkey/Channels/KFChannelFolder.h"
#include "lumenkey/Channels/KFChannelObjectRootBase.h"

#include <algorithm>

using Child = KFChannelBase;

bool KFChannelFolder::isSpline() const {
    return anyVisibleChild([](Child const& child) { return child.isSpline(); });
}

bool KFChannelFolder::isKeyframable() const {
    return anyVisibleChild([](Child const& child) { return child.isKeyframable(); });
}

bool KFChannelFolder::hasMoreThanOneKeypoint() const {
    return anyVisibleChild([](Child const& child) { return child.hasMoreThanOneKeypoint(); });
}

bool KFChannelFolder::hasFadeHandles() const {
    return anyVisibleChild([](Child const& child) { return child.hasFadeHandles(); });
}

bool KFChannelFolder::hasKeypoints(unsigned int mask) const {
    return anyVisibleChild(
        [=](Child const& child) { return !child.testFlag(mask) && child.hasKeypoints(0); });
}

bool KFChannelFolder::hasKeypointAt(Tempus const& t, unsigned int mask) const {
    return anyVisibleChild(
        [&](Child const& child) { return !child.testFlag(mask) && child.hasKeypointAt(t, 0); });
}

bool KFChannelFolder::allHaveKeypointsAt(Tempus const& t) const {
    return getNumberOfVisibleDescendants() > 0 &&
           !anyVisibleChild([&](Child const& child) { return !child.allHaveKeypointsAt(t); });
}

unsigned int KFChannelFolder::numberOfKeypointsAt(Tempus const& t) const {
    unsigned int sum = 0;
    forEachVisibleChild([&](Child const& child) { sum += child.numberOfKeypointsAt(t); });
    return sum;
}

bool KFChannelFolder::hasOnlyOneKeypointAt(Tempus const& t) const {
    return KFChannelFolder::numberOfKeypointsAt(t) <= 1;
}

bool KFChannelFolder::isModified(bool skipHidden) const {
    if (skipHidden && testFlag(kChannelFlagHidden)) {
        return false;
    }
    if (testFoldFlag(kFoldFlagModifiedIsEnabled)) {
        return !testFlag(kChannelFlagDisabled);
    }
    return anyChild([=](Child const& child) { return child.isModified(skipHidden); });
}

bool KFChannelFolder::saveWhenAtDefaultState() const {
    return KFChannelBase::saveWhenAtDefaultState() ||
           anyChild([](Child const& child) { return child.saveWhenAtDefaultState(); });
}

// Neighbouring keypoints ------------------------------------------------------------------------------------

bool KFChannelFolder::previousKeypoint(Tempus* t, unsigned int mask) const {
    if (t == nullptr) {
        return false;
    }
    Tempus latest = kTempusNegativeInfinity;
    bool found = false;
    forEachVisibleChild([&](Child const& child) {
        Tempus answer = *t;
        if (!child.testFlag(mask) && child.previousKeypoint(&answer, mask)) {
            latest = std::max(latest, answer);
            found = true;
        }
    });
    *t = found ? latest : *t;
    return found;
}

bool KFChannelFolder::nextKeypoint(Tempus* t, unsigned int mask) const {
    if (t == nullptr) {
        return false;
    }
    Tempus earliest = kTempusPositiveInfinity;
    bool found = false;
    forEachVisibleChild([&](Child const& child) {
        Tempus answer = *t;
        if (!child.testFlag(mask) && child.nextKeypoint(&answer, mask)) {
            earliest = std::min(earliest, answer);
            found = true;
        }
    });
    *t = found ? earliest : *t;
    return found;
}

Tempus KFChannelFolder::moveKeypointTo(Tempus const& from, Tempus const& to, bool a, bool) {
    KFChannelObjectRootBase const* const root = getAncestorRootBase();
    Tempus const frame = root != nullptr ? root->getFrameDuration() : kTempusZero;
    Tempus result = to;
    Tempus neighbour = from;
    if (from <= to) {
        if (nextKeypoint(&neighbour, 0)) {
            result = std::min(to, neighbour - frame);
        }
    } else if (previousKeypoint(&neighbour, 0)) {
        result = std::max(to, neighbour + frame);
    }
    forEachVisibleChild([&](Child& child) { child.moveKeypointTo(from, result, a, false); });
    return result;
}
