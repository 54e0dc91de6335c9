#pragma once

#include "lumenkey/foundation/BXExport.h"

namespace BXAlgorithm {

/// Cuts the cubic Bezier of each component, four control values, at the parameter (at - low) / (high - low), by de
/// Casteljau's construction. The left part ends where the right one begins, bit for bit. A component whose control
/// values are null is passed over, and so is each null output. An output may be the array of its own input. With
/// `low` equal to `high` the cut is at the start. A parameter outside 0 .. 1 extends the curve.
LUMENKEY_API void DeCasteljauSubdivide(double low, double high, double at, double const* x, double const* y,
                                       double const* z, double* leftX, double* leftY, double* leftZ,
                                       double* rightX, double* rightY, double* rightZ) noexcept;

} // namespace BXAlgorithm
