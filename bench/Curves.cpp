#include "bench/Curves.h"

#include <algorithm>
#include <random>

std::vector<Key> makeKeys(std::size_t count) {
    std::mt19937_64 random(1);
    std::uniform_int_distribution<std::int64_t> length(7500, 12500);
    std::uniform_real_distribution<double> value(0.1, 0.9);
    std::uniform_real_distribution<double> reach(0.15, 0.5);
    std::uniform_real_distribution<double> rise(-0.1, 0.1);

    std::vector<Key> keys(count);
    for (std::size_t i = 0; i < count; ++i) {
        keys[i].value = value(random);
        if (i == 0)
            continue;
        keys[i].ticks = keys[i - 1].ticks + length(random);
        double const seconds = keys[i].seconds() - keys[i - 1].seconds();
        keys[i - 1].out = {reach(random) * seconds, rise(random)};
        keys[i].in = {-reach(random) * seconds, rise(random)};
    }
    return keys;
}

BenchSpline::BenchSpline(std::uint32_t interpolation, bool deriveTangents)
    : _state(false, false, deriveTangents, true, interpolation, kKFExtrapolationConstant,
             kKFExtrapolationConstant, false),
      _spline(&_state) {}

BenchSpline::BenchSpline(std::vector<Key> const& keys, std::uint32_t interpolation)
    : BenchSpline(interpolation, false) {
    _spline.reserveMemoryForKeypoints(static_cast<int>(keys.size()));
    for (Key const& key : keys) {
        void* const handle = _spline.appendVertexNoTangents(key.time(), key.value, kTempusZero);
        _spline.setVertexInterpolation(handle, interpolation);
        _spline.setVertexInputHandles(handle, key.in.u, key.in.v, kTempusZero, true);
        _spline.setVertexOutputHandles(handle, key.out.u, key.out.v, kTempusZero, true);
    }
}

void Queries::add(Tempus const& time) {
    times.push_back(time);
    seconds.push_back(TempusGetSeconds(time));
}

Queries Queries::fromTheMiddle() const {
    Queries result = *this;
    auto const middle = static_cast<std::ptrdiff_t>(size() / 2);
    std::rotate(result.times.begin(), result.times.begin() + middle, result.times.end());
    std::rotate(result.seconds.begin(), result.seconds.begin() + middle, result.seconds.end());
    return result;
}

Queries evenly(std::vector<Key> const& keys, std::int32_t perSecond) {
    Queries queries;
    for (std::int64_t i = 1; TempusMake(i, perSecond) < keys.back().time(); ++i)
        queries.add(TempusMake(i, perSecond));
    return queries;
}

Queries everyFrame(std::vector<Key> const& keys) { return evenly(keys, kFrames); }

Queries atRandom(std::vector<Key> const& keys) {
    std::mt19937_64 random(2);
    std::uniform_int_distribution<std::int64_t> ticks(0, keys.back().ticks - 1);
    int const count = keys.size() > 10000 ? 100000 : 10000;
    Queries queries;
    for (int i = 0; i < count; ++i)
        queries.add(TempusMake(ticks(random), kTimescale));
    return queries;
}
