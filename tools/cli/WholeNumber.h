#pragma once

#include <CLI/CLI.hpp>
#include <charconv>
#include <cstdint>
#include <string>

namespace lumenkey::tools {

/// A check of an option, which must be a whole number from `least` on.
inline CLI::Validator wholeNumberFrom(std::uint64_t least) {
    return CLI::Validator(
        [least](std::string const& text) -> std::string {
            std::uint64_t number = 0;
            auto const [end, error] = std::from_chars(text.data(), text.data() + text.size(), number);
            bool const isSound = error == std::errc() && end == text.data() + text.size() && number >= least;
            return isSound ? ""
                           : "must be a whole number from " + std::to_string(least) + " on: '" + text + "'";
        },
        "");
}

} // namespace lumenkey::tools
