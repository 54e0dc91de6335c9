#include "tools/import/MotionScanner.h"

#include "tools/output/TextForms.h"

#include <algorithm>
#include <charconv>
#include <cmath>
#include <limits>

namespace lumenkey::tools {

namespace {

bool isBlank(char c) { return c == ' ' || c == '\t' || c == '\r' || c == '\v' || c == '\f'; }
bool isSpace(char c) { return isBlank(c) || c == '\n'; }
bool isBrace(char c) { return c == '{' || c == '}'; }

unsigned limited(std::size_t n) {
    return static_cast<unsigned>(std::min<std::size_t>(n, std::numeric_limits<unsigned>::max()));
}

} // namespace

void MotionScanner::skipBlanks() {
    while (!atEnd() && isBlank(_text[_position])) {
        ++_position;
    }
}

void MotionScanner::skipSpace() {
    while (!atEnd() && isSpace(_text[_position])) {
        ++_position;
    }
}

std::string_view MotionScanner::take(std::size_t end) {
    _token = _position;
    _position = end;
    return _text.substr(_token, end - _token);
}

std::string_view MotionScanner::word() {
    skipSpace();
    std::size_t end = _position;
    while (end < _text.size() && !isSpace(_text[end]) && !isBrace(_text[end])) {
        ++end;
    }
    bool const isBraceHere = end == _position && end < _text.size();
    return take(isBraceHere ? end + 1 : end);
}

std::string_view MotionScanner::peekWord() {
    std::size_t const position = _position;
    std::string_view const next = word();
    _position = position;
    return next;
}

std::string_view MotionScanner::restOfLine() {
    skipBlanks();
    std::size_t const end = std::min(_text.find_first_of("{\n", _position), _text.size());
    std::string_view line = take(end);
    while (!line.empty() && isBlank(line.back())) {
        line.remove_suffix(1);
    }
    return line;
}

std::string_view MotionScanner::field() {
    skipBlanks();
    std::size_t end = _position;
    while (end < _text.size() && !isSpace(_text[end])) {
        ++end;
    }
    return take(end);
}

double MotionScanner::numberFrom(std::string_view text, std::size_t position) const {
    std::string_view digits = text;
    if (digits.starts_with('+')) {
        digits.remove_prefix(1);
    }
    // Words such as "nan" and "inf" are numbers to from_chars, but not here.
    std::size_t const first = text.starts_with('-') ? 1 : 0;
    bool const startsLikeNumber =
        first < digits.size() && ((digits[first] >= '0' && digits[first] <= '9') || digits[first] == '.');
    double value = 0;
    auto const [end, error] = std::from_chars(digits.data(), digits.data() + digits.size(), value);
    if (!startsLikeNumber || error == std::errc::invalid_argument || end != digits.data() + digits.size()) {
        fail(position, text.empty() ? "a number is missing" : quoted(text) + " is not a number");
    }
    if (error != std::errc{} || !std::isfinite(value)) {
        fail(position, quoted(text) + " is out of the range of numbers");
    }
    return value;
}

void MotionScanner::expectWord(std::string_view expected) {
    std::string_view const found = word();
    if (!sameWord(found, expected)) {
        failAtToken((found.empty() ? "the file ends" : quoted(found) + " stands") + " where " +
                    std::string(expected) + " belongs");
    }
}

void MotionScanner::expectLabel(std::string_view label) {
    skipSpace();
    std::size_t const start = _position;
    bool found = sameWord(_text.substr(_position, label.size()), label);
    if (found) {
        _position += label.size();
        skipBlanks();
        found = !atEnd() && _text[_position] == ':';
        ++_position;
    }
    if (!found) {
        _position = start;
        std::string_view const other = word();
        failAtToken((other.empty() ? "the file ends" : quoted(other) + " stands") + " where '" +
                    std::string(label) + ":' belongs");
    }
}

unsigned MotionScanner::lineAt(std::size_t position) const {
    std::string_view const before = _text.substr(0, position);
    return limited(1 + static_cast<std::size_t>(std::count(before.begin(), before.end(), '\n')));
}

void MotionScanner::fail(std::size_t position, std::string const& what) const {
    position = std::min(position, _text.size());
    std::size_t const newline = position == 0 ? std::string_view::npos : _text.rfind('\n', position - 1);
    std::size_t const lineStart = newline == std::string_view::npos ? 0 : newline + 1;
    throw InputError{_file, lineAt(position), limited(position - lineStart + 1), what};
}

} // namespace lumenkey::tools
