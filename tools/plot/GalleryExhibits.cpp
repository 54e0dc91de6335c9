#include "tools/plot/GalleryExhibits.h"

#include <array>
#include <cstdint>

namespace lumenkey::tools {

namespace {

struct Named {
    std::uint32_t number;
    char const* title;
};

constexpr std::uint32_t kUnknownType = 99;

constexpr std::array<Named, 18> kTypes{{{kKFInterpolationConstant, "Constant"},
                                        {kKFInterpolationLinear, "Linear"},
                                        {kKFInterpolationBezier, "Bezier"},
                                        {kKFInterpolationCatmullRom, "Catmull-Rom"},
                                        {kKFInterpolationEaseIn, "Ease in"},
                                        {kKFInterpolationEaseOut, "Ease out"},
                                        {kKFInterpolationBSpline, "B-spline"},
                                        {kKFInterpolationXSpline, "X-spline"},
                                        {kKFInterpolationExponential, "Exponential"},
                                        {kKFInterpolationLogarithmic, "Logarithmic"},
                                        {kKFInterpolationEase, "Ease"},
                                        {kKFInterpolationAccelerate, "Accelerate"},
                                        {kKFInterpolationDecelerate, "Decelerate"},
                                        {kKFInterpolationLinearToo, "Linear too"},
                                        {kKFInterpolationConvex, "Convex"},
                                        {kKFInterpolationConcave, "Concave"},
                                        {kKFInterpolationSCurve, "S-curve"},
                                        {kUnknownType, "unknown: Bezier"}}};

constexpr std::array<Named, 5> kModes{{{kKFExtrapolationConstant, "Constant"},
                                       {kKFExtrapolationLinear, "Linear"},
                                       {kKFExtrapolationPingPong, "Ping-pong"},
                                       {kKFExtrapolationRepeat, "Repeat"},
                                       {kKFExtrapolationProgressiveRepeat, "Progressive repeat"}}};

/// A keypoint and the end of its handle forwards; the handle backwards is the same, mirrored.
struct Point {
    Tempus u;
    double value;
    double handleU;
    double handleV;
};

constexpr std::array<Point, 4> kShape{{{TempusMake(0, 1), 0.15, 0.3, 0.5},
                                       {TempusMake(1, 1), 0.9, 0.35, 0},
                                       {TempusMake(2, 1), 0.1, 0.35, 0.1},
                                       {TempusMake(3, 1), 0.7, 0.35, 0.05}}};

constexpr std::array<Point, 3> kCycle{{{TempusMake(0, 1), 0.1, 0.15, 0.3},
                                       {TempusMake(2, 5), 0.9, 0.15, 0},
                                       {TempusMake(1, 1), 0.45, 0.2, -0.12}}};

template <class Points> std::unique_ptr<ExhibitSpline> makeCurve(Points const& points, std::uint32_t type) {
    auto made = std::make_unique<ExhibitSpline>();
    // Types that are one function over the whole spline are made for a running parameter.
    made->state.parametric = type == kKFInterpolationBSpline || type == kKFInterpolationXSpline;
    made->state.deriveTangents = false;
    made->state.interpolation = type;
    KFSpline& spline = made->spline;
    for (Point const& point : points) {
        void* const handle = spline.appendVertexNoTangents(point.u, point.value, kTempusZero);
        spline.setVertexInterpolation(handle, type);
        if (spline.interpolatorUsesTangents(type, handle)) {
            spline.setVertexInputHandles(handle, -point.handleU, -point.handleV, kTempusZero, true);
            spline.setVertexOutputHandles(handle, point.handleU, point.handleV, kTempusZero, true);
        }
    }
    return made;
}

} // namespace

std::vector<GalleryExhibit> interpolationExhibits() {
    std::vector<GalleryExhibit> exhibits;
    for (Named const& type : kTypes) {
        exhibits.push_back({std::to_string(type.number), type.title, makeCurve(kShape, type.number),
                            kShape.front().u, kShape.back().u});
    }
    return exhibits;
}

std::vector<GalleryExhibit> extrapolationExhibits() {
    std::vector<GalleryExhibit> exhibits;
    for (Named const& mode : kModes) {
        auto curve = makeCurve(kCycle, kKFInterpolationBezier);
        curve->state.preExtrapolation = mode.number;
        curve->state.postExtrapolation = mode.number;
        exhibits.push_back({std::to_string(mode.number), mode.title, std::move(curve), TempusMake(-8, 5),
                            TempusMake(13, 5)});
    }
    return exhibits;
}

} // namespace lumenkey::tools
