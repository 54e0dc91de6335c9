#include "tools/time/ExactDecimal.h"

#include <algorithm>
#include <charconv>
#include <cstdint>
#include <limits>

namespace lumenkey::tools {

namespace {

constexpr Wide kLargestValue = std::numeric_limits<int64_t>::max();
constexpr Wide kLargestTimescale = std::numeric_limits<int32_t>::max();

bool isDigit(char c) { return c >= '0' && c <= '9'; }

/// Takes the digits before or after the point off the front of `text`; false when there is none.
bool takeDigits(std::string_view& text, ExactDecimal& number, bool afterPoint) {
    bool any = false;
    for (; !text.empty() && isDigit(text.front()); text.remove_prefix(1)) {
        any = true;
        int const digit = text.front() - '0';
        bool const kept = number.digits < powerOfTen(ExactDecimal::kMostDigits - 1);
        if (kept) {
            number.digits = number.digits * 10 + digit;
        } else {
            number.cut = number.cut || digit != 0;
        }
        number.exponent += (kept ? 0 : 1) - (afterPoint ? 1 : 0);
        number.lastDigit -= afterPoint ? 1 : 0;
    }
    return any;
}

bool takeExponent(std::string_view& text, ExactDecimal& number) {
    if (text.empty() || (text.front() != 'e' && text.front() != 'E')) {
        return true;
    }
    text.remove_prefix(1);
    if (text.size() > 1 && text[0] == '+' && isDigit(text[1])) {
        text.remove_prefix(1);
    }
    int power = 0;
    auto const [end, error] = std::from_chars(text.data(), text.data() + text.size(), power);
    text.remove_prefix(static_cast<size_t>(end - text.data()));
    number.exponent += power;
    number.lastDigit += power;
    return error == std::errc{} && power >= -999 && power <= 999;
}

/// Takes factors of `prime` out of both numbers, at most `count` times; how often they stay in the second.
int cancel(Wide& number, int prime, int count) {
    while (count > 0 && number % prime == 0) {
        number /= prime;
        --count;
    }
    return count;
}

} // namespace

Wide powerOfTen(int n) {
    Wide power = 1;
    for (int i = 0; i < n; ++i) {
        power *= 10;
    }
    return power;
}

std::optional<ExactDecimal> ExactDecimal::parse(std::string_view text) {
    ExactDecimal number;
    if (text.size() > 100'000) { // so that no exponent overflows
        return std::nullopt;
    }
    if (!text.empty() && (text.front() == '-' || text.front() == '+')) {
        number.negative = text.front() == '-';
        text.remove_prefix(1);
    }
    bool anyDigit = takeDigits(text, number, false);
    if (!text.empty() && text.front() == '.') {
        text.remove_prefix(1);
        anyDigit = takeDigits(text, number, true) || anyDigit;
    }
    if (!anyDigit || !takeExponent(text, number) || !text.empty()) {
        return std::nullopt;
    }
    return number;
}

Tempus ExactDecimal::toTempus() const {
    if (cut) {
        return kTempusInvalid;
    }
    if (digits == 0) {
        return kTempusZero;
    }
    Wide value = digits;
    Wide timescale = 1;
    for (int i = 0; i < exponent; ++i) {
        value *= 10;
        if (value > kLargestValue) {
            return kTempusInvalid;
        }
    }
    if (exponent < 0) {
        int const twos = cancel(value, 2, -exponent);
        int const fives = cancel(value, 5, -exponent);
        for (int i = 0; i < std::max(twos, fives); ++i) {
            timescale *= (i < twos ? 2 : 1) * (i < fives ? 5 : 1);
            if (timescale > kLargestTimescale) {
                return kTempusInvalid;
            }
        }
    }
    return TempusMake(static_cast<int64_t>(negative ? -value : value), static_cast<int32_t>(timescale));
}

Tempus ExactDecimal::toNearestTempus() const {
    constexpr int lowestExponent = -kMostDigits - 9;
    if (digits == 0 || exponent < lowestExponent || exponent > 9) {
        return kTempusInvalid;
    }
    Wide const denominator = powerOfTen(std::max(-exponent, 0));
    Wide const numerator = digits * (exponent > 0 ? powerOfTen(exponent) : 1);
    if (numerator / denominator > 1'000'000'000 || numerator < denominator / 1'000'000'000) {
        return kTempusInvalid;
    }
    Wide const value = (numerator * kLargestTimescale + denominator / 2) / denominator;
    Tempus time =
        TempusMake(static_cast<int64_t>(negative ? -value : value), static_cast<int32_t>(kLargestTimescale));
    time.flags |= kTempusFlagHasBeenRounded;
    return time;
}

} // namespace lumenkey::tools
