#pragma once

#include "lumenkey/foundation/BXExport.h"
#include "lumenkey/foundation/BXSingleton.h"
#include "lumenkey/splines/KFInterpolator.h"

#include <atomic>
#include <memory>

class KFBSplineInterpolator;
class KFXSplineInterpolator;

/// One instance of each strategy that all splines share. Made on first use, safely against a concurrent first
/// use; lives until the process ends.
class LUMENKEY_API KFInterpolatorStrategies : public BXSingleton {
public:
    static KFInterpolatorStrategies& getInstance();

    /// The strategy of a type; Bezier for every number that has none here, also for BSpline and XSpline,
    /// whose strategies belong to one spline each. The strategy isn't the caller's.
    KFInterpolator* getInterpolator(std::uint32_t type) const noexcept;

    KFInterpolatorStrategies();
    ~KFInterpolatorStrategies() override;

private:
    struct Strategies;
    std::unique_ptr<Strategies> _strategies;
};

/// The strategies of one spline: the shared ones, and a BSpline and an XSpline strategy of its own, each made
/// when it is first asked for.
///
/// Threads: `getInterpolator` may be called by several threads at once; of two strategies made at once one
/// survives. Assignment and destruction need the spline's lock.
class LUMENKEY_API KFInterpolators {
public:
    KFInterpolators();
    KFInterpolators(KFInterpolators const& other);
    KFInterpolators& operator=(KFInterpolators const& other);
    ~KFInterpolators();

    /// Both sides have a BSpline strategy or neither has, the same for XSpline, and those there are compare
    /// equal.
    bool operator==(KFInterpolators const& other) const;

    KFInterpolator* getInterpolator(std::uint32_t type);
    /// `init` of the BSpline strategy if there is one.
    void update(KFSpline& spline, Tempus const& t);

private:
    std::atomic<KFBSplineInterpolator*> _bSpline{nullptr};
    std::atomic<KFXSplineInterpolator*> _xSpline{nullptr};
    KFInterpolatorStrategies* _strategies;
};
