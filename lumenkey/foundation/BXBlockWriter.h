// Internal: not installed.
#pragma once

#include "lumenkey/foundation/BXStream.h"

#include <cstddef>
#include <cstring>
#include <memory>
#include <string_view>

/// Gathers text for a sink that is called for every 32 KiB. The first refusal of the sink is remembered, and
/// nothing more is given to it.
class BXBlockWriter {
public:
    explicit BXBlockWriter(BXStream& sink) : _sink(sink), _block(std::make_unique<char[]>(kBlock)) {}

    void append(std::string_view text) {
        if (text.size() <= kBlock - _used) {
            std::memcpy(_block.get() + _used, text.data(), text.size());
            _used += text.size();
        } else {
            appendLong(text);
        }
    }

    /// Where up to `size` bytes, at most 4,096, may be written; `taken` tells where they end.
    char* room(std::size_t size) {
        if (size > kBlock - _used) {
            flush();
        }
        return _block.get() + _used;
    }
    void taken(char const* end) noexcept { _used = static_cast<std::size_t>(end - _block.get()); }

    void flush();
    bool isGood() const noexcept { return _isGood; }

private:
    static constexpr std::size_t kBlock = 32 << 10;

    void appendLong(std::string_view text);
    void give(char const* bytes, std::size_t size);

    BXStream& _sink;
    std::unique_ptr<char[]> _block;
    std::size_t _used = 0;
    bool _isGood = true;
};
