#pragma once

#include "lumenkey/foundation/BXExport.h"
#include "lumenkey/foundation/BXSingleton.h"
#include "lumenkey/foundation/Tempus.h"

/// The process-wide switches of the library.
///
/// Plain fields without a lock: one thread sets them, and not while another one edits a spline.
class LUMENKEY_API KFCoreGlobals : public BXSingleton {
public:
    /// Made on first use, safely against a concurrent first use.
    static KFCoreGlobals& getInstance();

    /// While set, all curves count as animated, and the first vertex of a spline has its tangents derived.
    bool animate = false;
    /// Setting a keypoint offsets the curve instead of inserting.
    bool shouldOffset = false;
    /// The time that an object root answers when it is asked for the current one.
    Tempus currentTime = kTempusZero;

    KFCoreGlobals();
    ~KFCoreGlobals() override;
};
