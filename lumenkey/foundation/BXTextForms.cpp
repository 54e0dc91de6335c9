#include "lumenkey/foundation/BXTextForms.h"

#include <algorithm>
#include <charconv>
#include <cmath>
#include <system_error>

namespace {

constexpr char kHexDigits[] = "0123456789ABCDEF";

struct TimeWord {
    std::string_view word;
    Tempus time;
};
constexpr TimeWord kTimeWords[] = {
    {"invalid", kTempusInvalid},
    {"indefinite", kTempusIndefinite},
    {"+infinity", kTempusPositiveInfinity},
    {"-infinity", kTempusNegativeInfinity},
};

char* copy(char* out, std::string_view text) { return std::copy(text.begin(), text.end(), out); }

template <typename Number> char* digits(char* out, Number value) {
    return std::to_chars(out, out + BXText::kLongest, value).ptr;
}

std::string_view trimmed(std::string_view text) {
    while (!text.empty() && BXText::isSpace(text.front())) {
        text.remove_prefix(1);
    }
    while (!text.empty() && BXText::isSpace(text.back())) {
        text.remove_suffix(1);
    }
    return text;
}

/// Reads what `from_chars` takes at the start of the text, and takes it off the text.
template <typename Number> bool takeNumber(std::string_view& text, Number* out) {
    char const* const end = text.data() + text.size();
    auto const [stop, error] = std::from_chars(text.data(), end, *out);
    text = std::string_view(stop, static_cast<std::size_t>(end - stop));
    return error == std::errc{};
}

bool takeChar(std::string_view& text, char c) {
    if (text.empty() || text.front() != c) {
        return false;
    }
    text.remove_prefix(1);
    return true;
}

template <typename Number> bool readWhole(std::string_view text, Number* out) {
    text = trimmed(text);
    Number number{};
    if (!takeNumber(text, &number) || !text.empty()) {
        return false;
    }
    *out = number;
    return true;
}

/// Of an upper or lower case digit; -1 for what is none.
int hexValue(char c) {
    if (c >= '0' && c <= '9') {
        return c - '0';
    }
    if (c >= 'A' && c <= 'F') {
        return c - 'A' + 10;
    }
    return c >= 'a' && c <= 'f' ? c - 'a' + 10 : -1;
}

bool readsAsEscape(std::string_view text, std::size_t at) {
    return text.size() - at >= 4 && text[at] == '\\' && text[at + 1] == 'x' && hexValue(text[at + 2]) >= 0 &&
           hexValue(text[at + 3]) >= 0;
}

std::uint8_t byteAt(std::string_view text, std::size_t at) { return static_cast<std::uint8_t>(text[at]); }

/// Bytes of the character at `at` beyond ASCII; 0 if that is no character that XML holds.
std::size_t characterSize(std::string_view text, std::size_t at) {
    std::uint8_t const lead = byteAt(text, at);
    std::size_t const size = lead >= 0xF0 ? 4 : lead >= 0xE0 ? 3 : 2;
    if (lead < 0xC2 || lead > 0xF4 || text.size() - at < size) {
        return 0;
    }
    std::uint32_t character = lead & (0x7Fu >> size);
    for (std::size_t i = 1; i < size; ++i) {
        std::uint8_t const next = byteAt(text, at + i);
        if ((next & 0xC0) != 0x80) {
            return 0;
        }
        character = character << 6 | (next & 0x3Fu);
    }
    bool const overlong = (size == 3 && character < 0x800) || (size == 4 && character < 0x10000);
    bool const surrogate = character >= 0xD800 && character <= 0xDFFF;
    bool const refused = character == 0xFFFE || character == 0xFFFF || character > 0x10FFFF;
    return overlong || surrogate || refused ? 0 : size;
}

/// Where the plain stretches of nearly all texts never stop.
constexpr bool isPlainAscii(std::uint8_t byte) {
    return byte >= 0x20 && byte < 0x80 && byte != '&' && byte != '<' && byte != '>' && byte != '"' &&
           byte != '\\';
}

} // namespace

