#pragma once

#include <string>
#include <vector>

namespace lumenkey::tools {

/// A stretch of an axis; never empty, and finite.
struct PlotRange {
    double low = 0;
    double high = 1;

    /// Finite and with room between its ends, whatever is given.
    static PlotRange sound(double low, double high);
    /// Wider by a share of itself on both sides.
    PlotRange padded(double share) const;
    /// 0 at the low end, 1 at the high end.
    double share(double value) const { return (value - low) / (high - low); }
};

struct PlotTick {
    double value = 0;
    std::string label;
};

/// Round numbers, 1, 2 or 5 times a power of ten apart, at most about `most` of them.
std::vector<PlotTick> ticksWithin(PlotRange const& range, int most);

} // namespace lumenkey::tools
