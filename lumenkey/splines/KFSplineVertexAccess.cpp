// Settings of the whole spline and attributes of single vertices.

#include "lumenkey/splines/KFInterpolator.h"
#include "lumenkey/splines/KFSpline.h"
#include "lumenkey/splines/KFSplineAccess.h"
#include "lumenkey/splines/KFSplineOwner.h"
#include "lumenkey/splines/KFStaticVertex.h"
#include "lumenkey/splines/KFVertex.h"
#include "lumenkey/splines/KFVertexStore.h"

#include <algorithm>
#include <cmath>
#include <iterator>

namespace {

KFVertex* vertexOf(void* handle) noexcept { return static_cast<KFVertex*>(handle); }

/// Below it two values count as equal.
constexpr double kValueTolerance = 1e-7;

struct Speed {
    std::uint32_t speed;
    std::uint32_t type;
};

constexpr Speed kSpeeds[] = {
    {kKFVertexSpeedLinear, kKFInterpolationLinear},
    {kKFVertexSpeedDecelerate, kKFInterpolationDecelerate},
    {kKFVertexSpeedAccelerate, kKFInterpolationAccelerate},
    {kKFVertexSpeedEase, kKFInterpolationEase},
};

bool easesInTime(std::uint32_t type) noexcept {
    return type == kKFInterpolationEase || type == kKFInterpolationAccelerate ||
           type == kKFInterpolationDecelerate;
}

} // namespace

// --- The whole spline ---

void KFSpline::setInterpolation(std::uint32_t type) {
    if (type == kKFInterpolationMixed)
        return;
    KFSplineAccess const access(*this);
    bool const parametric = getState()->parametric;
    for (auto place = _store->begin(); place != _store->end(); place = _store->next(place)) {
        KFVertex& vertex = *_store->at(place);
        if (parametric || !vertex.testFlag(kKFVertexFlagLocked))
            vertex.setInterpolation(type);
    }
    getInterpolator(type)->init(*this, kTempusZero);
}

/// The type that all vertices share, or mixed. Each read of a spline whose first vertex has a whole-curve type asks for
/// it. There it is found once and kept: it can't change without a change of the store or of a vertex to or from such a
/// type, and both are counted. Kept are the low bits of either count, and behind them which of three answers it is.
std::uint32_t KFSpline::commonInterpolation() {
    constexpr std::uint32_t answers[] = {kKFInterpolationMixed, kKFInterpolationBSpline,
                                         kKFInterpolationXSpline};
    constexpr std::uint64_t answerMask = 3;
    // Read before any type: one that changes in between, by its handle, leaves an answer that isn't found again.
    std::uint64_t const counts = std::uint64_t{KFStaticVertex::getWholeCurveChanges()} << 32 |
                                 static_cast<std::uint32_t>(_store->version() << 2);
    std::uint32_t const first = _store->front()->getInterpolation();
    bool const keeps = _staticVertices && isWholeCurve(first);
    std::uint64_t const kept = _commonInterpolation;
    if (keeps && (kept & ~answerMask) == counts && (kept & answerMask) != 0)
        return answers[(kept & answerMask) - 1];

    std::uint32_t common = first;
    for (auto place = _store->begin(); place != _store->end(); place = _store->next(place)) {
        if (_store->at(place)->getInterpolation() == first)
            continue;
        common = kKFInterpolationMixed;
        break;
    }
    if (keeps) {
        auto const answer = std::find(std::begin(answers), std::end(answers), common) - std::begin(answers);
        _commonInterpolation = counts | static_cast<std::uint64_t>(answer + 1);
    }
    return common;
}

bool KFSpline::getInterpolation(std::uint32_t* type, bool* usesTangents, bool* isSpline) {
    std::uint32_t const answer = _store->empty() ? getState()->interpolation.get() : commonInterpolation();
    if (type != nullptr)
        *type = answer;
    if (usesTangents != nullptr)
        *usesTangents = interpolatorUsesTangents(answer, nullptr);
    if (isSpline != nullptr)
        *isSpline = !getInterpolator(answer)->useKeypoints();
    return true;
}

bool KFSpline::interpolatorUsesTangents(std::uint32_t type, void* handle) {
    KFSplineOwner const* const node = getNode();
    KFCustomInterpolator* const custom =
        node == nullptr ? nullptr : node->_customInterpolator.load(std::memory_order_acquire);
    if (custom != nullptr && custom->isActive(*this, handle))
        return custom->useTangents();
    return getInterpolator(type)->useTangents();
}

