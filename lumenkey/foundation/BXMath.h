#pragma once

#include <algorithm>
#include <cmath>

#include "lumenkey/foundation/BXExport.h"
#include "lumenkey/foundation/Tempus.h"

namespace BXMath {

// Times ------------------------------------------------------------------------------------------------------

/// Whether the two compare as equal or lie at most `tolerance` apart. Times that are no numbers are equal only to
/// their own kind.
LUMENKEY_API bool equal(Tempus const& a, Tempus const& b, Tempus const& tolerance) noexcept;

/// The position within the cycle of length b: f * b with f the part of a / b above its floor, exactly. The
/// result is `TempusModulo(a, b)`, with its answers for a zero b and for what is no number.
LUMENKEY_API Tempus mod(Tempus const& a, Tempus const& b) noexcept;

/// `low` when x is before it, else `high` when x is after it, else x.
inline Tempus clamp(Tempus const& x, Tempus const& low, Tempus const& high) noexcept {
    return x < low ? low : x > high ? high : x;
}

// Numbers ----------------------------------------------------------------------------------------------------

/// Whether a and b differ by at most `tolerance`; false if one is not a number.
inline bool equal(double a, double b, double tolerance = 1e-7) noexcept {
    return a == b || std::fabs(a - b) <= tolerance;
}

// Polynomials ------------------------------------------------------------------------------------------------
//
// Both solvers return the number of real roots, write them in ascending order, and leave the out-parameters
// beyond that number untouched. A multiple root counts once, and so do roots that round to the same double.

/// Roots of a x^2 + b x + c; `a` counts as 0 if its magnitude is at most `tolerance`. A constant has no root, not
/// even if it is 0. A root beyond the range of a double, and coefficients that are not finite, give none.
///
/// The form free of cancellation of Press et al., "Numerical Recipes", section 5.6, with the compensated
/// discriminant of Kahan, "On the Cost of Floating-Point Computation Without Extra-Precise Arithmetic" (2004):
/// its sign is right unless the products underflow, so a double root is seen as one exactly.
LUMENKEY_API int quadratic(double a, double b, double c, double& r1, double& r2, double tolerance) noexcept;

/// Roots of x^3 + a x^2 + b x + c: 1, 2 or 3 of them, never 0. Coefficients that are not finite give one root,
/// not-a-number.
///
/// Kahan, "To Solve a Real Cubic Equation" (1986), procedure QBC: Newton's iteration from beyond the root that
/// stands farthest from the inflection point, then the quadratic of the other two by the stabler of the two
/// deflations. Two roots closer than the rounding of the coefficients can tell are given as the double root
/// between them, so that a curve which only just touches a value is not reported as missing it. The residual at
/// each root is of the order of the rounding of the cubic's terms there.
LUMENKEY_API int cubic(double a, double b, double c, double& r1, double& r2, double& r3) noexcept;

// Easing -----------------------------------------------------------------------------------------------------

/// A move whose two ramps are known: what a caller keeps that asks for many positions of one move.
class EaseInOut {
public:
    /// A move at constant speed.
    constexpr EaseInOut() noexcept = default;
    EaseInOut(double in, double out) noexcept : _in(in > 0.0 ? in : 0.0), _out(out > 0.0 ? out : 0.0) {
        if (double const ramps = _in + _out; ramps > 1.0) {
            _in = std::min(_in / ramps, 1.0);
            _out = 1.0 - _in;
        }
        _steadySpeed = 2.0 / (2.0 - _in - _out);
        // A ramp covers half of what the steady speed would; rounding must not let the pieces overlap at the seams.
        _outSeam = 1.0 - 0.5 * _steadySpeed * _out;
        _inSeam = std::min(0.5 * _steadySpeed * _in, _outSeam);
    }

    /// The fraction of the way at `p`, which is limited to 0..1; 0 gives 0 and 1 gives 1.
    double fraction(double p) const noexcept {
        p = p > 0.0 ? std::min(p, 1.0) : 0.0;
        if (p < _in) {
            return std::min(0.5 * _steadySpeed * (p * p / _in), _inSeam);
        }
        if (p == 1.0) {
            return 1.0; // the steady piece may arrive a rounding short
        }
        if (p <= 1.0 - _out) {
            return std::min(_inSeam + _steadySpeed * (p - _in), _outSeam);
        }
        double const left = 1.0 - p;
        return std::max(1.0 - 0.5 * _steadySpeed * (left * left / _out), _outSeam);
    }

    /// The derivative of `fraction`.
    double speed(double p) const noexcept {
        p = p > 0.0 ? std::min(p, 1.0) : 0.0;
        if (p < _in) {
            return _steadySpeed * (p / _in);
        }
        return p <= 1.0 - _out ? _steadySpeed : _steadySpeed * ((1.0 - p) / _out);
    }

private:
    double _in = 0.0;
    double _out = 0.0;
    double _steadySpeed = 1.0;
    double _inSeam = 0.0;
    double _outSeam = 1.0;
};

/// The place reached at the fraction `p` of a move from `start` to `end` that gains speed evenly over the first
/// `in` of its time, loses it evenly over the last `out`, and is steady between: the parabolic ease of Parent,
/// "Computer Animation: Algorithms and Techniques", section on ease-in/ease-out by constant acceleration.
///
/// p is limited to 0 .. 1 (not-a-number counts as 0); 0 gives `start` and 1 gives `end` exactly, and between them
/// the result never steps back. `in` and `out` below 0 count as 0; if their sum is above 1 both are scaled down
/// to a sum of 1. With both 0 the move is linear and, from 0.0 to 1.0, gives p itself. `speed` receives the
/// derivative by p, which is continuous while both ramps have a length. Either pointer may be null.
inline void easeInOut(double p, double in, double out, double start, double end, double* result,
                      double* speed) noexcept {
    EaseInOut const move(in, out);
    if (result != nullptr) {
        *result = std::lerp(start, end, move.fraction(p));
    }
    if (speed != nullptr) {
        *speed = move.speed(p) * (end - start);
    }
}

} // namespace BXMath
