#include "lumenkey/Channels/KFSegmentWalk.h"

#include "lumenkey/Channels/KFChannelSegmentVisitor.h"
#include "lumenkey/curves/KFCurve.h"
#include "lumenkey/splines/KFSpline.h"
#include "lumenkey/splines/KFSplineExtremes.h"
#include "lumenkey/splines/KFVertex.h"

#include <algorithm>
#include <initializer_list>

namespace {

bool areNumbersOfOneEpoch(std::initializer_list<Tempus> times) {
    for (Tempus const& t : times) {
        if (!TempusIsNumeric(t) || t.epoch != times.begin()->epoch)
            return false;
    }
    return true;
}

KFVertex const& vertexOf(void* handle) { return *static_cast<KFVertex*>(handle); }

double valueOf(KFVertex const& vertex) { return vertex.getValueV(kTempusZero); }

using Visit = KFChannelSegmentVisitor::SegmentVisit KFChannelSegmentVisitor::*;

/// Null for a type that has no visit.
Visit visitOf(std::uint32_t type) {
    switch (type) {
    case kKFInterpolationLinear:
        return &KFChannelSegmentVisitor::visitLinear;
    case kKFInterpolationBezier:
        return &KFChannelSegmentVisitor::visitBezier;
    case kKFInterpolationCatmullRom:
        return &KFChannelSegmentVisitor::visitCatmullRom;
    case kKFInterpolationEaseIn:
        return &KFChannelSegmentVisitor::visitEaseIn;
    case kKFInterpolationEaseOut:
        return &KFChannelSegmentVisitor::visitEaseOut;
    case kKFInterpolationExponential:
        return &KFChannelSegmentVisitor::visitExponential;
    case kKFInterpolationLogarithmic:
        return &KFChannelSegmentVisitor::visitLogarithmic;
    case kKFInterpolationEase:
        return &KFChannelSegmentVisitor::visitEase;
    case kKFInterpolationAccelerate:
        return &KFChannelSegmentVisitor::visitAccelerate;
    case kKFInterpolationDecelerate:
        return &KFChannelSegmentVisitor::visitDecelerate;
    default:
        return nullptr;
    }
}

} // namespace

void KFSegmentWalk::overCurve(KFCurve& curve, Tempus const& start, Tempus const& end,
                              KFChannelSegmentVisitor& visitor, KFValueExtremes* extremes) {
    KFCurveNode* const root = curve.getRootNode();
    auto* const splineNode = dynamic_cast<KFSplineNode*>(root);
    if (splineNode == nullptr) {
        if (dynamic_cast<KFConstantNode*>(root) != nullptr)
            visitor.visitConstant(root->solveNode(kTempusZero, 0.0, 0.0), start, end);
        return;
    }
    KFSpline* const spline = splineNode->getSpline();
    std::size_t const count = spline == nullptr ? 0 : spline->getNumberOfVertices();
    if (count == 0) {
        visitor.visitConstant(splineNode->getInitialValue(), start, end);
    } else if (count == 1) {
        visitor.visitConstant(valueOf(*spline->vertexAt(spline->beginVertices())), start, end);
    } else if (start <= end) {
        KFSegmentWalk(*spline, visitor, extremes).walk(start, end);
    }
}

Tempus KFSegmentWalk::timeAt(KFVertexIterator place) const noexcept {
    return _spline.vertexAt(place)->getValueU();
}

double KFSegmentWalk::valueAt(Tempus const& t) { return _spline.getVertexValue(t, kTempusZero, true); }

void KFSegmentWalk::visitPoint(Tempus const& at) { _visitor.visitConstant(valueAt(at), at, at); }

void KFSegmentWalk::visitPiece(Piece const& piece) {
    std::uint32_t const type = piece.first->getInterpolation();
    if (type == kKFInterpolationConstant) {
        Tempus const middle = (piece.targetStart + piece.targetEnd) / 2;
        _visitor.visitConstant(valueAt(middle), piece.targetStart, piece.targetEnd);
    } else if (Visit const visit = visitOf(type)) {
        (_visitor.*visit)(_spline, piece.first, piece.second, piece.sourceStart, piece.sourceEnd,
                          piece.targetStart, piece.targetEnd, piece.offset);
    }
}

void KFSegmentWalk::walk(Tempus const& start, Tempus const& end) {
    KFVertexIterator left = _spline.beginVertices();
    KFVertexIterator const next = _spline.placeAfter(start);
    if (next == left) {
        walkOutside(Side::Before, start, TempusMinimum(timeAt(left), end));
    } else {
        left = _spline.previousPlace(next);
    }
    Tempus lastTime;
    if (walkInside(left, start, end, &lastTime) && end > lastTime)
        walkOutside(Side::After, TempusMaximum(lastTime, start), end);
}