bool KFSpline::hasInterpolation(std::uint32_t type) {
    if (_store->empty())
        return getState()->interpolation == type;
    for (auto place = _store->next(_store->begin()); place != _store->end(); place = _store->next(place)) {
        if (_store->at(place)->getInterpolation() == type)
            return true;
    }
    return false;
}

void KFSpline::setExtrapolation(std::uint32_t mode, std::uint32_t which) {
    KFSplineAccess const access(*this);
    (which == 0 ? getState()->postExtrapolation : getState()->preExtrapolation) = mode;
}

std::uint32_t KFSpline::getExtrapolation(std::uint32_t which) {
    return which == 0 ? getState()->postExtrapolation : getState()->preExtrapolation;
}

void KFSpline::lockSpline(bool lock) {
    for (auto place = _store->begin(); place != _store->end(); place = _store->next(place)) {
        KFVertex& vertex = *_store->at(place);
        if (lock) {
            vertex.setFlag(kKFVertexFlagLocked);
        } else {
            vertex.resetFlag(kKFVertexFlagLocked);
        }
    }
}

void KFSpline::setAllVerticesValues(double value, Tempus const& t) {
    KFSplineAccess const access(*this);
    for (auto place = _store->begin(); place != _store->end(); place = _store->next(place)) {
        _store->at(place)->setValueV(value, t);
    }
}

// --- One vertex ---

bool KFSpline::getVertex(Tempus const& u, double* v, Tempus const& t) {
    void* handle = nullptr;
    if (v == nullptr || !getVertexHandle(u, &handle, false))
        return false;
    *v = vertexOf(handle)->getValueV(t);
    return true;
}

bool KFSpline::getVertex(void* handle, Tempus* u, double* v, Tempus const& t) {
    if (handle == nullptr)
        return false;
    if (u != nullptr)
        *u = vertexOf(handle)->getValueU();
    if (v != nullptr)
        *v = vertexOf(handle)->getValueV(t);
    return true;
}

bool KFSpline::setVertexValue(void* handle, double value, Tempus const& t) {
    if (handle == nullptr)
        return false;
    KFSplineAccess const access(*this);
    vertexOf(handle)->setValueV(value, t);
    return true;
}

bool KFSpline::setVertexInterpolation(void* handle, std::uint32_t type) {
    if (handle == nullptr)
        return false;
    vertexOf(handle)->setInterpolation(type);
    return true;
}

bool KFSpline::getVertexInterpolation(void* handle, std::uint32_t* type, bool* usesTangents) {
    if (handle == nullptr)
        return false;
    std::uint32_t const answer = vertexOf(handle)->getInterpolation();
    if (type != nullptr)
        *type = answer;
    if (usesTangents != nullptr)
        *usesTangents = interpolatorUsesTangents(answer, handle);
    return true;
}

bool KFSpline::setVertexFlag(void* handle, std::uint32_t mask) {
    if (handle == nullptr)
        return false;
    vertexOf(handle)->setFlag(mask);
    return true;
}

bool KFSpline::resetVertexFlag(void* handle, std::uint32_t mask) {
    if (handle == nullptr)
        return false;
    vertexOf(handle)->resetFlag(mask);
    return true;
}

bool KFSpline::setVertexFlags(void* handle, std::uint32_t flags) {
    if (handle == nullptr)
        return false;
    vertexOf(handle)->setFlags(flags);
    return true;
}

bool KFSpline::getVertexFlags(void* handle, std::uint32_t* flags) {
    if (handle == nullptr)
        return false;
    if (flags != nullptr)
        *flags = vertexOf(handle)->getFlags();
    return true;
}

bool KFSpline::setVertexEnabled(void* handle, bool enabled, Tempus const& t) {
    if (handle == nullptr)
        return false;
    vertexOf(handle)->setEnabled(enabled, t);
    if (suppressesRefresh()) {
        _store->postponeValidity();
    } else if (_useValidList) {
        auto const place = _store->find(vertexOf(handle));
        if (place != _store->end())
            _store->updateValidity(place);
    }
    markEdited();
    return true;
}

bool KFSpline::enableVertex(void* handle, Tempus const& t) { return setVertexEnabled(handle, true, t); }

bool KFSpline::disableVertex(void* handle, Tempus const& t) { return setVertexEnabled(handle, false, t); }

bool KFSpline::isEnabledVertex(void* handle, Tempus const& t) {
    return handle != nullptr && vertexOf(handle)->isEnabled(t);
}

