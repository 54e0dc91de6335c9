// Internal: not installed.
#pragma once

#include "lumenkey/foundation/Tempus.h"
#include "lumenkey/splines/KFSegmentCache.h"

#include <cstdint>

class KFSpline;

/// A row of values at `start + step * (first + i)`, each to the bit what `getVertexValue` of the spline gives there.
///
/// Within a segment the samples are computed as a run, without a search, a check or a call for each: in vector units
/// where the machine has them, by the same operations in the same order. What the spline's index doesn't draw is read
/// point by point.
///
/// Threads: whoever makes one holds the spline's lock, or knows that no other thread edits, until it is done.
class KFSplineSampler {
public:
    KFSplineSampler(KFSpline& spline, Tempus const& start, Tempus const& step, std::uint32_t count,
                    Tempus const& t, std::uint32_t first = 0);

    /// Room for `count` values.
    void values(double* out);
    /// The position of sample `i`.
    Tempus position(std::uint32_t i) const noexcept {
        return BX_TempusSaferAdd(_start, _step * (_first + i));
    }

private:
    bool prepareRow() noexcept;
    std::uint32_t runLength(std::int64_t position, std::uint32_t left) const noexcept;
    void run(std::int64_t position, std::uint32_t count, double* out) const noexcept;

    KFSpline& _spline;
    Tempus const _start;
    Tempus const _step;
    Tempus const _t;
    std::uint32_t const _first;
    std::uint32_t const _count;
    std::int64_t _origin = 0;
    std::int64_t _stride = 0;
    KFSegmentCache _segment;
};
