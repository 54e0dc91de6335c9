#pragma once

#include "tools/output/OutputSink.h"

#include <cairo.h>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace lumenkey::tools {

enum class PlotFormat { Svg, Png, Pdf };

/// By the ending of a file name, in any case; nothing for any other ending.
std::optional<PlotFormat> plotFormatOf(std::string_view file);

struct PlotPoint {
    double x = 0;
    double y = 0;
};

struct PlotRectangle {
    double x = 0;
    double y = 0;
    double width = 0;
    double height = 0;

    double right() const { return x + width; }
    double bottom() const { return y + height; }
};

/// Components 0 .. 1.
struct PlotColour {
    double red = 0;
    double green = 0;
    double blue = 0;
    double opacity = 1;
};

struct PlotStroke {
    PlotColour colour;
    double width = 1;
    /// Lengths of strokes and gaps in turn; unbroken when empty.
    std::vector<double> dashes;
};

enum class PlotAlign { Start, Middle, End };

struct PlotText {
    double size = 12;
    PlotColour colour;
    PlotAlign align = PlotAlign::Start;
    bool bold = false;
    /// Read from below to above.
    bool upright = false;
};

/// A picture drawn from the upper left corner, in pixels (in PDF, points of 1/72 inch). It stands in memory
/// until it is saved. Coordinates that are no numbers interrupt a line; far-off ones are drawn at the edge of
/// what can be. Throws `OutputError` where the picture can't be made.
class PlotCanvas {
public:
    PlotCanvas(PlotFormat format, double width, double height);

    double width() const { return _width; }
    double height() const { return _height; }

    void fill(PlotRectangle const& area, PlotColour const& colour, double cornerRadius = 0);
    void outline(PlotRectangle const& area, PlotStroke const& stroke, double cornerRadius = 0);
    void line(PlotPoint from, PlotPoint to, PlotStroke const& stroke);
    void polyline(std::vector<PlotPoint> const& points, PlotStroke const& stroke);
    /// Discs with a rim, and squares; all rims above all insides.
    void dots(std::vector<PlotPoint> const& centres, double radius, PlotColour const& inside,
              PlotStroke const& rim);
    void squares(std::vector<PlotPoint> const& centres, double halfSide, PlotColour const& inside,
                 PlotStroke const& rim);

    /// `at` is on the base line.
    void text(PlotPoint at, std::string const& text, PlotText const& style);
    double textWidth(std::string const& text, PlotText const& style);

    /// Until `unclip`, nothing is drawn outside.
    void clip(PlotRectangle const& area);
    void unclip();

    /// Ends the picture and writes it to a file, as a whole or not at all.
    void save(std::string const& file);
    /// Ends the picture and writes it.
    void writeTo(OutputSink& out);

private:
    struct Release {
        void operator()(cairo_t* context) const { cairo_destroy(context); }
        void operator()(cairo_surface_t* surface) const { cairo_surface_destroy(surface); }
    };

    static cairo_status_t append(void* bytes, unsigned char const* data, unsigned length);
    void check(cairo_status_t status) const;
    void apply(PlotStroke const& stroke);
    void fillAndApply(PlotColour const& inside, PlotStroke const& rim);
    void setColour(PlotColour const& colour);
    void selectFont(PlotText const& style);
    void tracePath(PlotRectangle const& area, double cornerRadius);

    PlotFormat _format;
    double _width;
    double _height;
    /// What the surface wrote; above the surface, which writes until it is gone.
    std::unique_ptr<std::string> _bytes = std::make_unique<std::string>();
    std::unique_ptr<cairo_surface_t, Release> _surface;
    std::unique_ptr<cairo_t, Release> _context;
};

} // namespace lumenkey::tools