/// Of several keypoints at one time the last, with which the segment behind them begins. They are one point.
KFVertexIterator KFSegmentWalk::lastTogetherWith(KFVertexIterator place) const noexcept {
    for (KFVertexIterator next;; place = next) {
        next = _spline.nextPlace(place);
        if (next == _spline.endVertices() || timeAt(next) != timeAt(place))
            return place;
    }
}

/// From the keypoint at `place`; true when it came to the last one.
bool KFSegmentWalk::walkInside(KFVertexIterator place, Tempus const& start, Tempus const& end,
                               Tempus* lastTime) {
    bool mayShorten = _extremes != nullptr;
    for (KFVertexIterator next;; place = next) {
        place = lastTogetherWith(place);
        Tempus const time = timeAt(place);
        if (time > end)
            return false;
        bool const isPoint = time >= start;
        if (isPoint && mayShorten) {
            mayShorten = false;
            if (KFIncludeWholeSegments(_spline, time, end, *_extremes)) {
                next = _spline.previousPlace(_spline.placeAfter(end));
                if (next != place)
                    continue;
            }
        }
        Tempus const from = TempusMaximum(time, start);
        if (isPoint)
            visitPoint(from);
        next = _spline.nextPlace(place);
        if (next == _spline.endVertices()) {
            *lastTime = time;
            return true;
        }
        // A stretch without length inside a segment has a piece; one at its keypoint has none.
        Tempus const to = TempusMinimum(timeAt(next), end);
        if (from < to || (from == to && !isPoint))
            visitPiece({_spline.vertexAt(place), _spline.vertexAt(next), from, to, from, to});
    }
}

// --- Outside the keypoints ---

void KFSegmentWalk::walkOutside(Side side, Tempus const& start, Tempus const& end) {
    std::uint32_t const mode = _spline.getExtrapolation(static_cast<std::uint32_t>(side));
    switch (mode) {
    case kKFExtrapolationConstant:
        _visitor.visitConstant(valueAt(side == Side::Before ? start : end), start, end);
        break;
    case kKFExtrapolationLinear:
        _visitor.visitLinear(_spline, side == Side::Before ? nullptr : _spline.getLastVertex(),
                             side == Side::Before ? _spline.getFirstVertex() : nullptr, start, end, start,
                             end, 0.0);
        break;
    case kKFExtrapolationPingPong:
    case kKFExtrapolationRepeat:
    case kKFExtrapolationProgressiveRepeat:
        walkRepeats(side, mode, start, end);
        break;
    default:
        break;
    }
}

void KFSegmentWalk::walkRepeats(Side side, std::uint32_t mode, Tempus const& start, Tempus const& end) {
    Cycles cycles;
    if (cyclesOf(side, mode, start, cycles)) {
        if (areNumbersOfOneEpoch({start, end, cycles.anchor, cycles.outerBound}) &&
            TempusIsNumeric(cycles.length)) {
            walkCycles(side, cycles, start, end);
        }
    } else {
        _visitor.visitConstant(valueAt(start), start, end);
    }
}

/// From the first valid keypoint to the last one. Of several at the end the curve takes the last one behind
/// them, and the first one, whose value it has there, in front of them.
double KFSegmentWalk::riseOfCycle(Side side) {
    void* first = nullptr;
    void* last = nullptr;
    if (!_spline.getFirstValidVertexWithLock(&first, kTempusZero) ||
        !_spline.getLastValidVertexWithLock(&last, kTempusZero)) {
        return 0.0;
    }
    double const start = valueOf(vertexOf(first));
    if (side == Side::After)
        return valueOf(vertexOf(last)) - start;
    for (void* before = nullptr; _spline.getPreviousValidVertexWithLock(last, &before, kTempusZero) &&
                                 vertexOf(before).getValueU() == vertexOf(last).getValueU();) {
        last = before;
    }
    return start - valueOf(vertexOf(last));
}

/// False when nothing lies between the first and the last keypoint.
bool KFSegmentWalk::cyclesOf(Side side, std::uint32_t mode, Tempus const& start, Cycles& cycles) {
    Tempus const minTime = _spline.getMinValueU(kTempusZero, true);
    Tempus const maxTime = _spline.getMaxValueU(kTempusZero, true);
    if (minTime >= maxTime)
        return false;
    Run const run{minTime, maxTime};
    cycles = {minTime, maxTime - minTime, run, run, true, 0.0, side == Side::Before ? minTime : maxTime};
    if (mode == kKFExtrapolationProgressiveRepeat)
        cycles.rise = riseOfCycle(side);
    if (mode != kKFExtrapolationPingPong)
        return true;
    cycles.odd = {maxTime, minTime};
    Tempus const step = _spline.getStep();
    cycles.havePoints = side == Side::Before || !_spline.getState()->retimingExtrapolation;
    if (cycles.havePoints || cycles.length < step || step <= kTempusZero)
        return true;
    if (cycles.length == step) {
        // `mapPingPong` stays at the first keypoint: each piece starts there anew.
        KFVertexIterator const second = _spline.placeAfter(minTime);
        Run const again{minTime, second == _spline.endVertices() ? maxTime : timeAt(second)};
        cycles.anchor = start;
        cycles.length = again.to - again.from;
        cycles.even = cycles.odd = again;
    } else {
        cycles.anchor = maxTime;
        cycles.length = cycles.length - step;
        cycles.even = {minTime + cycles.length, minTime};
        cycles.odd = {minTime + step, maxTime};
    }
    return true;
}

