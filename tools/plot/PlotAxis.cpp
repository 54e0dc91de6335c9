#include "tools/plot/PlotAxis.h"

#include <algorithm>
#include <array>
#include <charconv>
#include <cmath>

namespace lumenkey::tools {

namespace {

/// So that differences of two ends stay finite.
constexpr double kGreatest = 1e300;
/// Ranges narrower than this share of their values have no room for doubles between ticks.
constexpr double kNarrowest = 1e-9;
/// Magnitudes below this are drawn as 0.
constexpr double kLeast = 1e-300;

double niceStep(double raw) {
    double const power = std::pow(10, std::floor(std::log10(raw)));
    for (double const factor : {1.0, 2.0, 5.0}) {
        if (factor * power >= raw) {
            return factor * power;
        }
    }
    return 10 * power;
}

std::string labelOf(double value, double step) {
    std::array<char, 64> buffer{};
    bool const plain = std::abs(value) < 1e7 && step >= 1e-6;
    int const decimals = std::max(0, static_cast<int>(-std::floor(std::log10(step * 1.0000001))));
    auto const result = plain ? std::to_chars(buffer.data(), buffer.data() + buffer.size(), value,
                                              std::chars_format::fixed, decimals)
                              : std::to_chars(buffer.data(), buffer.data() + buffer.size(), value,
                                              std::chars_format::general, 6);
    std::string label(buffer.data(), static_cast<std::size_t>(result.ptr - buffer.data()));
    // A real minus sign is as wide as a plus.
    return label.starts_with('-') ? "\u2212" + label.substr(1) : label;
}

} // namespace

PlotRange PlotRange::sound(double low, double high) {
    low = std::isnan(low) ? 0 : std::clamp(low, -kGreatest, kGreatest);
    high = std::isnan(high) ? 0 : std::clamp(high, -kGreatest, kGreatest);
    if (high < low) {
        std::swap(low, high);
    }
    double const magnitude = std::max(std::abs(low), std::abs(high));
    if (magnitude < kLeast) {
        return {-0.5, 0.5};
    }
    if (high - low <= magnitude * kNarrowest) {
        double const room = magnitude * 0.1;
        return {low - room, high + room};
    }
    return {low, high};
}

PlotRange PlotRange::padded(double share) const {
    double const room = (high - low) * share;
    return {low - room, high + room};
}

std::vector<PlotTick> ticksWithin(PlotRange const& range, int most) {
    double const step = niceStep((range.high - range.low) / std::max(most, 1));
    double const first = std::ceil(range.low / step);
    double const last = std::floor(range.high / step);
    std::vector<PlotTick> ticks;
    for (double i = first; i <= last && static_cast<int>(ticks.size()) <= most; ++i) {
        double const value = i == 0 ? 0 : i * step; // never minus zero
        ticks.push_back({value, labelOf(value, step)});
    }
    return ticks;
}

} // namespace lumenkey::tools
