#include "tools/import/MotionTime.h"

#include "tools/output/TextForms.h"
#include "tools/time/ExactDecimal.h"

#include <algorithm>
#include <array>
#include <cstdint>
#include <optional>

namespace lumenkey::tools {

namespace {

/// Duration of a frame, as a fraction of a second.
struct UsualDuration {
    int64_t value;
    int32_t timescale;
};

constexpr std::array<UsualDuration, 13> kUsualDurations{{{1001, 24000},
                                                         {1, 24},
                                                         {1, 25},
                                                         {1001, 30000},
                                                         {1, 30},
                                                         {1, 48},
                                                         {1, 50},
                                                         {1001, 60000},
                                                         {1, 60},
                                                         {1, 90},
                                                         {1, 100},
                                                         {1, 120},
                                                         {1, 240}}};

/// Beyond this many decimals the number is too small for any usual rate, and the products below would not
/// fit.
constexpr int kMostDecimals = 27;

/// How far printed and usual duration lie apart, and how far they may, both as multiples of one unit that
/// depends on the usual duration alone.
struct Distance {
    Wide apart;
    Wide allowed;
    double seconds;
};

Distance distanceBetween(ExactDecimal const& printed, UsualDuration const& usual) {
    // With n the denominator of the decimal, everything is multiplied by n * timescale.
    Wide const n = powerOfTen(std::max(-printed.exponent, 0));
    Wide const printedValue = printed.digits * powerOfTen(std::max(printed.exponent, 0)) * usual.timescale;
    Wide const usualValue = n * usual.value;
    Wide const apart = printedValue > usualValue ? printedValue - usualValue : usualValue - printedValue;

    // Where digits were cut, the last printed one is beyond what is kept.
    Wide const unit = printed.lastDigit < printed.exponent ? 0 : usual.timescale;
    Wide const byDigit = std::min(unit, printedValue / 8);
    return {apart, std::max(byDigit, usualValue / 100'000),
            static_cast<double>(apart) / static_cast<double>(n) / usual.timescale};
}

std::optional<Tempus> nearestUsualDuration(ExactDecimal const& printed) {
    // The limits keep the products within 128 bits; numbers outside are far from all usual durations.
    if (printed.exponent > 0 || printed.exponent < -kMostDecimals) {
        return std::nullopt;
    }
    std::optional<Tempus> nearest;
    double leastDistance = 0;
    for (UsualDuration const& usual : kUsualDurations) {
        Distance const distance = distanceBetween(printed, usual);
        if (distance.apart <= distance.allowed && (!nearest || distance.seconds < leastDistance)) {
            nearest = TempusMake(usual.value, usual.timescale);
            leastDistance = distance.seconds;
        }
    }
    return nearest;
}

/// Invalid beyond the limits.
Tempus durationOfDecimal(ExactDecimal const& decimal) {
    Tempus duration = decimal.toTempus();
    if (!TempusIsNumeric(duration)) {
        duration = decimal.toNearestTempus();
    }
    bool const isWithin = TempusIsNumeric(duration) &&
                          duration.value <= int64_t{86'400} * duration.timescale &&
                          Wide{duration.value} * 1'000'000'000 >= duration.timescale;
    return isWithin ? duration : kTempusInvalid;
}

} // namespace

FrameDuration frameDurationFromText(std::string_view text) {
    std::optional<ExactDecimal> const printed = ExactDecimal::parse(text);
    if (!printed) {
        return {kTempusInvalid, "'" + std::string(text) + "' is not a number of seconds"};
    }
    if (printed->negative || printed->isZero()) {
        return {kTempusInvalid, "a frame must last longer than 0 seconds"};
    }
    if (std::optional<Tempus> const usual = nearestUsualDuration(*printed)) {
        return {*usual, {}};
    }
    Tempus const duration = durationOfDecimal(*printed);
    if (!TempusIsNumeric(duration)) {
        return {kTempusInvalid, "a frame lasts at least a nanosecond and at most a day"};
    }
    return {duration, {}};
}

Tempus frameDurationFromSeconds(double seconds) {
    for (UsualDuration const& usual : kUsualDurations) {
        Tempus const duration = TempusMake(usual.value, usual.timescale);
        if (TempusGetSeconds(duration) == seconds) {
            return duration;
        }
    }
    std::optional<ExactDecimal> const decimal = ExactDecimal::parse(shortestText(seconds));
    return decimal && !decimal->negative ? durationOfDecimal(*decimal) : kTempusInvalid;
}

} // namespace lumenkey::tools
