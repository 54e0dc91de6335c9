#pragma once

#include "lumenkey/foundation/Tempus.h"
#include "lumenkey/splines/KFInterpolation.h"
#include "lumenkey/splines/KFSpline.h"
#include "lumenkey/splines/KFSplineState.h"

#include <cstddef>
#include <cstdint>
#include <vector>

/// The timescale of all keys.
inline constexpr std::int32_t kTimescale = 24000;
/// At this rate a segment lasts about ten frames: curves that are played back.
inline constexpr std::int32_t kFrames = 24;
/// About a hundred samples a segment: curves that are drawn, or control sound.
inline constexpr std::int32_t kDense = 240;

/// A handle relative to its key: seconds, and units of the value.
struct Handle {
    double u = 0.0;
    double v = 0.0;
};

struct Key {
    std::int64_t ticks = 0;
    /// Within 0 to 1, which every peer takes.
    double value = 0.0;
    Handle in, out;

    Tempus time() const noexcept { return TempusMake(ticks, kTimescale); }
    double seconds() const noexcept { return TempusGetSeconds(time()); }
};

/// The same keys at every call: segments of 7,500 to 12,500 ticks, handles that reach over 0.15 to 0.5 of
/// them.
std::vector<Key> makeKeys(std::size_t count);

/// A spline with a state of its own, which derives tangents while keys are edited only if told.
class BenchSpline {
public:
    explicit BenchSpline(std::uint32_t interpolation, bool deriveTangents = true);
    BenchSpline(std::vector<Key> const& keys, std::uint32_t interpolation);

    KFSpline* operator->() noexcept { return &_spline; }
    KFSpline& operator*() noexcept { return _spline; }

private:
    KFSplineState _state;
    KFSpline _spline;
};

/// Where a curve is read: the same positions for us and, as seconds, for who works in doubles.
struct Queries {
    std::vector<Tempus> times;
    std::vector<double> seconds;

    std::size_t size() const noexcept { return times.size(); }
    void add(Tempus const& time);
    /// The same positions, beginning in the middle.
    Queries fromTheMiddle() const;
};

/// `perSecond` positions a second between the first and the last key, beginning with the first after that.
Queries evenly(std::vector<Key> const& keys, std::int32_t perSecond);
Queries everyFrame(std::vector<Key> const& keys);
/// Positions at random between the first and the last key: 10,000, which no branch prediction learns by
/// heart, and for large curves 100,000.
Queries atRandom(std::vector<Key> const& keys);
