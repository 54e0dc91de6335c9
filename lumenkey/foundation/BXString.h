#pragma once

#include "lumenkey/foundation/BXExport.h"

#include <cstddef>
#include <string>
#include <string_view>

/// Names a text of the library's string bundle; `BXString(BXStringKey("Channel X"))` is that text.
struct BXStringKey {
    explicit constexpr BXStringKey(std::string_view text) noexcept : key(text) {}
    std::string_view key;
};

/// A text value in UTF-8. Positions and sizes are in bytes; any bytes are kept, also zeros and what is no UTF-8.
///
/// A plain value: copies are independent, and one object belongs to one thread at a time.
class LUMENKEY_API BXString {
public:
    BXString() noexcept = default;
    /// A null pointer gives the empty text.
    BXString(char const* text);
    BXString(std::string_view text);
    BXString(std::string text) noexcept;
    /// The bundle's text for the key; the key itself where the bundle has none.
    explicit BXString(BXStringKey key);

    void set(std::string_view text);
    void append(std::string_view text);
    /// Puts the text in front of the byte at `position`; behind the end where that lies further.
    void insert(std::size_t position, std::string_view text);
    void clear() noexcept { _text.clear(); }

    /// Position of the first occurrence at `from` or behind it; -1 if there is none. An empty `text` is found at
    /// `from` itself, if that is not behind the end.
    long find(std::string_view text, std::size_t from = 0) const noexcept;
    /// Negative, 0 or positive, byte by byte; a text comes behind its own beginning.
    int compare(BXString const& other) const noexcept;
    /// The same after full case folding (Unicode's, by utf8proc). Bytes that are no UTF-8 are compared as they are.
    int caseInsensitiveCompare(BXString const& other) const;

    std::size_t size() const noexcept { return _text.size(); }
    bool empty() const noexcept { return _text.empty(); }

    /// A copy with a zero behind it, which the caller frees with `std::free`.
    char* createCStr() const;
    /// The text in front of `end`, and the text from `begin` on; positions behind the end count as the end.
    BXString substrTo(std::size_t end) const;
    BXString substrFrom(std::size_t begin) const;

    /// The one shared string of the process with this text, which lives as long as the process. For names that
    /// come from a bounded set, such as those of classes. Any thread.
    static BXString const* intern(std::string_view text);

    std::string const& str() const noexcept { return _text; }
    char const* c_str() const noexcept { return _text.c_str(); }
    std::string_view view() const noexcept { return _text; }

    friend bool operator==(BXString const& a, BXString const& b) noexcept { return a._text == b._text; }

private:
    std::string _text;
};
