#include "lumenkey/Channels/KFCompoundChannel.h"

#include "lumenkey/Channels/KFChannel.h"

namespace {

KFChannel* asValue(KFChannelBase* child) noexcept {
    return child != nullptr && child->isValueChannel() ? static_cast<KFChannel*>(child) : nullptr;
}

KFCompoundChannel* asCompound(KFChannelBase* child) noexcept {
    return child->isCompoundChannel() ? static_cast<KFCompoundChannel*>(child) : nullptr;
}

bool removeValueFrom(KFChannelBase* child, Tempus const& t) {
    if (KFChannel* const value = asValue(child)) {
        return value->removeValue(t, false);
    }
    KFCompoundChannel* const compound = asCompound(child);
    return compound != nullptr && compound->removeValue(t);
}

void removeAllValuesFrom(KFChannelBase* child, Tempus const& t) {
    if (KFChannel* const value = asValue(child)) {
        value->removeAllValues(t, false);
    } else if (KFCompoundChannel* const compound = asCompound(child)) {
        compound->removeAllValues(t);
    }
}

} // namespace

// Construction ----------------------------------------------------------------------------------------------

KFCompoundChannel::KFCompoundChannel(KFFactory* factory, BXString const& name, KFChannelFolder* parent,
                                     unsigned int id, unsigned int flags, bool, unsigned int capacity)
    : KFChannelFolder(factory, name, parent, id, flags, capacity) {
    setFoldFlag(kFoldFlagsCompoundDefault);
    KFChannelFolder::saveStateAsDefault();
}

KFCompoundChannel::KFCompoundChannel(KFFactory* factory, BXString const& name, unsigned int id,
                                     unsigned int capacity)
    : KFChannelFolder(factory, name, id, capacity) {}

KFCompoundChannel::KFCompoundChannel(KFCompoundChannel const& other) : KFCompoundChannel(other, nullptr) {}

KFCompoundChannel::KFCompoundChannel(KFCompoundChannel const& other, KFChannelFolder* parent)
    : KFChannelFolder(other, parent) {}

KFCompoundChannel::~KFCompoundChannel() = default;

KFChannelBase* KFCompoundChannel::clone() const { return new KFCompoundChannel(*this, nullptr); }

char const* KFCompoundChannel::getFacadeWrapperName() { return "KWCompoundChannel"; }

bool KFCompoundChannel::isCompoundChannel() const { return true; }

// As one node -----------------------------------------------------------------------------------------------

void KFCompoundChannel::copy(KFChannelBase const* other, bool silent) {
    std::uint32_t const linked = getFoldFlags() & kFoldFlagLinked;
    KFChannelFolder::copy(other, silent);
    storeFoldFlags(getFoldFlags() | linked);
}

bool KFCompoundChannel::compare(KFChannelBase const* other) const {
    return other != nullptr && other->isCompoundChannel() &&
           isLinked() == static_cast<KFCompoundChannel const*>(other)->isLinked() &&
           KFChannelFolder::compare(other);
}

void KFCompoundChannel::markFactoriesForSerialization(BXSerializerWriteStream& stream, bool all) {
    // NOLINTNEXTLINE(bugprone-parent-virtual-call): the class fixes what the children are; they need no mark.
    KFChannelBase::markFactoriesForSerialization(stream, all);
}

void KFCompoundChannel::willBeModified(unsigned int kind) {
    KFChannelBase::willBeModified(kind);
    forEachChild([kind](KFChannelBase& child) {
        if (KFChannel* const value = asValue(&child)) {
            value->parentWillBeModified(kind);
        }
    });
}

// However many components have a keypoint, the compound has one.
bool KFCompoundChannel::hasOnlyOneKeypointAt(Tempus const& t) const { return hasKeypointAt(t, 0); }

unsigned int KFCompoundChannel::numberOfKeypointsAt(Tempus const& t) const {
    return hasKeypointAt(t, 0) ? 1 : 0;
}

bool KFCompoundChannel::setKeypointInterpolation(KFChannel*, void*, unsigned int, bool) { return false; }

void KFCompoundChannel::setCurveInterpolation(unsigned int) {}

// Linked edits ----------------------------------------------------------------------------------------------

/// Does `edit` without the flag, or the children would hand their edits back here.
template <class Edit> void KFCompoundChannel::editUnlinked(Edit const& edit) {
    resetFoldFlag(kFoldFlagLinked);
    edit();
    setFoldFlag(kFoldFlagLinked); // which announces the compound
}

