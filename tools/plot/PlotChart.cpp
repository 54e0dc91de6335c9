#include "tools/plot/PlotChart.h"

#include "tools/plot/PlotStyle.h"

#include <algorithm>

namespace lumenkey::tools {

namespace {

constexpr double kMarginLeft = 74;
constexpr double kMarginRight = 24;
constexpr double kMarginTop = 20;
constexpr double kMarginBottom = 50;
constexpr double kBetweenPanels = 22;
constexpr double kTickEvery = 90;
constexpr double kValueTickEvery = 28;
constexpr double kLegendLine = 20;
constexpr double kLegendSample = 22;
/// Beyond this the legend would leave no room for curves.
constexpr double kLegendShare = 0.25;
constexpr double kSmallText = 11;

PlotText const kTitle{15, style::kInk, PlotAlign::Start, true, false};
PlotText const kSubtitle{kSmallText, style::kFaintInk, PlotAlign::Start, false, false};
PlotText const kLegend{12, style::kInk, PlotAlign::Start, false, false};

PlotText tickText(PlotAlign align) { return {kSmallText, style::kFaintInk, align, false, false}; }

PlotStroke strokeOfCurve(std::size_t index) {
    static std::vector<double> const patterns[] = {{}, {7, 3}, {2, 2.5}, {8, 3, 2, 3}};
    static_assert(std::size(patterns) * style::kCurves.size() == kMostDistinctCurves);
    std::size_t const round = index / style::kCurves.size();
    return {style::kCurves[index % style::kCurves.size()], style::kCurveWidth,
            patterns[round % std::size(patterns)]};
}

std::string const kBeforeName = "before";
PlotStroke const kBeforeStroke{style::kBefore, style::kBeforeWidth, {}};

class ChartDrawing {
public:
    ChartDrawing(PlotChart const& chart, PlotCanvas& canvas) : _chart(chart), _canvas(canvas) {}

    void draw() {
        _canvas.fill({0, 0, _canvas.width(), _canvas.height()}, style::kPaper);
        double const top = drawLegend(drawTitle());
        double const bottom = std::max(_canvas.height() - kMarginBottom, top + 1);
        double const count = static_cast<double>(std::max<std::size_t>(_chart.panels.size(), 1));
        double const height = std::max((bottom - top - kBetweenPanels * (count - 1)) / count, 1.0);
        PlotRectangle area{kMarginLeft, top, widthOfCurves(_canvas.width()), height};
        for (ChartPanel const& panel : _chart.panels) {
            drawPanel(panel, area);
            area.y += height + kBetweenPanels;
        }
        area.y -= height + kBetweenPanels;
        drawSeconds(area);
    }

private:
    double drawTitle() {
        double const baseline = kMarginTop + kTitle.size * 0.75;
        _canvas.text({kMarginLeft, baseline}, _chart.title, kTitle);
        double const left = kMarginLeft + _canvas.textWidth(_chart.title, kTitle) + 12;
        bool const fits =
            left + _canvas.textWidth(_chart.subtitle, kSubtitle) < _canvas.width() - kMarginRight;
        _canvas.text({fits ? left : kMarginLeft, fits ? baseline : baseline + 17}, _chart.subtitle,
                     kSubtitle);
        return baseline + (fits ? 12 : 29);
    }

    /// Returns where the first panel begins.
    double drawLegend(double top) {
        double x = kMarginLeft;
        double y = top + kLegendLine * 0.7;
        double const lowest = top + _canvas.height() * kLegendShare;
        std::size_t index = 0;
        if (showsBefore()) {
            drawLegendEntry({x, y}, kBeforeName, kBeforeStroke);
            x += widthOfEntry(kBeforeName);
        }
        for (ChartPanel const& panel : _chart.panels) {
            for (ChartCurve const& curve : panel.curves) {
                double const width = widthOfEntry(curve.name);
                if (x > kMarginLeft && x + width > _canvas.width() - kMarginRight + 20) {
                    x = kMarginLeft;
                    y += kLegendLine;
                }
                if (y > lowest) {
                    _canvas.text({x, y}, "and " + std::to_string(curveCount() - index) + " more", kSubtitle);
                    return y + kLegendLine;
                }
                drawLegendEntry({x, y}, curve.name, strokeOfCurve(index++));
                x += width;
            }
        }
        return y + kLegendLine;
    }

    double widthOfEntry(std::string const& name) {
        return kLegendSample + 7 + _canvas.textWidth(name, kLegend) + 20;
    }

    bool showsBefore() const {
        return std::any_of(_chart.panels.begin(), _chart.panels.end(), [](ChartPanel const& panel) {
            return std::any_of(panel.curves.begin(), panel.curves.end(),
                               [](ChartCurve const& curve) { return curve.before.has_value(); });
        });
    }

