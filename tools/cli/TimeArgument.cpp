#include "tools/cli/TimeArgument.h"

#include "tools/cli/UsageError.h"
#include "tools/time/ExactDecimal.h"
#include "tools/time/TimeFraction.h"

#include <cstdint>
#include <limits>
#include <string>

namespace lumenkey::tools {

namespace {

[[noreturn]] void failForText(std::string_view text, std::string const& why) {
    throw UsageError{"'" + std::string(text) + "' " + why};
}

} // namespace

TimeArgument TimeArgument::parse(std::string_view text) {
    TimeArgument argument;
    if (text.find('/') != std::string_view::npos) {
        argument._amount = timeFromFraction(text);
        if (!TempusIsNumeric(argument._amount)) {
            failForText(text,
                        "is no time: both sides of VALUE/TIMESCALE are whole numbers, of 64 and 32 bits, "
                        "and the timescale is above 0");
        }
        return argument;
    }
    argument._countsFrames = text.ends_with('f');
    std::string_view const digits = text.substr(0, text.size() - (argument._countsFrames ? 1 : 0));
    std::optional<ExactDecimal> const number = ExactDecimal::parse(digits);
    if (!number) {
        failForText(text, "is no time: write VALUE/TIMESCALE, seconds (0.5) or frames (12f)");
    }
    argument._amount = number->toTempus();
    if (!TempusIsNumeric(argument._amount)) {
        failForText(text, "has more digits than exact time can hold; VALUE/TIMESCALE may say it better");
    }
    return argument;
}

std::optional<TimeArgument> TimeArgument::parseIfGiven(std::string_view text) {
    return text.empty() ? std::nullopt : std::optional(parse(text));
}

std::vector<TimeArgument> TimeArgument::parseList(std::string_view text) {
    std::vector<TimeArgument> arguments;
    for (;;) {
        std::size_t const comma = text.find(',');
        arguments.push_back(parse(text.substr(0, comma)));
        if (comma == std::string_view::npos) {
            return arguments;
        }
        text.remove_prefix(comma + 1);
    }
}

Tempus TimeArgument::resolve(Tempus const& frameDuration) const {
    if (!_countsFrames) {
        return _amount;
    }
    if (!TempusIsNumeric(frameDuration)) {
        throw UsageError{
            "the rows of the file aren't frames of one duration: write seconds or VALUE/TIMESCALE"};
    }
    Tempus const time = _amount * frameDuration;
    bool const isExact = !TempusHasBeenRounded(time) || TempusHasBeenRounded(frameDuration);
    if (!TempusIsNumeric(time) || !isExact) {
        throw UsageError{"a number of frames goes beyond exact time"};
    }
    return TempusReduced(time);
}

Tempus stepOfRate(std::string_view text) {
    Tempus rate = timeFromFraction(text);
    if (std::optional<ExactDecimal> const number = ExactDecimal::parse(text)) {
        rate = number->toTempus();
    }
    if (!TempusIsNumeric(rate) || rate.value <= 0 || rate.value > std::numeric_limits<int32_t>::max()) {
        failForText(text, "is no rate: write samples a second above 0, such as 24, 23.976 or 30000/1001");
    }
    return TempusMake(rate.timescale, static_cast<int32_t>(rate.value));
}

} // namespace lumenkey::tools
