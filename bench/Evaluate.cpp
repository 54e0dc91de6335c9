// Evaluation of one spline on one thread.

#include "bench/Benchmarks.h"
#include "bench/CountedMemory.h"
#include "bench/Limits.h"
#include "bench/Subjects.h"

#include <algorithm>
#include <utility>

namespace {

constexpr double kTolerance = 1e-9;

Contest ascendingBezier(Bench const& bench, std::size_t size) {
    auto const keys = makeKeys(size);
    PointReads ours(keys, kKFInterpolationBezier, everyFrame(keys));
    auto const read = [arrays = CubicArrays(keys), queries = ours.queries](std::size_t i) mutable {
        return arrays.ascending(queries->seconds[i]);
    };
    auto other = read;
    for (std::size_t i = 0; i < ours.queries->size(); ++i) {
        requireAgreement("Bezier, ascending", ours(i), other(i), kTolerance);
    }
    return {timePerItem(bench, ours.queries->size(), ours.pass()),
            timePerItem(bench, ours.queries->size(), readAll(ours.queries->size(), read))};
}

Contest randomBezier(Bench const& bench, std::size_t size) {
    auto const keys = makeKeys(size);
    PointReads ours(keys, kKFInterpolationBezier, atRandom(keys));
    auto const read = [arrays = CubicArrays(keys), queries = ours.queries](std::size_t i) mutable {
        return arrays.anywhere(queries->seconds[i]);
    };
    auto other = read;
    for (std::size_t i = 0; i < ours.queries->size(); ++i) {
        requireAgreement("Bezier, random", ours(i), other(i), kTolerance);
    }
    return {timePerItem(bench, ours.queries->size(), ours.pass()),
            timePerItem(bench, ours.queries->size(), readAll(ours.queries->size(), read))};
}

Contest rowOfBezier(Bench const& bench, std::size_t size, std::int32_t perSecond) {
    auto const keys = makeKeys(size);
    auto const queries = std::make_shared<Queries>(evenly(keys, perSecond));
    RowReads ours(keys, kKFInterpolationBezier, perSecond);
    auto const values = std::make_shared<std::vector<double>>(queries->size());
    auto const fill = [arrays = CubicArrays(keys), queries, values]() mutable {
        for (std::size_t i = 0; i < queries->size(); ++i)
            (*values)[i] = arrays.ascending(queries->seconds[i]);
        benchmark::ClobberMemory();
    };
    ours();
    auto other = fill;
    other();
    for (std::size_t i = 0; i < queries->size(); ++i) {
        requireAgreement("Bezier, row", (*ours.values)[i], (*values)[i], kTolerance);
    }
    return {timePerItem(bench, queries->size(), ours), timePerItem(bench, queries->size(), fill)};
}

Contest besideLookup(Bench const& bench, std::size_t size, std::uint32_t interpolation) {
    auto const keys = makeKeys(size);
    PointReads ours(keys, interpolation, everyFrame(keys));
    SegmentLookup const lookup(keys, *ours.queries);
    return {timePerItem(bench, lookup.size(), ours.pass()),
            timePerItem(bench, lookup.size(), readAll(lookup.size(), lookup))};
}

/// Counts while a Bezier and an Ease curve are read at ascending and at random times and as rows.
Contest allocationsOfReading(std::size_t size) {
    auto const count = [size] {
        auto const keys = makeKeys(size);
        std::uint64_t total = 0;
        for (std::uint32_t const type :
             {kKFInterpolationBezier, kKFInterpolationEase, kKFInterpolationCatmullRom}) {
            auto const ascending = PointReads(keys, type, everyFrame(keys)).pass();
            auto const random = PointReads(keys, type, atRandom(keys)).pass();
            RowReads row(keys, type, kFrames);
            std::uint64_t const before = CountedMemory::calls();
            ascending();
            random();
            row();
            total += CountedMemory::calls() - before;
        }
        return static_cast<double>(total);
    };
    // An instrument that counts nothing would find nothing: adding a key must allocate.
    auto const instrument = [] {
        BenchSpline spline(kKFInterpolationBezier);
        std::uint64_t const before = CountedMemory::calls();
        spline->addVertex(kTempusZero, 0.0, kTempusZero, false);
        double const calls = static_cast<double>(CountedMemory::calls() - before);
        requireAgreement("allocations of one added key, at least 1", std::min(calls, 1.0), 1.0, 0.0);
        return calls;
    };
    return {count, instrument};
}

} // namespace

void registerEvaluation(Bench& bench) {
    for (std::size_t const size : kSizes) {
        registerContest(bench, {withSize("evaluate/Bezier/ascending", size), "arrays, cached segment",
                                Bound::atMost(1.5), [&bench, size] { return ascendingBezier(bench, size); }});
    }
    for (std::size_t const size : kSizes) {
        registerContest(bench, {withSize("evaluate/Bezier/random", size), "arrays, binary search",
                                Bound::atMost(1.5), [&bench, size] { return randomBezier(bench, size); }});
    }
    for (std::size_t const size : kSizes) {
        registerContest(bench, {withSize("row/Bezier", size), "arrays, cached segment", Bound::atMost(1.2),
                                [&bench, size] { return rowOfBezier(bench, size, kFrames); }});
    }
    registerContest(bench, {"dense row/Bezier/1000", "arrays, cached segment", Bound::atMost(1.2),
                            [&bench] { return rowOfBezier(bench, 1000, kDense); }});
    for (auto const& [name, type] :
         {std::pair{"Linear", kKFInterpolationLinear}, std::pair{"Constant", kKFInterpolationConstant}}) {
        for (std::size_t const size : kSizes) {
            ContestEntry entry{
                withSize(std::string("evaluate/") + name + "/ascending", size),
                "look-up; ratio: (ours - it) / 10 ns", Bound::atMost(1.0),
                [&bench, size, interpolation = type] { return besideLookup(bench, size, interpolation); }};
            entry.ratio = [](double subject, double limit) { return (subject - limit) / 10.0; };
            registerContest(bench, std::move(entry));
        }
    }
    for (std::size_t const size : kSizes) {
        ContestEntry entry{withSize("allocations/reading", size), "one added key", Bound::atMost(0.0),
                           [size] { return allocationsOfReading(size); }};
        entry.unit = "calls";
        entry.ratio = [](double subject, double) { return subject; };
        entry.repeats = false;
        registerContest(bench, std::move(entry));
    }
}