    void drawLegendEntry(PlotPoint at, std::string const& name, PlotStroke stroke) {
        double const middle = at.y - kLegend.size * 0.36;
        stroke.width = std::max(stroke.width, 2.2);
        _canvas.line({at.x, middle}, {at.x + kLegendSample, middle}, stroke);
        _canvas.text({at.x + kLegendSample + 7, at.y}, name, kLegend);
    }

    std::size_t curveCount() const {
        std::size_t count = 0;
        for (ChartPanel const& panel : _chart.panels) {
            count += panel.curves.size();
        }
        return count;
    }

    PlotRange valuesOf(ChartPanel const& panel) const {
        PlotRange range = panel.curves.front().picture.valueRange();
        auto const widen = [&range](CurvePicture const& picture) {
            PlotRange const other = picture.valueRange();
            range = {std::min(range.low, other.low), std::max(range.high, other.high)};
        };
        for (ChartCurve const& curve : panel.curves) {
            widen(curve.picture);
            if (curve.before) {
                widen(*curve.before);
            }
        }
        return PlotRange::sound(range.low, range.high).padded(0.06);
    }

    void drawPanel(ChartPanel const& panel, PlotRectangle const& area) {
        PlotFrame const frame{area, _chart.seconds, valuesOf(panel)};
        drawGrid(frame, panel.unit);
        _canvas.clip({area.x - 4, area.y - 4, area.width + 8, area.height + 8});
        for (ChartCurve const& curve : panel.curves) {
            if (curve.before) {
                drawCurve(_canvas, frame, *curve.before, kBeforeStroke, KeypointMarks::None);
            }
        }
        for (ChartCurve const& curve : panel.curves) {
            drawCurve(_canvas, frame, curve.picture, strokeOfCurve(_drawn++),
                      marksFor(curve.picture, area.width));
        }
        _canvas.unclip();
    }

    void drawGrid(PlotFrame const& frame, std::string const& unit) {
        PlotRectangle const& area = frame.area;
        PlotStroke const thin{style::kGrid, 1, {}};
        for (PlotTick const& tick : ticksWithin(frame.seconds, static_cast<int>(area.width / kTickEvery))) {
            double const x = frame.at(tick.value, 0).x;
            _canvas.line({x, area.y}, {x, area.bottom()}, thin);
        }
        for (PlotTick const& tick :
             ticksWithin(frame.values, static_cast<int>(area.height / kValueTickEvery))) {
            double const y = frame.at(0, tick.value).y;
            bool const isZero = tick.value == 0;
            _canvas.line({area.x, y}, {area.right(), y}, isZero ? PlotStroke{style::kAxis, 1, {}} : thin);
            _canvas.text({area.x - 8, y + kSmallText * 0.36}, tick.label, tickText(PlotAlign::End));
        }
        _canvas.line({area.x, area.y}, {area.x, area.bottom()}, {style::kAxis, 1, {}});
        PlotText label = tickText(PlotAlign::Middle);
        label.upright = true;
        _canvas.text({kMarginLeft - 56, area.y + area.height / 2}, unit, label);
    }

    /// Below the last panel.
    void drawSeconds(PlotRectangle const& area) {
        PlotFrame const frame{area, _chart.seconds, {}};
        PlotStroke const stroke{style::kAxis, 1, {}};
        _canvas.line({area.x, area.bottom()}, {area.right(), area.bottom()}, stroke);
        for (PlotTick const& tick : ticksWithin(frame.seconds, static_cast<int>(area.width / kTickEvery))) {
            double const x = frame.at(tick.value, 0).x;
            _canvas.line({x, area.bottom()}, {x, area.bottom() + 4}, stroke);
            _canvas.text({x, area.bottom() + 17}, tick.label, tickText(PlotAlign::Middle));
        }
        _canvas.text({area.x + area.width / 2, area.bottom() + 36}, "time (s)", tickText(PlotAlign::Middle));
    }

    PlotChart const& _chart;
    PlotCanvas& _canvas;
    std::size_t _drawn = 0;
};

} // namespace

ChartPanel& panelOfUnit(PlotChart& chart, std::string_view unit) {
    for (ChartPanel& panel : chart.panels) {
        if (panel.unit == unit) {
            return panel;
        }
    }
    return chart.panels.emplace_back(ChartPanel{std::string(unit), {}});
}

double widthOfCurves(double chartWidth) { return std::max(chartWidth - kMarginLeft - kMarginRight, 1.0); }

void PlotChart::draw(PlotCanvas& canvas) const { ChartDrawing(*this, canvas).draw(); }

} // namespace lumenkey::tools
