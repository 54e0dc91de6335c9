#pragma once

#include "lumenkey/foundation/BXExport.h"
#include "lumenkey/foundation/BXLocks.h"
#include "lumenkey/foundation/Tempus.h"

#include <atomic>

class KFCustomInterpolator;

/// What a spline asks of the node that owns it: the node of a curve derives from this.
///
/// The pointers aren't owned. They may be set while other threads evaluate only if `_customLock` stays the same:
/// who exchanges the lock makes sure that nobody holds the old one.
class LUMENKEY_API KFSplineOwner {
public:
    virtual ~KFSplineOwner();

    /// The value of a spline without a valid vertex. Called under the spline's lock: it may not evaluate the spline.
    virtual double getInitialValue() const = 0;
    /// Duration of a frame, for the step of a retimed continuation.
    virtual Tempus getFrameDuration() const = 0;

    /// Replaces the spline's own lock when not null, so that a group of curves can share one.
    std::atomic<BXSpinLock*> _customLock{nullptr};
    /// Draws the segments for which it is active; null for none.
    std::atomic<KFCustomInterpolator*> _customInterpolator{nullptr};
    /// Set while many keypoints are loaded: the spline doesn't renew its list of valid vertices.
    std::atomic<bool> _suppressRefresh{false};
};
