// Internal: not installed.
#pragma once

#include <cstdint>
#include <string>

// How deep elements may lie in each other, the root counted. What is written stays within what is read.

inline constexpr std::uint32_t kGreatestDepth = 1000;
/// Of an element that something is made for. What that will write inside of such an element, which may be
/// more than it has read, must not be too deep to be read again.
inline constexpr std::uint32_t kGreatestDepthOfNodes = kGreatestDepth - 10;

inline std::string BXTooDeepText() {
    return "elements lie more than " + std::to_string(kGreatestDepth) + " deep in each other";
}
inline std::string BXNodeTooDeepText() {
    return "nodes lie more than " + std::to_string(kGreatestDepthOfNodes) + " elements deep in each other";
}
