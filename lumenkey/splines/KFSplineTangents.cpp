#include "lumenkey/splines/KFSpline.h"
#include "lumenkey/splines/KFTangent.h"
#include "lumenkey/splines/KFVertex.h"
#include "lumenkey/splines/KFVertexStore.h"

#include <cmath>

namespace {

KFVertex* vertexOf(void* handle) { return static_cast<KFVertex*>(handle); }

bool isStretchable(KFTangent const& tangent) { return std::fabs(tangent.u) >= kKFTangentTolerance; }

/// The factor that gives a tangent with the U part `tangentU` the derived length for a distance to the
/// neighbour.
double factorToDerivedLength(Tempus const& distance, double tangentU) {
    return std::fabs(TempusGetSeconds(distance) * (kKFDerivedTangentFraction / tangentU));
}

/// The factor by which the distance of a vertex to a neighbour grows when it moves from `oldU` to `newU`, by
/// way of the length that a derived tangent would have; 0 where the tangent or the old distance is too small
/// to be stretched.
double growthTowards(Tempus const& neighbourU, Tempus const& oldU, Tempus const& newU,
                     KFTangent const& tangent) {
    if (!isStretchable(tangent))
        return 0.0;
    double const oldLength = factorToDerivedLength(oldU - neighbourU, tangent.u);
    double const newLength = factorToDerivedLength(newU - neighbourU, tangent.u);
    return oldLength < kKFTangentTolerance ? 0.0 : newLength / oldLength;
}

/// The part of the span `whole` that `part` takes. A vertex that stands on its neighbour counts as one second
/// away.
double fractionOf(Tempus const& part, Tempus const& whole) {
    if (part == kTempusZero)
        return std::fabs(1.0 / TempusGetSeconds(whole));
    return std::fabs(TempusRatio(part, whole));
}

/// Rescales a moved vertex's own tangent towards a neighbour, whose distance was `oldDistance` and is
/// `newDistance`.
void stretchMovedTangent(KFVertex& vertex, KFTangentSide side, Tempus const& oldDistance,
                         Tempus const& newDistance, Tempus const& t) {
    KFTangent const tangent = KFTangentRead(vertex, side, t);
    if (!isStretchable(tangent) || oldDistance == kTempusZero)
        return;
    double factor = 0.0;
    if (!vertex.testFlag(kKFVertexFlagCrossedNeighbour)) {
        factor = fractionOf(newDistance, oldDistance);
    } else if (newDistance == kTempusZero) {
        factor = std::fabs(kKFDerivedTangentFraction / tangent.u);
    } else {
        factor = factorToDerivedLength(newDistance, tangent.u);
    }
    KFTangentWrite(vertex, side, tangent * factor, t);
}

/// Shrinks the tangent of an only neighbour by what the insertion of a vertex at `distance` had stretched it.
void undoStretch(KFVertex& neighbour, KFTangentSide side, Tempus const& distance, Tempus const& t) {
    KFTangent const tangent = KFTangentRead(neighbour, side, t);
    if (!isStretchable(tangent))
        return;
    KFTangentWrite(neighbour, side, tangent * (1.0 / factorToDerivedLength(distance, tangent.u)), t);
}

/// Gives the tangent of an only neighbour the derived length for a vertex at `distance`, in its own
/// direction.
void fitToDistance(KFVertex& neighbour, KFTangentSide side, Tempus const& distance, Tempus const& t) {
    KFTangent const tangent = KFTangentRead(neighbour, side, t);
    if (!isStretchable(tangent))
        return;
    KFTangentWrite(neighbour, side, tangent * factorToDerivedLength(distance, tangent.u), t);
}

/// Scales one side of all enabled vertices that stand at `u`, but for the one that came there.
void scaleTangentsAt(KFVertexStore const& vertices, KFVertex const* newcomer, Tempus const& u,
                     KFTangentSide side, double factor, Tempus const& t) {
    for (auto place = vertices.lowerBound(u); place != vertices.end(); place = vertices.next(place)) {
        KFVertex& vertex = *vertices.at(place);
        if (vertex.getValueU() != u)
            return;
        if (&vertex != newcomer && vertex.isEnabled(kTempusZero))
            KFTangentScale(vertex, side, factor, t);
    }
}

/// The handle shortening of a subdivision (de Casteljau) at `u`; an only neighbour is fitted to the distance.
void shortenFacingTangents(Tempus const& u, KFVertex* previous, KFVertex* next, Tempus const& t) {
    if (previous != nullptr && next != nullptr) {
        Tempus const span = next->getValueU() - previous->getValueU();
        KFTangentScale(*previous, KFTangentSide::Output, TempusRatio(u - previous->getValueU(), span), t);
        KFTangentScale(*next, KFTangentSide::Input, TempusRatio(next->getValueU() - u, span), t);
    } else if (previous != nullptr) {
        fitToDistance(*previous, KFTangentSide::Output, u - previous->getValueU(), t);
    } else if (next != nullptr) {
        fitToDistance(*next, KFTangentSide::Input, u - next->getValueU(), t);
    }
}

void writeUnitVector(KFTangent const& tangent, double* x, double* y) {
    double const length = std::sqrt(tangent.u * tangent.u + tangent.v * tangent.v);
    if (x != nullptr)
        *x = tangent.u / length;
    if (y != nullptr)
        *y = tangent.v / length;
}

} // namespace

