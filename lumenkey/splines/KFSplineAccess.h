// Internal: not installed.
#pragma once

#include "lumenkey/splines/KFSpline.h"

/// Holds, for a scope, the lock by which a spline is guarded; nothing with `lock` false.
///
/// Inside, only operations that don't take the lock may be called on the same spline. Who exchanges the
/// owner's `_customLock` makes sure that nobody holds the old one, so the lock given back is the lock that
/// was taken.
class [[nodiscard]] KFSplineAccess {
public:
    explicit KFSplineAccess(KFSpline const& spline, bool lock = true) : _spline(spline), _lock(lock) {
        _spline.preSplineAccess(_lock);
    }
    ~KFSplineAccess() { _spline.postSplineAccess(_lock); }
    KFSplineAccess(KFSplineAccess const&) = delete;
    KFSplineAccess& operator=(KFSplineAccess const&) = delete;

private:
    KFSpline const& _spline;
    bool const _lock;
};
