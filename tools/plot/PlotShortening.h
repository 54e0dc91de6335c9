#pragma once

#include "tools/plot/PlotCanvas.h"

#include <string>
#include <string_view>
#include <vector>

namespace lumenkey::tools {

/// What small files leave out, and nobody sees: both keep to a twentieth of a pixel.

/// The ends of a polyline and, of the points between, those that it needs to stay where it is. Points that
/// are no numbers stay.
std::vector<PlotPoint> withoutStraightPoints(std::vector<PlotPoint> const& points);

/// An SVG with no number longer than two decimals.
std::string withShortNumbers(std::string_view svg);

} // namespace lumenkey::tools
