// Internal: not installed.
#pragma once

#include "lumenkey/foundation/BXDocumentReader.h"

#include <algorithm>
#include <cstdint>
#include <string>

// How a parser of XML is fed, in blocks. It begins a token that a block cuts off anew with the next one. Blocks as
// long as what is left over keep that linear, and none reaches past the longest token.

inline constexpr std::uint64_t kFirstParserBlock = 64 << 10;
inline constexpr std::uint64_t kLongestToken = BXDocumentReader::kLongestText;

/// The size of the next block, where `fed` bytes were given and the parser is done with those before `done` (below 0
/// for none known). 0 if the token that is left over is too long.
constexpr std::uint64_t BXNextParserBlock(std::uint64_t fed, std::int64_t done) noexcept {
    std::uint64_t const left = done < 0 ? 0 : fed - std::min(fed, static_cast<std::uint64_t>(done));
    return left >= kLongestToken ? 0 : std::min(std::max(kFirstParserBlock, left), kLongestToken - left);
}

inline std::string BXTokenTooLong() {
    return "a tag or comment is longer than " + std::to_string(kLongestToken) + " bytes";
}
