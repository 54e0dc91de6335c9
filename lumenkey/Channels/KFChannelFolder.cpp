// The folder as a node: construction, the list of its children with the index by ID, its flags.

#include "lumenkey/Channels/KFChannelFolder.h"

#include "lumenkey/Channels/KFChannelFactories.h"
#include "lumenkey/Channels/KFChildIndex.h"

#include <algorithm>
#include <bit>
#include <new>

namespace {

/// Up to here a scan is as fast as an index, and folders are many: they carry none.
constexpr std::size_t kMostUnindexedChildren = 32;

constexpr std::uint32_t stateOf(std::uint32_t foldFlags) noexcept { return foldFlags & ~kFoldNonStateFlags; }

} // namespace

// Construction ----------------------------------------------------------------------------------------------

KFChannelFolder::KFChannelFolder(KFFactory* factory, BXString const& name, KFChannelFolder* parent,
                                 unsigned int id, unsigned int flags, unsigned int capacity)
    : KFChannelBase(factory, name, parent, id, flags) {
    storeFlags(getFlags() | kChannelFlagIsFolder);
    if (capacity > 0) {
        allocateDescendants();
        _descendants->reserve(capacity);
    }
    KFChannelFolder::saveStateAsDefault();
}

KFChannelFolder::KFChannelFolder(KFFactory* factory, BXString const& name, unsigned int id,
                                 unsigned int capacity)
    : KFChannelFolder(factory, name, nullptr, id, 0, capacity) {}

KFChannelFolder::KFChannelFolder(BXString const& name, KFChannelFolder* parent, unsigned int id,
                                 unsigned int flags, unsigned int capacity)
    : KFChannelFolder(getKFChannelFolder_FactoryBase(), name, parent, id, flags, capacity) {}

KFChannelFolder::KFChannelFolder(KFChannelFolder const& other) : KFChannelFolder(other, nullptr) {}

KFChannelFolder::KFChannelFolder(KFChannelFolder const& other, KFChannelFolder* parent)
    : KFChannelBase(other, parent), _foldFlags(other._foldFlags), _defaultFoldFlags(other._defaultFoldFlags) {
    storeFlags(getFlags() | kChannelFlagIsFolder);
}

// Children that are members of a composite are gone by now: none may be touched.
KFChannelFolder::~KFChannelFolder() = default;

KFChannelBase* KFChannelFolder::clone() const { return new KFChannelFolder(*this, nullptr); }

char const* KFChannelFolder::getFacadeWrapperName() { return "KWChannelFolder"; }

// The list --------------------------------------------------------------------------------------------------

std::size_t KFChannelFolder::getNumberOfDescendants() const noexcept {
    return _descendants ? _descendants->size() : 0;
}

unsigned int KFChannelFolder::getNumberOfVisibleDescendants() const noexcept {
    unsigned int count = 0;
    forEachVisibleChild([&count](KFChannelBase const&) { ++count; });
    return count;
}

void KFChannelFolder::allocateDescendants() {
    if (!_descendants) {
        _descendants = std::make_unique<std::vector<KFChannelBase*>>();
    }
}

/// Behind the end if it isn't listed.
std::size_t KFChannelFolder::positionOf(KFChannelBase const* child) const noexcept {
    if (!_descendants) {
        return 0;
    }
    return static_cast<std::size_t>(std::find(_descendants->begin(), _descendants->end(), child) -
                                    _descendants->begin());
}

std::size_t KFChannelFolder::positionBehind(KFChannelBase const* child, KFChannelBase const* next,
                                            std::size_t position) const noexcept {
    std::size_t const count = getNumberOfDescendants();
    if (position < count && (*_descendants)[position] == child) {
        return position + 1;
    }
    // The visit took the child out, or changed the list in front of it.
    if (std::size_t const ofNext = positionOf(next); ofNext < count) {
        return ofNext;
    }
    std::size_t const ofChild = positionOf(child);
    return ofChild < count ? ofChild + 1 : position;
}

void KFChannelFolder::insertAt(std::size_t position, KFChannelBase* child) {
    allocateDescendants();
    _descendants->insert(_descendants->begin() + static_cast<std::ptrdiff_t>(position), child);
    if (_index) {
        tryOnIndex([=, this] { enterIndex(child, position); });
    } else if (std::size_t const before = _descendants->size() - 1;
               before >= kMostUnindexedChildren && std::has_single_bit(before)) {
        tryOnIndex([this] { buildIndex(); }); // anew each time they doubled, where memory was out
    }
}

