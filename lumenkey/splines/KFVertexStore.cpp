#include "lumenkey/splines/KFVertexStore.h"

#include "lumenkey/splines/KFHandleSet.h"
#include "lumenkey/splines/KFVertex.h"

#include <algorithm>
#include <limits>
#include <numeric>

namespace {

/// Ticks stay within this magnitude, so that the evaluator can multiply them by small factors before it must check.
constexpr std::int64_t kLargestTick = std::int64_t{1} << 62;

std::int64_t tickOf(std::int64_t tick) noexcept { return tick; }
std::int64_t tickOf(KFVertexEntry const& entry) noexcept { return entry.tick; }

/// The first of some ascending ticks that is at or after `tick`, without a branch that depends on the data.
template <class Item>
std::size_t lowerBoundOf(Item const* data, std::size_t count, std::int64_t tick) noexcept {
    std::size_t first = 0;
    while (count > 1) {
        std::size_t const half = count / 2;
        first += tickOf(data[first + half - 1]) < tick ? half : 0;
        count -= half;
    }
    return first + (count == 1 && tickOf(data[first]) < tick ? 1 : 0);
}

/// The same in a block whose first tick, `first`, is before `tick` and behind which the next tick is `next`. Keypoints
/// mostly stand at fairly even distances, so it looks first near where `tick` would stand if they all were equal
/// (Peterson, "Addressing for Random-Access Storage", 1957), and in most blocks touches one or two lines of memory
/// instead of six.
std::size_t lowerBoundInBlock(std::vector<KFVertexEntry> const& entries, std::int64_t tick,
                              std::int64_t first, std::int64_t next) noexcept {
    constexpr std::size_t window = 8;
    constexpr std::size_t worthGuessing = 4 * window;
    KFVertexEntry const* const data = entries.data();
    std::size_t const count = entries.size();
    double const start = static_cast<double>(first);
    double const span = static_cast<double>(next) - start;
    if (count >= worthGuessing && span > 0.0) {
        double const last = static_cast<double>(count - window);
        double const guess = (static_cast<double>(tick) - start) / span * static_cast<double>(count);
        // Whatever the roundings, the comparisons below decide.
        auto const low = static_cast<std::size_t>(std::clamp(guess - 0.5 * window, 1.0, last));
        std::size_t const high = low + window;
        if (data[low - 1].tick < tick && (high == count || data[high].tick >= tick))
            return low + lowerBoundOf(data + low, window, tick);
    }
    return lowerBoundOf(data, count, tick);
}

bool validAtZero(KFVertex const& vertex) { return vertex.isEnabled(kTempusZero); }

} // namespace

KFVertexStore::KFVertexStore() = default;

KFVertexStore::~KFVertexStore() { clear(); }

void KFVertexStore::reserve(std::size_t count) {
    std::size_t const blocks = (count + kBlockCapacity - 1) / kBlockCapacity;
    _blocks.reserve(blocks);
    _firstTicks.reserve(blocks);
}

std::size_t KFVertexStore::bytes() const noexcept {
    std::size_t total = sizeof(*this) + _blocks.capacity() * sizeof(_blocks[0]) +
                        _firstTicks.capacity() * sizeof(std::int64_t);
    for (auto const& block : _blocks) {
        total += sizeof(Block) + block->entries.capacity() * sizeof(KFVertexEntry);
    }
    if (_handles)
        total += _handles->bytes();
    return total;
}

// --- Places ---

std::size_t KFVertexStore::indexOf(Place place) const noexcept {
    std::size_t index = place.slot;
    for (std::uint32_t block = 0; block < place.block; ++block)
        index += _blocks[block]->count();
    return index;
}

// --- Searches ---

KFVertexStore::Place KFVertexStore::lowerBoundTick(std::int64_t tick) const noexcept {
    // Equal positions may run over several blocks: the first of them stands in the last block that starts before them.
    std::size_t const behind = lowerBoundOf(_firstTicks.data(), _firstTicks.size(), tick);
    if (behind == 0)
        return begin();
    Block const& block = *_blocks[behind - 1];
    std::int64_t const next = behind < _firstTicks.size() ? _firstTicks[behind] : block.entries.back().tick;
    std::size_t const slot = lowerBoundInBlock(block.entries, tick, _firstTicks[behind - 1], next);
    if (slot == block.entries.size())
        return {static_cast<std::uint32_t>(behind), 0};
    return {static_cast<std::uint32_t>(behind - 1), static_cast<std::uint32_t>(slot)};
}

