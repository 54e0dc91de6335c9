#include "lumenkey/foundation/BXStream.h"

#include <algorithm>
#include <new>
#include <stdexcept>
#include <utility>

BXStream::~BXStream() = default;

BXBufferWriteStream::BXBufferWriteStream(int first, int growth)
    : _growth(static_cast<std::size_t>(std::max(growth, 0))) {
    _data.reserve(static_cast<std::size_t>(std::max(first, 0)));
}

bool BXBufferWriteStream::write(void const* bytes, std::size_t size) {
    if (size == 0) {
        return true;
    }
    try {
        std::size_t const room = _data.capacity() - _data.size();
        if (size > room) {
            _data.reserve(_data.capacity() + std::max({size - room, _growth, _data.capacity() / 2}));
        }
        auto const* const from = static_cast<std::uint8_t const*>(bytes);
        _data.insert(_data.end(), from, from + size);
        return true;
    } catch (std::bad_alloc const&) {
        return false;
    } catch (std::length_error const&) {
        return false;
    }
}

BXData BXBufferWriteStream::takeData() noexcept { return std::exchange(_data, {}); }
