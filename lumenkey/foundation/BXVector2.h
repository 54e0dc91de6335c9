#pragma once

#include <cmath>

template <class T> struct BXVector2 {
    T x{};
    T y{};

    constexpr BXVector2& operator+=(BXVector2 const& other) noexcept { return *this = *this + other; }
    constexpr BXVector2& operator-=(BXVector2 const& other) noexcept { return *this = *this - other; }
    constexpr BXVector2& operator*=(T factor) noexcept { return *this = *this * factor; }

    constexpr BXVector2 operator-() const noexcept { return {-x, -y}; }
    friend constexpr BXVector2 operator+(BXVector2 const& a, BXVector2 const& b) noexcept {
        return {a.x + b.x, a.y + b.y};
    }
    friend constexpr BXVector2 operator-(BXVector2 const& a, BXVector2 const& b) noexcept {
        return {a.x - b.x, a.y - b.y};
    }
    friend constexpr BXVector2 operator*(BXVector2 const& a, T factor) noexcept {
        return {a.x * factor, a.y * factor};
    }
    friend constexpr BXVector2 operator*(T factor, BXVector2 const& a) noexcept { return a * factor; }
    friend constexpr BXVector2 operator/(BXVector2 const& a, T divisor) noexcept {
        return {a.x / divisor, a.y / divisor};
    }
    friend constexpr bool operator==(BXVector2 const&, BXVector2 const&) noexcept = default;

    constexpr T dot(BXVector2 const& other) const noexcept { return x * other.x + y * other.y; }
    /// Free of overflow and underflow on the way.
    T length() const noexcept { return std::hypot(x, y); }
};