namespace {

/// The tick of the smallest multiple of 1/scale at or after `u`, or strictly after it; false when `u` has none.
bool tickBound(Tempus const& u, std::int64_t scale, bool strictly, std::int64_t* tick) noexcept {
    if (!TempusIsNumeric(u) || u.epoch != 0)
        return false;
    TempusDetail::Wide const product = TempusDetail::Wide{u.value} * scale;
    TempusDetail::Wide quotient = product / u.timescale;
    TempusDetail::Wide const remainder = product % u.timescale;
    if (remainder < 0)
        quotient -= 1;
    if (remainder != 0 || strictly)
        quotient += 1;
    if (quotient > std::numeric_limits<std::int64_t>::max())
        return false;
    if (quotient < std::numeric_limits<std::int64_t>::min())
        return false;
    *tick = static_cast<std::int64_t>(quotient);
    return true;
}

} // namespace

KFVertexStore::Place KFVertexStore::lowerBound(Tempus const& u) const noexcept {
    std::int64_t tick = 0;
    if (hasTicks() && tickBound(u, _tickScale, false, &tick))
        return lowerBoundTick(tick);
    return boundByComparison(u, false);
}

KFVertexStore::Place KFVertexStore::upperBound(Tempus const& u) const noexcept {
    std::int64_t tick = 0;
    if (hasTicks() && tickBound(u, _tickScale, true, &tick))
        return lowerBoundTick(tick);
    return boundByComparison(u, true);
}

KFVertexStore::Place KFVertexStore::boundByComparison(Tempus const& u, bool strictly) const noexcept {
    auto const stands = [&](KFVertexEntry const& entry) {
        int const order = TempusCompare(entry.vertex->getValueU(), u);
        return strictly ? order <= 0 : order < 0;
    };
    auto const block = std::partition_point(_blocks.begin(), _blocks.end(), [&](auto const& candidate) {
        return stands(candidate->entries.front());
    });
    if (block == _blocks.begin())
        return begin();
    auto const index = static_cast<std::uint32_t>(block - _blocks.begin());
    auto const& entries = _blocks[index - 1]->entries;
    auto const slot = std::partition_point(entries.begin(), entries.end(), stands);
    if (slot == entries.end())
        return {index, 0};
    return {index - 1, static_cast<std::uint32_t>(slot - entries.begin())};
}

KFVertexStore::Place KFVertexStore::find(KFVertex const* vertex) const noexcept {
    // Who appends one after another also looks for the last, which may share its position with many.
    if (!empty() && back() == vertex)
        return last();
    Tempus const u = vertex->getValueU();
    for (Place place = lowerBound(u); place != end() && TempusCompare(at(place)->getValueU(), u) == 0;
         place = next(place)) {
        if (at(place) == vertex)
            return place;
    }
    // A vertex whose position was written without telling the store doesn't stand where its position says.
    for (std::uint32_t index = 0; index < _blocks.size(); ++index) {
        auto const& entries = _blocks[index]->entries;
        auto const found = std::find_if(entries.begin(), entries.end(),
                                        [&](KFVertexEntry const& entry) { return entry.vertex == vertex; });
        if (found != entries.end())
            return {index, static_cast<std::uint32_t>(found - entries.begin())};
    }
    return end();
}

bool KFVertexStore::contains(void const* handle) const {
    if (handle == nullptr || empty())
        return false;
    if (!_handles) {
        auto handles = std::make_unique<KFHandleSet>();
        handles->reserve(_size);
        for (auto const& block : _blocks) {
            for (KFVertexEntry const& entry : block->entries)
                handles->insert(entry.vertex);
        }
        _handles = std::move(handles);
    }
    return _handles->contains(handle);
}

// --- Valid vertices ---

void KFVertexStore::updateEnds() noexcept {
    Place const first = validFrom(begin());
    _firstValid = first == end() ? nullptr : at(first);
    Place const lastPlace = validBefore(end());
    _lastValid = lastPlace == end() ? nullptr : at(lastPlace);
}

// --- Edits ---

KFVertexStore::Place KFVertexStore::insert(Place place, KFVertex* vertex, bool suppressed) {
    bool const enabled = validAtZero(*vertex);
    if (suppressed && enabled)
        _validityCurrent = false;
    bool const isValid = enabled && !suppressed;

    std::int64_t tick = 0;
    if (hasTicks() && !adoptPosition(vertex->getValueU(), &tick))
        _tickScale = 0;
    if (_handles)
        _handles->reserve(_size + 1);
    place = roomAt(place);
    Block& block = *_blocks[place.block];
    block.insert(place.slot, vertex, tick, isValid);
    if (_handles) // once nothing fails any more
        _handles->insert(vertex);
    _firstTicks[place.block] = block.entries.front().tick;
    _size += 1;
    _validCount += isValid ? 1 : 0;
    _version.advance();
    if (isValid) { // any other leaves the ends, and while many are added looking for these anew takes long
        updateEnds();
    }
    return place;
}

