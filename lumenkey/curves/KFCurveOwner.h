#pragma once

#include "lumenkey/foundation/BXExport.h"
#include "lumenkey/foundation/Tempus.h"

/// What a curve asks of the channel that owns it.
class LUMENKEY_API KFCurveOwner {
public:
    /// Duration of a frame of the object that the curve belongs to. It may be asked for under the lock of the curve's
    /// spline, so it may not evaluate or edit the curve.
    virtual Tempus getFrameDurationForCurve() const = 0;

protected:
    ~KFCurveOwner() = default;
};
