#include "tools/edit/CurveChange.h"

#include "tools/curve/SampleTimes.h"

#include <algorithm>
#include <cmath>

namespace lumenkey::tools {

namespace {

constexpr std::size_t kValuesAtOnce = 65'536;

void compareAt(SampleTimes const& times, KFCurve& before, KFCurve& after, CurveChange& change) {
    std::vector<double> old(std::min(times.count(), kValuesAtOnce));
    std::vector<double> now(old.size());
    for (std::size_t first = 0; first < times.count(); first += old.size()) {
        std::size_t const number = std::min(old.size(), times.count() - first);
        times.readValues(before, first, number, old.data());
        times.readValues(after, first, number, now.data());
        for (std::size_t i = 0; i < number; ++i) {
            double const apart = std::abs(now[i] - old[i]);
            if (apart > change.most) {
                change = {apart, times.at(first + i)};
            }
        }
    }
}

} // namespace

CurveChange changeBetween(KFCurve& before, KFCurve& after, TimeSpan const& span, Tempus const& step) {
    CurveChange change{0, span.from};
    std::int64_t const steps = TempusFloorQuotient(span.to - span.from, step);
    if (steps < kMostComparedValues) {
        compareAt(SampleTimes::row(span.from, step, static_cast<std::size_t>(steps) + 1), before, after,
                  change);
    } else {
        compareAt(SampleTimes::spread(span.from, span.to, kMostComparedValues), before, after, change);
    }
    compareAt(SampleTimes::list({span.to}), before, after, change);
    return change;
}

} // namespace lumenkey::tools
