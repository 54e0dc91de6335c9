#pragma once

#include "tools/plot/CurvePicture.h"
#include "tools/plot/PlotCanvas.h"

#include <cstddef>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace lumenkey::tools {

struct ChartCurve {
    std::string name;
    CurvePicture picture;
    /// What the curve was, drawn broad and pale below it.
    std::optional<CurvePicture> before;
};

/// Curves of one unit, which share an axis of values.
struct ChartPanel {
    std::string unit;
    std::vector<ChartCurve> curves;
};

/// So many curves of a chart can be told apart: each of the first has a stroke of its own.
inline constexpr std::size_t kMostDistinctCurves = 28;

/// Values over time: a panel for each unit above a common axis of seconds, with a legend. Curves take their
/// colours in order, over all panels.
struct PlotChart {
    std::string title;
    std::string subtitle;
    PlotRange seconds;
    std::vector<ChartPanel> panels;

    void draw(PlotCanvas& canvas) const;
};

/// The panel of a unit, added where there is none yet.
ChartPanel& panelOfUnit(PlotChart& chart, std::string_view unit);

/// How many pixels a chart of this width gives to its curves.
double widthOfCurves(double chartWidth);

} // namespace lumenkey::tools
