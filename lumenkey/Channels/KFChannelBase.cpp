#include "lumenkey/Channels/KFChannelBase.h"

#include "lumenkey/Channels/KFChannelObjectRootBase.h"
#include "lumenkey/Channels/KFChannelTimeConverter.h"

namespace {

KFChannelObjectRootBase* asRoot(KFChannelBase const* node) noexcept {
    return static_cast<KFChannelObjectRootBase*>(const_cast<KFChannelBase*>(node));
}

char const* textOrNull(BXString const* name) noexcept { return name != nullptr ? name->c_str() : nullptr; }

BXString const* interned(char const* name) { return name != nullptr ? BXString::intern(name) : nullptr; }

} // namespace

// Construction ----------------------------------------------------------------------------------------------

KFChannelBase::KFChannelBase(KFFactory* factory, BXString const& name, KFChannelFolder* parent,
                             unsigned int id, unsigned int flags)
    : KFFactoryBase(factory), _id(id), _name(name), _flags(flags | kChannelFlagHostOption4) {
    enterParent(parent);
    KFChannelBase::saveStateAsDefault();
}

KFChannelBase::KFChannelBase(KFFactory* factory, BXString const& name, unsigned int id)
    : KFChannelBase(factory, name, nullptr, id, 0) {}

KFChannelBase::KFChannelBase(KFChannelBase const& other) : KFChannelBase(other, nullptr) {}

KFChannelBase::KFChannelBase(KFChannelBase const& other, KFChannelFolder* parent)
    : KFFactoryBase(other), BXSerializer(other), _id(other._id), _name(other._name),
      _flags(other._flags & ~kChannelClassFlags), // whose classes set them in their own constructors
      _defaultFlags(other._defaultFlags), _timeConverter(other._timeConverter) {
    copyNames(other);
    enterParent(parent);
}

KFChannelBase::~KFChannelBase() { setResetCallback(nullptr, nullptr, false); }

void KFChannelBase::enterParent(KFChannelFolder* parent) {
    _parent = parent; // first, so that nothing is detached
    if (parent != nullptr) {
        parent->push_back(this);
    }
}

void KFChannelBase::copyNames(KFChannelBase const& other) {
    if (this != &other) {
        _internalName = other._internalName ? std::make_unique<BXString>(*other._internalName) : nullptr;
    }
    copyControllerNames(other);
}

void KFChannelBase::copyControllerNames(KFChannelBase const& other) noexcept {
    _labelCtlrClassName = other._labelCtlrClassName;
    _parameterCtlrClassName = other._parameterCtlrClassName;
    _inspectorCtlrClassName = other._inspectorCtlrClassName;
}

// Copies ----------------------------------------------------------------------------------------------------

void KFChannelBase::copy(KFChannelBase const* other, bool) {
    if (other == nullptr) {
        return;
    }
    setID(other->_id);
    _flags = (other->_flags & ~kChannelClassFlags) | (_flags & kChannelClassFlags) | kChannelFlagNameUnset;
    _defaultFlags = other->_defaultFlags;
    _name = other->_name;
    copyNames(*other);
}

bool KFChannelBase::compare(KFChannelBase const* other) const {
    return other != nullptr && _id == other->_id && _flags == other->_flags &&
           _name.caseInsensitiveCompare(other->_name) == 0;
}

KFChannelBase* KFChannelBase::clone() const { return new KFChannelBase(*this); }

void KFChannelBase::assign(KFChannelBase const* other) {
    if (other == nullptr) {
        return;
    }
    constexpr KFChannelFlags kept = kChannelClassFlags | kChannelFlagNameUnset;
    _flags = (other->_flags & ~kept) | (_flags & kept);
    copyControllerNames(*other);
}

bool KFChannelBase::allowsAssignment(KFChannelBase const* other) { return other != this; }

KFChannelBase& KFChannelBase::operator=(KFChannelBase const& other) {
    if (allowsAssignment(&other)) {
        assign(&other);
    }
    return *this;
}

// Identity --------------------------------------------------------------------------------------------------

unsigned int KFChannelBase::getInstanceID() const { return _id; }

BXSerializer* KFChannelBase::getSerializer() { return this; }

char const* KFChannelBase::getFacadeWrapperName() { return "KWChannelBase"; }

void KFChannelBase::setID(unsigned int id) {
    unsigned int const oldID = _id;
    _id = id;
    if (_parent != nullptr && id != oldID) {
        _parent->descendantIDChanged(this, oldID);
    }
}

void KFChannelBase::setName(BXString const& name, bool silent) {
    if (!silent) {
        willBeModified(kModifyData);
    }
    _name = name;
}

void KFChannelBase::setNameUnset(bool unset) noexcept {
    _flags = unset ? _flags | kChannelFlagNameUnset : _flags & ~kChannelFlagNameUnset;
}

void KFChannelBase::setInternalName(BXString const& name) {
    willBeModified(kModifyData);
    storeInternalName(name);
}

void KFChannelBase::storeInternalName(BXString const& name) {
    if (_internalName) {
        *_internalName = name;
    } else {
        _internalName = std::make_unique<BXString>(name);
    }
}

