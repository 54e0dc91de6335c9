// Internal: not installed.
#pragma once

#include "lumenkey/foundation/Tempus.h"
#include "lumenkey/splines/KFSpline.h"
#include "lumenkey/splines/KFVertex.h"

/// The slope at `u` of a curve over the whole spline: the difference of its values 1/1000 before and after,
/// or one of the two and its value at `u` where the other would lie outside the spline.
template <class ValueAt> double KFSlopeOfWholeCurve(KFSpline& spline, Tempus const& u, ValueAt valueAt) {
    Tempus const delta = TempusMake(1, 1000);
    Tempus const before = BX_TempusSaferSubtract(u, delta);
    Tempus const after = BX_TempusSaferAdd(u, delta);
    if (before < spline.getMinValueU(kTempusZero, false)) {
        return (valueAt(after) - valueAt(u)) / 0.001;
    }
    if (after > spline.getMaxValueU(kTempusZero, false)) {
        return (valueAt(u) - valueAt(before)) / 0.001;
    }
    return (valueAt(after) - valueAt(before)) / 0.002;
}

/// Puts a vertex on the chord between two others. All handles are vertices.
inline void KFSetValueOnChord(Tempus const& t, void* vA, void* vB, void* newVertex) {
    KFVertex const& a = *static_cast<KFVertex*>(vA);
    KFVertex const& b = *static_cast<KFVertex*>(vB);
    KFVertex& added = *static_cast<KFVertex*>(newVertex);
    double const valueA = a.getValueV(t);
    double const span = TempusSecondsBetween(a.getValueU(), b.getValueU());
    double const elapsed = TempusSecondsBetween(a.getValueU(), added.getValueU());
    double const slope = span == 0.0 ? 0.0 : (b.getValueV(t) - valueA) / span;
    added.setValueV(valueA + elapsed * slope, kTempusZero);
}
