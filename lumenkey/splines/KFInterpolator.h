#pragma once

#include "lumenkey/foundation/BXExport.h"
#include "lumenkey/foundation/Tempus.h"
#include "lumenkey/splines/KFInterpolation.h"

#include <vector>

class KFSpline;

/// A strategy that computes one segment of a spline, between a vertex and the next valid one, at a position.
///
/// Common to all operations: `vA` and `vB` are handles of the segment's ends and aren't null; `t` is the time
/// at which the vertices are read, which only vertices whose attributes move look at. Where the U of vA lies
/// after that of vB, which happens on the segment that closes a spline, the segment ends `getSmallDeltaU`
/// after vA.
///
/// Threads: a strategy takes no lock. Shared strategies have no state; those that belong to one spline change
/// their tables while they evaluate, under the spline's lock.
class LUMENKEY_API KFInterpolator {
public:
    // The order of the virtual operations is the interface that hosts derive from: never reorder.

    virtual ~KFInterpolator();

    /// Renews what the strategy keeps about the spline.
    virtual void init(KFSpline& spline, Tempus const& t);
    /// The value at `u`, or the slope when `derivative` is set and the strategy knows one: strategies that
    /// don't give the value then too. `parametric` is the setting of the spline.
    virtual double interpolate(KFSpline& spline, Tempus const& t, void* vA, void* vB, Tempus const& u,
                               bool parametric, bool derivative) = 0;
    /// Gives `newVertex`, which was placed into the segment, the value that keeps the curve.
    virtual void subDivide(KFSpline& spline, Tempus const& t, void* vA, void* vB, void* newVertex) = 0;
    /// Turns a handle into a tangent in place; each target may be null.
    virtual void convertHandlesToTangents(KFSpline& spline, double* u, double* v);
    virtual void convertTangentsToHandles(KFSpline& spline, double* u, double* v);
    virtual bool useTangents();
    /// False for a strategy that draws the whole spline as one function of its control points.
    virtual bool useKeypoints();
    /// The end and the start of the spline's range, given the U of the last and first vertex.
    virtual Tempus getAdjustedMaxU(KFSpline& spline, Tempus const& t, Tempus const& u);
    virtual Tempus getAdjustedMinU(KFSpline& spline, Tempus const& t, Tempus const& u);
    virtual bool needInit(KFSpline& spline);
    /// Appends the positions between `lowU` and `highU` at which the segment has `value`; false when it knows
    /// none.
    virtual bool uForCurveValue(KFSpline& spline, void* vA, void* vB, Tempus const& lowU, Tempus const& highU,
                                double value, std::vector<Tempus>& out);
    /// The position at which a segment that eases in time is read.
    virtual Tempus easeTime(KFSpline& spline, Tempus const& u, void* vA, void* vB);
};

/// An interpolator that a channel hands to the node of its curve. It draws the segments for which it is
/// active.
class LUMENKEY_API KFCustomInterpolator : public KFInterpolator {
public:
    virtual bool isActive(KFSpline& spline, void* vA) = 0;
};