KFVertexStore::Place KFVertexStore::roomAt(Place place) {
    // In front of a block, and at the end, the block before is asked first: appending fills it to the last slot.
    if (place.slot == 0 && place.block > 0 && _blocks[place.block - 1]->count() < kBlockCapacity) {
        return {place.block - 1, _blocks[place.block - 1]->count()};
    }
    if (place.block == _blocks.size() ||
        (place.slot == 0 && _blocks[place.block]->count() == kBlockCapacity)) {
        insertBlock(place.block, Block::kLeastRoom);
        return {place.block, 0};
    }
    if (_blocks[place.block]->count() < kBlockCapacity)
        return place;
    splitBlock(place.block);
    std::uint32_t const kept = _blocks[place.block]->count();
    return place.slot <= kept ? place : Place{place.block + 1, place.slot - kept};
}

void KFVertexStore::insertBlock(std::uint32_t index, std::uint32_t room) {
    auto block = std::make_unique<Block>();
    block->entries.reserve(room); // the caller fills it, since none may stay empty
    // Without memory neither list grows.
    if (_blocks.size() == _blocks.capacity())
        _blocks.reserve(std::max<std::size_t>(2 * _blocks.size(), 1));
    _firstTicks.insert(_firstTicks.begin() + index, 0);
    _blocks.insert(_blocks.begin() + index, std::move(block));
}

void KFVertexStore::splitBlock(std::uint32_t index) {
    constexpr std::uint32_t half = kBlockCapacity / 2;
    insertBlock(index + 1, half);
    Block& low = *_blocks[index];
    Block& high = *_blocks[index + 1];
    high.entries.assign(low.entries.begin() + half, low.entries.end());
    for (std::uint32_t slot = half; slot < kBlockCapacity; ++slot) {
        if (!low.valid.test(slot))
            continue;
        high.setValid(slot - half, true);
        low.setValid(slot, false);
    }
    low.entries.resize(half);
    _firstTicks[index + 1] = high.entries.front().tick;
}

KFVertexStore::Place KFVertexStore::remove(Place place) {
    Block& block = *_blocks[place.block];
    if (_handles)
        _handles->erase(block.entries[place.slot].vertex);
    _validCount -= block.valid.test(place.slot) ? 1 : 0;
    block.remove(place.slot);
    _size -= 1;
    _version.advance();
    if (block.count() == 0) {
        _blocks.erase(_blocks.begin() + place.block);
        _firstTicks.erase(_firstTicks.begin() + place.block);
        place.slot = 0;
    } else {
        _firstTicks[place.block] = block.entries.front().tick;
        mergeWithNext(place);
        if (place.slot == _blocks[place.block]->count())
            place = {place.block + 1, 0};
    }
    if (empty()) {
        _tickScale = 1;
        _validityCurrent = true;
        _handles.reset();
    }
    updateEnds();
    return place;
}

/// Two neighbours that fit into half a block become one, so that many deletions leave no thin blocks.
void KFVertexStore::mergeWithNext(Place const& place) {
    if (place.block + 1 >= _blocks.size())
        return;
    Block& low = *_blocks[place.block];
    Block& high = *_blocks[place.block + 1];
    if (low.count() + high.count() > kBlockCapacity / 2)
        return;
    for (std::uint32_t slot = 0; slot < high.count(); ++slot) {
        low.insert(low.count(), high.entries[slot].vertex, high.entries[slot].tick, high.valid.test(slot));
    }
    _blocks.erase(_blocks.begin() + place.block + 1);
    _firstTicks.erase(_firstTicks.begin() + place.block + 1);
}

void KFVertexStore::clear() {
    _handles.reset();
    while (!_blocks.empty()) {
        auto& entries = _blocks.back()->entries;
        while (!entries.empty()) {
            delete entries.back().vertex;
            entries.pop_back();
        }
        _blocks.pop_back();
    }
    _firstTicks.clear();
    _size = 0;
    _validCount = 0;
    _firstValid = nullptr;
    _lastValid = nullptr;
    _tickScale = 1;
    _validityCurrent = true;
    _version.advance();
}

void KFVertexStore::updateValidity(Place place) {
    Block& block = *_blocks[place.block];
    _validCount -= block.validCount;
    block.setValid(place.slot, validAtZero(*block.entries[place.slot].vertex));
    _validCount += block.validCount;
    _version.advance();
    updateEnds();
}

