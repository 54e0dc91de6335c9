#include "tools/plot/PlotCanvas.h"

#include "tools/output/SafeOutputFile.h"
#include "tools/output/TextForms.h"
#include "tools/plot/PlotShortening.h"

#include <algorithm>
#include <cairo-pdf.h>
#include <cairo-svg.h>
#include <cmath>
#include <new>
#include <numbers>

namespace lumenkey::tools {

namespace {

/// Cairo's coordinates have 24 bits before the point.
constexpr double kFarthest = 4'000'000;

constexpr char const* kFont = "DejaVu Sans";

double reachable(double coordinate) { return std::clamp(coordinate, -kFarthest, kFarthest); }

} // namespace

std::optional<PlotFormat> plotFormatOf(std::string_view file) {
    auto const endsWith = [file](std::string_view ending) {
        return file.size() > ending.size() &&
               std::equal(ending.begin(), ending.end(),
                          file.end() - static_cast<std::ptrdiff_t>(ending.size()),
                          [](char a, char b) { return a == (b >= 'A' && b <= 'Z' ? b - 'A' + 'a' : b); });
    };
    if (endsWith(".svg")) {
        return PlotFormat::Svg;
    }
    if (endsWith(".png")) {
        return PlotFormat::Png;
    }
    if (endsWith(".pdf")) {
        return PlotFormat::Pdf;
    }
    return std::nullopt;
}

PlotCanvas::PlotCanvas(PlotFormat format, double width, double height)
    : _format(format), _width(width), _height(height) {
    switch (format) {
    case PlotFormat::Svg:
        _surface.reset(cairo_svg_surface_create_for_stream(&append, _bytes.get(), width, height));
        cairo_svg_surface_set_document_unit(_surface.get(), CAIRO_SVG_UNIT_PX);
        break;
    case PlotFormat::Pdf:
        _surface.reset(cairo_pdf_surface_create_for_stream(&append, _bytes.get(), width, height));
        break;
    case PlotFormat::Png:
        _surface.reset(cairo_image_surface_create(CAIRO_FORMAT_ARGB32, static_cast<int>(std::lround(width)),
                                                  static_cast<int>(std::lround(height))));
        break;
    }
    check(cairo_surface_status(_surface.get()));
    _context.reset(cairo_create(_surface.get()));
    cairo_set_line_join(_context.get(), CAIRO_LINE_JOIN_ROUND);
}

cairo_status_t PlotCanvas::append(void* bytes, unsigned char const* data, unsigned length) {
    try {
        static_cast<std::string*>(bytes)->append(reinterpret_cast<char const*>(data), length);
        return CAIRO_STATUS_SUCCESS;
    } catch (std::bad_alloc const&) {
        return CAIRO_STATUS_NO_MEMORY;
    }
}

void PlotCanvas::check(cairo_status_t status) const {
    if (status != CAIRO_STATUS_SUCCESS) {
        throw OutputError{"the picture", cairo_status_to_string(status)};
    }
}

void PlotCanvas::setColour(PlotColour const& colour) {
    cairo_set_source_rgba(_context.get(), colour.red, colour.green, colour.blue, colour.opacity);
}

void PlotCanvas::apply(PlotStroke const& stroke) {
    setColour(stroke.colour);
    cairo_set_line_width(_context.get(), stroke.width);
    cairo_set_dash(_context.get(), stroke.dashes.data(), static_cast<int>(stroke.dashes.size()), 0);
    cairo_stroke(_context.get());
}

void PlotCanvas::tracePath(PlotRectangle const& area, double cornerRadius) {
    cairo_t* const context = _context.get();
    if (cornerRadius <= 0) {
        cairo_rectangle(context, area.x, area.y, area.width, area.height);
        return;
    }
    constexpr double quarter = std::numbers::pi / 2;
    double const r = cornerRadius;
    cairo_new_sub_path(context);
    cairo_arc(context, area.right() - r, area.y + r, r, -quarter, 0);
    cairo_arc(context, area.right() - r, area.bottom() - r, r, 0, quarter);
    cairo_arc(context, area.x + r, area.bottom() - r, r, quarter, 2 * quarter);
    cairo_arc(context, area.x + r, area.y + r, r, 2 * quarter, 3 * quarter);
    cairo_close_path(context);
}

void PlotCanvas::fill(PlotRectangle const& area, PlotColour const& colour, double cornerRadius) {
    tracePath(area, cornerRadius);
    setColour(colour);
    cairo_fill(_context.get());
}

void PlotCanvas::outline(PlotRectangle const& area, PlotStroke const& stroke, double cornerRadius) {
    tracePath(area, cornerRadius);
    apply(stroke);
}

void PlotCanvas::line(PlotPoint from, PlotPoint to, PlotStroke const& stroke) {
    polyline({from, to}, stroke);
}

void PlotCanvas::polyline(std::vector<PlotPoint> const& points, PlotStroke const& stroke) {
    bool isDown = false;
    for (PlotPoint const& point : withoutStraightPoints(points)) {
        if (std::isnan(point.x) || std::isnan(point.y)) {
            isDown = false;
            continue;
        }
        auto* const step = isDown ? &cairo_line_to : &cairo_move_to;
        step(_context.get(), reachable(point.x), reachable(point.y));
        isDown = true;
    }
    apply(stroke);
}

void PlotCanvas::fillAndApply(PlotColour const& inside, PlotStroke const& rim) {
    setColour(inside);
    cairo_fill_preserve(_context.get());
    apply(rim);
}

void PlotCanvas::dots(std::vector<PlotPoint> const& centres, double radius, PlotColour const& inside,
                      PlotStroke const& rim) {
    for (PlotPoint const& centre : centres) {
        if (!std::isnan(centre.x) && !std::isnan(centre.y)) {
            cairo_new_sub_path(_context.get());
            cairo_arc(_context.get(), reachable(centre.x), reachable(centre.y), radius, 0,
                      2 * std::numbers::pi);
            cairo_close_path(_context.get());
        }
    }
    fillAndApply(inside, rim);
}

void PlotCanvas::squares(std::vector<PlotPoint> const& centres, double halfSide, PlotColour const& inside,
                         PlotStroke const& rim) {
    for (PlotPoint const& centre : centres) {
        if (!std::isnan(centre.x) && !std::isnan(centre.y)) {
            cairo_rectangle(_context.get(), reachable(centre.x) - halfSide, reachable(centre.y) - halfSide,
                            2 * halfSide, 2 * halfSide);
        }
    }
    fillAndApply(inside, rim);
}

void PlotCanvas::selectFont(PlotText const& style) {
    cairo_select_font_face(_context.get(), kFont, CAIRO_FONT_SLANT_NORMAL,
                           style.bold ? CAIRO_FONT_WEIGHT_BOLD : CAIRO_FONT_WEIGHT_NORMAL);
    cairo_set_font_size(_context.get(), style.size);
}

double PlotCanvas::textWidth(std::string const& text, PlotText const& style) {
    selectFont(style);
    cairo_text_extents_t extents;
    // Cairo takes UTF-8 only and fails for good on anything else.
    cairo_text_extents(_context.get(), printableText(text).c_str(), &extents);
    return extents.x_advance;
}

void PlotCanvas::text(PlotPoint at, std::string const& text, PlotText const& style) {
    cairo_t* const context = _context.get();
    double const width = textWidth(text, style);
    double const shift = style.align == PlotAlign::Start    ? 0
                         : style.align == PlotAlign::Middle ? width / 2
                                                            : width;
    cairo_save(context);
    cairo_translate(context, at.x, at.y);
    if (style.upright) {
        cairo_rotate(context, -std::numbers::pi / 2);
    }
    cairo_move_to(context, -shift, 0);
    setColour(style.colour);
    cairo_show_text(context, printableText(text).c_str());
    cairo_new_path(context);
    cairo_restore(context);
}

void PlotCanvas::clip(PlotRectangle const& area) {
    cairo_save(_context.get());
    tracePath(area, 0);
    cairo_clip(_context.get());
}

void PlotCanvas::unclip() { cairo_restore(_context.get()); }

void PlotCanvas::save(std::string const& file) {
    SafeOutputFile out(file);
    writeTo(out);
    out.close();
}

void PlotCanvas::writeTo(OutputSink& out) {
    check(cairo_status(_context.get()));
    _context.reset();
    if (_format == PlotFormat::Png) {
        check(cairo_surface_write_to_png_stream(_surface.get(), &append, _bytes.get()));
    }
    cairo_surface_finish(_surface.get());
    check(cairo_surface_status(_surface.get()));
    out.write(_format == PlotFormat::Svg ? withShortNumbers(*_bytes) : *_bytes);
}

} // namespace lumenkey::tools
