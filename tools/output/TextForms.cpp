#include "tools/output/TextForms.h"

#include <algorithm>
#include <array>
#include <charconv>
#include <cmath>
#include <cstring>
#include <numeric>

namespace lumenkey::tools {

namespace {

/// Enough for any double in each of the forms used here.
using NumberBuffer = std::array<char, 64>;

std::string textOf(NumberBuffer const& buffer, std::to_chars_result result) {
    return {buffer.data(), static_cast<std::size_t>(result.ptr - buffer.data())};
}

char lowerCase(char c) { return c >= 'A' && c <= 'Z' ? static_cast<char>(c - 'A' + 'a') : c; }

/// In UTF-8, the first and the last of those that follow one another: controls, and what sets or parts lines
/// without being seen.
struct UnseenCharacters {
    std::string_view first;
    std::string_view last;
};
constexpr UnseenCharacters kUnseen[] = {
    {"\xC2\x80", "\xC2\x9F"},         // U+0080 to U+009F, as terminals take them
    {"\xD8\x9C", "\xD8\x9C"},         // U+061C, of a direction
    {"\xE2\x80\x8E", "\xE2\x80\x8F"}, // U+200E and U+200F, likewise
    {"\xE2\x80\xA8", "\xE2\x80\xAE"}, // U+2028 to U+202E: ends of lines, and stretches of a direction
    {"\xE2\x81\xA6", "\xE2\x81\xA9"}, // U+2066 to U+2069, likewise
};

/// How many bytes at the front of a text, which isn't empty, are such a character; 0 for none.
std::size_t unseenAtFront(std::string_view text) {
    auto const byte = static_cast<unsigned char>(text.front());
    if (byte < 0x20 || byte == 0x7F) {
        return 1;
    }
    for (auto const& [first, last] : kUnseen) {
        std::string_view const front = text.substr(0, first.size());
        // Views compare bytes as unsigned.
        if (first <= front && front <= last) {
            return front.size();
        }
    }
    return 0;
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
        std::size_t const unseen = unseenAtFront(text);
        if (unseen == 0) {
            printable += text.front();
        }
        for (char const c : text.substr(0, unseen)) {
            auto const byte = static_cast<unsigned char>(c);
            printable += "\\x";
            printable += hexadecimal[byte >> 4];
            printable += hexadecimal[byte & 0xF];
        }
        text.remove_prefix(std::max<std::size_t>(unseen, 1));
    }
    return printable;
}

std::string quoted(std::string_view text) {
    constexpr std::size_t longest = 40;
    bool const isLong = text.size() > longest;
    std::string result(1, '\'');
    result.append(text.substr(0, longest)).append(isLong ? "...'" : "'");
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
