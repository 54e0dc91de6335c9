// Adding and deleting keys one by one: what a key costs in a large spline over what it costs in a small one.

#include "bench/Benchmarks.h"
#include "bench/Subjects.h"

#include <algorithm>
#include <chrono>
#include <random>
#include <utility>

namespace {

constexpr std::size_t kSmall = 1000;
constexpr std::size_t kLarge = 100000;

enum class Order { Ascending, Descending, Random };
enum class End { First, Last };

std::vector<Key> keysIn(Order order, std::size_t size) {
    auto keys = makeKeys(size);
    if (order == Order::Descending)
        std::reverse(keys.begin(), keys.end());
    if (order == Order::Random)
        std::shuffle(keys.begin(), keys.end(), std::mt19937_64(3));
    return keys;
}

template <class Work> double nanoseconds(Work work) {
    auto const start = std::chrono::steady_clock::now();
    work();
    std::chrono::duration<double, std::nano> const elapsed = std::chrono::steady_clock::now() - start;
    return elapsed.count();
}

/// The mean over as many splines as make up a large one; making and destroying them isn't counted.
template <class Round> Measurement perKey(std::size_t size, Round round) {
    return [size, round] {
        std::size_t const rounds = kLarge / size;
        double total = 0.0;
        for (std::size_t i = 0; i < rounds; ++i)
            total += round();
        return total / static_cast<double>(rounds * size);
    };
}

template <class Add> Measurement adding(Order order, std::size_t size, Add add) {
    return perKey(size, [keys = keysIn(order, size), add] {
        BenchSpline spline(kKFInterpolationBezier);
        return nanoseconds([&] {
            for (Key const& key : keys)
                add(*spline, key);
        });
    });
}

Measurement deleting(End end, std::size_t size) {
    return perKey(size, [keys = makeKeys(size), end] {
        BenchSpline spline(keys, kKFInterpolationBezier);
        spline->getState()->deriveTangents = true;
        return nanoseconds([&] {
            for (std::size_t i = 0; i < keys.size(); ++i) {
                void* const handle = end == End::First ? spline->getFirstVertex() : spline->getLastVertex();
                spline->deleteVertex(handle, true, kTempusZero);
            }
        });
    });
}

void addWithTangents(KFSpline& spline, Key const& key) {
    spline.addVertex(key.time(), key.value, kTempusZero, false);
}

void addWithoutTangents(KFSpline& spline, Key const& key) {
    spline.addVertexNoTangents(key.time(), key.value, kTempusZero, false);
}

void registerGrowth(Bench& bench, std::string const& name, std::function<Measurement(std::size_t)> measure) {
    registerContest(bench, {name + "/100000", "a key of 1000", Bound::atMost(4.0), [measure] {
                                return Contest{measure(kLarge), measure(kSmall)};
                            }});
}

} // namespace

void registerEditing(Bench& bench) {
    for (auto const& [name, order] :
         {std::pair{"ascending", Order::Ascending}, std::pair{"descending", Order::Descending},
          std::pair{"random", Order::Random}}) {
        registerGrowth(bench, std::string("add/") + name, [inOrder = order](std::size_t size) {
            return adding(inOrder, size, addWithTangents);
        });
        registerGrowth(
            bench, std::string("add without tangents/") + name,
            [inOrder = order](std::size_t size) { return adding(inOrder, size, addWithoutTangents); });
    }
    registerGrowth(bench, "delete/first", [](std::size_t size) { return deleting(End::First, size); });
    registerGrowth(bench, "delete/last", [](std::size_t size) { return deleting(End::Last, size); });
}
