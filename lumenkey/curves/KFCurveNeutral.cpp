// Operations that this curve refuses: it follows no dynamic curve.
// None changes anything, and those with an answer give false.

#include "lumenkey/curves/KFCurve.h"

// --- Curves of dynamic channels ---

bool KFCurve::generateCurveFromDynamicCurve(Tempus const&, KFDynamicCurve*) { return false; }
