// Takes: what a recorded point, and reading a take back, cost at a million points over what they cost at a
// thousand.

#include "bench/Benchmarks.h"
#include "bench/Contest.h"

#include "lumenkey/curves/KFTypedCurves.h"

#include <benchmark/benchmark.h>
#include <limits>
#include <malloc.h>
#include <memory>
#include <vector>

namespace {

constexpr std::int64_t kSmall = 1000;
constexpr std::int64_t kLarge = 1'000'000;
/// Points that are recorded, or read, at once.
constexpr std::int64_t kPass = 500;

Tempus frame(std::int64_t i) { return TempusMake(i, 120); }

/// A take with guards, of so many points.
struct Take {
    KFCurveDouble curve{0.0};

    explicit Take(std::int64_t points) {
        curve.setIsSpline(true, kTempusZero);
        curve.setKeypoint(kTempusZero, 0.0, true);
        curve.setKeypoint(frame(2 * kLarge), 1.0, true);
        curve.beginPlayback(frame(1), kKFRecordingScopeTouch, 0, frame(1));
        curve.beginRecording(frame(1));
        record(2, points);
    }
    void record(std::int64_t from, std::int64_t count) {
        for (std::int64_t i = from; i < from + count; ++i)
            curve.setKeypoint(frame(i), static_cast<double>(i % 97), false);
    }
};

/// The heap keeps what is freed while it lives: else only the large take would pay for pages that are new
/// from the system.
class KeptHeap {
public:
    KeptHeap() { mallopt(M_TRIM_THRESHOLD, std::numeric_limits<int>::max()); }
    ~KeptHeap() { mallopt(M_TRIM_THRESHOLD, kUsual); }
    KeptHeap(KeptHeap const&) = delete;
    KeptHeap& operator=(KeptHeap const&) = delete;

private:
    static constexpr int kUsual = 128 * 1024;
};

/// From a thousand points on each pass has a take of its own.
Measurement recording(Bench const& bench, std::int64_t points) {
    return [points, passes = bench.repetitions > 5 ? 20 : 5] {
        std::chrono::duration<double, std::nano> total{};
        KeptHeap const keptHeap;
        std::vector<std::unique_ptr<Take>> takes;
        for (int pass = 0; pass < passes; ++pass) {
            if (takes.empty() || points == kSmall)
                takes.push_back(std::make_unique<Take>(points));
            std::int64_t const from = points + 2 + (points == kLarge ? pass * kPass : 0);
            auto const start = std::chrono::steady_clock::now();
            takes.back()->record(from, kPass);
            total += std::chrono::steady_clock::now() - start;
        }
        return total.count() / static_cast<double>(passes * kPass);
    };
}

Measurement playingBack(Bench const& bench, std::int64_t points) {
    auto const take = std::make_shared<Take>(points);
    return timePerItem(bench, kPass, [take, points] {
        Tempus const half = TempusMake(1, 240);
        for (std::int64_t i = 0; i < kPass; ++i)
            benchmark::DoNotOptimize(take->curve.getValue(frame(points / 2 + i) + half, 0.0));
    });
}

} // namespace

void registerRecording(Bench& bench) {
    registerContest(bench,
                    {"record a point/1000000", "a point in a take of 1000", Bound::atMost(1.2), [&bench] {
                         return Contest{recording(bench, kLarge), recording(bench, kSmall)};
                     }});
    registerContest(bench,
                    {"play back a take/1000000", "a value of a take of 1000", Bound::atMost(3.0), [&bench] {
                         return Contest{playingBack(bench, kLarge), playingBack(bench, kSmall)};
                     }});
}
