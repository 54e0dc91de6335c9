#pragma once

#include "tools/import/MotionFile.h"
#include "tools/output/OutputSink.h"

#include <functional>

namespace lumenkey::tools {

/// Writes a motion capture file (BVH) from which `readMotionText` gets the same motion: joints, offsets, end
/// sites and channels in their order, the frame time as it was printed, and every number as the shortest
/// decimal that reads back to the same bits. `progress` is told the share of the frames done, 0 .. 1.
void writeMotionText(Motion const& motion, OutputSink& out, std::function<void(double)> const& progress = {});

} // namespace lumenkey::tools
