#pragma once

#include <cmath>

template <class T> struct BXVector3 {
    T x{};
    T y{};
    T z{};

    constexpr BXVector3& operator+=(BXVector3 const& other) noexcept { return *this = *this + other; }
    constexpr BXVector3& operator-=(BXVector3 const& other) noexcept { return *this = *this - other; }
    constexpr BXVector3& operator*=(T factor) noexcept { return *this = *this * factor; }

    constexpr BXVector3 operator-() const noexcept { return {-x, -y, -z}; }
    friend constexpr BXVector3 operator+(BXVector3 const& a, BXVector3 const& b) noexcept {
        return {a.x + b.x, a.y + b.y, a.z + b.z};
    }
    friend constexpr BXVector3 operator-(BXVector3 const& a, BXVector3 const& b) noexcept {
        return {a.x - b.x, a.y - b.y, a.z - b.z};
    }
    friend constexpr BXVector3 operator*(BXVector3 const& a, T factor) noexcept {
        return {a.x * factor, a.y * factor, a.z * factor};
    }
    friend constexpr BXVector3 operator*(T factor, BXVector3 const& a) noexcept { return a * factor; }
    friend constexpr BXVector3 operator/(BXVector3 const& a, T divisor) noexcept {
        return {a.x / divisor, a.y / divisor, a.z / divisor};
    }
    friend constexpr bool operator==(BXVector3 const&, BXVector3 const&) noexcept = default;

    constexpr T dot(BXVector3 const& other) const noexcept { return x * other.x + y * other.y + z * other.z; }
    constexpr BXVector3 cross(BXVector3 const& other) const noexcept {
        return {y * other.z - z * other.y, z * other.x - x * other.z, x * other.y - y * other.x};
    }
    /// Free of overflow and underflow on the way.
    T length() const noexcept { return std::hypot(x, y, z); }
};
