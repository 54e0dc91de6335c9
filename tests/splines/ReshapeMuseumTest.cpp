// What simplifying and smoothing promise, over the whole museum: how far the curve may be moved, at its
// samples and between them. Parametric curves have no such promise, nor has what is locked.

#include "lumenkey/curves/KFTypedCurves.h"
#include "lumenkey/splines/KFInterpolation.h"
#include "tests/splines/museum.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>

namespace {

constexpr int kSamples = 200;
constexpr int kPerSample = 10;

struct Shown {
    KFCurveDouble curve{0.0};
    Tempus first, last, step;
    double height = 0.0; // of the values

    explicit Shown(Exhibit const& exhibit) {
        MuseumSpline const shown = exhibit.build();
        curve.setIsSpline(true, kTempusZero);
        curve.setSplineState(new KFSplineState(*shown.state));
        curve.setKeypoint(kTempusZero, 0.0, true);
        *curve.getSpline() = *shown.spline;
        double low = 0.0, high = 0.0;
        curve.getCurrentMinValueU(&first);
        curve.getCurrentMinValueV(&low, true);
        curve.getCurrentMaxValueV(&high, true);
        height = high - low;
        curve.getCurrentMaxValueU(&last);
        step = (last - first) * TempusMake(1, kSamples);
    }
    unsigned keypointsInStretch() {
        std::vector<void*> handles;
        curve.getKeypointHandleList(handles);
        return static_cast<unsigned>(std::count_if(handles.begin(), handles.end(), [this](void* handle) {
            Tempus u;
            return curve.getKeypoint(handle, &u, nullptr) && u >= first && u <= last;
        }));
    }
    bool promises() {
        std::vector<void*> handles;
        curve.getKeypointHandleList(handles);
        auto const isLocked = [this](void* handle) {
            bool locked = false;
            return curve.isLockedKeypoint(handle, &locked) && locked;
        };
        return handles.size() > 1 && step > kTempusZero && !curve.isCurveParametric() &&
               std::none_of(handles.begin(), handles.end(), isLocked);
    }
    bool isLinear() {
        std::uint32_t type = 0;
        return curve.getCurveInterpolation(&type) && type == kKFInterpolationLinear;
    }
    /// Up to the last sample but one: the very end may be read as the continuation already.
    std::vector<double> read(int perSample) {
        std::vector<double> values;
        for (int i = 0; i <= (kSamples - 2) * perSample; ++i)
            values.push_back(curve.getValue(first + step * TempusMake(i, perSample), 0.0));
        return values;
    }
};

/// What the values span around place `i`: from the sample before its neighbourhood to the one behind.
double spanAround(std::vector<double> const& values, std::size_t i) {
    std::size_t const sample = i / kPerSample;
    std::size_t const from = sample == 0 ? 0 : (sample - 1) * kPerSample;
    std::size_t const to = std::min(values.size() - 1, (sample + 2) * kPerSample);
    auto const [low, high] = std::minmax_element(values.begin() + static_cast<std::ptrdiff_t>(from),
                                                 values.begin() + static_cast<std::ptrdiff_t>(to) + 1);
    return *high - *low;
}

} // namespace

TEST(ReshapeMuseum, SimplifyingStaysWithinTheTolerance) {
    int seen = 0;
    for (Exhibit const& exhibit : museum()) {
        for (double const part : {0.1, 0.01, 0.0}) {
            SCOPED_TRACE(exhibit.name + " " + std::to_string(part));
            Shown before(exhibit), after(exhibit);
            if (!before.promises())
                continue;
            ++seen;
            // Straight lines are found exactly, everything else is fitted.
            double const tolerance = before.isLinear() ? 0.0 : part * before.height;
            ASSERT_TRUE(after.curve.simplifyCurve(after.first, after.last, after.step, tolerance * 200.0, 2.0,
                                                  KFCurve::kSimplifyByFit, 0));
            // Fewer than the samples where the tolerance is wide.
            unsigned const most = part == 0.1 ? kSamples * 9 / 10 : kSamples;
            EXPECT_LE(after.keypointsInStretch(), before.isLinear() ? before.keypointsInStretch() : most);
            std::vector<double> const was = before.read(kPerSample);
            std::vector<double> const is = after.read(kPerSample);
            for (std::size_t i = 0; i < was.size(); ++i) {
                double const span = spanAround(was, i);
                double const between = before.isLinear() || i % kPerSample == 0 ? 1e-5 : 1.25;
                ASSERT_LE(std::fabs(is[i] - was[i]), tolerance + between * span + 1e-9) << i;
            }
        }
    }
    EXPECT_GT(seen, 100);
}

TEST(ReshapeMuseum, SmoothingMovesNoSampleByMoreThanItsFourthDifference) {
    for (Exhibit const& exhibit : museum()) {
        SCOPED_TRACE(exhibit.name);
        Shown before(exhibit), after(exhibit);
        if (!before.promises())
            continue;
        ASSERT_TRUE(after.curve.smoothCurve(after.first, after.last, after.step));
        EXPECT_EQ(after.keypointsInStretch(), unsigned{kSamples});
        std::vector<double> const was = before.read(1);
        std::vector<double> const is = after.read(1);
        auto const at = [&](std::ptrdiff_t i) {
            return was[static_cast<std::size_t>(std::max<std::ptrdiff_t>(i, 0))];
        };
        auto const fourthDifference = [&](std::ptrdiff_t i) {
            return std::fabs(at(i - 2) - 4 * at(i - 1) + 6 * at(i) - 4 * at(i + 1) + at(i + 2));
        };
        // What the filter takes away is (2, 5, 2) / 21 of the fourth differences around. So cubics stay.
        for (std::ptrdiff_t i = 0; i + 3 < std::ssize(was); ++i) {
            double const moved = std::fabs(is[static_cast<std::size_t>(i)] - at(i));
            double const rough =
                2 * fourthDifference(i - 1) + 5 * fourthDifference(i) + 2 * fourthDifference(i + 1);
            ASSERT_LE(moved, rough / 21.0 + 1e-9 * (1.0 + before.height)) << i;
        }
    }
}
