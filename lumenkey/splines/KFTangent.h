// Internal: not installed.
#pragma once

#include "lumenkey/foundation/Tempus.h"
#include "lumenkey/splines/KFVertex.h"

#include <cmath>

/// The side of a vertex on which a tangent stands.
enum class KFTangentSide { Input, Output };

/// One of the two tangents of a vertex: U in seconds, V in units of the value.
struct KFTangent {
    double u = 0.0;
    double v = 0.0;

    /// A zero stays a positive one.
    KFTangent operator-() const noexcept { return {0.0 - u, 0.0 - v}; }
    KFTangent operator*(double factor) const noexcept { return {u * factor, v * factor}; }
};

/// What is smaller counts as 0: a tangent's U part that cannot be stretched, a difference of values that is
/// none.
inline constexpr double kKFTangentTolerance = 1e-7;

/// A handle, which callers see and which makes the control points, is this many times the tangent that a vertex
/// stores. On a parametric spline tangents make the control points as they are, and callers see a third of them.
inline constexpr int kKFHandlesPerTangent = 12;

/// The U part of a derived tangent, as a fraction of the distance to the neighbour: its handle reaches a third of
/// the way.
inline constexpr double kKFDerivedTangentFraction = 1.0 / (3 * kKFHandlesPerTangent);

inline KFTangent KFTangentRead(KFVertex const& vertex, KFTangentSide side, Tempus const& t) {
    KFTangent tangent;
    if (side == KFTangentSide::Input) {
        vertex.getInputTangents(&tangent.u, &tangent.v, t);
    } else {
        vertex.getOutputTangents(&tangent.u, &tangent.v, t);
    }
    return tangent;
}

inline void KFTangentWrite(KFVertex& vertex, KFTangentSide side, KFTangent const& tangent, Tempus const& t) {
    if (side == KFTangentSide::Input) {
        vertex.setInputTangents(tangent.u, tangent.v, t);
    } else {
        vertex.setOutputTangents(tangent.u, tangent.v, t);
    }
}

inline void KFTangentScale(KFVertex& vertex, KFTangentSide side, double factor, Tempus const& t) {
    KFTangentWrite(vertex, side, KFTangentRead(vertex, side, t) * factor, t);
}

/// The output tangent of `p` that draws a straight line to the later `q`: a third of the way as a handle. The
/// input tangent of `q` is its opposite.
inline KFTangent KFTangentAlongLine(KFVertex const& p, KFVertex const& q) {
    double const distance = TempusGetSeconds((q.getValueU() - p.getValueU()) / kKFHandlesPerTangent);
    double const rise = (q.getValueV(kTempusZero) - p.getValueV(kTempusZero)) / kKFHandlesPerTangent;
    return {distance / 3.0, rise / 3.0};
}

/// Lays both tangents of the segment from `p` to the later `q` along the straight line between them.
inline void KFTangentStraightenSegment(KFVertex& p, KFVertex& q) {
    KFTangent const line = KFTangentAlongLine(p, q);
    KFTangentWrite(p, KFTangentSide::Output, line, kTempusZero);
    KFTangentWrite(q, KFTangentSide::Input, -line, kTempusZero);
}

/// Lays the tangent of `neighbour` flat on `facing`, its side towards `vertex`, when both have the same value
/// at `t`. When that leaves the neighbour with a slope on its other side only, its handles count as broken.
inline void KFTangentFlattenFacing(KFVertex& neighbour, KFTangentSide facing, KFVertex const& vertex,
                                   Tempus const& t) {
    if (!(std::fabs(neighbour.getValueV(t) - vertex.getValueV(t)) < kKFTangentTolerance)) {
        return;
    }
    KFTangentWrite(neighbour, facing, {KFTangentRead(neighbour, facing, t).u, 0.0}, t);
    KFTangentSide const other = facing == KFTangentSide::Input ? KFTangentSide::Output : KFTangentSide::Input;
    if (std::fabs(KFTangentRead(neighbour, other, t).v) >= kKFTangentTolerance) {
        neighbour.setFlag(kKFVertexFlagHandlesBroken);
    }
}
