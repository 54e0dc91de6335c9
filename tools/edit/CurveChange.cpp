#include "tools/edit/CurveChange.h"

#include "tools/curve/SampleTimes.h"

#include <algorithm>
#include <cmath>
#include <limits>
#include <utility>
#include <vector>

namespace lumenkey::tools {

namespace {

constexpr std::size_t kValuesAtOnce = 65'536;

/// Infinite where only one of them is a number, or they are different infinities.
double distanceBetween(double old, double now) {
    double const apart = std::abs(now - old);
    if (!std::isnan(apart)) {
        return apart;
    }
    bool const isSame = std::isnan(old) ? std::isnan(now) : old == now;
    return isSame ? 0 : std::numeric_limits<double>::infinity();
}

void compareAt(SampleTimes const& times, KFCurve& before, KFCurve& after, CurveChange& change) {
    std::vector<double> old(std::min(times.count(), kValuesAtOnce));
    std::vector<double> now(old.size());
    for (std::size_t first = 0; first < times.count(); first += old.size()) {
        std::size_t const number = std::min(old.size(), times.count() - first);
        times.readValues(before, first, number, old.data());
        times.readValues(after, first, number, now.data());
        for (std::size_t i = 0; i < number; ++i) {
            double const apart = distanceBetween(old[i], now[i]);
            if (apart > change.most) {
                change = {apart, times.at(first + i)};
            }
        }
    }
}

std::vector<Tempus> timesOfKeypoints(KFCurve& curve) {
    std::vector<void*> handles;
    curve.getKeypointHandleList(handles);
    std::vector<Tempus> times(handles.size());
    for (std::size_t i = 0; i < handles.size(); ++i) {
        curve.getKeypoint(handles[i], &times[i], nullptr);
    }
    return times;
}

} // namespace

CurveChange changeBetween(KFCurve& before, KFCurve& after, TimeSpan const& span, Tempus const& step) {
    CurveChange change{0, span.from};
    std::int64_t const steps = TempusFloorQuotient(span.to - span.from, step);
    if (steps < kMostComparedSteps) {
        compareAt(SampleTimes::row(span.from, step, static_cast<std::size_t>(steps) + 1), before, after,
                  change);
    } else {
        compareAt(SampleTimes::spread(span.from, span.to, kComparedOfMore), before, after, change);
    }
    compareAt(SampleTimes::list({span.to}), before, after, change);
    return change;
}

void compareAtKeypoints(KFCurve& before, KFCurve& after, CurveChange& change) {
    constexpr std::uint32_t beside = 1'000; // of the way from one keypoint to the next
    std::vector<Tempus> keypoints = timesOfKeypoints(before);
    std::vector<Tempus> const others = timesOfKeypoints(after);
    keypoints.insert(keypoints.end(), others.begin(), others.end());
    std::sort(keypoints.begin(), keypoints.end());
    keypoints.erase(std::unique(keypoints.begin(), keypoints.end()), keypoints.end());
    std::vector<Tempus> times;
    for (std::size_t i = 0; i < keypoints.size(); ++i) {
        if (i > 0) {
            Tempus const gap = keypoints[i] - keypoints[i - 1];
            times.insert(times.end(), {keypoints[i - 1] + gap / beside, keypoints[i - 1] + gap / 2U,
                                       keypoints[i] - gap / beside});
        }
        times.push_back(keypoints[i]);
    }
    compareAtTimes(std::move(times), before, after, change);
}

void compareAtTimes(std::vector<Tempus> times, KFCurve& before, KFCurve& after, CurveChange& change) {
    compareAt(SampleTimes::list(std::move(times)), before, after, change);
}

} // namespace lumenkey::tools
