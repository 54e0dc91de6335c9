#pragma once

#include <cstdint>

/// Interpolation types: how the segment that starts at a vertex is drawn. The numbers stand in documents: never
/// renumber. A number that isn't listed draws as Bezier.
enum KFInterpolation : std::uint32_t {
    kKFInterpolationConstant = 0,
    kKFInterpolationLinear = 1,
    kKFInterpolationBezier = 4,
    kKFInterpolationCatmullRom = 6,
    kKFInterpolationEaseIn = 7,
    kKFInterpolationEaseOut = 8,
    kKFInterpolationBSpline = 10,
    kKFInterpolationXSpline = 12,
    kKFInterpolationExponential = 13,
    kKFInterpolationLogarithmic = 14,
    kKFInterpolationEase = 15,
    kKFInterpolationAccelerate = 16,
    kKFInterpolationDecelerate = 17,
    kKFInterpolationLinearToo = 18,
    kKFInterpolationConvex = 19,
    kKFInterpolationConcave = 20,
    kKFInterpolationSCurve = 21,
    /// Never stored: what a query answers when the vertices differ.
    kKFInterpolationMixed = 100,
};

/// Extrapolation modes: how an open curve goes on outside its first and last valid vertex. The numbers stand in
/// documents. Any other number leaves the initial value of the curve's node.
enum KFExtrapolation : std::uint32_t {
    /// Holds the value of the end vertex.
    kKFExtrapolationConstant = 0,
    /// Goes on with the slope at the end vertex.
    kKFExtrapolationLinear = 1,
    /// Repeats the curve, every second cycle reversed.
    kKFExtrapolationPingPong = 2,
    /// Repeats the curve.
    kKFExtrapolationRepeat = 3,
    /// Repeats the curve, each cycle offset by the rise of one cycle.
    kKFExtrapolationProgressiveRepeat = 4,
};

/// Speeds of a vertex, which stand for Linear and the three types that ease in time.
enum KFVertexSpeed : std::uint32_t {
    kKFVertexSpeedLinear = 0,
    kKFVertexSpeedDecelerate = 1,
    kKFVertexSpeedAccelerate = 2,
    kKFVertexSpeedEase = 3,
};
