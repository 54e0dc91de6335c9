#include "lumenkey/foundation/BXString.h"

#include "lumenkey/foundation/BXStringBundle.h"

#include <utf8proc.h>

#include <algorithm>
#include <cstdlib>
#include <cstring>
#include <mutex>
#include <unordered_map>

namespace {
/// Walks a text as folded code points. A byte that starts no valid UTF-8 sequence stands for itself, above all code
/// points, so that two such texts are equal only if their bytes are.
class FoldedText {
public:
    explicit FoldedText(std::string_view text) noexcept : _rest(text) {}

    /// -1 at the end.
    std::int64_t next() noexcept {
        while (_at == _count) {
            if (_rest.empty()) {
                return -1;
            }
            if (std::int64_t const single = readNext(); single >= 0) {
                return single;
            }
        }
        return _folded[_at++];
    }

private:
    static constexpr std::int64_t kRawByte = 0x110000;

    /// A code point that needs no folding table, or -1 with its folding in `_folded` (which may be empty).
    std::int64_t readNext() noexcept {
        auto const first = static_cast<unsigned char>(_rest.front());
        if (first < 0x80) {
            _rest.remove_prefix(1);
            return first >= 'A' && first <= 'Z' ? first + ('a' - 'A') : first;
        }
        utf8proc_int32_t point = 0;
        utf8proc_ssize_t const length =
            utf8proc_iterate(reinterpret_cast<utf8proc_uint8_t const*>(_rest.data()),
                             static_cast<utf8proc_ssize_t>(_rest.size()), &point);
        if (length <= 0) {
            _rest.remove_prefix(1);
            return kRawByte + first;
        }
        _rest.remove_prefix(static_cast<std::size_t>(length));
        int boundary = 0;
        _at = 0;
        _count = utf8proc_decompose_char(point, _folded, kMostFolded, UTF8PROC_CASEFOLD, &boundary);
        if (_count < 0 || _count > kMostFolded) {
            _count = 0;
            return point;
        }
        return -1;
    }

    // Unicode folds one code point into three at most.
    static constexpr utf8proc_ssize_t kMostFolded = 4;

    std::string_view _rest;
    utf8proc_int32_t _folded[kMostFolded] = {};
    utf8proc_ssize_t _at = 0;
    utf8proc_ssize_t _count = 0;
};

struct InternedTexts {
    std::mutex mutex;
    std::unordered_map<std::string_view, BXString const*> texts;
};

/// Never destroyed: names are read until the last object of the process is gone.
InternedTexts& internedTexts() {
    static InternedTexts* const interned = new InternedTexts();
    return *interned;
}
} // namespace

BXString::BXString(char const* text) : _text(text == nullptr ? "" : text) {}
BXString::BXString(std::string_view text) : _text(text) {}
BXString::BXString(std::string text) noexcept : _text(std::move(text)) {}
BXString::BXString(BXStringKey key) : _text(BXStringBundleText(key.key)) {}

void BXString::set(std::string_view text) { _text.assign(text); }

void BXString::append(std::string_view text) { _text.append(text); }

void BXString::insert(std::size_t position, std::string_view text) {
    _text.insert(std::min(position, _text.size()), text);
}

long BXString::find(std::string_view text, std::size_t from) const noexcept {
    std::size_t const at = _text.find(text, from);
    return at == std::string::npos ? -1 : static_cast<long>(at);
}

int BXString::compare(BXString const& other) const noexcept { return _text.compare(other._text); }

int BXString::caseInsensitiveCompare(BXString const& other) const {
    FoldedText left(_text);
    FoldedText right(other._text);
    for (;;) {
        std::int64_t const a = left.next();
        std::int64_t const b = right.next();
        if (a != b) {
            return a < b ? -1 : 1;
        }
        if (a < 0) {
            return 0;
        }
    }
}

char* BXString::createCStr() const {
    char* const made = static_cast<char*>(std::malloc(_text.size() + 1));
    if (made != nullptr) {
        std::memcpy(made, _text.c_str(), _text.size() + 1);
    }
    return made;
}

BXString BXString::substrTo(std::size_t end) const { return BXString(view().substr(0, end)); }

BXString BXString::substrFrom(std::size_t begin) const {
    return BXString(view().substr(std::min(begin, _text.size())));
}

BXString const* BXString::intern(std::string_view text) {
    InternedTexts& interned = internedTexts();
    std::lock_guard const guard(interned.mutex);
    if (auto const found = interned.texts.find(text); found != interned.texts.end()) {
        return found->second;
    }
    BXString const* const made = new BXString(text);
    interned.texts.emplace(made->view(), made);
    return made;
}
