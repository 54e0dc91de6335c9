// The smallest and largest value of a curve over a stretch of time. The stretch is cut at the keypoints; each piece is
// looked at in equal steps, and the steps around its smallest and its largest value are narrowed down by thirds.

#include "lumenkey/Channels/KFChannel.h"
#include "lumenkey/Channels/KFChannelImpl.h"
#include "lumenkey/curves/KFCurve.h"

#include <algorithm>
#include <limits>

namespace {

constexpr std::int64_t kSteps = 64;
/// Each leaves two thirds: 40 of them a ten-millionth of two steps.
constexpr int kNarrowings = 40;
/// Repeats in a piece outside the keypoints that are each looked at in full.
constexpr std::int64_t kMostCycles = 1000;

/// A piece of a curve, read by a position from 0 to 1.
struct Piece {
    KFCurve& curve;
    Tempus start;
    Tempus duration;

    double at(double position) const {
        double value = 0.0;
        curve.getPointWithoutBehavior(start + duration * position, 0.0, &value);
        return value;
    }

    /// The largest value of `sign` times the curve between two positions that have at most one extreme between them.
    double narrowedDown(double low, double high, double sign) const {
        double best = -std::numeric_limits<double>::max();
        for (int i = 0; i < kNarrowings; ++i) {
            double const lower = low + (high - low) / 3.0;
            double const upper = high - (high - low) / 3.0;
            double const atLower = sign * at(lower);
            double const atUpper = sign * at(upper);
            best = std::max({best, atLower, atUpper});
            (atLower < atUpper ? low : high) = atLower < atUpper ? lower : upper;
        }
        return best;
    }
};

struct Extremes {
    double lowest = std::numeric_limits<double>::max();
    double highest = -std::numeric_limits<double>::max();

    void include(double value) {
        lowest = std::min(lowest, value);
        highest = std::max(highest, value);
    }

    void include(Piece const& piece, std::int64_t steps) {
        double const step = 1.0 / static_cast<double>(steps);
        std::int64_t lowestStep = 0;
        std::int64_t highestStep = 0;
        Extremes inPiece;
        for (std::int64_t i = 0; i <= steps; ++i) {
            double const value = piece.at(static_cast<double>(i) * step);
            if (value < inPiece.lowest)
                lowestStep = i;
            if (value > inPiece.highest)
                highestStep = i;
            inPiece.include(value);
        }
        auto const below = [step](std::int64_t i) {
            return std::max(0.0, static_cast<double>(i - 1) * step);
        };
        auto const above = [step](std::int64_t i) {
            return std::min(1.0, static_cast<double>(i + 1) * step);
        };
        include(inPiece.lowest);
        include(inPiece.highest);
        include(-piece.narrowedDown(below(lowestStep), above(lowestStep), -1.0));
        include(piece.narrowedDown(below(highestStep), above(highestStep), 1.0));
    }
};

Extremes extremesBetween(KFCurve& curve, Tempus const& first, Tempus const& last) {
    Extremes extremes;
    Tempus range = kTempusZero;
    curve.getCurrentRangeU(&range);
    Tempus start = first;
    while (start < last) {
        Tempus next = last;
        if (curve.getNextKeypoint(start, &next, nullptr) && next > last)
            next = last;
        Tempus const duration = next - start;
        std::int64_t const cycles = range > kTempusZero ? TempusFloorQuotient(duration, range) : 0;
        extremes.include(Piece{curve, start, duration}, kSteps * (1 + std::min(cycles, kMostCycles)));
        start = next;
    }
    return extremes;
}

} // namespace

bool KFChannel::getCurrentMinAndMax(Tempus const& from, Tempus const& to, double* minimum, double* maximum) {
    if (minimum == nullptr && maximum == nullptr)
        return false;
    Extremes extremes;
    if (getCurveInterface() != nullptr) {
        Tempus const first = TempusMinimum(from, to);
        if (hasKeypoints(0) && TempusIsNumeric(from) && TempusIsNumeric(to))
            extremes = extremesBetween(curve(), first, TempusMaximum(from, to));
        extremes.include(getCurveValue(first, false));
    }
    if (minimum != nullptr)
        *minimum = extremes.lowest;
    if (maximum != nullptr)
        *maximum = extremes.highest;
    return true;
}
