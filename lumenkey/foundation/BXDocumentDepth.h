// Internal: not installed.
#pragma once

#include <cstddef>
#include <cstdint>
#include <string>

// How deep elements may lie in each other, the root counted, and how many attributes one may have. What is
// written stays within what is read.

inline constexpr std::uint32_t kGreatestDepth = 1000;
/// Of an element that something is made for. What that will write inside of such an element, which may be
/// more than it has read, must not be too deep to be read again.
inline constexpr std::uint32_t kGreatestDepthOfNodes = kGreatestDepth - 10;

/// More than any has; a hostile one would cost many times its text.
inline constexpr std::size_t kMostAttributes = 1000;

inline std::string BXTooDeepText() {
    return "elements lie more than " + std::to_string(kGreatestDepth) + " deep in each other";
}
inline std::string BXNodeTooDeepText() {
    return "nodes lie more than " + std::to_string(kGreatestDepthOfNodes) + " elements deep in each other";
}
inline std::string BXTooManyAttributesText() {
    return "an element has more than " + std::to_string(kMostAttributes) + " attributes";
}
/// `pairs` are names and values in turn, with null at the end.
inline bool BXHasTooManyAttributes(char const* const* pairs) noexcept {
    std::size_t count = 0;
    while (count <= kMostAttributes && pairs[2 * count] != nullptr)
        ++count;
    return count > kMostAttributes;
}
