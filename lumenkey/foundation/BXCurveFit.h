#pragma once

#include <vector>

#include "lumenkey/foundation/BXExport.h"
#include "lumenkey/foundation/BXSingleton.h"
#include "lumenkey/foundation/BXVector2.h"

/// Fits a row of cubic Bezier pieces through sampled points: Schneider, "An Algorithm for Automatically
/// Fitting Digitized Curves", Graphics Gems (1990). A piece is fitted by least squares along the tangents at
/// its ends, its parameters improved by Newton-Raphson, and cut at the worst point while it is too far off.
///
/// No state: any number of threads may fit at once.
class LUMENKEY_API BXCurveFit : public BXSingleton {
public:
    static BXCurveFit& getInstance();

    /// Replaces `result` by control points in the order keypoint, out-handle, in-handle, keypoint, ...,
    /// keypoint: 3k + 1 absolute points for k pieces, the first and last being the first and last of
    /// `points`, bit for bit. No points give none; one point gives one. Points with a coordinate that is not
    /// finite are passed over.
    ///
    /// `tolerance` is a distance (not its square), in the unit of the points; below 0 and not-a-number count
    /// as 0. It holds at the given points, and how it is measured depends on them:
    /// - x strictly ascending, as in a curve over time: |y(x) - y| at each point's x. Handles then stay
    ///   within the x range of their piece, so that no piece turns back in x.
    /// - otherwise: the distance of the point from the curve.
    ///
    /// Cost: about O(n), since a stretch that is far too long for a piece is recognised by a few of its
    /// points. At most O(n log n): cuts fall in the middle once a stretch lies more than 32 deep. Nothing
    /// recurses.
    void FitCurve(std::vector<BXVector2<double>> const& points, std::vector<BXVector2<double>>& result,
                  double tolerance) const;

private:
    BXCurveFit() noexcept;
    ~BXCurveFit() override;
    friend BXCurveFit& BXSingletonInstance<BXCurveFit>();
};
