// Operations that replace a stretch of a curve: it is read as a row of samples, and what was fitted to them or filtered
// from them becomes its keypoints. Thinning looks at the keypoints alone.

#include "lumenkey/curves/KFCurve.h"

#include "lumenkey/foundation/BXCurveFit.h"
#include "lumenkey/splines/KFSpline.h"
#include "lumenkey/splines/KFSplineState.h"
#include "lumenkey/splines/KFVertex.h"

#include <algorithm>
#include <cmath>

namespace {

using Point = BXVector2<double>;

/// Where no more than one step fits, a stretch is cut into so many.
constexpr std::int64_t kSamplesOfShortStretch = 1000;
/// Slopes that differ by less are the same line.
constexpr double kSlopeTolerance = 1e-7;

/// Sample i stands at `start + step * i`.
struct Row {
    Tempus start;
    Tempus step;
    std::vector<double> values;

    Tempus timeOf(std::size_t i) const { return start + step * static_cast<std::uint32_t>(i); }
    /// The value at a place that may lie outside: then that of the nearest end.
    double valueNear(std::int64_t i) const {
        auto const last = static_cast<std::int64_t>(values.size()) - 1;
        return values[static_cast<std::size_t>(std::clamp<std::int64_t>(i, 0, last))];
    }
};

/// What one unit of either axis of a fit stands for.
struct FitUnits {
    Tempus time;
    double scale; // the fit's values are the curve's times this

