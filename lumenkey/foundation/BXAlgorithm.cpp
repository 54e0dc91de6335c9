#include "lumenkey/foundation/BXAlgorithm.h"

#include <algorithm>
#include <cmath>

namespace BXAlgorithm {
namespace {

void subdivide(double const* p, double t, double* left, double* right) noexcept {
    if (p == nullptr) {
        return;
    }
    double const p01 = std::lerp(p[0], p[1], t);
    double const p12 = std::lerp(p[1], p[2], t);
    double const p23 = std::lerp(p[2], p[3], t);
    double const p012 = std::lerp(p01, p12, t);
    double const p123 = std::lerp(p12, p23, t);
    double const cut = std::lerp(p012, p123, t);
    double const leftPart[4] = {p[0], p01, p012, cut};
    double const rightPart[4] = {cut, p123, p23, p[3]};
    if (left != nullptr) {
        std::copy_n(leftPart, 4, left);
    }
    if (right != nullptr) {
        std::copy_n(rightPart, 4, right);
    }
}

} // namespace

void DeCasteljauSubdivide(double low, double high, double at, double const* x, double const* y,
                          double const* z, double* leftX, double* leftY, double* leftZ, double* rightX,
                          double* rightY, double* rightZ) noexcept {
    double const t = high == low ? 0.0 : (at - low) / (high - low);
    subdivide(x, t, leftX, rightX);
    subdivide(y, t, leftY, rightY);
    subdivide(z, t, leftZ, rightZ);
}

} // namespace BXAlgorithm
