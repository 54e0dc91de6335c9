#include "lumenkey/persistence/KFHandleText.h"

#include <algorithm>
#include <charconv>
#include <cmath>
#include <limits>
#include <string>

// The product with a scale of 12 needs four bits more than a double has.
static_assert(std::numeric_limits<long double>::digits >= std::numeric_limits<double>::digits + 4);

namespace {

/// No double needs more.
constexpr std::ptrdiff_t kDigitsOfDouble = std::numeric_limits<double>::max_digits10;

bool hasDigitsBeyondDouble(std::string_view text) {
    if (text.size() <= static_cast<std::size_t>(kDigitsOfDouble))
        return false;
    std::string_view const mantissa = text.substr(0, text.find_first_of("eE"));
    std::size_t const first = mantissa.find_first_of("123456789");
    if (first == std::string_view::npos)
        return false;
    return std::count_if(mantissa.begin() + static_cast<std::ptrdiff_t>(first), mantissa.end(),
                         [](char c) { return c >= '0' && c <= '9'; }) > kDigitsOfDouble;
}

/// More digits than a double has, be it by zeros behind them.
std::string longText(long double number) {
    char buffer[64];
    std::string text(
        buffer, std::to_chars(buffer, buffer + sizeof buffer, number, std::chars_format::scientific).ptr);
    while (!hasDigitsBeyondDouble(text))
        text.insert(text.find('e'), text.find('.') == std::string::npos ? ".0" : "0");
    return text;
}

bool readLong(std::string_view text, long double* out) {
    std::size_t const start = text.find_first_not_of(" \t\r\n");
    if (start == std::string_view::npos)
        return false;
    char const* const end = text.data() + text.size();
    return std::from_chars(text.data() + start, end, *out).ec == std::errc();
}

/// The double next to the product that gives the tangent back; the product itself where none does.
double handleOf(double tangent, double scale) {
    double const product = tangent * scale;
    if (product / scale == tangent)
        return product;
    for (double const end : {-HUGE_VAL, HUGE_VAL}) {
        double const neighbour = std::nextafter(product, end);
        if (neighbour / scale == tangent)
            return neighbour;
    }
    return product;
}

} // namespace

void KFWriteHandle(BXSerializerWriteStream& stream, std::uint32_t tag, double tangent, double scale) {
    if (stream.isHashStream()) {
        stream.writeElement(tag, tangent);
        return;
    }
    double const handle = handleOf(tangent, scale);
    if (handle / scale == tangent || !std::isfinite(handle)) {
        stream.writeElement(tag, handle);
        return;
    }
    stream.startElement(tag);
    stream.writeValue(
        BXString(longText(static_cast<long double>(tangent) * static_cast<long double>(scale))));
    stream.endElement();
}

bool KFReadHandle(BXStreamElement const& element, double scale, double* tangent) {
    double handle = 0.0;
    if (!element.getAsDouble(&handle))
        return false;
    long double exact = 0.0L;
    std::optional<std::string_view> const text = element.text();
    if (text && hasDigitsBeyondDouble(*text) && readLong(*text, &exact)) {
        *tangent = static_cast<double>(exact / static_cast<long double>(scale));
    } else {
        *tangent = handle / scale;
    }
    return true;
}
