#pragma once

#include "tools/plot/PlotCanvas.h"

#include <array>
#include <cstddef>

/// The look of all pictures, in one place.
namespace lumenkey::tools::style {

constexpr PlotColour fromHex(unsigned rgb) {
    return {(rgb >> 16 & 0xFF) / 255.0, (rgb >> 8 & 0xFF) / 255.0, (rgb & 0xFF) / 255.0, 1};
}

inline constexpr PlotColour kPaper = fromHex(0xFFFFFF);
inline constexpr PlotColour kDesk = fromHex(0xF3F5F7);
inline constexpr PlotColour kInk = fromHex(0x20262E);
inline constexpr PlotColour kFaintInk = fromHex(0x66707C);
inline constexpr PlotColour kGrid = fromHex(0xE4E8EC);
inline constexpr PlotColour kAxis = fromHex(0x9AA4AF);
inline constexpr PlotColour kHandle = fromHex(0x8A94A0);

/// Told apart with every kind of colour blindness, on white (Okabe and Ito 2008, without the yellow).
inline constexpr std::array<PlotColour, 7> kCurves{fromHex(0x0072B2), fromHex(0xD55E00), fromHex(0x009E73),
                                                   fromHex(0xCC79A7), fromHex(0xE69F00), fromHex(0x56B4E9),
                                                   fromHex(0x333333)};

inline constexpr double kCurveWidth = 1.6;
/// Of what a curve was before an edit.
inline constexpr PlotColour kBefore = fromHex(0xC3CAD2);
inline constexpr double kBeforeWidth = 4;
/// Of a continuation outside the keypoints.
inline constexpr std::array<double, 2> kContinuationDashes{4, 3};

} // namespace lumenkey::tools::style
