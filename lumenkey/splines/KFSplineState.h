#pragma once

#include "lumenkey/foundation/BXExport.h"
#include "lumenkey/foundation/BXRelaxed.h"
#include "lumenkey/foundation/Tempus.h"

#include <cstdint>

/// The settings that a curve shares with its spline.
///
/// A record with `shared` set is one that many curves use and none owns; a curve that departs from it makes a local
/// copy first (`createLocalCopy`).
///
/// Threads: the switches and numbers may be read beside one thread that sets them; `roundingDelta` may not.
class LUMENKEY_API KFSplineState {
public:
    KFSplineState() noexcept = default;
    /// `shared` becomes true; `roundingDelta` follows `roundingInUSpace`.
    KFSplineState(bool parametric, bool roundingInUSpace, bool deriveTangents, bool sanitizeBezier,
                  std::uint32_t interpolation, std::uint32_t preExtrapolation,
                  std::uint32_t postExtrapolation, bool retimingExtrapolation) noexcept;
    /// All settings; `shared` false.
    KFSplineState(KFSplineState const& other) noexcept;
    /// All settings; `shared` stays as it is.
    KFSplineState& operator=(KFSplineState const& other) noexcept;
    virtual ~KFSplineState();

    /// All settings but `shared`.
    bool operator==(KFSplineState const& other) const noexcept;

    /// This record itself when it isn't shared; otherwise a new copy that isn't, which the caller owns.
    KFSplineState* createLocalCopy();

    /// Sets the switch and `roundingDelta` with it.
    void setRoundingInUSpace(bool inUSpace) noexcept;

    /// The curve is a parametric path: U is a running parameter, and handles are a third of a tangent.
    BXRelaxed<bool> parametric{false};
    /// Selects `roundingDelta`; write it by `setRoundingInUSpace`.
    BXRelaxed<bool> roundingInUSpace{true};
    /// Tangents follow automatically from the neighbours, and editing keeps the curve's shape.
    BXRelaxed<bool> deriveTangents{true};
    /// Bezier segments of curves that aren't parametric are kept from folding back in time.
    BXRelaxed<bool> sanitizeBezier{true};
    /// The continuation after the last keypoint follows the frame grid of a retimed clip.
    BXRelaxed<bool> retimingExtrapolation{false};
    /// The smallest step of the engine: 1/30 s with `roundingInUSpace`, else 1/3000000 s.
    Tempus roundingDelta = TempusMake(1, 30);
    /// Type of new keypoints where no neighbour gives one (`KFInterpolation`).
    BXRelaxed<std::uint32_t> interpolation{1};
    /// Modes of `KFExtrapolation`, after the last and before the first keypoint.
    BXRelaxed<std::uint32_t> postExtrapolation{0};
    BXRelaxed<std::uint32_t> preExtrapolation{0};
    BXRelaxed<bool> shared{true};
};
