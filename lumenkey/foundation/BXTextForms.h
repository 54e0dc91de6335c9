// Internal: not installed.
#pragma once

#include "lumenkey/foundation/BXString.h"
#include "lumenkey/foundation/BXUUID.h"
#include "lumenkey/foundation/Tempus.h"

#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>

/// How values stand in documents as text. No locale has a say.
///
///     bool          1, 0                              also read: true, false
///     whole number  decimal
///     double        the shortest decimal that gives the same bits again; inf, -inf, nan (of any bits)
///     time          VALUE/TIMESCALE, @EPOCH behind it unless that is 0, ~ behind it all if it has been
///                   rounded: 48/24, -7/30@2, 1/3~; the words invalid, indefinite, +infinity, -infinity, also with ~
///     UUID          the usual grouping in upper case
///     string        itself in UTF-8; see `escaped`
///
/// A time whose bits are neither those of a number nor those of a constant is VALUE/TIMESCALE@EPOCH#FLAGS,
/// all in decimal: every time comes back bit for bit.
namespace BXText {

/// Room for the text of any value but a string.
inline constexpr std::size_t kLongest = 80;

/// Each writes at `out`, where there is room for `kLongest`, and answers the end of what it wrote.
char* write(char* out, bool value) noexcept;
char* write(char* out, std::uint32_t value) noexcept;
char* write(char* out, std::uint64_t value) noexcept;
char* write(char* out, double value) noexcept;
char* write(char* out, Tempus const& value) noexcept;
char* write(char* out, BXUUID const& value) noexcept;

/// White space in XML.
constexpr bool isSpace(char c) noexcept { return c == ' ' || c == '\t' || c == '\n' || c == '\r'; }

/// Each takes the whole text, but for XML's white space around it, or answers false with `*out` as it was.
bool read(std::string_view text, bool* out) noexcept;
/// 32 bits are the low half of any number that 64 bits hold: what was a long number for its writer keeps
/// those.
bool read(std::string_view text, std::uint32_t* out) noexcept;
bool read(std::string_view text, std::int32_t* out) noexcept;
bool read(std::string_view text, std::uint64_t* out) noexcept;
/// False for what is too large or too small for a double.
bool read(std::string_view text, double* out) noexcept;
bool read(std::string_view text, Tempus* out) noexcept;
bool read(std::string_view text, BXUUID* out) noexcept;
/// Undoes `escaped`; always true.
bool read(std::string_view text, BXString* out);

enum class Place { Attribute, Content };

/// Where the next stretch ends that stands for itself in XML, looked for from `begin`.
std::size_t plainEnd(std::string_view text, std::size_t begin, Place place) noexcept;

/// The text for the one byte at `at`, where no plain stretch begins, written at `out` (room for 8); answers
/// the end.
///
/// XML's own characters are entities (&amp; &lt; &gt; &quot;); what its parsers would turn into something
/// else, a carriage return, and in attributes a tab and a line feed, are character references. A byte that
/// XML can't hold, which is a control character, one that is no part of valid UTF-8, or one of U+FFFE or
/// U+FFFF, is \xHH in upper case. A backslash stays, but where it would read as the start of such an escape
/// (before an x and two hexadecimal digits in either case) it is \x5C. So C:\temp stays as it is, and every
/// sequence of bytes comes back.
char* escaped(char* out, std::string_view text, std::size_t at) noexcept;

} // namespace BXText
