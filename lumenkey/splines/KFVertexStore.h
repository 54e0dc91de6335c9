// Internal: not installed.
#pragma once

#include "lumenkey/foundation/Tempus.h"
#include "lumenkey/splines/KFStoreVersion.h"
#include "lumenkey/splines/KFVertexBlock.h"
#include "lumenkey/splines/KFVertexIterator.h"

#include <cstddef>
#include <cstdint>
#include <memory>
#include <vector>

class KFHandleSet;
class KFVertex;

/// The vertices of one spline in their order, with an index of their positions and of which of them are valid.
///
/// Vertices stand in blocks of up to `kBlockCapacity` pointers. Beside each pointer stands its position as ticks of a
/// timescale common to all vertices, and a bit that says whether the vertex is in the list of valid ones; the first
/// tick of each block stands in a directory. Two binary searches over contiguous numbers find a position, and
/// an insertion moves at most one block. Where no common timescale fits (kept below 2^62 ticks), positions are
/// compared exactly, vertex by vertex; `hasTicks` tells.
///
/// Whether a vertex is valid is what it answered to `isEnabled` at time zero when it was inserted as valid, or at the
/// last `refresh`.
///
/// The store owns its vertices. It takes no lock: its spline's lock guards it.
class KFVertexStore {
public:
    using Place = KFVertexIterator;
    static constexpr std::uint32_t kBlockCapacity = KFVertexBlock::kCapacity;

    KFVertexStore();
    ~KFVertexStore();
    KFVertexStore(KFVertexStore const&) = delete;
    KFVertexStore& operator=(KFVertexStore const&) = delete;

    std::size_t size() const noexcept { return _size; }
    bool empty() const noexcept { return _size == 0; }
    void reserve(std::size_t count);
    std::size_t bytes() const noexcept;
    /// Changes with each change of the set, order, positions or validity of vertices, before the lock is given back.
    std::uint64_t version() const noexcept { return _version.get(); }
    /// The same for who doesn't hold the lock.
    std::uint64_t acquiredVersion() const noexcept { return _version.acquired(); }

    // Places: first to last, then `end`.
    Place begin() const noexcept { return {0, 0}; }
    Place end() const noexcept;
    Place last() const noexcept;
    Place next(Place place) const noexcept;
    /// The place before; `place` isn't `begin`.
    Place previous(Place place) const noexcept;
    KFVertex* at(Place place) const noexcept;
    KFVertex* front() const noexcept { return empty() ? nullptr : at(begin()); }
    KFVertex* back() const noexcept { return empty() ? nullptr : at(last()); }
    /// The index of a place in the order. O(blocks).
    std::size_t indexOf(Place place) const noexcept;

    // Searches by position, by exact comparison of times. Places may be `end`.
    /// The first vertex at or after `u`.
    Place lowerBound(Tempus const& u) const noexcept;
    /// The first vertex strictly after `u`.
    Place upperBound(Tempus const& u) const noexcept;
    /// The place of a vertex of this store: by its U, else by looking at every place; `end` when it isn't here.
    Place find(KFVertex const* vertex) const noexcept;
    /// Whether a pointer is a vertex of this store. It is compared, never followed. O(1) after the first call.
    bool contains(void const* handle) const;

    // Valid vertices. Places are `end` when there is none.
    std::size_t validCount() const noexcept { return _validCount; }
    KFVertex* firstValid() const noexcept { return _firstValid; }
    KFVertex* lastValid() const noexcept { return _lastValid; }
    bool isValid(Place place) const noexcept;
    /// The first valid place at or after `place`.
    Place validFrom(Place place) const noexcept;
    /// The last valid place before `place`.
    Place validBefore(Place place) const noexcept;
    /// False while a vertex is listed otherwise than it is enabled: it was inserted or changed without being listed.
    bool validityIsCurrent() const noexcept { return _validityCurrent; }

