#include "tools/curve/Keypoint.h"

#include "lumenkey/splines/KFVertex.h"
#include "tools/output/TextForms.h"

#include <array>
#include <string_view>
#include <utility>

namespace lumenkey::tools {

namespace {

constexpr std::array<std::pair<std::uint32_t, std::string_view>, 17> kNames{
    {{kKFInterpolationConstant, "constant"},
     {kKFInterpolationLinear, "linear"},
     {kKFInterpolationBezier, "bezier"},
     {kKFInterpolationCatmullRom, "catmull-rom"},
     {kKFInterpolationEaseIn, "ease in"},
     {kKFInterpolationEaseOut, "ease out"},
     {kKFInterpolationBSpline, "b-spline"},
     {kKFInterpolationXSpline, "x-spline"},
     {kKFInterpolationExponential, "exponential"},
     {kKFInterpolationLogarithmic, "logarithmic"},
     {kKFInterpolationEase, "ease"},
     {kKFInterpolationAccelerate, "accelerate"},
     {kKFInterpolationDecelerate, "decelerate"},
     {kKFInterpolationLinearToo, "linear too"},
     {kKFInterpolationConvex, "convex"},
     {kKFInterpolationConcave, "concave"},
     {kKFInterpolationSCurve, "s-curve"}}};

std::string lettersOf(std::string_view name) {
    std::string letters(name);
    std::erase_if(letters, [](char c) { return c == ' ' || c == '-' || c == '_'; });
    return letters;
}

} // namespace

Keypoint readKeypoint(KFSpline& spline, void* handle) {
    Keypoint key;
    spline.getVertex(handle, &key.time, &key.value, kTempusZero);
    spline.getVertexInterpolation(handle, &key.interpolation, &key.usesHandles);
    spline.getVertexInputHandles(handle, &key.in.seconds, &key.in.value, kTempusZero, true);
    spline.getVertexOutputHandles(handle, &key.out.seconds, &key.out.value, kTempusZero, true);
    key.enabled = spline.isEnabledVertex(handle, kTempusZero);
    spline.getVertexFlags(handle, &key.flags);
    return key;
}

std::vector<void*> keypointHandles(KFSpline& spline) {
    std::vector<void*> handles;
    spline.getAllVerticesHandles(handles);
    return handles;
}

std::vector<void*> everyKeypointHandle(KFSpline& spline) {
    std::vector<void*> handles;
    handles.reserve(spline.getNumberOfVertices());
    for (KFVertexIterator place = spline.beginVertices(); place != spline.endVertices();
         place = spline.nextPlace(place)) {
        handles.push_back(spline.vertexAt(place));
    }
    return handles;
}

std::optional<KeypointEnds> keypointEnds(KFSpline const* spline) {
    if (spline == nullptr || spline->getNumberOfVertices() == 0) {
        return std::nullopt;
    }
    return KeypointEnds{spline->vertexAt(spline->beginVertices())->getValueU(),
                        spline->vertexAt(spline->previousPlace(spline->endVertices()))->getValueU()};
}

std::string interpolationName(std::uint32_t type) {
    for (auto const& [number, name] : kNames) {
        if (number == type) {
            return std::string(name);
        }
    }
    return "bezier (" + std::to_string(type) + ")";
}

std::optional<std::uint32_t> interpolationNamed(std::string_view name) {
    for (auto const& [number, known] : kNames) {
        if (sameWord(lettersOf(known), lettersOf(name))) {
            return number;
        }
    }
    return std::nullopt;
}

std::string interpolationNames() {
    std::string names;
    for (auto const& [number, name] : kNames) {
        names += (names.empty() ? "" : ", ") + std::string(name);
    }
    return names;
}

} // namespace lumenkey::tools
