#include "lumenkey/splines/KFSpline.h"

#include "lumenkey/foundation/BXMath.h"
#include "lumenkey/splines/KFInterpolator.h"
#include "lumenkey/splines/KFSplineAccess.h"
#include "lumenkey/splines/KFVertex.h"

#include <algorithm>

namespace {

/// The first enabled vertex exactly at `u`; null if there is none.
KFVertex* enabledAt(KFSpline& spline, Tempus const& u) {
    void* handle = nullptr;
    if (!spline.getVertexHandle(u, &handle, false)) {
        return nullptr;
    }
    for (KFVertexIterator place = spline.getVertexIter(handle); place != spline.endVertices();
         place = spline.nextPlace(place)) {
        KFVertex* const vertex = spline.vertexAt(place);
        if (vertex->getValueU() != u) {
            break;
        }
        if (vertex->isEnabled(kTempusZero)) {
            return vertex;
        }
    }
    return nullptr;
}

/// The last enabled vertex at or before `u`; of several at `u` itself the first.
KFVertex* enabledAtOrBefore(KFSpline& spline, Tempus const& u) {
    if (KFVertex* const exact = enabledAt(spline, u)) {
        return exact;
    }
    void* handle = nullptr;
    spline.getPreviousValidVertex(u, &handle, kTempusZero, false);
    return static_cast<KFVertex*>(handle);
}

/// The first enabled vertex at or after `u`.
KFVertex* enabledAtOrAfter(KFSpline& spline, Tempus const& u) {
    if (KFVertex* const exact = enabledAt(spline, u)) {
        return exact;
    }
    void* handle = nullptr;
    spline.getNextValidVertex(u, &handle, kTempusZero, false);
    return static_cast<KFVertex*>(handle);
}

/// Searches the segments between two vertices, each limited to what lies within `from` and `to`.
void searchSegments(KFSpline& spline, KFVertex* w, KFVertex const* last, Tempus const& from, Tempus const& to,
                    double value, std::vector<Tempus>& out) {
    while (w != last) {
        void* handle = nullptr;
        if (!spline.getNextValidVertex(w, &handle, kTempusZero)) {
            return;
        }
        KFVertex* const next = static_cast<KFVertex*>(handle);
        Tempus const startU = w->getValueU();
        Tempus const endU = next->getValueU();
        auto const isInside = [&](Tempus const& u) { return startU < u && u < endU; };
        Tempus const lowU = isInside(from) ? from : startU;
        Tempus const highU = isInside(to) ? to : endU;
        spline.getInterpolator(w->getInterpolation())
            ->uForCurveValue(spline, w, next, lowU, highU, value, out);
        w = next;
    }
}

/// A vertex on the curve at `u`, which takes the place of one that stands there.
KFVertex* addVertexOnCurve(KFSpline& spline, Tempus const& u) {
    double const value = spline.getVertexValue(u, kTempusZero, true);
    return static_cast<KFVertex*>(spline.addVertex(u, value, kTempusZero, true));
}

void makeRamp(KFVertex* vertex, bool eased) {
    if (vertex == nullptr) {
        return;
    }
    vertex->setInterpolation(eased ? kKFInterpolationEase : kKFInterpolationLinear);
    if (eased) {
        vertex->setBias(1.0, kTempusZero);
    }
}

} // namespace

bool KFSpline::getUForValue(double value, std::vector<Tempus>& out, BXTimeRange& range, Tempus& step,
                            std::uint32_t flags) {
    KFSplineAccess access(*this);
    Tempus const minU = getMinValueU(kTempusZero, false);
    Tempus const maxU = getMaxValueU(kTempusZero, false);
    Tempus const from = TempusMinimum(TempusMaximum(range.start, minU), maxU);
    Tempus const to = TempusMaximum(TempusMinimum(TempusRangeGetEnd(range) - step, maxU), minU);

    KFVertex* const first = enabledAtOrBefore(*this, from);
    KFVertex* const last = enabledAtOrAfter(*this, to);
    if (first != nullptr && from <= to) {
        searchSegments(*this, first, last, from, to, value, out);
    }
    if (flags == 1) {
        std::reverse(out.begin(), out.end());
    }
    return !out.empty();
}

bool KFSpline::createSegment(Tempus const& a, Tempus const& b, Tempus const& c, bool eased) {
    Tempus const low = a - c;
    Tempus const high = b + c;
    void* ignored = nullptr;
    bool hasLow = false;
    bool hasHigh = false;
    {
        KFSplineAccess access(*this);
        hasLow = getVertexHandle(low, &ignored, false);
        hasHigh = getVertexHandle(high, &ignored, false);
        if (hasLow && hasHigh && getVertexHandle(a, &ignored, false) && getVertexHandle(b, &ignored, false)) {
            return false;
        }
    }
    bool const isOpenBefore = TempusIsNegativeInfinity(a);
    bool const isOpenAfter = TempusIsPositiveInfinity(b);
    if (isOpenBefore && isOpenAfter) {
        return false;
    }

    // `addVertex` takes the lock itself.
    KFVertex* lowRamp = nullptr;
    KFVertex* highRamp = nullptr;
    if (!isOpenBefore && !hasLow) {
        lowRamp = addVertexOnCurve(*this, low);
        addVertexOnCurve(*this, a);
    }
    if (!isOpenAfter && !hasHigh) {
        highRamp = addVertexOnCurve(*this, b);
        addVertexOnCurve(*this, high);
    }
    makeRamp(lowRamp, eased);
    makeRamp(highRamp, eased);
    return true;
}