void KFSpline::offsetVertexInTime(void* handle, Tempus const& u, Tempus const&) {
    if (handle == nullptr)
        return;
    auto const place = _store->find(vertexOf(handle));
    vertexOf(handle)->setValueU(u);
    if (place != _store->end())
        _store->updatePosition(place);
}

bool KFSpline::setVertexBiasLinear(void* handle, double bias, Tempus const& t) {
    bool const ends = getFirstValidVertex(nullptr, t) && getLastValidVertex(nullptr, t);
    if (handle == nullptr || (!_closed && !suppressesRefresh() && !ends))
        return false;
    vertexOf(handle)->setBias(bias, t);
    return true;
}

bool KFSpline::getVertexBiasLinear(void* handle, double* bias, Tempus const& t) {
    if (handle == nullptr)
        return false;
    if (bias != nullptr)
        *bias = vertexOf(handle)->getBias(t);
    return true;
}

bool KFSpline::setVertexBiasExp(void* handle, double exponent, Tempus const& t) {
    return setVertexBiasLinear(handle, std::exp(exponent), t);
}

bool KFSpline::getVertexBiasExp(void* handle, double* exponent, Tempus const& t) {
    if (handle == nullptr)
        return false;
    if (exponent != nullptr)
        *exponent = std::log(vertexOf(handle)->getBias(t));
    return true;
}

bool KFSpline::setVertexNormal(void* handle, double normal, Tempus const& t) {
    if (handle == nullptr)
        return false;
    vertexOf(handle)->setNormal(normal, t);
    return true;
}

bool KFSpline::getVertexNormal(void* handle, double* normal, Tempus const& t) {
    if (handle == nullptr)
        return false;
    if (normal != nullptr)
        *normal = vertexOf(handle)->getNormal(t);
    return true;
}

/// The vertex at exactly `u` if it is enabled, else the last enabled one before it.
void* KFSpline::vertexWithNormalAt(Tempus const& u, Tempus const& t) {
    void* handle = nullptr;
    if (getVertexHandle(u, &handle, false) && vertexOf(handle)->isEnabled(t))
        return handle;
    getPreviousValidVertex(u, &handle, t, false);
    return handle;
}

bool KFSpline::setVertexNormal(Tempus const& u, double normal, Tempus const& t) {
    void* const handle = vertexWithNormalAt(u, t);
    return handle != nullptr && setVertexNormal(handle, normal, t);
}

bool KFSpline::getVertexNormal(Tempus const& u, double* normal, Tempus const& t) {
    void* const handle = vertexWithNormalAt(u, t);
    return handle != nullptr && getVertexNormal(handle, normal, t);
}

// --- Speeds ---

bool KFSpline::setVertexSpeed(void* handle, std::uint32_t speed) {
    if (handle == nullptr || speed >= std::size(kSpeeds))
        return false;
    vertexOf(handle)->setInterpolation(kSpeeds[speed].type);
    if (speed != kKFVertexSpeedLinear)
        vertexOf(handle)->setBias(1.0, kTempusZero);
    return true;
}

bool KFSpline::getVertexSpeed(void* handle, std::uint32_t* speed) {
    if (handle == nullptr)
        return false;
    std::uint32_t const type = vertexOf(handle)->getInterpolation();
    auto const* const found = std::find_if(std::begin(kSpeeds), std::end(kSpeeds),
                                           [&](Speed const& row) { return row.type == type; });
    if (found == std::end(kSpeeds))
        return false;
    if (speed != nullptr)
        *speed = found->speed;
    return true;
}

bool KFSpline::adjustVertexSpeed(void* handle, double delta) {
    void* next = nullptr;
    if (handle == nullptr || !getNextValidVertex(handle, &next, kTempusZero))
        return false;
    KFVertex& vertex = *vertexOf(handle);
    if (vertex.getInterpolation() == kKFInterpolationLinear) {
        double const rise = vertexOf(next)->getValueV(kTempusZero) - vertex.getValueV(kTempusZero);
        if (std::fabs(rise) < kValueTolerance)
            return false;
        vertex.setInterpolation(kKFInterpolationEase);
        vertex.setBias(2.0, kTempusZero);
    }
    std::uint32_t const type = vertex.getInterpolation();
    if (!easesInTime(type))
        return false;
    double const step = type == kKFInterpolationDecelerate ? -(delta / -3.0) : delta / -3.0;
    vertex.setBias(std::clamp(vertex.getBias(kTempusZero) + step, 0.0, 2.0), kTempusZero);
    return false;
}