template <class Operation>
void KFCompoundChannel::editLinked(KFChannel* child, bool force, Operation const& operation) {
    if (force || isLinked()) {
        editUnlinked([&] { forEachChild(operation); });
    } else if (child != nullptr) {
        operation(*child);
    }
}

void KFCompoundChannel::compoundAddKeypointAt(KFChannel* child, Tempus const& t, bool force) {
    editLinked(child, force, [&](KFChannelBase& each) { each.addKeypointAt(t); });
}

void KFCompoundChannel::compoundDeleteKeypointAt(KFChannel* child, Tempus const& t, bool force) {
    editLinked(child, force, [&](KFChannelBase& each) { each.deleteKeypointAt(t); });
}

void KFCompoundChannel::compoundReset(KFChannel* child, bool force) {
    editLinked(child, force, [](KFChannelBase& each) { each.reset(false); });
}

void KFCompoundChannel::compoundSetIsSpline(KFChannel* child, bool on, bool force) {
    editLinked(child, force, [on](KFChannelBase& each) { each.setIsSpline(on); });
}

Tempus KFCompoundChannel::compoundMoveKeypointTo(KFChannel* child, Tempus const& from, Tempus const& to,
                                                 bool a, bool b, bool force) {
    if (child == nullptr) {
        return to;
    }
    if (!force && !isLinked()) {
        return child->moveKeypointTo(from, to, a, false);
    }
    editUnlinked([&] {
        Tempus const reached = child->moveKeypointTo(from, to, a, b);
        forEachChild([&](KFChannelBase& each) {
            if (&each != child) {
                each.moveKeypointTo(from, reached, a, false);
            }
        });
    });
    return to;
}

// Values ----------------------------------------------------------------------------------------------------

void KFCompoundChannel::setValue(KFChannel* child, Tempus const& t, double value) {
    if (child == nullptr) {
        return;
    }
    if (!isLinked()) {
        child->setValue(t, value, false);
        return;
    }
    editUnlinked([&] {
        forEachChild([&](KFChannelBase& each) {
            if (&each == child) {
                child->setValue(t, value, false);
            } else if (KFChannel* const other = asValue(&each)) {
                other->setValue(t);
            }
        });
    });
}

KFChannelBase* KFCompoundChannel::childAt(unsigned int index) const noexcept {
    return index < getNumberOfDescendants() ? (*getDescendants())[index] : nullptr;
}

void KFCompoundChannel::keyChildren(KFChannelBase const* except, Tempus const& t) {
    forEachChild([&](KFChannelBase& child) {
        KFChannel* const value = &child != except ? asValue(&child) : nullptr;
        if (value != nullptr) {
            value->setValue(t);
        }
    });
}

void KFCompoundChannel::setValue(unsigned int index, Tempus const& t, double value) {
    KFChannel* const child = asValue(childAt(index));
    if (child == nullptr) {
        return;
    }
    child->setValue(t, value, false);
    if (isLinked()) {
        keyChildren(child, t);
    }
}

void KFCompoundChannel::setValue(unsigned int index, Tempus const& t) {
    if (isLinked()) {
        keyChildren(nullptr, t);
    } else if (KFChannel* const child = asValue(childAt(index))) {
        child->setValue(t);
    }
}

bool KFCompoundChannel::removeValue(unsigned int index, Tempus const& t) {
    KFChannelBase* const child = childAt(index);
    if (child == nullptr) {
        return false;
    }
    bool const removed = removeValueFrom(child, t);
    if (isLinked()) {
        forEachChild([&](KFChannelBase& each) {
            if (&each != child) {
                removeValueFrom(&each, t);
            }
        });
    }
    return removed;
}

bool KFCompoundChannel::removeValue(Tempus const& t) {
    bool removed = false;
    forEachChild([&](KFChannelBase& child) { removed |= removeValueFrom(&child, t); });
    return removed;
}

void KFCompoundChannel::removeAllValues(Tempus const& t, unsigned int index) {
    if (isLinked()) {
        forEachChild([&](KFChannelBase& child) { removeAllValuesFrom(&child, t); });
    } else if (KFChannelBase* const child = childAt(index)) {
        removeAllValuesFrom(child, t);
    }
}

void KFCompoundChannel::removeAllValues(Tempus const& t) {
    forEachChild([&](KFChannelBase& child) { removeAllValuesFrom(&child, t); });
}