    // Edits.
    /// Puts a vertex in front of `place` and owns it. With `suppressed` it doesn't become valid before the next
    /// `refresh`, else it is valid when it is enabled at time zero. Returns its place.
    Place insert(Place place, KFVertex* vertex, bool suppressed);
    Place append(KFVertex* vertex, bool suppressed) { return insert(end(), vertex, suppressed); }
    /// Takes a vertex out; the caller owns it. Returns the place of the one behind it.
    Place remove(Place place);
    /// Destroys all vertices, last first.
    void clear();
    /// Reads the position of one vertex again.
    void updatePosition(Place place);
    /// Reads the validity of one vertex again.
    void updateValidity(Place place);
    /// Says that a vertex was enabled or disabled and that the list isn't to follow before the next `refresh`.
    void postponeValidity() noexcept { _validityCurrent = false; }
    /// Says that something changed that evaluation depends on.
    void touch() noexcept { _version.advance(); }
    /// Reads all positions again.
    void updateAllPositions();
    /// Reads the validity of all vertices again.
    void refresh();
    /// Makes `place` the first and keeps the cyclic order.
    void rotate(Place place);
    // The index of positions, for the evaluator.
    /// The common timescale of the ticks; 0 when there is none.
    std::int64_t tickScale() const noexcept { return _tickScale; }
    bool hasTicks() const noexcept { return _tickScale != 0; }
    std::int64_t tickAt(Place place) const noexcept;
    /// The first place whose tick is at or after `tick`; requires `hasTicks`.
    Place lowerBoundTick(std::int64_t tick) const noexcept;

private:
    using Block = KFVertexBlock;

    Place boundByComparison(Tempus const& u, bool strictly) const noexcept;
    Place roomAt(Place place);
    void insertBlock(std::uint32_t index, std::uint32_t room);
    void splitBlock(std::uint32_t index);
    void mergeWithNext(Place const& place);
    void updateEnds() noexcept;
    bool tickOf(Tempus const& u, std::int64_t* tick) const noexcept;
    bool adoptPosition(Tempus const& u, std::int64_t* tick) noexcept;
    bool adoptTimescale(std::int32_t timescale) noexcept;
    bool widenScale(std::int32_t timescale) noexcept;

    std::vector<std::unique_ptr<Block>> _blocks;
    std::vector<std::int64_t> _firstTicks;
    mutable std::unique_ptr<KFHandleSet> _handles;
    std::size_t _size = 0;
    std::size_t _validCount = 0;
    KFVertex* _firstValid = nullptr;
    KFVertex* _lastValid = nullptr;
    std::int64_t _tickScale = 1;
    KFStoreVersion _version;
    bool _validityCurrent = true;
};

inline KFVertexStore::Place KFVertexStore::end() const noexcept {
    return {static_cast<std::uint32_t>(_blocks.size()), 0};
}

inline KFVertexStore::Place KFVertexStore::last() const noexcept { return empty() ? end() : previous(end()); }

inline KFVertexStore::Place KFVertexStore::next(Place place) const noexcept {
    if (place.slot + 1 < _blocks[place.block]->count())
        return {place.block, place.slot + 1};
    return {place.block + 1, 0};
}

inline KFVertexStore::Place KFVertexStore::previous(Place place) const noexcept {
    if (place.slot > 0)
        return {place.block, place.slot - 1};
    return {place.block - 1, _blocks[place.block - 1]->count() - 1};
}

inline KFVertex* KFVertexStore::at(Place place) const noexcept {
    return _blocks[place.block]->entries[place.slot].vertex;
}

inline std::int64_t KFVertexStore::tickAt(Place place) const noexcept {
    return _blocks[place.block]->entries[place.slot].tick;
}

inline bool KFVertexStore::isValid(Place place) const noexcept {
    return _blocks[place.block]->valid.test(place.slot);
}

inline KFVertexStore::Place KFVertexStore::validFrom(Place place) const noexcept {
    if (_validCount == _size)
        return place;
    for (; place.block < _blocks.size(); place = {place.block + 1, 0}) {
        Block const& block = *_blocks[place.block];
        if (block.validCount == 0)
            continue;
        std::uint32_t const slot = block.valid.from(place.slot);
        if (slot < kBlockCapacity)
            return {place.block, slot};
    }
    return end();
}

inline KFVertexStore::Place KFVertexStore::validBefore(Place place) const noexcept {
    if (_validCount == _size)
        return place == begin() ? end() : previous(place);
    if (place.block < _blocks.size()) {
        std::uint32_t const slot = _blocks[place.block]->valid.before(place.slot);
        if (slot < kBlockCapacity)
            return {place.block, slot};
    }
    for (std::uint32_t index = place.block; index-- > 0;) {
        Block const& block = *_blocks[index];
        if (block.validCount > 0)
            return {index, block.valid.before(kBlockCapacity)};
    }
    return end();
}
