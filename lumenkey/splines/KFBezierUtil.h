#pragma once

#include "lumenkey/foundation/BXExport.h"

/// The cubic with control values p[0] to p[3] at `t`.
LUMENKEY_API double KFBezierEval(double const* p, double t) noexcept;

/// The number of real parameters at which the cubic has `value`, written ascending to `roots`, which has room
/// for three. A leading coefficient below 1e-7 counts as 0.
LUMENKEY_API int KFBezierGetRoots(double const* p, double value, double* roots) noexcept;

/// The parameter in 0 to 1 at which the cubic has `value`: of several roots the one nearest to 0..1, the
/// later on a tie, clamped. Without a root, which a proper polygon doesn't know, the clamped fraction of the
/// way from p[0] to p[3] at which the value lies.
LUMENKEY_API double KFBezierFindParameter(double const* p, double value) noexcept;

/// Keeps the polygon of U from folding back: where U(t) would turn back inside the segment, the handles are
/// shortened to where it just doesn't, and the handles of V with them, which keeps their direction.
LUMENKEY_API void KFBezierSanitizeControlPolygon(double* polygonU, double* polygonV) noexcept;
