#pragma once

#include "lumenkey/curves/KFCurve.h"
#include "tools/edit/KeypointStretch.h"

#include <cstdint>
#include <vector>

namespace lumenkey::tools {

/// In each step of a sampled curve, curves are compared at so many times.
inline constexpr std::int32_t kComparedPerStep = 10;

/// Where two curves lie farthest apart: infinitely where only one is a number.
struct CurveChange {
    double most = 0;
    /// The first such time.
    Tempus at{};
};

/// Steps are read in one walk; times that are spread over more of them one by one, which takes forty times as
/// long for each.
inline constexpr std::int64_t kMostComparedSteps = 20'000'000;
inline constexpr std::size_t kComparedOfMore = 500'000;

/// Reads both curves at `from`, at every step from there on, and at `to`. From `kMostComparedSteps` steps on,
/// `kComparedOfMore` times are spread evenly.
CurveChange changeBetween(KFCurve& before, KFCurve& after, TimeSpan const& span, Tempus const& step);

/// Compares them too at all keypoints of both, and between and just beside these: there `changeBetween` may
/// see nothing of a step or a peak that is narrower than its own.
void compareAtKeypoints(KFCurve& before, KFCurve& after, CurveChange& change);
/// Likewise at some times.
void compareAtTimes(std::vector<Tempus> times, KFCurve& before, KFCurve& after, CurveChange& change);

} // namespace lumenkey::tools
