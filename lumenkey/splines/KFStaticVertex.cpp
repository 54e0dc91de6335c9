#include "lumenkey/splines/KFStaticVertex.h"

#include "lumenkey/splines/KFInterpolation.h"

#include <cmath>
#include <typeinfo>

namespace {

/// Below it a tangent component counts as none.
constexpr double kFlatTolerance = 1e-7;

/// A comparison with NaN is false, so NaN passes through both.
double atMostZero(double u) noexcept { return u > 0.0 ? 0.0 : u; }
double atLeastZero(double u) noexcept { return u < 0.0 ? 0.0 : u; }

bool isWholeCurve(std::uint32_t type) noexcept {
    return type == kKFInterpolationBSpline || type == kKFInterpolationXSpline;
}

} // namespace

std::atomic<std::uint32_t> KFStaticVertex::_wholeCurveChanges{0};
std::atomic<std::uint64_t> KFStaticVertex::_watchedChanges{0};

KFStaticVertex::KFStaticVertex(Tempus const& u, double value) noexcept
    : KFVertex(u), _enabled(true), _valueV(value), _bias(1.0) {}

KFStaticVertex::KFStaticVertex(KFVertex const* vertex, Tempus const& t)
    : KFVertex(vertex->getValueU()), _enabled(true), _valueV(vertex->getValueV(t)),
      _bias(vertex->getBias(t)) {
    double u = 0.0;
    double v = 0.0;
    vertex->getInputTangents(&u, &v, t);
    _inputTangentU = u;
    _inputTangentV = v;
    vertex->getOutputTangents(&u, &v, t);
    _outputTangentU = u;
    _outputTangentV = v;
    KFVertex::setInterpolation(vertex->getInterpolation());
}

KFStaticVertex& KFStaticVertex::operator=(KFStaticVertex const& other) noexcept {
    setInterpolation(other.KFVertex::getInterpolation());
    KFVertex::operator=(other);
    _enabled = other._enabled;
    _valueV = other._valueV;
    _bias = other._bias;
    _inputTangentU = other._inputTangentU;
    _outputTangentU = other._outputTangentU;
    _inputTangentV = other._inputTangentV;
    _outputTangentV = other._outputTangentV;
    touch();
    return *this;
}

KFStaticVertex::~KFStaticVertex() = default;

void KFStaticVertex::setValueU(Tempus const& u) {
    KFVertex::setValueU(u);
    touch();
}

void KFStaticVertex::setValueV(double value, Tempus const&) {
    if (isGuarded())
        return;
    _valueV = value;
    touch();
}

void KFStaticVertex::setBias(double bias, Tempus const&) {
    if (isGuarded())
        return;
    _bias = bias;
    touch();
}

void KFStaticVertex::setInputTangents(double u, double v, Tempus const&) {
    if (isGuarded() || !_enabled)
        return;
    _inputTangentU = atMostZero(u);
    _inputTangentV = v;
    touch();
}

void KFStaticVertex::setOutputTangents(double u, double v, Tempus const&) {
    if (isGuarded() || !_enabled)
        return;
    _outputTangentU = atLeastZero(u);
    _outputTangentV = v;
    touch();
}

void KFStaticVertex::flattenTangents(Tempus const&) {
    if (isGuarded() || !_enabled)
        return;
    _inputTangentU = 0.0;
    _inputTangentV = 0.0;
    _outputTangentU = 0.0;
    _outputTangentV = 0.0;
    resetFlag(kKFVertexFlagHandlesBroken);
    touch();
}

void KFStaticVertex::resetTangents() { flattenTangents(kTempusZero); }

void KFStaticVertex::swapTangents() {
    double const inputU = _inputTangentU;
    double const inputV = _inputTangentV;
    _inputTangentU = _outputTangentU;
    _inputTangentV = _outputTangentV;
    _outputTangentU = inputU;
    _outputTangentV = inputV;
    touch();
}

void KFStaticVertex::setEnabled(bool enabled, Tempus const&) {
    _enabled = enabled;
    touch();
}

bool KFStaticVertex::isFlat() const {
    return std::fabs(_inputTangentU) < kFlatTolerance && std::fabs(_inputTangentV) < kFlatTolerance &&
           std::fabs(_outputTangentU) < kFlatTolerance && std::fabs(_outputTangentV) < kFlatTolerance;
}

void KFStaticVertex::setInterpolation(std::uint32_t type) {
    bool const wholeCurve = isWholeCurve(type) || isWholeCurve(KFVertex::getInterpolation());
    KFVertex::setInterpolation(type);
    if (wholeCurve) {
        _wholeCurveChanges.fetch_add(1, std::memory_order_release);
        _watchedChanges.fetch_add(1, std::memory_order_release);
    }
    touch();
}

KFVertex* KFStaticVertex::clone() const { return new KFStaticVertex(*this); }

void KFStaticVertex::offsetVertexInTime(Tempus const& delta) {
    storeValueU(BX_TempusSaferAdd(getValueU(), delta));
    touch();
}

bool KFStaticVertex::isEqual(KFVertex const* other) const {
    if (other == nullptr || typeid(*other) != typeid(*this))
        return false;
    auto const& vertex = static_cast<KFStaticVertex const&>(*other);
    return KFVertex::isEqual(other) && _enabled.get() == vertex._enabled.get() &&
           _valueV.get() == vertex._valueV.get() && _bias.get() == vertex._bias.get() &&
           _inputTangentU.get() == vertex._inputTangentU.get() &&
           _inputTangentV.get() == vertex._inputTangentV.get() &&
           _outputTangentU.get() == vertex._outputTangentU.get() &&
           _outputTangentV.get() == vertex._outputTangentV.get();
}

void KFStaticVertex::getValue(Tempus* u, double* v, Tempus const&) const {
    if (u != nullptr)
        *u = getValueU();
    if (v != nullptr)
        *v = _valueV;
}
