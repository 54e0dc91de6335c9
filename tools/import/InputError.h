#pragma once

#include <string>

namespace lumenkey::tools {

/// What is wrong with an input file, and where: thrown by everything that reads one. Lines and columns count
/// from 1, columns in bytes; a file that cannot be read at all is at fault at 1:1.
struct InputError {
    std::string file;
    unsigned line = 1;
    unsigned column = 1;
    std::string what;

    /// `FILE:LINE:COLUMN: what`, on one line whatever stands in the names.
    std::string text() const;
};

} // namespace lumenkey::tools