    double seconds() const { return TempusGetSeconds(time); }
    double of(Tempus const& u) const { return TempusGetSeconds(u) / seconds(); }
};

bool canBeCut(Tempus const& start, Tempus const& end, Tempus const& step) {
    return TempusIsNumeric(start) && TempusIsNumeric(end) && TempusIsNumeric(step) && step > kTempusZero;
}

std::int64_t wholeSteps(Tempus const& start, Tempus const& end, Tempus const& step) {
    return std::max<std::int64_t>(TempusFloorQuotient(end - start, step), 0);
}

/// False, with nothing done, for a row that is too long or a node that isn't the curve's.
bool sample(KFCurve& curve, KFCurveNode* stopNode, std::int64_t count, Row& row) {
    if (count > KFCurve::kMostShapeSamples)
        return false;
    row.values.resize(static_cast<std::size_t>(count));
    KFCurveNodeParam param;
    param.outputStart = row.start;
    param.outputStep = row.step;
    param.outputCount = static_cast<std::uint32_t>(count);
    param.outputValues = row.values.data();
    if (!curve.processCurve(param, stopNode))
        return false;
    row.values.resize(std::min<std::size_t>(row.values.size(), param.outputCount));
    return true;
}

/// The root alone, in steps or, where that is wanted, in a thousandth of the stretch.
bool sampleRoot(KFCurve& curve, Tempus const& end, bool finely, Row& row) {
    if (!finely)
        return sample(curve, nullptr, wholeSteps(row.start, end, row.step), row);
    row.step = (end - row.start) * TempusMake(1, kSamplesOfShortStretch);
    return sample(curve, nullptr, kSamplesOfShortStretch, row);
}

/// The fit begins and ends at the first and last finite sample, bit for bit.
std::vector<Point> fit(Row const& row, FitUnits const& units, double tolerance) {
    std::vector<Point> points(row.values.size());
    for (std::size_t i = 0; i < points.size(); ++i)
        points[i] = {units.of(row.timeOf(i)), row.values[i] * units.scale};
    std::vector<Point> fitted;
    BXCurveFit::getInstance().FitCurve(points, fitted, tolerance);
    return fitted;
}

/// Keypoint, out-handle, in-handle, keypoint, ..., keypoint. They are Bezier whatever the settings of the curve: the
/// fit is good for no other type. The first sample's time isn't rounded: a keypoint may have stayed there, and a second
/// one a tick beside it would leave the old value in the curve.
void placeFitted(KFSpline& spline, std::vector<Point> const& fitted, Row const& row, FitUnits const& units) {
    auto const handle = [&units](Point const& from, Point const& to) {
        Point const way = to - from;
        return Point{way.x * units.seconds() / KFCurve::kHandleScale,
                     way.y / KFCurve::kHandleScale / units.scale};
    };
    for (std::size_t k = 0; k < fitted.size(); k += 3) {
        Point const& keypoint = fitted[k];
        Tempus const u = keypoint.x == units.of(row.start)
                             ? row.start
                             : KFChronoForChannelSeconds(keypoint.x, kKFChannelTimescale) * units.time;
        void* const vertex = spline.addVertexNoTangents(u, keypoint.y / units.scale, kTempusZero, true);
        std::uint32_t flags = 0;
        if (spline.getVertexFlags(vertex, &flags) && (flags & kKFVertexFlagLocked) == 0)
            spline.setVertexInterpolation(vertex, kKFInterpolationBezier);
        if (k > 0) {
            Point const in = handle(keypoint, fitted[k - 1]);
            spline.setVertexInputHandles(vertex, in.x, in.y, kTempusZero, false);
        }
        if (k + 1 < fitted.size()) {
            Point const out = handle(keypoint, fitted[k + 1]);
            spline.setVertexOutputHandles(vertex, out.x, out.y, kTempusZero, false);
        }
    }
}

/// By position, since of several vertices at one the list of handles has the first only.
void deleteStretch(KFSpline& spline, Tempus const& start, Tempus const& end) {
    spline.deleteVertex(start, true, kTempusZero);
    spline.deleteVertices(start, end);
}

/// The mean over 2 * radius + 1 samples; beyond either end the end's sample counts again, without being visited.
void average(Row& row, std::int64_t radius) {
    std::vector<double> means(row.values.size());
    auto const last = static_cast<std::int64_t>(means.size()) - 1;
    double const weight = 1.0 / static_cast<double>(2 * radius + 1);
    for (std::int64_t i = 0; i <= last; ++i) {
        std::int64_t const from = std::max<std::int64_t>(i - radius, 0);
        std::int64_t const to = std::min(i + radius, last);
        double sum = 0.0;
        if (i < radius)
            sum += static_cast<double>(radius - i) * (row.values.front() * weight);
        for (std::int64_t k = from; k <= to; ++k)
            sum += row.values[static_cast<std::size_t>(k)] * weight;
        if (i + radius > last)
            sum += static_cast<double>(i + radius - last) * (row.values.back() * weight);
        means[static_cast<std::size_t>(i)] = sum;
    }
    row.values = std::move(means);
}

/// A quadratic fitted to seven samples, at the middle one.
void smooth(Row& row) {
    constexpr double kernel[] = {-2.0, 3.0, 6.0, 7.0, 6.0, 3.0, -2.0};
    std::vector<double> smoothed(row.values.size());
    for (std::size_t i = 0; i < smoothed.size(); ++i) {
        for (std::int64_t k = -3; k <= 3; ++k)
            smoothed[i] += row.valueNear(static_cast<std::int64_t>(i) + k) * kernel[k + 3] * (1.0 / 21.0);
    }
    row.values = std::move(smoothed);
}

bool refit(KFCurve& curve, Tempus const& start, Tempus const& end, Tempus const& step, double tolerance,
           std::int32_t radius) {
    bool const finely = !(tolerance > 1.0) && !(end - start > step);
    Row row{start, step, {}};
    if (!sampleRoot(curve, end, finely, row))
        return false;
    if (radius > 0)
        average(row, radius);
    FitUnits const units{step, 1.0};
    std::vector<Point> const fitted = fit(row, units, tolerance);
    deleteStretch(*curve.getSpline(), start, end);
    placeFitted(*curve.getSpline(), fitted, row, units);
    return true;
}

/// Returns the value there.
double addVertexOnCurve(KFSpline& spline, Tempus const& u) {
    double const value = spline.getVertexValue(u, kTempusZero, true);
    if (!spline.getVertexHandle(u, nullptr, true))
        spline.addVertex(u, value, kTempusZero, true);
    return value;
}

/// Deletes vertices of straight lines, but for the ends of the stretch.
void deleteCollinear(KFSpline& spline, Tempus const& start, Tempus const& end) {
    Tempus anchorTime = start;
    double anchorValue = addVertexOnCurve(spline, start);
    void* present = nullptr;
    void* next = nullptr;
    spline.getNextValidVertexWithLock(start, &present, kTempusZero, false);
    while (present != nullptr && spline.getNextValidVertexWithLock(present, &next, kTempusZero)) {
        Tempus time, nextTime;
        double value = 0.0, nextValue = 0.0;
        spline.getVertex(present, &time, &value, kTempusZero);
        spline.getVertex(next, &nextTime, &nextValue, kTempusZero);
        if (!(time < end))
            break;
        double const before = (value - anchorValue) / TempusSecondsBetween(anchorTime, time);
        double const behind = (nextValue - value) / TempusSecondsBetween(time, nextTime);
        bool const bends = std::fabs(before - behind) >= kSlopeTolerance;
        if (bends || !spline.deleteVertex(present, true, kTempusZero)) {
            anchorTime = time;
            anchorValue = value;
        }
        present = next;
    }
    addVertexOnCurve(spline, end);
}

bool haveOppositeSigns(double a, double b) { return (a > 0.0 && b < 0.0) || (a < 0.0 && b > 0.0); }

/// Each vertex is compared with the last one that stayed, and with its neighbour as it stood at the beginning.
void thinToExtremes(KFSpline& spline, Tempus const& start, Tempus const& end) {
    std::vector<void*> handles;
    spline.getAllVerticesHandles(handles);
    double previous = 0.0;
    spline.getVertex(handles.front(), nullptr, &previous, kTempusZero);
    for (std::size_t i = 1; i + 1 < handles.size(); ++i) {
        Tempus u;
        double value = 0.0, next = 0.0;
        spline.getVertex(handles[i], &u, &value, kTempusZero);
        spline.getVertex(handles[i + 1], nullptr, &next, kTempusZero);
        bool const isOutside = u < start || end < u;
        if (isOutside || haveOppositeSigns(value - previous, next - value)) {
            previous = value;
        } else {
            spline.deleteVertex(handles[i], true, kTempusZero);
        }
    }
}

/// Null for a curve with nothing to reshape.
KFSpline* splineToReshape(KFCurve const& curve) {
    KFSpline* const spline = curve.isSpline() ? curve.getSpline() : nullptr;
    return spline != nullptr && spline->getNumberOfVertices() > 1 ? spline : nullptr;
}

} // namespace