void KFChannelFolder::push_back(KFChannelBase* child) {
    if (child != nullptr) {
        child->registerParent(this);
        insertAt(getNumberOfDescendants(), child);
    }
}

void KFChannelFolder::push_front(KFChannelBase* child) { insertDescendantAfter(nullptr, child); }

void KFChannelFolder::insertDescendantBefore(KFChannelBase const* anchor, KFChannelBase* child) {
    if (child != nullptr) {
        child->registerParent(this);
        insertAt(positionOf(anchor), child);
    }
}

void KFChannelFolder::insertDescendantAfter(KFChannelBase const* anchor, KFChannelBase* child) {
    if (child != nullptr) {
        child->registerParent(this);
        std::size_t const position = positionOf(anchor);
        insertAt(position < getNumberOfDescendants() ? position + 1 : 0, child);
    }
}

void KFChannelFolder::removeDescendant(KFChannelBase* child) {
    std::size_t const position = positionOf(child);
    if (position >= getNumberOfDescendants()) {
        return;
    }
    bool const hasTold = child->getParent() == this; // of each new ID
    child->unregisterParent(this);
    _descendants->erase(_descendants->begin() + static_cast<std::ptrdiff_t>(position));
    if (!_index) {
        return;
    }
    auto const behind = _descendants->begin() + static_cast<std::ptrdiff_t>(position);
    KFChildIndexEntry const* const entry = _index->find(child->getID());
    if (!hasTold || entry == nullptr ||
        (entry->count > 1 && std::find(behind, _descendants->end(), child) != _descendants->end())) {
        _index.reset(); // the last case: it has a second entry and now no parent to tell
    } else {
        leaveIndex(child, child->getID(), 1, position);
    }
}

void KFChannelFolder::removeAllDescendants(bool detach) {
    if (detach) {
        forEachChild([this](KFChannelBase& child) { child.unregisterParent(this); });
    }
    if (_descendants) {
        _descendants->clear();
    }
    _index.reset();
}

// The index by ID -------------------------------------------------------------------------------------------

KFChannelBase* KFChannelFolder::getDescendant(unsigned int id) const {
    if (_index) {
        KFChildIndexEntry const* const found = _index->find(id);
        return found != nullptr ? found->first : nullptr;
    }
    if (_descendants) {
        for (KFChannelBase* const child : *_descendants) {
            if (child->getID() == id) {
                return child;
            }
        }
    }
    return nullptr;
}

bool KFChannelFolder::comesFirst(KFChannelBase const* child, KFChannelBase const* other) const noexcept {
    auto const found =
        std::find_if(_descendants->begin(), _descendants->end(),
                     [=](KFChannelBase const* each) { return each == child || each == other; });
    return found != _descendants->end() && *found == child;
}

void KFChannelFolder::buildIndex() {
    auto index = std::make_unique<KFChildIndex>();
    index->reserve(_descendants->size());
    for (KFChannelBase* const child : *_descendants) {
        if (child->getParent() != this) {
            return; // left over from a child listed twice; nobody would tell of its new ID
        }
        ++index->insert({child, child->getID(), 0}).count;
    }
    _index = std::move(index);
}

template <class Change> void KFChannelFolder::tryOnIndex(Change const& change) noexcept {
    try {
        change();
    } catch (std::bad_alloc const&) {
        _index.reset();
    }
}

/// For a child that stands at `position` already.
void KFChannelFolder::enterIndex(KFChannelBase* child, std::size_t position) {
    KFChildIndexEntry& entry = _index->insert({child, child->getID(), 0});
    ++entry.count;
    bool const isLast = position + 1 == _descendants->size();
    if (entry.first != child && !isLast && comesFirst(child, entry.first)) {
        entry.first = child;
    }
}

/// For `count` entries of a child that had the ID, and stood at `oldPosition` at first.
void KFChannelFolder::leaveIndex(KFChannelBase const* child, unsigned int id, unsigned int count,
                                 std::size_t oldPosition) {
    KFChildIndexEntry& entry = *_index->find(id);
    if (entry.count <= count) {
        _index->erase(&entry);
        return;
    }
    entry.count -= count;
    if (entry.first == child) {
        auto const behind = _descendants->begin() + static_cast<std::ptrdiff_t>(oldPosition);
        auto const next = std::find_if(behind, _descendants->end(),
                                       [id](KFChannelBase const* each) { return each->getID() == id; });
        if (next == _descendants->end()) {
            _index->erase(&entry);
        } else {
            entry.first = *next;
        }
    }
}

