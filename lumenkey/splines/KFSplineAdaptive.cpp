// Polylines that spend points only where the curve bends.
//
// Each walk goes from stop to stop, a stop being a valid vertex or an end of the row. A segment between two stops is
// straight, and gets samples at its ends alone, or curved, and gets a row of samples. Stops are found by search, so a
// walk costs O(log n) for each stop and the evaluation of its samples.

#include "lumenkey/splines/KFSpline.h"

#include "lumenkey/foundation/BXMath.h"
#include "lumenkey/splines/KFSplineAccess.h"
#include "lumenkey/splines/KFSplineSamples.h"
#include "lumenkey/splines/KFVertex.h"

#include <cmath>
#include <limits>

namespace {

using KFSampling::sampleOne;
using KFSampling::sampleUniform;

/// The vertices between which a segment is judged; null where the curve goes on without one. The second may stand
/// behind the end of the walk.
struct Segment {
    KFVertex* start = nullptr;
    KFVertex* next = nullptr;
};

/// What makes a Bezier segment straight: flat handles or flat tangents at its ends, or nothing.
enum class FlatBezier { IsCurved, ByHandles, ByTangents };

Segment segmentFrom(KFSpline& spline, Tempus const& current) {
    void* next = nullptr;
    spline.getNextValidVertex(current, &next, kTempusZero, false);
    void* start = nullptr;
    if (!spline.getVertexHandle(current, &start, false)) {
        spline.getPreviousValidVertex(current, &start, kTempusZero, false);
    }
    return {static_cast<KFVertex*>(start), static_cast<KFVertex*>(next)};
}

/// The stop behind `current`: the next vertex unless it stands after `end`, by `slack` or more. In a spline that a
/// mirroring warp has left out of order the walk still goes forward.
Tempus stopAfter(Tempus const& current, Segment const& segment, Tempus const& end, Tempus const& slack) {
    if (segment.next == nullptr) {
        return end;
    }
    Tempus const u = segment.next->getValueU();
    bool const beyond = u > end && u - end >= slack;
    return beyond || u <= current ? end : u;
}

bool isSmall(double x) { return std::fabs(x) < 1e-7; }

bool isFlatBezier(KFSpline& spline, Segment const& segment, FlatBezier rule) {
    double inU = 0.0, inV = 0.0, outU = 0.0, outV = 0.0;
    if (rule == FlatBezier::ByHandles) {
        spline.getVertexInputHandles(segment.next, &inU, &inV, kTempusZero, true);
        spline.getVertexOutputHandles(segment.start, &outU, &outV, kTempusZero, true);
    } else {
        segment.next->getInputTangents(&inU, &inV, kTempusZero);
        segment.start->getOutputTangents(&outU, &outV, kTempusZero);
    }
    return isSmall(inU) && isSmall(inV) && isSmall(outU) && isSmall(outV);
}

bool isStraight(KFSpline& spline, Segment const& segment, FlatBezier rule) {
    if (segment.start == nullptr) {
        return segment.next != nullptr && spline.getExtrapolation(1) <= kKFExtrapolationLinear;
    }
    if (segment.next == nullptr) {
        return spline.getExtrapolation(0) <= kKFExtrapolationLinear;
    }
    std::uint32_t const type = segment.start->getInterpolation();
    if (type == kKFInterpolationBezier && rule != FlatBezier::IsCurved) {
        return isFlatBezier(spline, segment, rule);
    }
    return type == kKFInterpolationLinear;
}

/// How many steps fit into a length; 0 where that is no number.
std::uint32_t wholeSteps(Tempus const& length, Tempus const& step) {
    double const steps = TempusGetSeconds(length) / TempusGetSeconds(step);
    if (!std::isfinite(steps) || steps < 1.0) {
        return 0;
    }
    constexpr std::uint32_t most = std::numeric_limits<std::int32_t>::max();
    return steps >= most ? most : static_cast<std::uint32_t>(steps);
}

/// The walk of `sampleSplineSegments`: each stop once, the end exactly.
class SegmentWalk {
public:
    SegmentWalk(KFSpline& spline, std::vector<Tempus>& times, std::vector<double>& values)
        : _spline(spline), _times(times), _sink(&times, &values) {}

