#pragma once

#include "tools/generate/WalkCycle.h"

#include <cstdint>
#include <functional>
#include <string>
#include <string_view>

namespace lumenkey::generate {

/// Frames a second, as a fraction: 120/1, 30000/1001.
struct FrameRate {
    std::uint32_t frames = 120;
    std::uint32_t seconds = 1;
};

/// Writes the walk as a motion capture file (BVH), piece by piece into `out`, which answers false to stop.
bool writeMotion(WalkCycle const& walk, std::uint64_t frameCount, FrameRate const& rate,
                 std::function<bool(std::string_view)> const& out);

} // namespace lumenkey::generate
