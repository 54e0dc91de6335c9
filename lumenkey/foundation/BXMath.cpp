#include "lumenkey/foundation/BXMath.h"

#include <limits>
#include <utility>

namespace BXMath {
namespace {

/// u * v - x * y with an error of about one unit in the last place, barring overflow and underflow (Kahan).
double differenceOfProducts(double u, double v, double x, double y) noexcept {
    double const p = u * v;
    double const q = x * y;
    double const difference = p - q;
    if (3.0 * std::fabs(difference) >= std::fabs(p) + std::fabs(q)) {
        return difference;
    }
    return difference + (std::fma(u, v, -p) - std::fma(x, y, -q));
}

/// Keeps the finite ones of the two, ascending and without repetition.
int writePair(double first, double second, double& r1, double& r2) noexcept {
    double const low = std::min(first, second) + 0.0; // no negative zero
    double const high = std::max(first, second) + 0.0;
    int count = 0;
    if (std::isfinite(low)) {
        r1 = low;
        count = 1;
    }
    if (std::isfinite(high) && !(count == 1 && high == low)) {
        (count == 0 ? r1 : r2) = high;
        ++count;
    }
    return count;
}

/// Whether squares and products of such numbers neither overflow nor lose bits to underflow.
bool isModerate(double x) noexcept {
    double const size = std::fabs(x);
    return x == 0.0 || (size > 1e-140 && size < 1e140);
}

/// The larger part of -half -+ sqrt(half^2 - a c): the one that has no cancellation.
double largerNumerator(double half, double root) noexcept { return -(half + std::copysign(root, half)); }

/// For coefficients whose products leave the range of a double: x = 2^shift y balances a and c, and the
/// discriminant is taken relative to its larger term.
int extremeQuadratic(double a, double half, double c, double& r1, double& r2) noexcept {
    constexpr int none = -10000;
    int const exponentA = std::ilogb(a);
    int const exponentC = c != 0.0 ? std::ilogb(c) : none;
    int const exponentHalf = half != 0.0 ? std::ilogb(half) : none;
    int const scale = std::max(exponentHalf, (exponentA + exponentC + 1) / 2);
    if (scale < none / 4) {
        return writePair(0.0, 0.0, r1, r2);
    }
    double const scaledA = std::ldexp(a, -exponentA);
    double const scaledHalf = std::ldexp(half, -scale);
    double const scaledC = std::ldexp(c, exponentA - 2 * scale);
    double const discriminant = differenceOfProducts(scaledHalf, scaledHalf, scaledA, scaledC);
    if (discriminant < 0.0) {
        return 0;
    }
    double const numerator = largerNumerator(scaledHalf, std::sqrt(discriminant));
    double const first = std::ldexp(numerator / scaledA, scale - exponentA);
    return writePair(first, discriminant == 0.0 ? first : std::ldexp(c / numerator, -scale), r1, r2);
}

/// The value of the cubic at x with the coefficients b1, c2 of its quotient by (x - root at x).
struct CubicAt {
    CubicAt(double a, double b, double c, double x) noexcept
        : linear(x + a), constant(linear * x + b), value(constant * x + c),
          slope((x + linear) * x + constant) {}
    double linear;
    double constant;
    double value;
    double slope;
};

/// The real root farthest from the inflection point, by Newton's iteration from beyond it, where the steps all go
/// one way. The divisor just above 1 keeps rounding from carrying a step past the root; the first step that gains
/// nothing ends the search.
double isolatedRoot(double a, double b, double c) noexcept {
    double x = -a / 3.0;
    CubicAt at(a, b, c, x);
    double const side = at.value < 0.0 ? -1.0 : 1.0;
    double reach = std::cbrt(std::fabs(at.value));
    if (at.slope < 0.0) {
        reach = 1.324718 * std::max(reach, std::sqrt(-at.slope));
    }
    double next = x - side * reach;
    constexpr int stepLimit = 200; // never met; bounds the loop should a platform round otherwise
    for (int step = 0; step < stepLimit && next != x; ++step) {
        x = next;
        at = CubicAt(a, b, c, x);
        next = at.slope == 0.0 ? x : x - at.value / at.slope / (1.0 + 0x1p-50);
        if (side * next <= side * x) {
            break;
        }
    }
    return x;
}

/// `isolatedRoot` with the coefficients scaled to x = 2^shift y where cubes would leave the range.
double isolatedRootInRange(double a, double b, double c) noexcept {
    bool const belowLimit = std::fabs(a) < 1e50 && std::fabs(b) < 1e100 && std::fabs(c) < 1e150;
    if (belowLimit && (std::fabs(a) > 1e-50 || std::fabs(b) > 1e-100 || std::fabs(c) > 1e-150)) {
        return isolatedRoot(a, b, c);
    }
    int shift = std::ilogb(c) / 3;
    shift = a != 0.0 ? std::max(shift, std::ilogb(a)) : shift;
    shift = b != 0.0 ? std::max(shift, std::ilogb(b) / 2) : shift;
    double const root =
        isolatedRoot(std::ldexp(a, -shift), std::ldexp(b, -2 * shift), std::ldexp(c, -3 * shift));
    return std::ldexp(root, shift);
}

/// The roots that the cubic has beside `root`.
int remainingPair(double a, double b, double c, double root, double& r1, double& r2) noexcept {
    double linear = root + a;
    double constant = linear * root + b;
    if (std::fabs(root * root * root) > std::fabs(c)) {
        constant = -c / root;
        linear = (constant - b) / root;
    }
    // Near the middle m of the pair the cubic is (m - root) ((x - m)^2 - quarter). Where that differs from touching
    // the axis at m by less than the rounding of the cubic's own terms, the two are one double root.
    double const middle = -0.5 * linear;
    double const quarter = differenceOfProducts(middle, middle, 1.0, constant);
    double const size = std::fabs(middle);
    double const terms = ((size + std::fabs(a)) * size + std::fabs(b)) * size + std::fabs(c);
    constexpr double rounding = 8.0 * 0x1p-53;
    if (std::isfinite(terms) && std::fabs(quarter) * std::fabs(middle - root) <= rounding * terms) {
        r1 = middle;
        return 1;
    }
    return quadratic(1.0, linear, constant, r1, r2, 0.0);
}

} // namespace

bool equal(Tempus const& a, Tempus const& b, Tempus const& tolerance) noexcept {
    if (a == b) {
        return true;
    }
    return TempusIsNumeric(a) && TempusIsNumeric(b) && TempusAbsoluteValue(a - b) <= tolerance;
}

Tempus mod(Tempus const& a, Tempus const& b) noexcept { return TempusModulo(a, b); }

int quadratic(double a, double b, double c, double& r1, double& r2, double tolerance) noexcept {
    if (!std::isfinite(a) || !std::isfinite(b) || !std::isfinite(c)) {
        return 0;
    }
    if (a == 0.0 || std::fabs(a) <= tolerance) {
        double const root = -c / b + 0.0;
        if (b == 0.0 || !std::isfinite(root)) {
            return 0;
        }
        r1 = root;
        return 1;
    }
    double const half = 0.5 * b;
    if (!isModerate(a) || !isModerate(half) || !isModerate(c)) {
        return extremeQuadratic(a, half, c, r1, r2);
    }
    double const discriminant = differenceOfProducts(half, half, a, c);
    if (discriminant < 0.0) {
        return 0;
    }
    if (discriminant == 0.0) {
        r1 = -half / a + 0.0;
        return 1;
    }
    double const numerator = largerNumerator(half, std::sqrt(discriminant));
    return writePair(numerator / a, c / numerator, r1, r2);
}

int cubic(double a, double b, double c, double& r1, double& r2, double& r3) noexcept {
    if (!std::isfinite(a) || !std::isfinite(b) || !std::isfinite(c)) {
        r1 = std::numeric_limits<double>::quiet_NaN();
        return 1;
    }
    double roots[3] = {};
    int count = 1;
    if (c == 0.0) {
        count += quadratic(1.0, a, b, roots[1], roots[2], 0.0);
    } else {
        roots[0] = isolatedRootInRange(a, b, c);
        count += remainingPair(a, b, c, roots[0], roots[1], roots[2]);
    }
    // The pair is ascending; the first root finds its place with two exchanges.
    if (count > 1 && roots[0] > roots[1]) {
        std::swap(roots[0], roots[1]);
    }
    if (count > 2 && roots[1] > roots[2]) {
        std::swap(roots[1], roots[2]);
    }
    count = static_cast<int>(std::unique(roots, roots + count) - roots);
    r1 = roots[0] + 0.0;
    if (count > 1) {
        r2 = roots[1] + 0.0;
    }
    if (count > 2) {
        r3 = roots[2] + 0.0;
    }
    return count;
}

} // namespace BXMath