// --- Upkeep around an edit ---

void KFSpline::scaleTangentsAroundPoint(Tempus const& a, Tempus const& b, Tempus const& t) {
    if (!getState()->deriveTangents)
        return;
    void* found = nullptr;
    if (!getNextValidVertex(b, &found, t, false)) {
        if (!getPreviousValidVertex(b, &found, t, false))
            return;
        KFVertex& previous = *vertexOf(found);
        KFTangent const tangent = KFTangentRead(previous, KFTangentSide::Output, t);
        double const growth = growthTowards(previous.getValueU(), b, a, tangent);
        KFTangentWrite(previous, KFTangentSide::Output, tangent * growth, t);
        return;
    }
    KFVertex& next = *vertexOf(found);
    Tempus const nextU = next.getValueU();
    if (!getPreviousValidVertex(&next, &found, kTempusZero)) {
        KFTangent const tangent = KFTangentRead(next, KFTangentSide::Input, t);
        KFTangentWrite(next, KFTangentSide::Input, tangent * growthTowards(nextU, b, a, tangent), t);
        return;
    }
    KFVertex& previous = *vertexOf(found);
    Tempus const previousU = previous.getValueU();
    if (b == previousU)
        return; // another vertex still stands where this one was
    Tempus const span = nextU - previousU;
    KFTangentScale(previous, KFTangentSide::Output, std::fabs(TempusRatio(span, b - previousU)), t);
    KFTangentScale(next, KFTangentSide::Input, std::fabs(TempusRatio(span, b - nextU)), t);
}

void KFSpline::scaleTangentsAfterInsertion(void* handle, Tempus const& delta, Tempus const& t) {
    if (!getState()->deriveTangents || delta == kTempusZero)
        return;
    KFVertex& vertex = *vertexOf(handle);
    Tempus const newU = vertex.getValueU();
    Tempus const oldU = newU - delta;
    void* previous = nullptr;
    void* next = nullptr;
    getPreviousValidVertex(handle, &previous, kTempusZero);
    getNextValidVertex(handle, &next, kTempusZero);
    Tempus const previousU = previous != nullptr ? vertexOf(previous)->getValueU() : kTempusInvalid;
    Tempus const nextU = next != nullptr ? vertexOf(next)->getValueU() : kTempusInvalid;
    // Between two neighbours at one U there is no segment to divide.
    if (previous != nullptr && next != nullptr && previousU != nextU) {
        Tempus const span = nextU - previousU;
        scaleTangentsAt(store(), &vertex, previousU, KFTangentSide::Output,
                        fractionOf(newU - previousU, span), t);
        scaleTangentsAt(store(), &vertex, nextU, KFTangentSide::Input, fractionOf(newU - nextU, span), t);
    }
    if (previous != nullptr) {
        stretchMovedTangent(vertex, KFTangentSide::Input, oldU - previousU, newU - previousU, t);
    }
    if (next != nullptr) {
        stretchMovedTangent(vertex, KFTangentSide::Output, oldU - nextU, newU - nextU, t);
    }
}

