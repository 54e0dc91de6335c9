// Internal: not installed.
#pragma once

#include "lumenkey/foundation/BXDocumentReader.h"

#include <algorithm>
#include <cstdint>
#include <string>
#include <string_view>

// How a parser of XML is fed, in blocks, and asked for places. It begins a token that a block cuts off anew with the
// next one. Blocks as long as what is left over keep that linear, and none reaches past the longest token.

inline constexpr std::uint64_t kFirstParserBlock = 64 << 10;
inline constexpr std::uint64_t kLongestToken = BXDocumentReader::kLongestText;

/// The size of the next block, where `fed` bytes were given and the parser is done with those before `done` (below 0
/// for none known). 0 if the token that is left over is too long.
constexpr std::uint64_t BXNextParserBlock(std::uint64_t fed, std::int64_t done) noexcept {
    std::uint64_t const left = done < 0 ? 0 : fed - std::min(fed, static_cast<std::uint64_t>(done));
    return left >= kLongestToken ? 0 : std::min(std::max(kFirstParserBlock, left), kLongestToken - left);
}

/// Whether a document begins with a byte order mark.
inline bool BXStartsWithMark(std::string_view text) noexcept {
    return text.starts_with("\xEF\xBB\xBF") || text.starts_with("\xFF\xFE") || text.starts_with("\xFE\xFF");
}

/// The column of a place, counted from 1, of a parser that takes a mark for a character of the first line.
constexpr std::uint64_t BXParserColumn(std::uint64_t line, std::uint64_t before, bool hasMark) noexcept {
    return before + (hasMark && line == 1 && before != 0 ? 0 : 1);
}

inline std::string BXTokenTooLong() {
    return "a tag or comment is longer than " + std::to_string(kLongestToken) + " bytes";
}
