// Internal: not installed.
#pragma once

#include "lumenkey/splines/KFSegmentCache.h"
#include "lumenkey/splines/KFStoreVersion.h"

#include <cstdint>

/// A place for one segment in the table of a thread.
struct alignas(64) KFSegmentPlace {
    KFSegmentCache segment;
    /// The run of versions of the spline whose place it is, and of the one that missed it last.
    std::uint64_t owner = 0;
    std::uint64_t contender = 0;

    /// The segment, for the spline with that version to move; null while the place is another's.
    KFSegmentCache* claim(std::uint64_t version) noexcept {
        std::uint64_t const run = KFStoreVersion::runOf(version);
        if (owner != run) {
            bool const again = contender == run;
            contender = run;
            if (!again)
                return nullptr;
            owner = run;
            segment.forget();
        }
        return &segment;
    }
};

/// The segments that a thread prepared last, one for each of the few splines that it reads most: by them it reads on
/// without a lock, and without writing anything that another thread reads.
///
/// A kept segment holds copies of all numbers that its values are made of. It was prepared under the spline's lock, and
/// it stands as long as three things are what they were then, each read atomically:
///
/// - the version of the spline's store (`KFStoreVersion`), which changes under the lock with the set, order, positions
///   or validity of the vertices, and which no other spline ever has, not even one made at the same address;
/// - `KFStaticVertex::getWatchedChanges`, which changes when a vertex changes that any kept segment was prepared from:
///   hosts write attributes of vertices without the spline's lock. A vertex is watched from then on (`watch`);
/// - the settings and the owner's interpolator, which the spline asks anyway (`segmentStands`).
///
/// The vertices themselves aren't looked at: without the lock they may be gone. A read takes effect where it reads the
/// version: an edit that was over before is seen, and one that is under way changes the version, or a watched vertex,
/// before its lock is given back; who finds that waits for the lock. Where any of the three differs the read goes the
/// way under the lock, which finds most segments still good by the revisions of their vertices.
///
/// A spline that an owner's custom lock guards is read under that lock always, since the lock may hold several splines
/// still together. Vertices that aren't static ones have no segments.
///
/// A thread's places are a fixed table, of zeroed or constant memory that nothing constructs or destroys. A spline's
/// version tells its place. Of two splines that have the same one, the later gets it by missing it twice in a row, so
/// that many splines read in turn leave it alone and use what each spline keeps under its own lock.
class KFThreadSegments {
public:
    /// The calling thread's place for the spline with that version. It is the thread's own.
    static KFSegmentPlace& placeOf(std::uint64_t version) noexcept {
        KFSegmentPlace* place = &_places[KFStoreVersion::runOf(version) % kPlaces];
#if defined(__GNUC__)
        // Else the compiler asks for the thread's address again at each use.
        asm("" : "+r"(place));
#endif
        return *place;
    }

private:
    static constexpr std::uint64_t kPlaces = 16;

    static constinit thread_local KFSegmentPlace _places[kPlaces];
};
