#include "lumenkey/foundation/BXAsciiStream.h"

#include "lumenkey/foundation/BXTextForms.h"

#include <algorithm>
#include <array>
#include <cstring>
#include <new>
#include <stdexcept>

namespace {

constexpr std::string_view kDigits = "ABCDEFGHIJKLMNOPQRSTUVWXYZabcdefghijklmnopqrstuvwxyz0123456789+/";
constexpr std::uint8_t kNoDigit = 0xFF;

constexpr std::array<std::uint8_t, 256> kValues = [] {
    std::array<std::uint8_t, 256> values{};
    values.fill(kNoDigit);
    for (std::size_t i = 0; i < kDigits.size(); ++i)
        values[static_cast<std::uint8_t>(kDigits[i])] = static_cast<std::uint8_t>(i);
    return values;
}();

} // namespace

/// One group: of `count` bytes, 1 to 3.
void BXAsciiStream::append(std::uint8_t const* bytes, std::size_t count) {
    std::uint32_t const group = static_cast<std::uint32_t>(bytes[0]) << 16 |
                                static_cast<std::uint32_t>(count > 1 ? bytes[1] : 0) << 8 |
                                static_cast<std::uint32_t>(count > 2 ? bytes[2] : 0);
    for (std::size_t i = 0; i < 4; ++i)
        _text += i <= count ? kDigits[group >> (18 - 6 * i) & 63] : '=';
}

bool BXAsciiStream::write(void const* bytes, std::size_t size) {
    if (_state != State::Writing)
        return false;
    try {
        std::size_t const needed = _text.size() + (size / 3 + 2) * 4;
        if (needed > _text.capacity())
            _text.reserve(std::max(needed, 2 * _text.capacity()));
    } catch (std::bad_alloc const&) {
        return false;
    } catch (std::length_error const&) {
        return false;
    }
    auto const* next = static_cast<std::uint8_t const*>(bytes);
    for (std::uint8_t const* const end = next + size; next != end; ++next) {
        _rest[_restSize++] = *next;
        if (_restSize == sizeof _rest) {
            append(_rest, _restSize);
            _restSize = 0;
        }
    }
    return true;
}

BXString BXAsciiStream::getString() const { return BXString(_text); }

bool BXAsciiStream::open(BXString const& text) {
    *this = BXAsciiStream();
    _state = State::Reading;
    if (decode(text.view()))
        return true;
    _bytes.clear();
    return false;
}

bool BXAsciiStream::decode(std::string_view text) {
    std::uint32_t group = 0;
    std::size_t digits = 0;
    std::size_t padding = 0;
    for (char const c : text) {
        if (BXText::isSpace(c))
            continue;
        std::uint8_t const value = kValues[static_cast<std::uint8_t>(c)];
        bool const isPadding = c == '=' && digits >= 2;
        // Nothing stands behind padding but more of it, up to the end of the group.
        if ((value == kNoDigit && !isPadding) || (padding != 0 && (!isPadding || digits == 0)))
            return false;
        padding += isPadding ? 1 : 0;
        group = group << 6 | (isPadding ? 0U : value);
        if (++digits == 4) {
            for (std::size_t i = 0; i < 3 - padding; ++i)
                _bytes.push_back(static_cast<std::uint8_t>(group >> (16 - 8 * i)));
            group = 0;
            digits = 0;
        }
    }
    return digits == 0;
}

std::size_t BXAsciiStream::read(void* out, std::size_t size) {
    std::size_t const taken = std::min(size, _bytes.size() - _position);
    if (taken != 0)
        std::memcpy(out, _bytes.data() + _position, taken);
    _position += taken;
    return taken;
}

void BXAsciiStream::close() {
    if (_state == State::Writing && _restSize != 0)
        append(_rest, _restSize);
    _restSize = 0;
    _bytes = {};
    _position = 0;
    _state = State::Written;
}
