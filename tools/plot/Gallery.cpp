#include "tools/plot/Gallery.h"

#include "tools/plot/CurvePicture.h"
#include "tools/plot/GalleryExhibits.h"
#include "tools/plot/PlotStyle.h"

namespace lumenkey::tools {

namespace {

constexpr double kMargin = 28;
constexpr double kBetween = 14;
constexpr double kHeading = 48;
constexpr double kCardHead = 30;
constexpr double kCardPadding = 12;
constexpr double kCorner = 6;

PlotText const kSectionTitle{15, style::kInk, PlotAlign::Start, true, false};
PlotText const kSectionNote{11, style::kFaintInk, PlotAlign::Start, false, false};
PlotText const kCardTitle{12, style::kInk, PlotAlign::Start, true, false};
PlotText const kCardNumber{11, style::kFaintInk, PlotAlign::End, false, false};

/// Exhibits in rows of cards, under a title.
struct Section {
    char const* title;
    char const* note;
    std::size_t columns;
    double cardHeight;
    PlotColour colour;
};

void drawCard(PlotCanvas& canvas, PlotRectangle const& card, GalleryExhibit const& exhibit,
              PlotColour const& colour) {
    canvas.fill(card, style::kPaper, kCorner);
    canvas.outline(card, {style::kGrid, 1, {}}, kCorner);
    canvas.text({card.x + kCardPadding, card.y + 20}, exhibit.title, kCardTitle);
    canvas.text({card.right() - kCardPadding, card.y + 20}, exhibit.number, kCardNumber);

    PlotRectangle const area{card.x + kCardPadding, card.y + kCardHead, card.width - 2 * kCardPadding,
                             card.height - kCardHead - kCardPadding};
    CurvePicture const picture = traceCurve(exhibit.curve->spline, exhibit.from, exhibit.to, area.width);
    PlotRange const seconds =
        PlotRange::sound(TempusGetSeconds(exhibit.from), TempusGetSeconds(exhibit.to)).padded(0.03);
    PlotFrame const frame{area, seconds, picture.valueRange().padded(0.06)};
    PlotStroke const thin{style::kGrid, 1, {}};
    for (Keypoint const& key : picture.keypoints) {
        double const x = frame.at(TempusGetSeconds(key.time), 0).x;
        canvas.line({x, area.y}, {x, area.bottom()}, thin);
    }
    canvas.clip({card.x + 1, area.y - 4, card.width - 2, area.height + 8});
    drawCurve(canvas, frame, picture, {colour, style::kCurveWidth, {}}, KeypointMarks::Large);
    canvas.unclip();
}

/// Returns the place for what comes below.
double drawSection(PlotCanvas& canvas, double top, Section const& section,
                   std::vector<GalleryExhibit> const& exhibits) {
    canvas.text({kMargin, top + 20}, section.title, kSectionTitle);
    double const noteLeft = kMargin + canvas.textWidth(section.title, kSectionTitle) + 12;
    canvas.text({noteLeft, top + 20}, section.note, kSectionNote);
    double const columns = static_cast<double>(section.columns);
    double const width = (canvas.width() - 2 * kMargin - kBetween * (columns - 1)) / columns;
    double y = top + kHeading - kBetween;
    for (std::size_t i = 0; i < exhibits.size(); ++i) {
        double const x = kMargin + static_cast<double>(i % section.columns) * (width + kBetween);
        drawCard(canvas, {x, y, width, section.cardHeight}, exhibits[i], section.colour);
        bool const endsRow = i % section.columns == section.columns - 1 || i + 1 == exhibits.size();
        y += endsRow ? section.cardHeight + kBetween : 0;
    }
    return y;
}

} // namespace

void drawGallery(PlotCanvas& canvas) {
    canvas.fill({0, 0, canvas.width(), canvas.height()}, style::kDesk);
    double const next =
        drawSection(canvas, 14,
                    {"Interpolation types",
                     "how a segment is drawn, by the number in documents; handles where a type has them", 6,
                     180, style::kCurves[0]},
                    interpolationExhibits());
    drawSection(canvas, next + 4,
                {"Extrapolation modes",
                 "how a curve goes on before its first and after its last keypoint (dashed)", 5, 180,
                 style::kCurves[1]},
                extrapolationExhibits());
}

} // namespace lumenkey::tools
