#include "tools/cli/TimeArgument.h"

#include "tools/cli/UsageError.h"
#include "tools/time/ExactDecimal.h"

#include <charconv>
#include <cstdint>
#include <optional>
#include <string>

namespace lumenkey::tools {

namespace {

template <class Integer> std::optional<Integer> readInteger(std::string_view text) {
    Integer value = 0;
    auto const [end, error] = std::from_chars(text.data(), text.data() + text.size(), value);
    if (error != std::errc{} || end != text.data() + text.size()) {
        return std::nullopt;
    }
    return value;
}

Tempus readFraction(std::string_view text, std::size_t slash) {
    auto const value = readInteger<int64_t>(text.substr(0, slash));
    auto const timescale = readInteger<int32_t>(text.substr(slash + 1));
    return value && timescale ? TempusReduced(TempusMake(*value, *timescale)) : kTempusInvalid;
}

[[noreturn]] void failForText(std::string_view text, std::string const& why) {
    throw UsageError{"'" + std::string(text) + "' " + why};
}

} // namespace

TimeArgument TimeArgument::parse(std::string_view text) {
    TimeArgument argument;
    std::size_t const slash = text.find('/');
    if (slash != std::string_view::npos) {
        argument._amount = readFraction(text, slash);
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
    Tempus const time = _amount * frameDuration;
    bool const isExact = !TempusHasBeenRounded(time) || TempusHasBeenRounded(frameDuration);
    if (!TempusIsNumeric(time) || !isExact) {
        throw UsageError{"a number of frames goes beyond exact time"};
    }
    return TempusReduced(time);
}

} // namespace lumenkey::tools
