#pragma once

#include "lumenkey/foundation/BXString.h"

#include <utility>

/// Names a file of this machine by its path, which is taken as it is: absolute, or from the working
/// directory.
class BXURL {
public:
    explicit BXURL(BXString path) noexcept : _path(std::move(path)) {}

    BXString const& path() const noexcept { return _path; }

private:
    BXString _path;
};
