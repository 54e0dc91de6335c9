// The truth beside Tempus: rationals of unlimited size (1,536 bits), by schoolbook arithmetic and without division.
#pragma once

#include <array>
#include <bit>
#include <cmath>
#include <cstddef>
#include <cstdint>
#include <cstdlib>

#include "lumenkey/foundation/Tempus.h"

/// A number from 0 to below 2^1536; a result beyond that ends the program.
class Natural {
public:
    Natural(uint64_t n = 0) : _limbs{static_cast<uint32_t>(n), static_cast<uint32_t>(n >> 32)} {}

    bool isZero() const { return _limbs == std::array<uint32_t, kLimbs>{}; }
    bool isEven() const { return (_limbs[0] & 1) == 0; }

    friend int compare(Natural const& a, Natural const& b) {
        for (std::size_t i = kLimbs; i-- > 0;) {
            if (a._limbs[i] != b._limbs[i]) {
                return a._limbs[i] < b._limbs[i] ? -1 : 1;
            }
        }
        return 0;
    }
    friend Natural operator+(Natural const& a, Natural const& b) {
        Natural sum;
        uint64_t carry = 0;
        for (std::size_t i = 0; i < kLimbs; ++i) {
            carry += uint64_t{a._limbs[i]} + b._limbs[i];
            sum._limbs[i] = static_cast<uint32_t>(carry);
            carry >>= 32;
        }
        return carry == 0 ? sum : outOfRange();
    }
    friend Natural operator-(Natural const& a, Natural const& b) {
        Natural difference;
        int64_t borrow = 0;
        for (std::size_t i = 0; i < kLimbs; ++i) {
            borrow += int64_t{a._limbs[i]} - int64_t{b._limbs[i]};
            difference._limbs[i] = static_cast<uint32_t>(borrow);
            borrow >>= 32;
        }
        return borrow == 0 ? difference : outOfRange();
    }
    friend Natural operator*(Natural const& a, Natural const& b) {
        Natural product;
        for (std::size_t i = 0; i < kLimbs; ++i) {
            uint64_t carry = 0;
            for (std::size_t j = 0; a._limbs[i] != 0 && (j < kLimbs || carry != 0); ++j) {
                uint64_t const digit = j < kLimbs ? b._limbs[j] : 0;
                if (i + j >= kLimbs) {
                    if (digit != 0 || carry != 0) {
                        return outOfRange();
                    }
                    break;
                }
                carry += a._limbs[i] * digit + product._limbs[i + j];
                product._limbs[i + j] = static_cast<uint32_t>(carry);
                carry >>= 32;
            }
        }
        return product;
    }
    Natural half() const {
        Natural result;
        for (std::size_t i = 0; i < kLimbs; ++i) {
            uint32_t const above = i + 1 < kLimbs ? _limbs[i + 1] : 0;
            result._limbs[i] = (_limbs[i] >> 1) | (above << 31);
        }
        return result;
    }
    static Natural powerOfTwo(int exponent) {
        Natural result;
        result._limbs.at(static_cast<std::size_t>(exponent / 32)) = uint32_t{1} << (exponent % 32);
        return result;
    }

private:
    static constexpr std::size_t kLimbs = 48;
    [[noreturn]] static Natural outOfRange() { std::abort(); }

    std::array<uint32_t, kLimbs> _limbs{};
};

struct SlowRational {
    bool negative = false;
    Natural numerator = 0;
    Natural denominator = 1;

    static SlowRational of(int64_t value, int64_t over = 1) {
        auto const size = [](int64_t n) {
            return n < 0 ? ~static_cast<uint64_t>(n) + 1 : static_cast<uint64_t>(n);
        };
        return {(value < 0) != (over < 0), size(value), size(over)};
    }
    static SlowRational of(Tempus const& t) { return of(t.value, t.timescale); }
    static SlowRational of(double x) {
        int exponent = 0;
        double const fraction = std::frexp(x, &exponent);
        SlowRational r = of(static_cast<int64_t>(std::ldexp(fraction, 53)));
        exponent -= 53;
        Natural& scaled = exponent > 0 ? r.numerator : r.denominator;
        scaled = scaled * Natural::powerOfTwo(std::abs(exponent));
        return r;
    }

    friend int compare(SlowRational const& a, SlowRational const& b) {
        SlowRational const difference = a - b;
        return difference.numerator.isZero() ? 0 : difference.negative ? -1 : 1;
    }
    friend SlowRational operator+(SlowRational const& a, SlowRational const& b) {
        Natural const left = a.numerator * b.denominator;
        Natural const right = b.numerator * a.denominator;
        Natural const denominator = a.denominator * b.denominator;
        if (a.negative == b.negative) {
            return {a.negative, left + right, denominator};
        }
        bool const leftLarger = compare(left, right) >= 0;
        return {leftLarger ? a.negative : b.negative, leftLarger ? left - right : right - left, denominator};
    }
    friend SlowRational operator-(SlowRational const& a, SlowRational b) {
        b.negative = !b.negative;
        return a + b;
    }
    friend SlowRational operator*(SlowRational const& a, SlowRational const& b) {
        return {a.negative != b.negative, a.numerator * b.numerator, a.denominator * b.denominator};
    }
    friend SlowRational operator/(SlowRational const& a, SlowRational const& b) {
        return a * SlowRational{b.negative, b.denominator, b.numerator};
    }
};

/// Binary, by Stein: halves and differences only.
inline Natural greatestCommonDivisor(Natural a, Natural b) {
    Natural twos = 1;
    while (!a.isZero() && !b.isZero()) {
        if (a.isEven() && b.isEven()) {
            twos = twos + twos;
        }
        bool const bothOdd = !a.isEven() && !b.isEven();
        if (bothOdd) {
            (compare(a, b) >= 0 ? a : b) = compare(a, b) >= 0 ? a - b : b - a;
        } else {
            bool const evenA = a.isEven();
            bool const evenB = b.isEven();
            a = evenA ? a.half() : a;
            b = evenB ? b.half() : b;
        }
    }
    return (a.isZero() ? b : a) * twos;
}
