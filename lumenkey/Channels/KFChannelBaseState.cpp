// Flags, and what they say: defaults, locks, enabled and soloed channels.

#include "lumenkey/Channels/KFChannelObjectRootBase.h"

namespace {

bool anyHas(KFChannelFlags mask, KFChannelBase const* node) noexcept {
    for (; node != nullptr; node = node->getParent()) {
        if (node->testFlag(mask)) {
            return true;
        }
    }
    return false;
}

} // namespace

void KFChannelBase::finishInitializing() { _flags |= kChannelFlagInitialized; }

void KFChannelBase::saveStateAsDefault() { _defaultFlags = _flags & ~kChannelNonStateFlags; }

bool KFChannelBase::isStateModified() { return (_flags & ~kChannelNonStateFlags) != _defaultFlags; }

bool KFChannelBase::saveWhenAtDefaultState() const { return testFlag(kChannelFlagSaveWhenAtDefault); }

void KFChannelBase::setFlag(KFChannelFlags mask, bool silent) {
    if (!silent && (mask & ~kChannelNonStateFlags) != 0) {
        willBeModified(kModifyState);
    }
    _flags |= mask;
}

void KFChannelBase::resetFlag(KFChannelFlags mask, bool silent) {
    if (!silent && (mask & ~kChannelNonStateFlags) != 0) {
        willBeModified(kModifyState);
    }
    _flags &= ~mask;
}

void KFChannelBase::setFlags(KFChannelFlags flags) {
    if ((flags & ~kChannelNonStateFlags) != 0) {
        willBeModified(kModifyState);
    }
    _flags = flags;
}

void KFChannelBase::lock(bool on, bool) {
    willBeModified(kModifyState);
    _flags = on ? _flags | kChannelFlagLocked : _flags & ~kChannelFlagLocked;
}

bool KFChannelBase::isLocked(bool checkAncestors) const noexcept {
    return checkAncestors ? anyHas(kChannelFlagLocked, this) : testFlag(kChannelFlagLocked);
}

bool KFChannelBase::isAnyAncestorLocked() const noexcept { return anyHas(kChannelFlagLocked, _parent); }

bool KFChannelBase::isAnyAncestorDisabled() const noexcept { return anyHas(kChannelFlagDisabled, _parent); }

bool KFChannelBase::isAnyAncestorSolo() const noexcept { return anyHas(kChannelFlagSolo, _parent); }

void KFChannelBase::enable(bool on, bool silent) {
    if (!silent) {
        willBeModified(kModifyState);
    }
    _flags = on ? _flags & ~kChannelFlagDisabled : _flags | kChannelFlagDisabled;
}

bool KFChannelBase::isEnabled(bool checkAncestors, bool honourSolo) const {
    if (honourSolo && testFlag(kChannelFlagSoloable)) {
        KFChannelObjectRootBase* const root = getChannelRootBase();
        if (root != nullptr && root->checkSolo()) {
            return isAnyAncestorSolo() ? !testFlag(kChannelFlagDisabled)
                                       : testFlag(kChannelFlagSolo | kChannelFlagChildSolo);
        }
    }
    return !isDisabled(checkAncestors, false);
}

bool KFChannelBase::isDisabled(bool checkAncestors, bool) const noexcept {
    return checkAncestors ? anyHas(kChannelFlagDisabled, this) : testFlag(kChannelFlagDisabled);
}

void KFChannelBase::solo(bool on) {
    if (!testFlag(kChannelFlagSoloable)) {
        return;
    }
    willBeModified(kModifyState);
    _flags = on ? _flags | kChannelFlagSolo : _flags & ~kChannelFlagSolo;
}

void KFChannelBase::setChildSolo(bool skipSelf) noexcept {
    for (KFChannelBase* node = skipSelf ? _parent : this; node != nullptr; node = node->_parent) {
        if (node->testFlag(kChannelFlagSoloable)) {
            node->_flags |= kChannelFlagChildSolo;
        }
    }
}