BXString KFChannelBase::getFullDisplayName() const {
    BXString text = _name;
    auto const prepend = [&text](KFChannelBase const& node) {
        text.insert(0, ".");
        text.insert(0, node._name.view());
    };
    auto const isUnnamedRoot = [](KFChannelBase const& node) {
        return node.testFlag(kChannelFlagIsObjectRoot) && !node.testFlag(kChannelFlagRootInFullName);
    };

    KFChannelBase const* folder = _parent;
    if (folder != nullptr && folder->isCompoundChannel()) {
        prepend(*folder);
        folder = folder->_parent;
    }
    if (folder == nullptr) {
        return text;
    }
    KFChannelBase const* const root = getChannelRootBase();
    std::string_view const rootName = root != nullptr ? root->_name.view() : std::string_view();
    if (text.find(rootName) >= 0 || isUnnamedRoot(*folder)) {
        return text;
    }
    KFChannelBase const* const above = folder->_parent;
    if (above == nullptr || isUnnamedRoot(*above)) {
        return text;
    }
    prepend(*folder);
    if (above->testFlag(kChannelFlagRootInFullName)) {
        prepend(*above);
    }
    return text;
}

char const* KFChannelBase::getLabelCtlrClassName() const noexcept { return textOrNull(_labelCtlrClassName); }

char const* KFChannelBase::getParameterCtlrClassName() const noexcept {
    return textOrNull(_parameterCtlrClassName);
}

char const* KFChannelBase::getInspectorCtlrClassName() const noexcept {
    return textOrNull(_inspectorCtlrClassName);
}

void KFChannelBase::setLabelCtlrClassName(char const* name) { _labelCtlrClassName = interned(name); }

void KFChannelBase::setParameterCtlrClassName(char const* name) { _parameterCtlrClassName = interned(name); }

void KFChannelBase::setInspectorCtlrClassName(char const* name) { _inspectorCtlrClassName = interned(name); }

// Place -----------------------------------------------------------------------------------------------------

bool KFChannelBase::registerParent(KFChannelFolder* parent) {
    KFChannelFolder* const old = _parent;
    bool const moves = old != nullptr && old != parent;
    if (moves) {
        old->removeDescendant(this);
    }
    _parent = parent;
    return !moves;
}

bool KFChannelBase::unregisterParent(KFChannelFolder*) noexcept {
    bool const had = _parent != nullptr;
    _parent = nullptr;
    return had;
}

bool KFChannelBase::isDescendantOf(KFChannelFolder const& folder) const noexcept {
    for (KFChannelBase const* node = _parent; node != nullptr; node = node->_parent) {
        if (node == &folder) {
            return true;
        }
    }
    return false;
}

KFChannelObjectRootBase* KFChannelBase::getChannelRootBase() const noexcept {
    for (KFChannelBase const* node = this; node != nullptr; node = node->_parent) {
        if (node->testFlag(kChannelFlagIsObjectRoot)) {
            return asRoot(node);
        }
    }
    return nullptr;
}

KFChannelObjectRootBase* KFChannelBase::getAncestorRootBase() const noexcept {
    KFChannelBase const* topmost = nullptr;
    for (KFChannelBase const* node = this; node != nullptr; node = node->_parent) {
        if (node->testFlag(kChannelFlagIsObjectRoot)) {
            topmost = node;
        }
    }
    return asRoot(topmost);
}

void* KFChannelBase::getObjectManipulator() const {
    KFChannelObjectRootBase const* const root = getChannelRootBase();
    return root != nullptr ? root->getManipulator() : nullptr;
}

KFChannelRef KFChannelBase::getRef(bool relativeToRoot) const {
    return KFChannelRef(this, relativeToRoot ? getChannelRootBase() : nullptr);
}

// Announcements ---------------------------------------------------------------------------------------------

void KFChannelBase::willBeModified(unsigned int kind) {
    if (KFChannelObjectRootBase* const root = getChannelRootBase()) {
        root->willModifyChannel(this, kind);
    }
}

bool KFChannelBase::hasBeenModified(bool* out) {
    KFChannelObjectRootBase* const root = getChannelRootBase();
    return root != nullptr && root->wasChannelModified(this, out);
}

void KFChannelBase::addToUndo(BXString const& text) const {
    if (KFChannelObjectRootBase const* const root = getChannelRootBase()) {
        root->addToUndo(this, text);
    }
}

// Time ------------------------------------------------------------------------------------------------------

Tempus KFChannelBase::getFrameDuration() const {
    KFChannelObjectRootBase const* const root = getChannelRootBase();
    return root != nullptr ? root->getFrameDuration() : TempusMake(1, 30);
}

Tempus KFChannelBase::getTimeOffset() const {
    return _parent != nullptr ? _parent->getTimeOffset() : kTempusZero;
}

Tempus KFChannelBase::globalToLocalTime(Tempus const& t) const {
    if (_timeConverter != nullptr) {
        return _timeConverter->globalToLocalTime(this, t);
    }
    return _parent != nullptr ? _parent->globalToLocalTime(t) : t;
}

Tempus KFChannelBase::localToGlobalTime(Tempus const& t) const {
    if (_timeConverter != nullptr) {
        return _timeConverter->localToGlobalTime(this, t);
    }
    return _parent != nullptr ? _parent->localToGlobalTime(t) : t;
}

Tempus KFChannelBase::globalToLocalTime(Tempus const& t, Tempus const& offset) {
    return BX_TempusSaferSubtract(t, offset);
}

Tempus KFChannelBase::localToGlobalTime(Tempus const& t, Tempus const& offset) {
    return BX_TempusSaferAdd(t, offset);
}
