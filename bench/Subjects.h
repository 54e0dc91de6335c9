#pragma once

#include "bench/Contest.h"
#include "bench/Curves.h"

#include <cstddef>
#include <cstdint>
#include <functional>
#include <memory>
#include <string>
#include <vector>

#include <benchmark/benchmark.h>

inline constexpr std::size_t kSizes[] = {10, 1000, 100000};

inline std::string withSize(std::string const& name, std::size_t size) {
    return name + "/" + std::to_string(size);
}

/// A function without arguments that works through all positions and sums what `read(i)` gives.
template <class Read> std::function<void()> readAll(std::size_t count, Read read) {
    return [count, read]() mutable {
        double sum = 0.0;
        for (std::size_t i = 0; i < count; ++i)
            sum += read(i);
        benchmark::DoNotOptimize(sum);
    };
}

/// One of our splines and the positions at which it is read, by single reads under the lock.
struct PointReads {
    PointReads(std::vector<Key> const& keys, std::uint32_t interpolation, Queries const& queriesIn)
        : spline(std::make_shared<BenchSpline>(keys, interpolation)),
          queries(std::make_shared<Queries>(queriesIn)) {}

    double operator()(std::size_t i) {
        return (*spline)->getVertexValue(queries->times[i], kTempusZero, true);
    }
    std::function<void()> pass() const {
        return [kept = *this] {
            KFSpline& reader = **kept.spline;
            double sum = 0.0;
            for (Tempus const& time : kept.queries->times)
                sum += reader.getVertexValue(time, kTempusZero, true);
            benchmark::DoNotOptimize(sum);
        };
    }

    std::shared_ptr<BenchSpline> spline;
    std::shared_ptr<Queries const> queries;
};

/// One of our splines, read as a row at the positions of `evenly`.
struct RowReads {
    RowReads(std::vector<Key> const& keys, std::uint32_t interpolation, std::int32_t perSecond)
        : spline(std::make_shared<BenchSpline>(keys, interpolation)), step(TempusMake(1, perSecond)),
          values(std::make_shared<std::vector<double>>(evenly(keys, perSecond).size())) {}

    void operator()() {
        auto count = static_cast<std::uint32_t>(values->size());
        (*spline)->sampleSpline(step, step, count, nullptr, values->data(), kTempusZero, false);
        benchmark::ClobberMemory();
    }

    std::shared_ptr<BenchSpline> spline;
    Tempus step;
    std::shared_ptr<std::vector<double>> values;
};
