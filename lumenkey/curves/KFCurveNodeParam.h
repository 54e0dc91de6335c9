#pragma once

#include "lumenkey/foundation/BXExport.h"
#include "lumenkey/foundation/Tempus.h"

#include <cstdint>

/// Request and result of one node when a chain runs over a row of samples.
///
/// The output fields say what the node must produce and where; the input fields what it needs from the node in
/// front of it, and `getNeededRange` of the node fills them. By default input and output are one buffer, so that
/// the whole chain works in place in the caller's. A node that needs a wider or shifted row sets its own input
/// fields and allocates `inputValues` with new[]; with `ownsInputValues` the record frees them.
struct LUMENKEY_API KFCurveNodeParam {
    KFCurveNodeParam() noexcept = default;
    /// All fields; a copy never owns a buffer.
    KFCurveNodeParam(KFCurveNodeParam const& other) noexcept;
    KFCurveNodeParam& operator=(KFCurveNodeParam const&) = delete;
    ~KFCurveNodeParam();

    /// The input fields become the output fields, not owned: the node works in place.
    void needSameRange() noexcept;

    /// Always true; nothing in the library reads it.
    bool active = true;
    /// A spline samples segment by segment instead of uniformly.
    bool segmentSampling = false;
    /// The caller's number, as in the point form of `solveNode`.
    double operand = 0.0;

    Tempus inputStart;
    Tempus inputStep;
    std::uint32_t inputCount = 0;
    double* inputValues = nullptr;
    bool ownsInputValues = false;

    Tempus outputStart;
    Tempus outputStep;
    /// A node may lower it to what it produced.
    std::uint32_t outputCount = 0;
    double* outputValues = nullptr;
    bool ownsOutputValues = false;
};
