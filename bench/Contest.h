#pragma once

#include "bench/Report.h"

#include <chrono>
#include <cstddef>
#include <functional>
#include <limits>
#include <string>

/// How long and how often is measured, and where to the results go.
struct Bench {
    Report report;
    int repetitions = 25;
    /// The shortest stretch of time that is measured at once.
    std::chrono::nanoseconds batch = std::chrono::milliseconds(4);

    void setQuick() noexcept {
        repetitions = 5;
        batch = std::chrono::microseconds(500);
    }
};

/// Measures once, and gives the figure for one item: nanoseconds, bytes and so on.
using Measurement = std::function<double()>;

/// Ours and what it is held against. Each owns what it needs.
struct Contest {
    Measurement subject;
    Measurement limit;
};

/// One benchmark and its row of the table. Subject and limit are measured in turns, and the ratio is the
/// median of the turns' ratios, so that a machine that slows down or is disturbed for a while slows both.
struct ContestEntry {
    std::string name;
    std::string against;
    Bound bound;
    /// Called when the benchmark runs.
    std::function<Contest()> prepare;
    std::string unit = "ns";
    std::function<double(double subject, double limit)> ratio = [](double subject, double limit) {
        return subject / limit;
    };
    /// False for what comes out the same every time.
    bool repeats = true;
    /// For what takes seconds.
    int mostRepetitions = std::numeric_limits<int>::max();
};
void registerContest(Bench& bench, ContestEntry entry);

/// Nanoseconds for one of `items` that each call of `pass` works through; calls are repeated to fill a batch.
Measurement timePerItem(Bench const& bench, std::size_t items, std::function<void()> pass);

/// The program ends with a message when two of the contestants differ by more than `tolerance`: then they
/// don't do the same, and comparing their times would say nothing.
void requireAgreement(std::string const& what, double ours, double other, double tolerance);
