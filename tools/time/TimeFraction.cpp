#include "tools/time/TimeFraction.h"

#include <charconv>
#include <cstdint>

namespace lumenkey::tools {

namespace {

template <class Integer> bool readInteger(std::string_view text, Integer* value) {
    auto const [end, error] = std::from_chars(text.data(), text.data() + text.size(), *value);
    return error == std::errc{} && end == text.data() + text.size();
}

} // namespace

Tempus timeFromFraction(std::string_view text) {
    std::size_t const slash = text.find('/');
    int64_t value = 0;
    int32_t timescale = 0;
    bool const isFraction = slash != std::string_view::npos && readInteger(text.substr(0, slash), &value) &&
                            readInteger(text.substr(slash + 1), &timescale);
    return isFraction ? TempusReduced(TempusMake(value, timescale)) : kTempusInvalid;
}

} // namespace lumenkey::tools