    void add(Tempus const& u) { sampleOne(_spline, u, kTempusZero, _sink); }

    void addUnlessLast(Tempus const& u) {
        if (!isLast(u)) {
            add(u);
        }
    }

    void walk(Tempus const& start, Tempus const& end, Tempus const& step) {
        Tempus next;
        for (Tempus current = start; current < end; current = next) {
            Segment const segment = segmentFrom(_spline, current);
            next = stopAfter(current, segment, end, kTempusZero);
            if (isStraight(_spline, segment, FlatBezier::ByTangents)) {
                addUnlessLast(current);
                add(next);
            } else {
                std::uint32_t const first = isLast(current) ? 1 : 0;
                std::uint32_t const steps = wholeSteps(next - current, step);
                sampleUniform(_spline, current, step, first, steps + 1 - first, kTempusZero, _sink);
            }
        }
        addUnlessLast(end);
    }

private:
    bool isLast(Tempus const& u) const {
        return !_times.empty() && BXMath::equal(_times.back(), u, kTempusZero);
    }

    KFSpline& _spline;
    std::vector<Tempus>& _times;
    KFSampleSink _sink;
};

} // namespace

std::uint32_t KFSampling::walkIntoArrays(KFSpline& spline, Tempus const& start, Tempus const& step,
                                         std::uint32_t count, Tempus const& t, KFSampleSink& sink) {
    Tempus const end = position(start, step, count);
    Tempus next;
    for (Tempus current = start; current < end; current = next) {
        Segment const segment = segmentFrom(spline, current);
        next = stopAfter(current, segment, end, step);
        std::uint32_t const first = sink.written() == 0 ? 0 : 1;
        if (isStraight(spline, segment, FlatBezier::ByHandles)) {
            if (first == 0) {
                sampleOne(spline, current, t, sink);
            }
            sampleOne(spline, next, t, sink);
        } else if (std::uint32_t const steps = wholeSteps(next - current, step); steps > first) {
            sampleUniform(spline, current, step, first, steps - first, t, sink);
        }
    }
    return sink.written();
}

std::uint32_t KFSampling::walkIntoVectors(KFSpline& spline, Tempus const& start, Tempus const& step,
                                          std::uint32_t count, Tempus const& t, KFSampleSink& sink) {
    Tempus const end = count == 0 ? start : position(start, step, count - 1);
    Tempus next;
    for (Tempus current = start; current < end; current = next) {
        Segment const segment = segmentFrom(spline, current);
        next = stopAfter(current, segment, end, kTempusZero);
        if (isStraight(spline, segment, FlatBezier::IsCurved)) {
            sampleOne(spline, current, t, sink);
            sampleOne(spline, next, t, sink);
        } else {
            sampleUniform(spline, current, step, 0, wholeSteps(next - current, step), t, sink);
        }
    }
    return sink.written();
}

bool KFSpline::sampleSplineSegments(Tempus const& start, Tempus const& end, Tempus const& step,
                                    std::vector<Tempus>* times, std::vector<double>* values) {
    times->clear();
    values->clear();
    if (end < start) {
        return false;
    }
    bool const isOneSample = start == end || step <= kTempusZero;
    {
        KFSplineAccess access(*this);
        SegmentWalk walk(*this, *times, *values);
        if (isOneSample) {
            walk.add(start);
            return true;
        }
        if (KFSampling::wholeCurveStrategy(*this) == nullptr) {
            if (getNumberOfValidVertices(kTempusZero) < 2) {
                walk.add(start);
                walk.add(end);
            } else {
                walk.walk(start, end, step);
            }
            return true;
        }
    }
    // `sampleSpline` takes the lock itself.
    std::uint32_t count = wholeSteps(end - start, step);
    return sampleSpline(start, step, count, times, values, kTempusZero, false);
}
