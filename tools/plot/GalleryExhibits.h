#pragma once

#include "lumenkey/splines/KFSpline.h"
#include "lumenkey/splines/KFSplineState.h"

#include <memory>
#include <string>
#include <vector>

namespace lumenkey::tools {

/// A spline with the settings it needs by its side.
struct ExhibitSpline {
    KFSplineState state;
    KFSpline spline{&state};
};

/// A curve that shows one ability of the engine, and the stretch of time to show.
struct GalleryExhibit {
    std::string number;
    std::string title;
    std::unique_ptr<ExhibitSpline> curve;
    Tempus from{};
    Tempus to{};
};

/// One for each interpolation type, all over the same keypoints; a number that is no type stands at the end.
std::vector<GalleryExhibit> interpolationExhibits();

/// One for each extrapolation mode, on both sides of the same three keypoints.
std::vector<GalleryExhibit> extrapolationExhibits();

} // namespace lumenkey::tools
