// Internal: not installed.
#pragma once

#include <string_view>

/// The texts that the library shows to people, by key. An unknown key is its own text.
std::string_view BXStringBundleText(std::string_view key) noexcept;
