#include "lumenkey/splines/KFBezierUtil.h"

#include "lumenkey/foundation/BXMath.h"
#include "lumenkey/splines/KFCubic.h"

#include <algorithm>
#include <cmath>

double KFBezierEval(double const* p, double t) noexcept { return KFCubic::fromBezier(p)(t); }

int KFBezierGetRoots(double const* p, double value, double* roots) noexcept {
    KFCubic const cubic = KFCubic::fromBezier(p);
    double const constant = cubic.c0 - value;
    if (std::fabs(cubic.c3) < 1e-7) {
        return BXMath::quadratic(cubic.c2, cubic.c1, constant, roots[0], roots[1], 0.0);
    }
    return BXMath::cubic(cubic.c2 / cubic.c3, cubic.c1 / cubic.c3, constant / cubic.c3, roots[0], roots[1],
                         roots[2]);
}

namespace {

double distanceFromUnit(double root) noexcept { return root < 0.0 ? -root : root > 1.0 ? root - 1.0 : 0.0; }

double clampToUnit(double fraction) noexcept {
    return fraction > 0.0 ? std::min(fraction, 1.0) : 0.0; // not-a-number counts as 0
}

} // namespace

double KFBezierFindParameter(double const* p, double value) noexcept {
    double roots[3] = {};
    int const count = KFBezierGetRoots(p, value, roots);
    if (count == 0) {
        return clampToUnit((value - p[0]) / (p[3] - p[0]));
    }
    double nearest = roots[0];
    for (int i = 1; i < count; ++i) {
        if (!(distanceFromUnit(nearest) < distanceFromUnit(roots[i]))) {
            nearest = roots[i];
        }
    }
    return clampToUnit(nearest);
}

// With handles that reach d1 forward from the start and d2 back from the end, U'(t) has two roots inside when
// the handles overlap by too much. The polygons that just don't fold have a double root, at a parameter s:
//
//     U'(t) = 3 (U3 - U0) / (1 - 3 s + 3 s^2) * (t - s)^2
//
// whose handles are s^2 / g and (1 - s)^2 / g with g = (1 - 3 s + 3 s^2) / (U3 - U0). The s chosen keeps the
// proportion of the handles, s^2 : (1 - s)^2 = d1 : d2. Their sum is above 2/3 then, so one of them at least
// is long.
void KFBezierSanitizeControlPolygon(double* polygonU, double* polygonV) noexcept {
    double const start = polygonU[0];
    double const end = polygonU[3];
    // With both inner points between the outer ones U'(t), whose Bezier values are then such that the square
    // of the middle one doesn't exceed the product of the others, has no two roots: nothing to solve.
    if (start <= polygonU[1] && polygonU[1] <= end && start <= polygonU[2] && polygonU[2] <= end) {
        return;
    }
    double const a = -3.0 * start + 9.0 * polygonU[1] - 9.0 * polygonU[2] + 3.0 * end;
    if (!(a > 0.0)) {
        return;
    }
    double const b = 6.0 * start - 12.0 * polygonU[1] + 6.0 * polygonU[2];
    double const slowest = -b / (2.0 * a);
    if (!(slowest >= 0.0 && slowest <= 1.0)) {
        return;
    }
    double r1 = 0.0;
    double r2 = 0.0;
    if (BXMath::quadratic(a, b, -3.0 * start + 3.0 * polygonU[1], r1, r2, 0.0) != 2) {
        return;
    }
    double const d1 = polygonU[1] - start;
    double const d2 = end - polygonU[2];
    // Only vertices of foreign classes have handles that point away from the segment.
    double const root1 = std::sqrt(std::max(d1, 0.0));
    double const root2 = std::sqrt(std::max(d2, 0.0));
    double const s = std::fabs(d1 - d2) < 1e-7 ? 0.5 : root1 / (root1 + root2);
    double const g = (1.0 - 3.0 * s + 3.0 * s * s) / (end - start);
    double const newU1 = start + s * s / g;
    double const newU2 = start + (2.0 * s * s - s) / g;
    double const shortening = d2 <= d1 ? (newU1 - start) / d1 : (end - newU2) / d2;
    polygonU[1] = newU1;
    polygonU[2] = newU2;
    polygonV[1] = polygonV[0] + (polygonV[1] - polygonV[0]) * shortening;
    polygonV[2] = polygonV[3] + (polygonV[2] - polygonV[3]) * shortening;
}