bool KFCurve::bakeCurve(void* node, Tempus const& start, Tempus const& step, Tempus const& end,
                        double tolerance, double scale) {
    if (!isSpline() || !canBeCut(start, end, step) || scale == 0.0 || !std::isfinite(scale))
        return false;
    Row row{start, step, {}};
    if (!sample(*this, static_cast<KFCurveNode*>(node), wholeSteps(start, end, step), row))
        return false;
    FitUnits const units{TempusMake(1, 1), scale};
    std::vector<Point> const fitted = fit(row, units, tolerance / 100.0);

    createLocalSplineState()->sanitizeBezier = false;
    KFSpline& spline = *splineForNewKeypoints();
    spline.deleteVertices(start, end);
    spline.setInterpolation(kKFInterpolationBezier);
    placeFitted(spline, fitted, row, units);
    return true;
}

bool KFCurve::simplifyCurve(Tempus const& start, Tempus const& end, Tempus const& step, double tolerance,
                            double range, std::uint32_t mode, std::int32_t radius) {
    KFSpline* const spline = splineToReshape(*this);
    if (spline == nullptr)
        return false;
    if (mode == kSimplifyToExtremes)
        thinToExtremes(*spline, start, end);
    if (mode != kSimplifyByFit)
        return true;

    if (!canBeCut(start, end, step) || end < start)
        return false;
    std::uint32_t interpolation = 0;
    getCurveInterpolation(&interpolation);
    if (radius != 0 || interpolation != kKFInterpolationLinear)
        return refit(*this, start, end, step, tolerance / 100.0 / range, radius);
    deleteCollinear(*spline, start, end);
    return true;
}

bool KFCurve::smoothCurve(Tempus const& start, Tempus const& end, Tempus const& step) {
    KFSpline* const spline = splineToReshape(*this);
    Row row{start, step, {}};
    if (spline == nullptr || !canBeCut(start, end, step) || end < start ||
        !sampleRoot(*this, end, !(end - start > step), row))
        return false;

    smooth(row);
    deleteStretch(*spline, start, end);
    for (std::size_t i = 0; i < row.values.size(); ++i) {
        void* const handle = spline->addVertexNoTangents(row.timeOf(i), row.values[i], kTempusZero, true);
        spline->setVertexInputHandles(handle, 0.0, 0.0, kTempusZero, false);
        spline->setVertexOutputHandles(handle, 0.0, 0.0, kTempusZero, false);
    }
    return true;
}
