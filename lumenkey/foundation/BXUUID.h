#pragma once

#include "lumenkey/foundation/BXExport.h"

#include <array>
#include <compare>
#include <cstdint>
#include <string>
#include <string_view>

/// 16 bytes that name something for ever, read as four 32-bit words, first word first.
struct LUMENKEY_API BXUUID {
    std::array<std::uint32_t, 4> words{};

    constexpr bool isZero() const noexcept { return (words[0] | words[1] | words[2] | words[3]) == 0; }

    /// Ordered by the words as unsigned numbers, first word first.
    friend constexpr auto operator<=>(BXUUID const&, BXUUID const&) noexcept = default;

    /// The usual grouping in upper case: 4B723EA5-2443-11D7-9C75-00039366FB58.
    std::string text() const;
    /// Reads that grouping in either case, the whole of `text`. False, and `*out` as it was, for anything else.
    static constexpr bool fromText(std::string_view text, BXUUID* out) noexcept;
};

constexpr bool BXUUID::fromText(std::string_view text, BXUUID* out) noexcept {
    if (text.size() != 36) {
        return false;
    }
    BXUUID read;
    unsigned digits = 0;
    for (std::size_t i = 0; i < text.size(); ++i) {
        char const c = text[i];
        if (i == 8 || i == 13 || i == 18 || i == 23) {
            if (c != '-') {
                return false;
            }
            continue;
        }
        std::uint32_t digit = 0;
        if (c >= '0' && c <= '9') {
            digit = static_cast<std::uint32_t>(c - '0');
        } else if (c >= 'A' && c <= 'F') {
            digit = static_cast<std::uint32_t>(c - 'A') + 10;
        } else if (c >= 'a' && c <= 'f') {
            digit = static_cast<std::uint32_t>(c - 'a') + 10;
        } else {
            return false;
        }
        read.words[digits / 8] = (read.words[digits / 8] << 4) | digit;
        ++digits;
    }
    *out = read;
    return true;
}
