#pragma once

#include <string>

namespace lumenkey::tools {

/// Wrong arguments: a mistake of whoever called the program, told with the usage of the verb.
struct UsageError {
    std::string what;
};

} // namespace lumenkey::tools