namespace BXText {

char* write(char* out, bool value) noexcept {
    *out = value ? '1' : '0';
    return out + 1;
}

char* write(char* out, std::uint32_t value) noexcept { return digits(out, value); }
char* write(char* out, std::uint64_t value) noexcept { return digits(out, value); }

char* write(char* out, double value) noexcept {
    // A sign of "not a number" means nothing, and would only make equal documents differ.
    return std::isnan(value) ? copy(out, "nan") : digits(out, value);
}

char* write(char* out, Tempus const& value) noexcept {
    std::uint32_t const flags = value.flags & ~kTempusFlagHasBeenRounded;
    bool standsForFlags = TempusIsNumeric(value);
    if (!standsForFlags && (value.value | value.timescale | value.epoch) == 0) {
        for (TimeWord const& row : kTimeWords) {
            if (row.time.flags == flags) {
                out = copy(out, row.word);
                return value.flags != flags ? copy(out, "~") : out;
            }
        }
    }
    out = digits(out, value.value);
    *out++ = '/';
    out = digits(out, value.timescale);
    if (value.epoch != 0) {
        *out++ = '@';
        out = digits(out, value.epoch);
    }
    if (!standsForFlags) {
        *out++ = '#';
        return digits(out, value.flags);
    }
    return value.flags != flags ? copy(out, "~") : out;
}

char* write(char* out, BXUUID const& value) noexcept {
    for (unsigned digit = 0; digit < 32; ++digit) {
        if (digit == 8 || digit == 12 || digit == 16 || digit == 20) {
            *out++ = '-';
        }
        *out++ = kHexDigits[value.words[digit / 8] >> (28 - 4 * (digit % 8)) & 0xF];
    }
    return out;
}

bool read(std::string_view text, bool* out) noexcept {
    text = trimmed(text);
    bool const value = text == "1" || text == "true";
    if (!value && text != "0" && text != "false") {
        return false;
    }
    *out = value;
    return true;
}

bool read(std::string_view text, std::uint64_t* out) noexcept { return readWhole(text, out); }

bool read(std::string_view text, std::uint32_t* out) noexcept {
    std::uint64_t number = 0;
    if (!readWhole(text, &number)) {
        return false;
    }
    *out = static_cast<std::uint32_t>(number);
    return true;
}

bool read(std::string_view text, std::int32_t* out) noexcept {
    std::uint32_t low = 0;
    std::int64_t number = 0;
    if (readWhole(text, &number)) {
        low = static_cast<std::uint32_t>(number);
    } else if (!read(text, &low)) {
        return false;
    }
    *out = static_cast<std::int32_t>(low);
    return true;
}

bool read(std::string_view text, double* out) noexcept { return readWhole(text, out); }

bool read(std::string_view text, Tempus* out) noexcept {
    text = trimmed(text);
    std::string_view word = text;
    bool const rounded = word.ends_with('~');
    word.remove_suffix(rounded ? 1 : 0);
    std::uint32_t const mark = rounded ? kTempusFlagHasBeenRounded : 0;
    for (TimeWord const& row : kTimeWords) {
        if (row.word == word) {
            *out = row.time;
            out->flags |= mark;
            return true;
        }
    }
    Tempus time{0, 0, kTempusFlagValid, 0};
    if (!takeNumber(text, &time.value) || !takeChar(text, '/') || !takeNumber(text, &time.timescale) ||
        (takeChar(text, '@') && !takeNumber(text, &time.epoch))) {
        return false;
    }
    if (takeChar(text, '#')) {
        if (!takeNumber(text, &time.flags)) {
            return false;
        }
    } else if (time.timescale <= 0) {
        return false;
    } else if (takeChar(text, '~')) {
        time.flags |= kTempusFlagHasBeenRounded;
    }
    if (!text.empty()) {
        return false;
    }
    *out = time;
    return true;
}

bool read(std::string_view text, BXUUID* out) noexcept { return BXUUID::fromText(trimmed(text), out); }

bool read(std::string_view text, BXString* out) {
    std::size_t at = text.find('\\');
    if (at == std::string_view::npos) {
        out->set(text);
        return true;
    }
    std::string made;
    std::size_t done = 0;
    for (; at != std::string_view::npos; at = text.find('\\', at)) {
        if (!readsAsEscape(text, at)) {
            ++at;
            continue;
        }
        made.append(text, done, at - done);
        made += static_cast<char>(hexValue(text[at + 2]) << 4 | hexValue(text[at + 3]));
        at += 4;
        done = at;
    }
    made.append(text, done);
    *out = BXString(std::move(made));
    return true;
}

std::size_t plainEnd(std::string_view text, std::size_t begin, Place place) noexcept {
    std::size_t at = begin;
    while (at < text.size()) {
        std::uint8_t const byte = byteAt(text, at);
        if (isPlainAscii(byte) || (byte == '\\' && !readsAsEscape(text, at)) ||
            (place == Place::Content && (byte == '\t' || byte == '\n'))) {
            ++at;
        } else if (std::size_t const size = byte >= 0x80 ? characterSize(text, at) : 0; size != 0) {
            at += size;
        } else {
            break;
        }
    }
    return at;
}

char* escaped(char* out, std::string_view text, std::size_t at) noexcept {
    std::uint8_t const byte = byteAt(text, at);
    switch (byte) {
    case '&':
        return copy(out, "&amp;");
    case '<':
        return copy(out, "&lt;");
    case '>':
        return copy(out, "&gt;");
    case '"':
        return copy(out, "&quot;");
    case '\t':
        return copy(out, "&#9;");
    case '\n':
        return copy(out, "&#10;");
    case '\r':
        return copy(out, "&#13;");
    default:
        out = copy(out, "\\x");
        *out++ = kHexDigits[byte >> 4];
        *out++ = kHexDigits[byte & 0xF];
        return out;
    }
}

} // namespace BXText
