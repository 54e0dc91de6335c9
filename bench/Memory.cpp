// What a static vertex costs in memory, all told: the vertex itself and its share of the store.

#include "bench/Benchmarks.h"
#include "bench/CountedMemory.h"
#include "bench/Subjects.h"

#include <algorithm>
#include <memory>
#include <random>
#include <utility>

namespace {

void loadAtOnce(KFSpline& spline, std::vector<Key> const& keys) {
    std::vector<Tempus> times;
    std::vector<double> values;
    for (Key const& key : keys) {
        times.push_back(key.time());
        values.push_back(key.value);
    }
    spline.reserveMemoryForKeypoints(static_cast<int>(keys.size()));
    spline.appendVertexesNoTangents(static_cast<unsigned>(keys.size()), times.data(), values.data(),
                                    kTempusZero);
}

void addAscending(KFSpline& spline, std::vector<Key> const& keys) {
    for (Key const& key : keys)
        spline.addVertex(key.time(), key.value, kTempusZero, false);
}

void addAtRandom(KFSpline& spline, std::vector<Key> const& keys) {
    auto shuffled = keys;
    std::shuffle(shuffled.begin(), shuffled.end(), std::mt19937_64(3));
    addAscending(spline, shuffled);
}

using Fill = void (*)(KFSpline&, std::vector<Key> const&);

double bytesPerVertex(Fill fill, std::size_t size) {
    BenchSpline spline(kKFInterpolationBezier);
    fill(*spline, makeKeys(size));
    std::size_t bytes = spline->getStoreBytes();
    for (auto place = spline->beginVertices(); place != spline->endVertices();
         place = spline->nextPlace(place)) {
        bytes += CountedMemory::objectBytes(spline->vertexAt(place));
    }
    return static_cast<double>(bytes) / static_cast<double>(size);
}

/// What the heap itself says, the spline and the heap's bookkeeping included.
double heapBytesPerVertex(Fill fill, std::size_t size) {
    auto const keys = makeKeys(size);
    // Small splines by the hundred: the heap counts the few freed pieces that it keeps at hand as in use.
    std::size_t const count = std::max<std::size_t>(1, 10000 / size);
    std::vector<std::unique_ptr<BenchSpline>> splines(count);
    std::size_t const before = CountedMemory::heapBytes();
    for (auto& spline : splines) {
        spline = std::make_unique<BenchSpline>(kKFInterpolationBezier);
        fill(**spline, keys);
    }
    return static_cast<double>(CountedMemory::heapBytes() - before) / static_cast<double>(count * size);
}

} // namespace

void registerMemory(Bench& bench) {
    for (auto const& [name, fill] : {std::pair<char const*, Fill>{"loaded at once", loadAtOnce},
                                     std::pair<char const*, Fill>{"added ascending", addAscending},
                                     std::pair<char const*, Fill>{"added at random", addAtRandom}}) {
        for (std::size_t const size : kSizes) {
            ContestEntry entry{withSize(std::string("bytes per vertex/") + name, size),
                               "the heap's own figure", Bound::atMost(128.0), [size, with = fill] {
                                   return Contest{[=] { return bytesPerVertex(with, size); },
                                                  [=] { return heapBytesPerVertex(with, size); }};
                               }};
            entry.unit = "B";
            entry.ratio = [](double subject, double) { return subject; };
            entry.repeats = false;
            registerContest(bench, std::move(entry));
        }
    }
}
