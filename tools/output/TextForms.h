#pragma once

#include "lumenkey/foundation/Tempus.h"

#include <string>
#include <string_view>

namespace lumenkey::tools {

/// The shortest decimal that reads back to the same bits; `inf`, `-inf` and `nan` for what is no number.
std::string shortestText(double value);
void appendShortest(std::string& text, double value);

/// For tables: six decimals, or seven significant digits where those would show nothing or too much.
std::string tableText(double value);

/// `VALUE/TIMESCALE` in lowest terms, with `@EPOCH` and `~` behind it where the time has an epoch or was
/// rounded; the words `invalid`, `indefinite`, `+infinity`, `-infinity` for what is no number.
std::string timeText(Tempus const& time);

/// UTF-8 that never breaks a line, moves the cursor or turns a direction: control characters, also those of
/// C1, marks of lines and directions that aren't seen, and what is no character, as `\xNN` for each byte of
/// theirs.
std::string printableText(std::string_view text);

/// In quotes, and shortened where it is long.
std::string quoted(std::string_view text);

/// What the system calls an error, such as "No such file or directory"; in English whatever the locale.
std::string systemErrorText(int error);

/// Whether two words are the same but for the case of ASCII letters.
bool sameWord(std::string_view a, std::string_view b);

/// The number of characters of UTF-8 text; a byte that is no part of one counts as one.
std::size_t widthOfText(std::string_view text);

} // namespace lumenkey::tools
