#pragma once

#include "tools/plot/PlotCanvas.h"

#include <string>

namespace lumenkey::tools {

/// What the ending of an output file asks for. Throws `UsageError` for another ending.
PlotFormat requirePlotFormat(std::string const& file);

} // namespace lumenkey::tools
