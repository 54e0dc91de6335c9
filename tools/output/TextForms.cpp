#include "tools/output/TextForms.h"

#include <algorithm>
#include <array>
#include <charconv>
#include <cmath>
#include <cstdint>
#include <cstring>
#include <iterator>
#include <numeric>
#include <utf8proc.h>

namespace lumenkey::tools {

namespace {

/// Enough for any double in each of the forms used here.
using NumberBuffer = std::array<char, 64>;

std::string textOf(NumberBuffer const& buffer, std::to_chars_result result) {
    return {buffer.data(), static_cast<std::size_t>(result.ptr - buffer.data())};
}

char lowerCase(char c) { return c >= 'A' && c <= 'Z' ? static_cast<char>(c - 'A' + 'a') : c; }

/// The first and the last of those that follow one another: controls, what sets or parts lines without being
/// seen, and what is no character.
struct UnseenCharacters {
    std::int32_t first;
    std::int32_t last;
};
constexpr UnseenCharacters kUnseen[] = {
    {0x00, 0x1F},     {0x7F, 0x9F}, // as terminals take them
    {0x61C, 0x61C},                 // of a direction
    {0x200E, 0x200F},               // likewise
    {0x2028, 0x202E},               // ends of lines, and stretches of a direction
    {0x2066, 0x2069},               // likewise
    {0xFDD0, 0xFDEF},
};

bool isUnseen(std::int32_t code) {
    constexpr std::int32_t noCharacter = 0xFFFE; // at the end of each plane, and the one behind it
    return (code & noCharacter) == noCharacter ||
           std::any_of(std::begin(kUnseen), std::end(kUnseen), [code](UnseenCharacters const& some) {
               return some.first <= code && code <= some.last;
           });
}

} // namespace

std::string shortestText(double value) {
    std::string text;
    appendShortest(text, value);
    return text;
}

void appendShortest(std::string& text, double value) {
    if (std::isnan(value)) {
        text += "nan";
        return;
    }
    NumberBuffer buffer;
    auto const [end, error] = std::to_chars(buffer.data(), buffer.data() + buffer.size(), value);
    text.append(buffer.data(), static_cast<std::size_t>(end - buffer.data()));
}

std::string tableText(double value) {
    double const magnitude = std::abs(value);
    NumberBuffer buffer{};
    char* const begin = buffer.data();
    char* const end = begin + buffer.size();
    value = value == 0 ? 0 : value; // people need no minus zero
    bool const showsInDecimals = magnitude < 1e9 && (magnitude >= 1e-4 || magnitude == 0);
    return textOf(buffer, showsInDecimals ? std::to_chars(begin, end, value, std::chars_format::fixed, 6)
                                          : std::to_chars(begin, end, value, std::chars_format::general, 7));
}

std::string timeText(Tempus const& time) {
    switch (TempusGetKind(time)) {
    case TempusKind::Number:
        break;
    case TempusKind::PositiveInfinity:
        return "+infinity";
    case TempusKind::NegativeInfinity:
        return "-infinity";
    case TempusKind::Indefinite:
        return "indefinite";
    case TempusKind::Invalid:
        return "invalid";
    }
    // The remainder is in reach of int64_t even where the magnitude of the value is not.
    int64_t const divisor = std::gcd(time.value % time.timescale, int64_t{time.timescale});
    std::string text = std::to_string(time.value / divisor) + "/" + std::to_string(time.timescale / divisor);
    if (time.epoch != 0) {
        text += "@" + std::to_string(time.epoch);
    }
    return TempusHasBeenRounded(time) ? text + "~" : text;
}

std::string printableText(std::string_view text) {
    constexpr std::string_view hexadecimal = "0123456789abcdef";
    std::string printable;
    while (!text.empty()) {
        utf8proc_int32_t code = 0;
        utf8proc_ssize_t const size =
            utf8proc_iterate(reinterpret_cast<utf8proc_uint8_t const*>(text.data()),
                             static_cast<utf8proc_ssize_t>(text.size()), &code); // below 0 for no character
        std::string_view const bytes =
            text.substr(0, static_cast<std::size_t>(std::max<utf8proc_ssize_t>(size, 1)));
        text.remove_prefix(bytes.size());
        if (size > 0 && !isUnseen(code)) {
            printable += bytes;
            continue;
        }
        for (char const c : bytes) {
            auto const byte = static_cast<unsigned char>(c);
            printable += "\\x";
            printable += hexadecimal[byte >> 4];
            printable += hexadecimal[byte & 0xF];
        }
    }
    return printable;
}

std::string quoted(std::string_view text) {
    constexpr std::size_t longest = 40;
    bool const isLong = text.size() > longest;
    std::string result(1, '\'');
    std::size_t size = std::min(text.size(), longest);
    while (isLong && size > 0 && (static_cast<unsigned char>(text[size]) & 0xC0) == 0x80) {
        --size; // back to where a character begins
    }
    result.append(text.substr(0, size)).append(isLong ? "...'" : "'");
    return result;
}

std::string systemErrorText(int error) {
    char const* const text = ::strerrordesc_np(error);
    return text != nullptr ? text : "error " + std::to_string(error);
}

bool sameWord(std::string_view a, std::string_view b) {
    return std::equal(a.begin(), a.end(), b.begin(), b.end(),
                      [](char x, char y) { return lowerCase(x) == lowerCase(y); });
}

std::size_t widthOfText(std::string_view text) {
    std::size_t width = 0;
    for (char const c : text) {
        // Continuation bytes belong to the character before them.
        width += (static_cast<unsigned char>(c) & 0xC0) != 0x80;
    }
    return width;
}

} // namespace lumenkey::tools