void KFSpline::scaleTangentsBeforeDeletion(void* handle, Tempus const& t) {
    if (!getState()->deriveTangents)
        return;
    // Neighbours by position, not by handle: a fellow at the same U is at no distance that could be scaled,
    // and a disabled vertex, which can be deleted too, isn't in the list of valid ones.
    Tempus const u = vertexOf(handle)->getValueU();
    void* previous = nullptr;
    void* next = nullptr;
    getPreviousValidVertex(u, &previous, kTempusZero, false);
    getNextValidVertex(u, &next, kTempusZero, false);
    if (previous != nullptr && next != nullptr) {
        Tempus const previousU = vertexOf(previous)->getValueU();
        Tempus const nextU = vertexOf(next)->getValueU();
        Tempus const span = nextU - previousU;
        KFTangentScale(*vertexOf(previous), KFTangentSide::Output, 1.0 / TempusRatio(u - previousU, span), t);
        KFTangentScale(*vertexOf(next), KFTangentSide::Input, 1.0 / TempusRatio(nextU - u, span), t);
    } else if (previous != nullptr) {
        undoStretch(*vertexOf(previous), KFTangentSide::Output, u - vertexOf(previous)->getValueU(), t);
    } else if (next != nullptr) {
        undoStretch(*vertexOf(next), KFTangentSide::Input, u - vertexOf(next)->getValueU(), t);
    }
}

// --- Derivation ---

void KFSpline::derivePoint(Tempus const& u, double* inU, double* inV, double* outU, double* outV,
                           Tempus const& t, bool readOnly) {
    if (!getState()->deriveTangents)
        return;
    void* previousHandle = nullptr;
    void* nextHandle = nullptr;
    getPreviousValidVertex(u, &previousHandle, kTempusZero, false);
    getNextValidVertex(u, &nextHandle, kTempusZero, false);
    KFVertex* const previous = vertexOf(previousHandle);
    KFVertex* const next = vertexOf(nextHandle);
    Tempus const step = getState()->roundingDelta;
    double const value = getVertexValue(u, kTempusZero, false);

    KFTangent input;
    KFTangent output;
    if (previous != nullptr) {
        double const rise = next != nullptr ? value - getVertexValue(u - step, kTempusZero, false)
                                            : (value - previous->getValueV(kTempusZero)) /
                                                  TempusGetSeconds(u - previous->getValueU());
        input = -KFTangent{TempusGetSeconds(step), rise};
    }
    if (next != nullptr) {
        double const rise = previous != nullptr ? getVertexValue(u + step, kTempusZero, false) - value
                                                : (next->getValueV(kTempusZero) - value) /
                                                      TempusGetSeconds(next->getValueU() - u);
        output = {TempusGetSeconds(step), rise};
    }
    if (!readOnly)
        shortenFacingTangents(u, previous, next, t);
    if (previous != nullptr)
        input = input * factorToDerivedLength(u - previous->getValueU(), input.u);
    if (next != nullptr)
        output = output * factorToDerivedLength(u - next->getValueU(), output.u);

    if (inU != nullptr)
        *inU = input.u;
    if (inV != nullptr)
        *inV = input.v;
    if (outU != nullptr)
        *outU = output.u;
    if (outV != nullptr)
        *outV = output.v;
}

void KFSpline::deriveCurve(KFVertex& vertex, Tempus const& t, bool readOnly) {
    void* first = nullptr;
    void* last = nullptr;
    if (!getFirstValidVertex(&first, kTempusZero) || !getLastValidVertex(&last, t))
        return;
    if (!getState()->deriveTangents)
        return;
    Tempus const u = vertex.getValueU();
    void* previous = nullptr;
    void* next = nullptr;
    getPreviousValidVertex(u, &previous, kTempusZero, false);
    getNextValidVertex(u, &next, kTempusZero, false);

    if (next != nullptr && &vertex == first) {
        KFTangent const line = KFTangentAlongLine(vertex, *vertexOf(next));
        KFTangentWrite(vertex, KFTangentSide::Output, line, kTempusZero);
        KFTangentWrite(vertex, KFTangentSide::Input, -line, kTempusZero);
        KFTangentFlattenFacing(*vertexOf(next), KFTangentSide::Input, vertex, t);
        return;
    }
    if (previous != nullptr && &vertex == last) {
        KFTangent const line = KFTangentAlongLine(*vertexOf(previous), vertex);
        KFTangentWrite(vertex, KFTangentSide::Input, -line, kTempusZero);
        KFTangentWrite(vertex, KFTangentSide::Output, line, kTempusZero);
        KFTangentFlattenFacing(*vertexOf(previous), KFTangentSide::Output, vertex, t);
        return;
    }

    KFTangent input;
    KFTangent output;
    derivePoint(u, &input.u, &input.v, &output.u, &output.v, t, readOnly);
    bool outputFirst = std::fabs(input.u) <= std::fabs(output.u);
    if (vertexOf(first)->getValueU() >= u) {
        input = -output;
        outputFirst = true;
    } else if (vertexOf(last)->getValueU() <= u) {
        output = -input;
        outputFirst = false;
    }
    if (outputFirst)
        KFTangentWrite(vertex, KFTangentSide::Output, output, t);
    KFTangentWrite(vertex, KFTangentSide::Input, input, t);
    if (!outputFirst)
        KFTangentWrite(vertex, KFTangentSide::Output, output, t);
}