void KFChannelFolder::descendantIDChanged(KFChannelBase* child, unsigned int oldID) {
    if (!_index || child == nullptr) {
        return;
    }
    KFChildIndexEntry const* const old = _index->find(oldID);
    if (old == nullptr) {
        return; // not listed any more
    }
    bool const isOnlyOne = old->count == 1;
    auto const entries =
        isOnlyOne ? old->first == child : std::count(_descendants->begin(), _descendants->end(), child);
    if (entries == 0) {
        return;
    }
    auto const count = static_cast<unsigned int>(entries);
    leaveIndex(child, oldID, count, isOnlyOne ? 0 : positionOf(child));
    tryOnIndex([=, this] {
        KFChildIndexEntry& entry = _index->insert({child, child->getID(), 0});
        entry.count += count;
        if (entry.first != child && comesFirst(child, entry.first)) {
            entry.first = child;
        }
    });
}

// Flags -----------------------------------------------------------------------------------------------------

void KFChannelFolder::setFoldFlags(std::uint32_t flags) {
    if (stateOf(flags) != 0) {
        willBeModified(kModifyData);
    }
    _foldFlags = flags;
}

void KFChannelFolder::setFoldFlag(std::uint32_t mask) {
    if (stateOf(mask) != 0) {
        willBeModified(kModifyData);
    }
    _foldFlags |= mask;
}

void KFChannelFolder::resetFoldFlag(std::uint32_t mask) {
    if (stateOf(mask) != 0) {
        willBeModified(kModifyData);
    }
    _foldFlags &= ~mask;
}

void KFChannelFolder::saveStateAsDefault() {
    KFChannelBase::saveStateAsDefault();
    _defaultFoldFlags = stateOf(_foldFlags);
}

bool KFChannelFolder::isStateModified() {
    return KFChannelBase::isStateModified() || stateOf(_foldFlags) != _defaultFoldFlags;
}

// Copies ----------------------------------------------------------------------------------------------------

std::vector<KFChannelBase*> const* KFChannelFolder::matchingList(KFChannelBase const& other) const noexcept {
    if (!other.testFlag(kChannelFlagIsFolder) || !_descendants) {
        return nullptr;
    }
    auto const* const list = static_cast<KFChannelFolder const&>(other).getDescendants();
    return list != nullptr && list->size() == _descendants->size() ? list : nullptr;
}

void KFChannelFolder::copy(KFChannelBase const* other, bool silent) {
    if (other == nullptr) {
        return;
    }
    KFChannelBase::copy(other, silent);
    if (other->testFlag(kChannelFlagIsFolder)) {
        auto const& folder = static_cast<KFChannelFolder const&>(*other);
        _foldFlags = folder._foldFlags;
        _defaultFoldFlags = folder._defaultFoldFlags;
    }
}

bool KFChannelFolder::compare(KFChannelBase const* other) const {
    if (other == nullptr || !other->testFlag(kChannelFlagIsFolder) || !KFChannelBase::compare(other)) {
        return false;
    }
    auto const* const theirs = matchingList(*other);
    return theirs != nullptr &&
           std::equal(_descendants->begin(), _descendants->end(), theirs->begin(),
                      [](KFChannelBase const* a, KFChannelBase const* b) { return !(*a != *b); });
}

bool KFChannelFolder::allowsAssignment(KFChannelBase const* other) {
    if (other == nullptr || other == this || !other->testFlag(kChannelFlagIsFolder)) {
        return false;
    }
    if (!_descendants && static_cast<KFChannelFolder const*>(other)->getDescendants() == nullptr) {
        return true;
    }
    auto const* const theirs = matchingList(*other);
    return theirs != nullptr &&
           std::equal(_descendants->begin(), _descendants->end(), theirs->begin(),
                      [](KFChannelBase* a, KFChannelBase const* b) { return a->allowsAssignment(b); });
}

void KFChannelFolder::assign(KFChannelBase const* other) {
    if (other == nullptr) {
        return;
    }
    KFChannelBase::assign(other);
    auto const* const theirs = allowsAssignment(other) ? matchingList(*other) : nullptr;
    for (std::size_t i = 0; theirs != nullptr && i < theirs->size() && i < _descendants->size(); ++i) {
        (*_descendants)[i]->assign((*theirs)[i]);
    }
}

void KFChannelFolder::setValue(KFChannelBase const& other) {
    auto const* const theirs = matchingList(other);
    for (std::size_t i = 0; theirs != nullptr && i < theirs->size() && i < _descendants->size(); ++i) {
        (*_descendants)[i]->setValue(*(*theirs)[i]);
    }
}
