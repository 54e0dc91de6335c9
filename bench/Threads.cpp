// Two threads that evaluate, beside one.

#include "bench/Benchmarks.h"
#include "bench/Limits.h"
#include "bench/Subjects.h"

#include <array>
#include <atomic>
#include <chrono>
#include <fstream>
#include <memory>
#include <mutex>
#include <thread>

namespace {

using Clock = std::chrono::steady_clock;
using Passes = std::vector<std::function<void()>>;

constexpr std::size_t kSize = 1000;

/// Items in a microsecond that all threads together get done in a while, each repeating its own pass of
/// `items`.
double throughput(Passes const& passes, std::size_t items, std::chrono::nanoseconds duration) {
    std::atomic<std::size_t> ready{0};
    std::vector<double> rates(passes.size());
    std::vector<std::thread> threads;
    for (std::size_t i = 0; i < passes.size(); ++i) {
        threads.emplace_back([&, i] {
            passes[i]();
            ready.fetch_add(1);
            while (ready.load() < passes.size())
                std::this_thread::yield();
            auto const start = Clock::now();
            std::size_t calls = 0;
            while (Clock::now() - start < duration) {
                passes[i]();
                ++calls;
            }
            std::chrono::duration<double, std::micro> const elapsed = Clock::now() - start;
            rates[i] = static_cast<double>(calls * items) / elapsed.count();
        });
    }
    for (std::thread& thread : threads)
        thread.join();
    double sum = 0.0;
    for (double const rate : rates)
        sum += rate;
    return sum;
}

/// Both passes at once, beside the first one alone.
Contest twoBesideOne(Bench const& bench, std::size_t items, Passes passes) {
    Passes const first{passes.front()};
    auto const duration = bench.batch * 5;
    return {[=] { return throughput(passes, items, duration); },
            [=] { return throughput(first, items, duration); }};
}

Contest twoSplines(Bench const& bench) {
    auto const keys = makeKeys(kSize);
    auto const queries = everyFrame(keys);
    return twoBesideOne(bench, queries.size(),
                        {PointReads(keys, kKFInterpolationBezier, queries).pass(),
                         PointReads(keys, kKFInterpolationBezier, queries).pass()});
}

/// Each thread is elsewhere on the curve.
Contest oneSpline(Bench const& bench) {
    auto const keys = makeKeys(kSize);
    PointReads first(keys, kKFInterpolationBezier, everyFrame(keys));
    PointReads second = first;
    second.queries = std::make_shared<Queries>(first.queries->fromTheMiddle());
    return twoBesideOne(bench, first.queries->size(), {first.pass(), second.pass()});
}

std::function<void()> arraysPass(std::vector<Key> const& keys, Queries const& queries) {
    return readAll(queries.size(), [arrays = CubicArrays(keys), queries](std::size_t i) mutable {
        return arrays.ascending(queries.seconds[i]);
    });
}

/// Nothing is shared and nothing locked: what the machine has to give at that time.
Contest twoArrays(Bench const& bench) {
    auto const keys = makeKeys(kSize);
    auto const queries = everyFrame(keys);
    return twoBesideOne(bench, queries.size(), {arraysPass(keys, queries), arraysPass(keys, queries)});
}

struct GuardedArrays {
    explicit GuardedArrays(std::vector<Key> const& keys) : arrays(keys) {}
    std::mutex mutex;
    CubicArrays arrays;
};

/// One evaluator without a lock of its own behind a std::mutex.
Contest oneMutex(Bench const& bench) {
    auto const keys = makeKeys(kSize);
    auto const queries = everyFrame(keys);
    auto const shared = std::make_shared<GuardedArrays>(keys);
    auto const pass = [shared](Queries const& positions) {
        return readAll(positions.size(), [shared, positions](std::size_t i) {
            std::lock_guard const guard(shared->mutex);
            return shared->arrays.ascending(positions.seconds[i]);
        });
    };
    return twoBesideOne(bench, queries.size(), {pass(queries), pass(queries.fromTheMiddle())});
}

std::string loadAverage() {
    std::ifstream file("/proc/loadavg");
    std::string lastMinute = "unknown";
    file >> lastMinute;
    return lastMinute;
}

} // namespace

void registerThreads(Bench& bench) {
    bench.report.note("Threads: " + std::to_string(std::thread::hardware_concurrency()) +
                      " processors; load average before the start " + loadAverage() +
                      ". The row of the arrays tells what two threads could get here and now.");
    auto const add = [&bench](std::string const& name, Bound bound, Contest (*prepare)(Bench const&)) {
        ContestEntry entry{"two threads/" + name, "one thread", bound,
                           [&bench, prepare] { return prepare(bench); }};
        entry.unit = "/us";
        registerContest(bench, std::move(entry));
    };
    add("two splines", Bound::atLeast(1.9), twoSplines);
    add("two array evaluators", Bound::none(), twoArrays);
    add("one spline", Bound::atLeast(1.0), oneSpline);
    add("one array evaluator in a std::mutex", Bound::none(), oneMutex);
}
