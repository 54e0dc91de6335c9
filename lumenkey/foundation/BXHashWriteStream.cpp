#include "lumenkey/foundation/BXHashWriteStream.h"

#include <algorithm>
#include <bit>
#include <cmath>
#include <cstring>
#include <new>
#include <string_view>

#include <xxhash.h>

namespace {

/// First byte of each call. Digests may be stored, so never renumber.
enum class Call : std::uint8_t { Start = 1, Value = 16, Attribute = 32 };

/// Added to `Value` and `Attribute`; likewise.
enum class Type : std::uint8_t {
    Bool = 0,
    UInt32 = 1,
    UInt64 = 2,
    Double = 3,
    String = 4,
    Uuid = 5,
    Time = 6
};

constexpr Type typeOf(bool) { return Type::Bool; }
constexpr Type typeOf(std::uint32_t) { return Type::UInt32; }
constexpr Type typeOf(std::uint64_t) { return Type::UInt64; }
constexpr Type typeOf(double) { return Type::Double; }
constexpr Type typeOf(std::string_view) { return Type::String; }
constexpr Type typeOf(BXUUID const&) { return Type::Uuid; }
constexpr Type typeOf(Tempus const&) { return Type::Time; }

struct FreeState {
    void operator()(XXH3_state_t* state) const noexcept { XXH3_freeState(state); }
};

} // namespace

/// Numbers are gathered, low byte first, and go into the hash a kilobyte at a time: the digest is that of the
/// bytes, however they are cut.
class BXHashWriteStream::Digest {
public:
    Digest() : _state(XXH3_createState()) {
        if (!_state) {
            throw std::bad_alloc();
        }
        XXH3_128bits_reset(_state.get());
    }

    void start(std::uint32_t tag) {
        reserve();
        put(static_cast<std::uint8_t>(Call::Start));
        put(tag);
        put(_scopes);
    }

    void pushScope() { ++_scopes; }
    void popScope() {
        if (_scopes != 0) {
            --_scopes;
        }
    }

    template <typename Value> void value(Value const& value) {
        reserve();
        putKind(Call::Value, typeOf(value));
        putValue(value);
    }

    template <typename Value> void attribute(std::uint32_t tag, Value const& value) {
        reserve();
        putKind(Call::Attribute, typeOf(value));
        put(tag);
        putValue(value);
    }

    std::array<std::uint8_t, 16> hash() {
        flush();
        XXH128_canonical_t canonical;
        XXH128_canonicalFromHash(&canonical, XXH3_128bits_digest(_state.get()));
        std::array<std::uint8_t, 16> bytes{};
        std::copy(std::begin(canonical.digest), std::end(canonical.digest), bytes.begin());
        return bytes;
    }

private:
    static constexpr std::size_t kBlock = 1024;
    /// The longest call without the text of a string: an attribute that is a time.
    static constexpr std::size_t kLongestCall = 1 + 4 + 24;

    void reserve() {
        if (kBlock - _used < kLongestCall) {
            flush();
        }
    }

    void flush() {
        XXH3_128bits_update(_state.get(), _block.data(), _used);
        _used = 0;
    }

    template <typename Number> void put(Number number) {
        if constexpr (std::endian::native == std::endian::little) {
            std::memcpy(_block.data() + _used, &number, sizeof(Number));
        } else {
            for (std::size_t i = 0; i < sizeof(Number); ++i) {
                _block[_used + i] = static_cast<std::uint8_t>(number >> (8 * i));
            }
        }
        _used += sizeof(Number);
    }

    void putKind(Call call, Type type) {
        put(static_cast<std::uint8_t>(static_cast<unsigned>(call) + static_cast<unsigned>(type)));
    }

    void putValue(bool value) { put(static_cast<std::uint8_t>(value)); }
    void putValue(std::uint32_t value) { put(value); }
    void putValue(std::uint64_t value) { put(value); }
    void putValue(double value) {
        constexpr std::uint64_t kAnyNaN = 0x7FF8000000000000;
        put(std::isnan(value) ? kAnyNaN : std::bit_cast<std::uint64_t>(value));
    }
    void putValue(BXUUID const& value) {
        for (std::uint32_t const word : value.words) {
            put(word);
        }
    }
    void putValue(Tempus const& value) {
        put(static_cast<std::uint64_t>(value.value));
        put(static_cast<std::uint32_t>(value.timescale));
        put(value.flags);
        put(static_cast<std::uint64_t>(value.epoch));
    }
    void putValue(std::string_view value) {
        put(std::uint64_t{value.size()});
        if (value.size() > kBlock - _used) {
            flush();
        }
        if (value.size() > kBlock) {
            XXH3_128bits_update(_state.get(), value.data(), value.size());
        } else {
            std::memcpy(_block.data() + _used, value.data(), value.size());
            _used += value.size();
        }
    }

    std::unique_ptr<XXH3_state_t, FreeState> _state;
    std::array<std::uint8_t, kBlock> _block;
    std::size_t _used = 0;
    std::uint32_t _scopes = 0;
};

BXHashWriteStream::BXHashWriteStream() : _digest(std::make_unique<Digest>()) {}
BXHashWriteStream::~BXHashWriteStream() = default;

std::array<std::uint8_t, 16> BXHashWriteStream::getHash() { return _digest->hash(); }

void BXHashWriteStream::pushScope(BXScope const*) { _digest->pushScope(); }
void BXHashWriteStream::popScope() { _digest->popScope(); }
void BXHashWriteStream::startElement(std::uint32_t tag) { _digest->start(tag); }
void BXHashWriteStream::endElement() {}
void BXHashWriteStream::writeValue(bool value) { _digest->value(value); }
void BXHashWriteStream::writeValue(std::uint32_t value) { _digest->value(value); }
void BXHashWriteStream::writeValue(std::uint64_t value) { _digest->value(value); }
void BXHashWriteStream::writeValue(double value) { _digest->value(value); }
void BXHashWriteStream::writeValue(BXString const& value) { _digest->value(value.view()); }
void BXHashWriteStream::writeValue(BXUUID const& value) { _digest->value(value); }
void BXHashWriteStream::writeValue(Tempus const& value) { _digest->value(value); }
void BXHashWriteStream::writeAttribute(std::uint32_t tag, bool value) { _digest->attribute(tag, value); }
void BXHashWriteStream::writeAttribute(std::uint32_t tag, std::uint32_t value) {
    _digest->attribute(tag, value);
}
void BXHashWriteStream::writeAttribute(std::uint32_t tag, std::uint64_t value) {
    _digest->attribute(tag, value);
}
void BXHashWriteStream::writeAttribute(std::uint32_t tag, double value) { _digest->attribute(tag, value); }
void BXHashWriteStream::writeAttribute(std::uint32_t tag, BXString const& value) {
    _digest->attribute(tag, value.view());
}
void BXHashWriteStream::writeAttribute(std::uint32_t tag, BXUUID const& value) {
    _digest->attribute(tag, value);
}
void BXHashWriteStream::writeAttribute(std::uint32_t tag, Tempus const& value) {
    _digest->attribute(tag, value);
}
void BXHashWriteStream::endLine() {}
bool BXHashWriteStream::isHashStream() const { return true; }

void BXHashWriteStream::writeElement(std::uint32_t tag, double value) {
    _digest->start(tag);
    _digest->value(value);
}

void BXHashWriteStream::writeElement(std::uint32_t tag, Tempus const& value) {
    _digest->start(tag);
    _digest->value(value);
}
