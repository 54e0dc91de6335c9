#pragma once

#include "lumenkey/curves/KFCurve.h"
#include "lumenkey/splines/KFSpline.h"
#include "tools/curve/Keypoint.h"
#include "tools/plot/PlotAxis.h"
#include "tools/plot/PlotCanvas.h"

#include <vector>

namespace lumenkey::tools {

/// A curve between two times as the engine draws it, in seconds and values: what lies between the keypoints,
/// and the continuation on both sides.
struct CurvePicture {
    std::vector<PlotPoint> before;
    std::vector<PlotPoint> inside;
    std::vector<PlotPoint> after;
    /// Those between the two times. Handles that shape nothing, at the ends, are left out.
    std::vector<Keypoint> keypoints;
    /// The curve is one function and the keypoints are its control points, which it need not pass through.
    bool isOneFunction = false;

    /// Over everything, handles too.
    PlotRange valueRange() const;
};

/// Follows the curve to half a pixel where it bends, and no finer where keypoints stand closer: of the points
/// in half a pixel the first, the lowest, the highest and the last stay.
CurvePicture traceCurve(KFSpline& spline, Tempus const& from, Tempus const& to, double pixels);
/// The same for any curve: one without keypoints is a level line.
CurvePicture traceCurve(KFCurve& curve, Tempus const& from, Tempus const& to, double pixels);

/// Where seconds and values stand in a picture.
struct PlotFrame {
    PlotRectangle area;
    PlotRange seconds;
    PlotRange values;

    PlotPoint at(double second, double value) const;
};

/// Discs, dots, or nothing where keypoints stand so close that marks would only thicken the line.
enum class KeypointMarks { Large, Small, None };

void drawCurve(PlotCanvas& canvas, PlotFrame const& frame, CurvePicture const& curve,
               PlotStroke const& stroke, KeypointMarks marks);

/// What there is room for when the curve is so many pixels wide.
KeypointMarks marksFor(CurvePicture const& curve, double pixels);

} // namespace lumenkey::tools
