#include "tools/plot/PlotShortening.h"

#include <array>
#include <charconv>
#include <cmath>

namespace lumenkey::tools {

namespace {

constexpr double kSeenPixels = 0.05;
/// So many points at most are left out in a row, which bounds the work for each.
constexpr std::size_t kMostLeftOut = 100;
constexpr int kDecimals = 2;

/// From the straight line between two others, whichever way round; not a number for what is none.
double distanceFromLine(PlotPoint const& point, PlotPoint const& from, PlotPoint const& to) {
    double const x = to.x - from.x;
    double const y = to.y - from.y;
    double const squared = x * x + y * y;
    double const share = ((point.x - from.x) * x + (point.y - from.y) * y) / squared;
    double const nearest = squared > 0 ? std::fmin(std::fmax(share, 0), 1) : 0;
    return std::hypot(point.x - from.x - nearest * x, point.y - from.y - nearest * y);
}

bool isStraight(std::vector<PlotPoint> const& points, std::size_t first, std::size_t last) {
    for (std::size_t i = first + 1; i < last; ++i) {
        if (!(distanceFromLine(points[i], points[first], points[last]) <= kSeenPixels)) {
            return false;
        }
    }
    return true;
}

bool isDigit(char c) { return c >= '0' && c <= '9'; }

void appendShort(std::string& text, std::string_view number) {
    double value = 0;
    std::from_chars(number.data(), number.data() + number.size(), value);
    std::array<char, 400> buffer{};
    auto const result = std::to_chars(buffer.data(), buffer.data() + buffer.size(), value,
                                      std::chars_format::fixed, kDecimals);
    std::string_view rounded(buffer.data(), static_cast<std::size_t>(result.ptr - buffer.data()));
    while (rounded.ends_with('0')) {
        rounded.remove_suffix(1);
    }
    rounded.remove_suffix(rounded.ends_with('.') ? 1 : 0);
    text += rounded;
}

} // namespace

std::vector<PlotPoint> withoutStraightPoints(std::vector<PlotPoint> const& points) {
    std::vector<PlotPoint> kept;
    for (std::size_t first = 0; first < points.size();) {
        kept.push_back(points[first]);
        std::size_t next = first + 1;
        while (next + 1 < points.size() && next - first < kMostLeftOut &&
               isStraight(points, first, next + 1)) {
            ++next;
        }
        first = next;
    }
    return kept;
}

std::string withShortNumbers(std::string_view svg) {
    std::string shortened;
    for (std::size_t i = 0; i < svg.size();) {
        std::size_t end = i;
        while (end < svg.size() && isDigit(svg[end])) {
            ++end;
        }
        std::size_t const point = end;
        bool const hasPoint = end > i && end + 1 < svg.size() && svg[end] == '.' && isDigit(svg[end + 1]);
        for (end += hasPoint ? 1 : 0; hasPoint && end < svg.size() && isDigit(svg[end]); ++end) {
        }
        if (hasPoint && end - point > kDecimals + 1) {
            appendShort(shortened, svg.substr(i, end - i));
        } else {
            end = end > i ? end : i + 1;
            shortened += svg.substr(i, end - i);
        }
        i = end;
    }
    return shortened;
}

} // namespace lumenkey::tools