/// What comes between the first and the last of many whole cycles adds nothing to the extremes: a repeat and
/// a ping-pong take the same values again, and a progressive repeat shifts each value further the same way. A
/// spline that is closed or drawn as one function isn't extrapolated, so that its points don't repeat.
bool KFSegmentWalk::maySkipCycles() {
    return _extremes != nullptr && !_spline.isClosed() &&
           _spline.getInterpolator(_spline.getState()->interpolation)->useKeypoints();
}

void KFSegmentWalk::walkCycles(Side side, Cycles const& cycles, Tempus const& start, Tempus const& end) {
    constexpr int neededWhole = 2; // one in each direction
    bool const maySkip = maySkipCycles();
    int whole = 0;
    std::int64_t number = TempusFloorQuotient(start - cycles.anchor, cycles.length);
    Tempus begin = start - TempusModulo(start - cycles.anchor, cycles.length);
    for (Tempus target = start;; target = begin) {
        auto const count = static_cast<double>(number);
        double const offset = cycles.rise * (side == Side::Before ? -count : count);
        Cycle const cycle{number % 2 == 0 ? cycles.even : cycles.odd, begin, offset};
        if (!walkCycle(cycles, cycle, target, end))
            return;
        std::int64_t passed = 1;
        if (whole < neededWhole && target == begin)
            ++whole;
        if (maySkip && whole >= neededWhole) // on to the last whole cycle
            passed = std::max(passed, TempusFloorQuotient(end - begin, cycles.length) - 1);
        // Times so far out that they can't tell two cycles from each other end the walk.
        Tempus const next = begin + cycles.length * TempusMake(passed, 1);
        if (!(next > begin) || !TempusIsNumeric(next) || __builtin_add_overflow(number, passed, &number))
            return;
        begin = next;
    }
}

/// The first vertex behind a source time, as seen on an ascending line, from a place not far away: going
/// backwards a vertex exactly there still lies behind it.
KFVertexIterator KFSegmentWalk::placeBehind(KFVertexIterator place, Tempus const& source,
                                            bool forward) const noexcept {
    if (forward) {
        while (place != _spline.endVertices() && timeAt(place) <= source)
            place = _spline.nextPlace(place);
    } else {
        while (place != _spline.beginVertices() && timeAt(_spline.previousPlace(place)) >= source)
            place = _spline.previousPlace(place);
    }
    return place;
}

/// One cycle from `target` on; false when it came to `end`. The keypoint at the end of a cycle is left to the
/// next one.
bool KFSegmentWalk::walkCycle(Cycles const& cycles, Cycle const& cycle, Tempus target, Tempus const& end) {
    Run const& run = cycle.run;
    bool const forward = run.isForward();
    Tempus source = run.at(target - cycle.begin);
    KFVertexIterator behind = _spline.placeAfter(source);
    for (;;) {
        if (forward ? source >= run.to : source <= run.to)
            return true;
        behind = placeBehind(behind, source, forward);
        KFVertex* const first =
            behind == _spline.beginVertices() ? nullptr : _spline.vertexAt(_spline.previousPlace(behind));
        KFVertex* const second = behind == _spline.endVertices() ? nullptr : _spline.vertexAt(behind);
        KFVertex const* const here = forward ? first : second;
        bool const isPoint = here != nullptr && here->getValueU() == source && target != cycles.outerBound;
        if (cycles.havePoints && isPoint)
            visitPoint(target);
        if (target >= end)
            return false;

        KFVertex const* const ahead = forward ? second : first;
        Tempus nextSource = run.to;
        if (ahead != nullptr) {
            nextSource = forward ? TempusMinimum(run.to, ahead->getValueU())
                                 : TempusMaximum(run.to, ahead->getValueU());
        }
        Tempus nextTarget = cycle.begin + run.until(nextSource);
        if (nextTarget > end) {
            nextSource = run.at(end - cycle.begin);
            nextTarget = end;
        }
        if (first != nullptr && second != nullptr && target < nextTarget)
            visitPiece({first, second, source, nextSource, target, nextTarget, cycle.offset});
        source = nextSource;
        target = nextTarget;
    }
}
