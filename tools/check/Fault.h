#pragma once

#include <string>

namespace lumenkey::tools {

struct Fault {
    /// May be empty, where nothing is at fault.
    std::string what;
    /// Whether a reader takes it as it is, or needn't have it.
    bool isKept = false;
};

} // namespace lumenkey::tools