bool KFSpline::deriveVertex(void* handle, Tempus const& t) {
    deriveCurve(*vertexOf(handle), t, true);
    return true;
}

// --- Directions at a point ---

bool KFSpline::getPointInputTangents(Tempus const& u, double* x, double* y, Tempus const& t) {
    if (!getState()->deriveTangents)
        return false;
    KFTangent tangent;
    derivePoint(u, &tangent.u, &tangent.v, nullptr, nullptr, t, true);
    writeUnitVector(tangent, x, y);
    return true;
}

bool KFSpline::getPointOutputTangents(Tempus const& u, double* x, double* y, Tempus const& t) {
    if (!getState()->deriveTangents)
        return false;
    KFTangent tangent;
    derivePoint(u, nullptr, nullptr, &tangent.u, &tangent.v, t, true);
    writeUnitVector(tangent, x, y);
    return true;
}

void KFSpline::getNormals(Tempus const& u, double* nx, double* ny, Tempus const& t) {
    Tempus const before = u - getState()->roundingDelta;
    Tempus const behind = u + getState()->roundingDelta;
    double const rise = getVertexValue(behind, t, false) - getVertexValue(before, t, false);
    double const run = TempusGetSeconds(behind - before);
    double const length = std::sqrt(rise * rise + run * run);
    *nx = -rise / length;
    *ny = run / length;
}

// --- Handles ---

bool KFSpline::setVertexSmooth(void* handle, bool smooth, Tempus const& t) {
    KFVertex& vertex = *vertexOf(handle);
    if (smooth) {
        vertex.setInterpolation(kKFInterpolationBezier);
        deriveCurve(vertex, kTempusZero, false);
    } else {
        vertex.setInterpolation(kKFInterpolationLinear);
        vertex.setInputTangents(0.0, 0.0, t);
        vertex.setOutputTangents(0.0, 0.0, t);
    }
    return true;
}

bool KFSpline::flattenHandles(void* handle, Tempus const& t) {
    if (handle == nullptr)
        return false;
    vertexOf(handle)->flattenTangents(t);
    vertexOf(handle)->setFlag(kKFVertexFlagHandlesEdited);
    return true;
}

bool KFSpline::setVertexInputHandles(void* handle, double u, double v, Tempus const& t, bool convert) {
    KFVertex& vertex = *vertexOf(handle);
    if (convert)
        getInterpolator(vertex.getInterpolation())->convertHandlesToTangents(*this, &u, &v);
    vertex.resetFlag(kKFVertexFlagCrossedNeighbour);
    vertex.setFlag(kKFVertexFlagHandlesEdited);
    vertex.setInputTangents(u, v, t);
    return true;
}

bool KFSpline::setVertexOutputHandles(void* handle, double u, double v, Tempus const& t, bool convert) {
    KFVertex& vertex = *vertexOf(handle);
    if (convert)
        getInterpolator(vertex.getInterpolation())->convertHandlesToTangents(*this, &u, &v);
    vertex.setOutputTangents(u, v, t);
    vertex.resetFlag(kKFVertexFlagCrossedNeighbour);
    vertex.setFlag(kKFVertexFlagHandlesEdited);
    return true;
}

bool KFSpline::getVertexInputHandles(void* handle, double* u, double* v, Tempus const& t, bool convert) {
    KFVertex& vertex = *vertexOf(handle);
    vertex.getInputTangents(u, v, t);
    if (convert)
        getInterpolator(vertex.getInterpolation())->convertTangentsToHandles(*this, u, v);
    return true;
}

bool KFSpline::getVertexOutputHandles(void* handle, double* u, double* v, Tempus const& t, bool convert) {
    KFVertex& vertex = *vertexOf(handle);
    vertex.getOutputTangents(u, v, t);
    if (convert)
        getInterpolator(vertex.getInterpolation())->convertTangentsToHandles(*this, u, v);
    return true;
}
