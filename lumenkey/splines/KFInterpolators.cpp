#include "lumenkey/splines/KFInterpolators.h"

#include "lumenkey/splines/KFBSplineInterpolator.h"
#include "lumenkey/splines/KFBasicInterpolators.h"
#include "lumenkey/splines/KFInterpolation.h"
#include "lumenkey/splines/KFSplineInterpolator.h"
#include "lumenkey/splines/KFXSplineInterpolator.h"

struct KFInterpolatorStrategies::Strategies {
    KFConstantInterpolator constant;
    KFLinearInterpolator linear;
    KFBezierInterpolator bezier;
    KFCatmullRomInterpolator catmullRom;
    KFEaseInInterpolator easeIn;
    KFEaseOutInterpolator easeOut;
    KFExponentialInterpolator exponential;
    KFLogarithmicInterpolator logarithmic;
    KFEaseInterpolator ease;
    KFAccelerateInterpolator accelerate;
    KFDecelerateInterpolator decelerate;
    KFConvexInterpolator convex;
    KFConcaveInterpolator concave;
    KFSCurveInterpolator sCurve;
};

KFInterpolatorStrategies::KFInterpolatorStrategies()
    : BXSingleton(0), _strategies(std::make_unique<Strategies>()) {}

KFInterpolatorStrategies::~KFInterpolatorStrategies() = default;

KFInterpolatorStrategies& KFInterpolatorStrategies::getInstance() {
    return BXSingletonInstance<KFInterpolatorStrategies>();
}

KFInterpolator* KFInterpolatorStrategies::getInterpolator(std::uint32_t type) const noexcept {
    Strategies& all = *_strategies;
    switch (type) {
    case kKFInterpolationConstant:
        return &all.constant;
    case kKFInterpolationLinear:
    case kKFInterpolationLinearToo:
        return &all.linear;
    case kKFInterpolationCatmullRom:
        return &all.catmullRom;
    case kKFInterpolationEaseIn:
        return &all.easeIn;
    case kKFInterpolationEaseOut:
        return &all.easeOut;
    case kKFInterpolationExponential:
        return &all.exponential;
    case kKFInterpolationLogarithmic:
        return &all.logarithmic;
    case kKFInterpolationEase:
        return &all.ease;
    case kKFInterpolationAccelerate:
        return &all.accelerate;
    case kKFInterpolationDecelerate:
        return &all.decelerate;
    case kKFInterpolationConvex:
        return &all.convex;
    case kKFInterpolationConcave:
        return &all.concave;
    case kKFInterpolationSCurve:
        return &all.sCurve;
    default:
        return &all.bezier;
    }
}

namespace {

/// The strategy in `slot`, after putting `fresh` there if the slot was empty.
template <class Strategy>
Strategy* install(std::atomic<Strategy*>& slot, std::unique_ptr<Strategy> fresh) noexcept {
    Strategy* present = nullptr;
    if (slot.compare_exchange_strong(present, fresh.get(), std::memory_order_acq_rel,
                                     std::memory_order_acquire)) {
        return fresh.release();
    }
    return present;
}

template <class Strategy> Strategy* getOrMake(std::atomic<Strategy*>& slot) {
    Strategy* const present = slot.load(std::memory_order_acquire);
    return present != nullptr ? present : install(slot, std::make_unique<Strategy>());
}

template <class Strategy> void assign(std::atomic<Strategy*>& slot, std::atomic<Strategy*> const& other) {
    Strategy const* const source = other.load(std::memory_order_acquire);
    if (source == nullptr) {
        delete slot.exchange(nullptr, std::memory_order_acq_rel);
    } else if (Strategy* const own = slot.load(std::memory_order_acquire); own != nullptr) {
        *own = *source;
    } else {
        install(slot, std::make_unique<Strategy>(*source));
    }
}

template <class Strategy>
bool agree(std::atomic<Strategy*> const& slotA, std::atomic<Strategy*> const& slotB) {
    Strategy const* const a = slotA.load(std::memory_order_acquire);
    Strategy const* const b = slotB.load(std::memory_order_acquire);
    return a == nullptr || b == nullptr ? a == b : *a == *b;
}

} // namespace

KFInterpolators::KFInterpolators() : _strategies(&KFInterpolatorStrategies::getInstance()) {}

KFInterpolators::KFInterpolators(KFInterpolators const& other) : KFInterpolators() {
    assign(_bSpline, other._bSpline);
    assign(_xSpline, other._xSpline);
}

KFInterpolators& KFInterpolators::operator=(KFInterpolators const& other) {
    if (this != &other) {
        assign(_bSpline, other._bSpline);
        assign(_xSpline, other._xSpline);
    }
    return *this;
}

KFInterpolators::~KFInterpolators() {
    delete _bSpline.load(std::memory_order_acquire);
    delete _xSpline.load(std::memory_order_acquire);
}

bool KFInterpolators::operator==(KFInterpolators const& other) const {
    return agree(_bSpline, other._bSpline) && agree(_xSpline, other._xSpline);
}

KFInterpolator* KFInterpolators::getInterpolator(std::uint32_t type) {
    switch (type) {
    case kKFInterpolationBSpline:
        return getOrMake(_bSpline);
    case kKFInterpolationXSpline:
        return getOrMake(_xSpline);
    default:
        return _strategies->getInterpolator(type);
    }
}

void KFInterpolators::update(KFSpline& spline, Tempus const& t) {
    if (KFBSplineInterpolator* const bSpline = _bSpline.load(std::memory_order_acquire); bSpline != nullptr) {
        bSpline->init(spline, t);
    }
}
