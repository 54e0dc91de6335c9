#pragma once

#include "tools/plot/PlotCanvas.h"

namespace lumenkey::tools {

inline constexpr double kGalleryWidth = 1'120;
inline constexpr double kGalleryHeight = 880;

/// One small picture for each interpolation type and extrapolation mode, drawn by the engine. Meant for a
/// canvas of the size above.
void drawGallery(PlotCanvas& canvas);

} // namespace lumenkey::tools
