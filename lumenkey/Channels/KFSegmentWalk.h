// Internal: not installed.
#pragma once

#include "lumenkey/foundation/Tempus.h"
#include "lumenkey/splines/KFVertexIterator.h"

#include <cstdint>

class KFChannelSegmentVisitor;
class KFCurve;
class KFSpline;
class KFVertex;
struct KFValueExtremes;

/// The walk behind `KFChannelSegmentVisitor::visitSegments`, over a spline of two vertices or more.
///
/// It goes by places in the order of vertices. Of a cycle outside the keypoints the target times are counted
/// from the cycle's start, so that they don't drift, and a cycle always ends, whatever its times are rounded
/// to.
class KFSegmentWalk {
public:
    /// Whatever the root. `extremes` is null, or what the visitor keeps, which then is nothing but the lowest
    /// and the highest value that it was shown: pieces that can't change them are left out. Where a repeat's
    /// times can't be written exactly, that holds but for what their rounding makes of values.
    static void overCurve(KFCurve& curve, Tempus const& start, Tempus const& end,
                          KFChannelSegmentVisitor& visitor, KFValueExtremes* extremes);

private:
    /// The numbers are those of `KFSpline::getExtrapolation`.
    enum class Side : std::uint32_t { After = 0, Before = 1 };

    /// Source times that are run through, in either direction, while the target time goes on by the same
    /// length.
    struct Run {
        Tempus from, to;
        bool isForward() const noexcept { return from < to; }
        /// The source time a while behind the start.
        Tempus at(Tempus const& elapsed) const noexcept {
            return isForward() ? from + elapsed : from - elapsed;
        }
        Tempus until(Tempus const& source) const noexcept {
            return isForward() ? source - from : from - source;
        }
    };
    /// How the curve repeats outside: cycle n runs from `anchor + n * length`.
    struct Cycles {
        Tempus anchor, length;
        Run even, odd;
        bool havePoints = true;
        /// What the values of a cycle lie above those of the one nearer to the keypoints.
        double rise = 0.0;
        /// Where the keypoints are met, which are visited from inside.
        Tempus outerBound = kTempusZero;
    };
    struct Cycle {
        Run run;
        Tempus begin;
        double offset;
    };
    struct Piece {
        KFVertex* first;
        KFVertex* second;
        Tempus sourceStart, sourceEnd, targetStart, targetEnd;
        double offset = 0.0;
    };

    KFSegmentWalk(KFSpline& spline, KFChannelSegmentVisitor& visitor, KFValueExtremes* extremes) noexcept
        : _spline(spline), _visitor(visitor), _extremes(extremes) {}

    void walk(Tempus const& start, Tempus const& end);
    bool walkInside(KFVertexIterator place, Tempus const& start, Tempus const& end, Tempus* lastTime);
    KFVertexIterator lastTogetherWith(KFVertexIterator place) const noexcept;
    void walkOutside(Side side, Tempus const& start, Tempus const& end);
    void walkRepeats(Side side, std::uint32_t mode, Tempus const& start, Tempus const& end);
    bool cyclesOf(Side side, std::uint32_t mode, Tempus const& start, Cycles& cycles);
    double riseOfCycle(Side side);
    void walkCycles(Side side, Cycles const& cycles, Tempus const& start, Tempus const& end);
    bool walkCycle(Cycles const& cycles, Cycle const& cycle, Tempus target, Tempus const& end);
    KFVertexIterator placeBehind(KFVertexIterator place, Tempus const& source, bool forward) const noexcept;
    bool maySkipCycles();
    void visitPiece(Piece const& piece);
    void visitPoint(Tempus const& at);

    Tempus timeAt(KFVertexIterator place) const noexcept;
    double valueAt(Tempus const& t);

    KFSpline& _spline;
    KFChannelSegmentVisitor& _visitor;
    KFValueExtremes* const _extremes;
};
