#include "lumenkey/foundation/BXHashWriteStream.h"

#include <algorithm>
#include <bit>
#include <cmath>
#include <concepts>
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

    void start(std::uint32_t tag) { taken(putStart(room(), tag)); }

    void pushScope() { ++_scopes; }
    void popScope() {
        if (_scopes != 0) {
            --_scopes;
        }
    }

    template <typename Value> void value(Value const& value) { taken(putTyped(room(), value)); }

    /// An element that holds nothing but a value.
    template <typename Value> void element(std::uint32_t tag, Value const& value) {
        taken(putTyped(putStart(room(), tag), value));
    }

    template <typename Value> void attribute(std::uint32_t tag, Value const& value) {
        taken(put(put(putKind(room(), Call::Attribute, typeOf(value)), tag), value));
    }

    void value(std::string_view text) {
        taken(put(putKind(room(), Call::Value, Type::String), std::uint64_t{text.size()}));
        append(text);
    }

    void attribute(std::uint32_t tag, std::string_view text) {
        taken(put(put(putKind(room(), Call::Attribute, Type::String), tag), std::uint64_t{text.size()}));
        append(text);
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
    /// The longest that is put at once: an element that is a time.
    static constexpr std::size_t kLongest = 1 + 4 + 4 + 1 + 24;

    /// Where up to so many bytes may be put; `taken` tells where they end.
    std::uint8_t* room() {
        if (kBlock - _used < kLongest) {
            flush();
        }
        return _block.data() + _used;
    }
    void taken(std::uint8_t const* end) { _used = static_cast<std::size_t>(end - _block.data()); }

    void flush() {
        XXH3_128bits_update(_state.get(), _block.data(), _used);
        _used = 0;
    }

    void append(std::string_view text) {
        if (text.size() > kBlock - _used) {
            flush();
        }
        if (text.size() > kBlock) {
            XXH3_128bits_update(_state.get(), text.data(), text.size());
        } else {
            std::memcpy(_block.data() + _used, text.data(), text.size());
            _used += text.size();
        }
    }

    std::uint8_t* putStart(std::uint8_t* at, std::uint32_t tag) const {
        return put(put(put(at, static_cast<std::uint8_t>(Call::Start)), tag), _scopes);
    }

    template <typename Value> static std::uint8_t* putTyped(std::uint8_t* at, Value const& value) {
        return put(putKind(at, Call::Value, typeOf(value)), value);
    }

    static std::uint8_t* putKind(std::uint8_t* at, Call call, Type type) {
        return put(at, static_cast<std::uint8_t>(static_cast<unsigned>(call) + static_cast<unsigned>(type)));
    }

    // Each gives the place behind.

    template <std::unsigned_integral Number> static std::uint8_t* put(std::uint8_t* at, Number number) {
        if constexpr (std::endian::native == std::endian::little) {
            std::memcpy(at, &number, sizeof(Number));
        } else {
            for (std::size_t i = 0; i < sizeof(Number); ++i) {
                at[i] = static_cast<std::uint8_t>(number >> (8 * i));
            }
        }
        return at + sizeof(Number);
    }
    static std::uint8_t* put(std::uint8_t* at, bool value) {
        return put(at, static_cast<std::uint8_t>(value));
    }
    static std::uint8_t* put(std::uint8_t* at, double value) {
        constexpr std::uint64_t kAnyNaN = 0x7FF8000000000000;
        return put(at, std::isnan(value) ? kAnyNaN : std::bit_cast<std::uint64_t>(value));
    }
    static std::uint8_t* put(std::uint8_t* at, BXUUID const& value) {
        for (std::uint32_t const word : value.words) {
            at = put(at, word);
        }
        return at;
    }
    static std::uint8_t* put(std::uint8_t* at, Tempus const& value) {
        at = put(at, static_cast<std::uint64_t>(value.value));
        at = put(at, static_cast<std::uint32_t>(value.timescale));
        at = put(at, value.flags);
        return put(at, static_cast<std::uint64_t>(value.epoch));
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

void BXHashWriteStream::writeElement(std::uint32_t tag, double value) { _digest->element(tag, value); }
void BXHashWriteStream::writeElement(std::uint32_t tag, Tempus const& value) { _digest->element(tag, value); }
