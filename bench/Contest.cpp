#include "bench/Contest.h"

#include <algorithm>
#include <cmath>
#include <cstdlib>
#include <iostream>
#include <memory>
#include <utility>
#include <vector>

#include <benchmark/benchmark.h>

namespace {

using Clock = std::chrono::steady_clock;

double median(std::vector<double> values) {
    auto const middle = values.begin() + static_cast<std::ptrdiff_t>(values.size() / 2);
    std::nth_element(values.begin(), middle, values.end());
    return *middle;
}

std::chrono::nanoseconds timeOf(std::function<void()> const& pass, std::size_t calls) {
    auto const start = Clock::now();
    for (std::size_t i = 0; i < calls; ++i)
        pass();
    return Clock::now() - start;
}

void run(Bench& bench, ContestEntry const& entry, benchmark::State& state) {
    Contest const contest = entry.prepare();
    std::vector<double> subjects;
    std::vector<double> limits;
    std::vector<double> ratios;
    bool subjectFirst = true;
    for (auto _ : state) {
        double limit = subjectFirst ? 0.0 : contest.limit();
        double const subject = contest.subject();
        if (subjectFirst)
            limit = contest.limit();
        subjectFirst = !subjectFirst;
        subjects.push_back(subject);
        limits.push_back(limit);
        ratios.push_back(entry.ratio(subject, limit));
        state.SetIterationTime(entry.unit == "ns" ? subject * 1e-9 : 0.0);
    }
    ReportRow row{entry.name,    median(subjects), median(limits), entry.unit,
                  entry.against, median(ratios),   entry.bound};
    state.counters["ours"] = row.figure;
    state.counters["limit"] = row.limit;
    state.counters["ratio"] = row.ratio;
    state.SetLabel(entry.unit);
    bench.report.add(std::move(row));
}

} // namespace

void registerContest(Bench& bench, ContestEntry entry) {
    int const repetitions = entry.repeats ? std::min(bench.repetitions, entry.mostRepetitions) : 1;
    auto const shared = std::make_shared<ContestEntry const>(std::move(entry));
    benchmark::RegisterBenchmark(shared->name.c_str(),
                                 [&bench, shared](benchmark::State& state) { run(bench, *shared, state); })
        ->Iterations(repetitions)
        ->UseManualTime();
}

Measurement timePerItem(Bench const& bench, std::size_t items, std::function<void()> pass) {
    std::size_t calls = 1;
    while (timeOf(pass, calls) < bench.batch)
        calls *= 2;
    double const count = static_cast<double>(calls) * static_cast<double>(items);
    return [calls, count, pass = std::move(pass)] {
        return static_cast<double>(timeOf(pass, calls).count()) / count;
    };
}

void requireAgreement(std::string const& what, double ours, double other, double tolerance) {
    if (std::fabs(ours - other) <= tolerance)
        return;
    std::cerr << "lumenkey_bench: " << what << ": " << ours << " here, " << other << " there\n";
    std::exit(1);
}
