#pragma once

#include "lumenkey/foundation/Tempus.h"

#include <string_view>

namespace lumenkey::tools {

/// Reads `VALUE/TIMESCALE`, whole numbers of 64 and 32 bits with the timescale above 0, in lowest terms;
/// invalid for any other text.
Tempus timeFromFraction(std::string_view text);

} // namespace lumenkey::tools