void KFVertexStore::refresh() {
    _validCount = 0;
    for (auto const& block : _blocks) {
        for (std::uint32_t slot = 0; slot < block->count(); ++slot) {
            block->setValid(slot, validAtZero(*block->entries[slot].vertex));
        }
        _validCount += block->validCount;
    }
    _validityCurrent = true;
    _version.advance();
    updateEnds();
}

void KFVertexStore::rotate(Place place) {
    if (place == begin() || place == end())
        return;
    std::vector<KFVertex*> vertices;
    std::vector<bool> valid;
    vertices.reserve(_size);
    valid.reserve(_size);
    auto const take = [&](Place from, Place to) {
        for (; from != to; from = next(from)) {
            vertices.push_back(at(from));
            valid.push_back(isValid(from));
        }
    };
    take(place, end());
    take(begin(), place);
    std::vector<std::unique_ptr<Block>> blocks;
    for (std::size_t i = 0; i < vertices.size(); ++i) {
        if (i % kBlockCapacity == 0)
            blocks.push_back(std::make_unique<Block>());
        blocks.back()->insert(blocks.back()->count(), vertices[i], 0, valid[i]);
    }
    std::vector<std::int64_t> firstTicks(blocks.size());
    _blocks.swap(blocks);
    _firstTicks.swap(firstTicks);
    updateAllPositions();
    updateEnds();
}

// --- Ticks ---

bool KFVertexStore::tickOf(Tempus const& u, std::int64_t* tick) const noexcept {
    // The caller made sure that the timescale of `u` divides the common one.
    std::int64_t product = 0;
    if (__builtin_mul_overflow(u.value, _tickScale / u.timescale, &product))
        return false;
    if (product > kLargestTick || product < -kLargestTick)
        return false;
    *tick = product;
    return true;
}

bool KFVertexStore::adoptPosition(Tempus const& u, std::int64_t* tick) noexcept {
    if (!TempusIsNumeric(u) || u.epoch != 0)
        return false;
    if (_tickScale % u.timescale != 0 && !adoptTimescale(u.timescale))
        return false;
    return tickOf(u, tick);
}

bool KFVertexStore::adoptTimescale(std::int32_t timescale) noexcept {
    std::int64_t const factor = timescale / std::gcd(_tickScale, std::int64_t{timescale});
    if (_tickScale > kLargestTick / factor)
        return false;
    std::int64_t const limit = kLargestTick / factor;
    for (auto const& block : _blocks) {
        for (KFVertexEntry const& entry : block->entries) {
            if (entry.tick > limit || entry.tick < -limit)
                return false;
        }
    }
    for (auto const& block : _blocks) {
        for (KFVertexEntry& entry : block->entries)
            entry.tick *= factor;
    }
    for (std::int64_t& tick : _firstTicks)
        tick *= factor;
    _tickScale *= factor;
    return true;
}

void KFVertexStore::updatePosition(Place place) {
    Block& block = *_blocks[place.block];
    std::int64_t tick = 0;
    if (hasTicks() && adoptPosition(block.entries[place.slot].vertex->getValueU(), &tick)) {
        block.entries[place.slot].tick = tick;
        _firstTicks[place.block] = block.entries.front().tick;
    } else {
        _tickScale = 0;
    }
    _version.advance();
}

void KFVertexStore::updateAllPositions() {
    _tickScale = 1;
    _version.advance();
    for (auto const& block : _blocks) {
        for (KFVertexEntry const& entry : block->entries) {
            Tempus const u = entry.vertex->getValueU();
            bool const fits = TempusIsNumeric(u) && u.epoch == 0;
            if (!fits || (_tickScale % u.timescale != 0 && !widenScale(u.timescale))) {
                _tickScale = 0;
                return;
            }
        }
    }
    for (std::size_t index = 0; index < _blocks.size(); ++index) {
        Block& block = *_blocks[index];
        for (KFVertexEntry& entry : block.entries) {
            if (!tickOf(entry.vertex->getValueU(), &entry.tick)) {
                _tickScale = 0;
                return;
            }
        }
        _firstTicks[index] = block.entries.front().tick;
    }
    updateEnds();
}

bool KFVertexStore::widenScale(std::int32_t timescale) noexcept {
    std::int64_t const factor = timescale / std::gcd(_tickScale, std::int64_t{timescale});
    if (_tickScale > kLargestTick / factor)
        return false;
    _tickScale *= factor;
    return true;
}
