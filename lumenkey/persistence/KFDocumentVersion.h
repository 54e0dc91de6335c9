// Internal: not installed.
#pragma once

#include <algorithm>
#include <charconv>
#include <cstdint>
#include <string_view>

/// Takes a number off the front, behind spaces and a plus sign. False, and both as they were, without one.
inline bool KFTakeNumber(std::string_view& text, std::uint32_t& number) {
    std::size_t start = std::min(text.find_first_not_of(" \t\r\n\v\f"), text.size());
    if (start < text.size() && text[start] == '+')
        ++start;
    char const* const end = text.data() + text.size();
    auto const [behind, error] = std::from_chars(text.data() + start, end, number);
    if (error != std::errc())
        return false;
    text.remove_prefix(static_cast<std::size_t>(behind - text.data()));
    return true;
}

/// The version of a document: two numbers, each behind any spaces, with a dot between them. What isn't there
/// stays.
inline void KFReadVersion(std::string_view text, std::uint32_t& major, std::uint32_t& minor) {
    if (KFTakeNumber(text, major) && text.starts_with('.')) {
        text.remove_prefix(1);
        KFTakeNumber(text, minor);
    }
}
