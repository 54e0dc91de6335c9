// Internal: not installed.
#pragma once

#include "lumenkey/splines/KFSegmentCache.h"
#include "lumenkey/splines/KFStoreVersion.h"

#include <cstddef>
#include <cstdint>

/// A place for one spline in the table of a thread: all segments of a spline with few vertices, that of the last read
/// of another.
class alignas(64) KFSegmentPlace {
public:
    /// So many segments are kept at most.
    static constexpr std::uint32_t kMost = 12;

    KFSegmentPlace() noexcept = default;
    KFSegmentPlace(KFSegmentPlace const&) = delete;
    KFSegmentPlace& operator=(KFSegmentPlace const&) = delete;

    /// The segment that was read last. It may be another spline's, or none.
    KFSegmentCache const& current() const noexcept { return *_current; }
    /// Whether it keeps several segments of the spline with that version.
    bool keepsSeveral(std::uint64_t version) const noexcept {
        return _used > 1 && _owner == KFStoreVersion::runOf(version);
    }

    /// The kept segment of that version that seems to hold `u`, at `position` by the scale of the current segment: ask
    /// it again by its own. The current one where there is none.
    KFSegmentCache const& around(Tempus const& u, std::int64_t position, std::uint64_t version) noexcept {
        // No branch depends on what is found: at positions in any order none would be foreseen.
        KFSegmentCache* found = _current;
        for (std::uint32_t i = 0; i < _used; ++i) {
            KFSegmentCache& segment = _segments[i];
            unsigned const fits = static_cast<unsigned>(segment.version == version) &
                                  static_cast<unsigned>(segment.scale.timescale == u.timescale) &
                                  static_cast<unsigned>(segment.low < position) &
                                  static_cast<unsigned>(position < segment.high);
            found = fits != 0 ? &segment : found;
        }
        _current = found;
        return *found;
    }

    /// Whether it keeps all segments of a spline with so many vertices.
    static bool keepsAll(std::size_t vertexCount) noexcept { return vertexCount <= kMost + 1; }

    /// The one segment for the spline with that version, to prepare for another position. Null while the place is
    /// another spline's.
    KFSegmentCache* claim(std::uint64_t version) noexcept {
        if (!own(KFStoreVersion::runOf(version)))
            return nullptr;
        _current = _segments;
        _next = 0;
        _used = 1;
        return _current;
    }

    /// The same of a spline all of whose segments are kept: the one that holds `u`, else the one prepared longest ago.
    /// Tell `keep` afterwards.
    KFSegmentCache* claimFor(Tempus const& u, std::uint64_t version) noexcept {
        if (!own(KFStoreVersion::runOf(version)))
            return nullptr;
        std::int64_t position = 0;
        if (current().scale.stepsOf(u, &position) && holds(around(u, position, version), u))
            return _current;
        return &_segments[_next];
    }

    /// What `claimFor` gave is the current segment, if it is around `u`; at the position of a vertex none is.
    void keep(KFSegmentCache& claimed, Tempus const& u) noexcept {
        if (!holds(claimed, u))
            return;
        _current = &claimed;
        auto const index = static_cast<std::uint32_t>(_current - _segments);
        if (index == _next)
            _next = _next + 1 < kMost ? _next + 1 : 0;
        _used = _used > index ? _used : index + 1;
    }

private:
    static bool holds(KFSegmentCache const& segment, Tempus const& u) noexcept {
        std::int64_t position = 0;
        return segment.scale.stepsOf(u, &position) && segment.holds(position);
    }

    /// Whether the place is that of a run of versions, or becomes so by missing it again.
    bool own(std::uint64_t run) noexcept {
        if (_owner == run)
            return true;
        bool const again = _contender == run;
        _contender = run;
        if (!again)
            return false;
        _owner = run;
        for (std::uint32_t i = 0; i < _used; ++i)
            _segments[i].forget();
        _current = _segments;
        _next = _used = 0;
        return true;
    }

    KFSegmentCache* _current = _segments;
    /// The one to be prepared when another is needed.
    std::uint32_t _next = 0;
    /// Those behind aren't looked at.
    std::uint32_t _used = 0;
    /// The run of versions of the spline whose place it is, and of the one that missed it last.
    std::uint64_t _owner = 0;
    std::uint64_t _contender = 0;
    KFSegmentCache _segments[kMost];
};

/// The segments that a thread prepared last, of the few splines that it reads most: by them it reads on without a
/// lock, and without writing anything that another thread reads.
///
/// A kept segment holds copies of all numbers that its values are made of. Who prepared it held the spline's lock or
/// knew that nobody edits, and it stands as long as three things are what they were then, each read atomically:
///
/// - the version of the spline's store (`KFStoreVersion`), which changes under the lock with the set, order, positions
///   or validity of the vertices, and which no other spline ever has, not even one made at the same address;
/// - `KFStaticVertex::getWatchedChanges`, which changes when a vertex changes that any kept segment was prepared from:
///   hosts write attributes of vertices without the spline's lock. A vertex is watched from then on (`watch`);
/// - the settings and the owner's interpolator, which the spline asks anyway (`segmentStandsWithoutLock`).
///
/// The vertices themselves aren't looked at: without the lock they may be gone. A read takes effect where it reads the
/// version: an edit that was over before is seen, and one that is under way changes the version, or a watched vertex,
/// before its lock is given back; who finds that waits for the lock. Where any of the three differs the read goes the
/// way under the lock, which finds most segments still good by the revisions of their vertices.
///
/// A spline that an owner's custom lock guards is read under that lock always, since the lock may hold several splines
/// still together. Vertices that aren't static ones have no segments.
///
/// A thread's places are a table of 70 KiB that it allocates when it first reads a spline and frees at its end. Without
/// one, for want of memory or because the thread is ending, it reads under the locks. A spline's version tells its
/// place. Of two splines that have the same one, the later gets it by missing it twice in a row, so that many splines
/// read in turn leave it alone and use what each spline keeps under its own lock.
class KFThreadSegments {
public:
    /// The calling thread's place for the spline with that version; null before `makePlaceOf`. It is the thread's own.
    static KFSegmentPlace* placeOf(std::uint64_t version) noexcept { return placeIn(_places, version); }
    /// The same for a thread that has none yet. Null where it can't have one.
    static KFSegmentPlace* makePlaceOf(std::uint64_t version) noexcept {
        return placeIn(makePlaces(), version);
    }

private:
    struct Keeper;

    static KFSegmentPlace* placeIn(KFSegmentPlace* places, std::uint64_t version) noexcept {
        return places == nullptr ? nullptr : places + KFStoreVersion::runOf(version) % kPlaces;
    }
    static KFSegmentPlace* makePlaces() noexcept;

    static constexpr std::uint64_t kPlaces = 16;

    // No object of a class, which each read would have to ask whether it is there.
    static constinit thread_local KFSegmentPlace* _places;
    static constinit thread_local bool _isEnding;
};
