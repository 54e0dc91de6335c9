// Internal: not installed.
#pragma once

#include "lumenkey/splines/KFCubic.h"
#include "lumenkey/splines/KFShapes.h"
#include "lumenkey/splines/KFStaticVertex.h"
#include "lumenkey/splines/KFVertexIterator.h"

#include <cstdint>

/// How the positions of a spline and those at which it is asked come to one timescale.
///
/// Both are whole numbers of steps of 1/R seconds: a position of the store is `perTick` steps a tick, a position
/// asked for is `perUnit` steps a unit of its own timescale. R is the least common multiple of the two timescales.
struct KFStepScale {
    std::int64_t tickScale = 0;
    std::int32_t timescale = 0;
    std::int64_t perTick = 0;
    std::int64_t perUnit = 0;
    double stepsPerSecond = 1.0;

    /// False, and unusable, when R doesn't stay below 2^53, up to where doubles hold all whole numbers.
    bool prepare(std::int64_t tickScaleIn, std::int32_t timescaleIn) noexcept;

    /// A position asked for, in steps; false for one of another timescale, and for what is no plain number.
    bool stepsOf(Tempus const& u, std::int64_t* position) const noexcept {
        return u.timescale == timescale && u.flags == kTempusFlagValid && u.epoch == 0 &&
               !__builtin_mul_overflow(u.value, perUnit, position);
    }
};

/// What evaluation computed about one segment between two static vertices, so that the next position in it needs no
/// search and no polygon. Positions are in steps of the scale.
///
/// It is current while the store's version, the settings and the revisions of the vertices that it depends on are
/// those that it names. Which positions it is asked for in which order never changes an answer.
///
/// Threads: whoever uses a cache owns it or holds the lock that guards it. The revisions may be compared only while the
/// vertices are certain to be there, under the spline's lock; see `KFThreadSegments` for who doesn't hold it.
struct KFSegmentCache {
    enum class Kind : std::uint8_t { None, Constant, Linear, Cubic, ParametricCubic, Eased, Shape };

    /// A vertex and its revision when it was read.
    struct Reading {
        KFStaticVertex const* vertex = nullptr;
        std::uint32_t revision = 0;

        void take(KFStaticVertex const* from) noexcept {
            vertex = from;
            revision = from->getRevision();
        }
        bool stands() const noexcept { return vertex->getRevision() == revision; }
        bool watch() const noexcept { return vertex->watch() == revision; }
    };

    KFStepScale scale;
    /// Positions of vA and vB, and the distance between them.
    std::int64_t low = 0;
    std::int64_t high = 0;
    double width = 0.0;

    Kind kind = Kind::None;
    bool parametric = false;
    bool sanitizeBezier = false;
    bool dependsOnNeighbours = false;
    std::uint32_t defaultType = 0;
    std::uint32_t type = 0;
    std::uint64_t version = 0;
    /// `KFStaticVertex::getWatchedChanges` and `getWholeCurveChanges` before anything else was read.
    std::uint64_t watchedChanges = 0;
    std::uint32_t wholeCurveChanges = 0;

    double a = 0.0;
    double b = 0.0;
    KFCubic value;
    KFCubicInverse parameter;
    BXMath::EaseInOut easing;

    Reading vertexA, vertexB;
    /// The vertices beyond the ends, for a shape that depends on them.
    Reading beforeA, afterB;
    KFVertexIterator placeOfB;

    /// Strictly between the two ends.
    bool holds(std::int64_t position) const noexcept { return low < position && position < high; }

    bool readingsStand() const noexcept {
        return vertexA.stands() && vertexB.stands() &&
               wholeCurveChanges == KFStaticVertex::getWholeCurveChanges() &&
               (!dependsOnNeighbours || (beforeA.stands() && afterB.stands()));
    }

    void forget() noexcept {
        kind = Kind::None;
        version = 0;
    }

    /// Has the vertices say of their next change that they were watched. A segment whose vertices have changed since it
    /// was prepared is forgotten.
    void watch() noexcept {
        bool const stands = kind != Kind::None && vertexA.watch() && vertexB.watch() &&
                            (!dependsOnNeighbours || (beforeA.watch() && afterB.watch()));
        if (!stands)
            forget();
    }

    /// The value at a position that the segment holds.
    [[gnu::always_inline]] double valueAt(std::int64_t position) const noexcept {
        if (kind == Kind::Constant)
            return a;
        double const p = static_cast<double>(position - low) / width;
        if (kind == Kind::Linear)
            return KFShape::linear(static_cast<double>(high - position) / width, p, a, b);
        if (kind == Kind::Cubic && parameter.method() != KFCubicInverse::Method::Search)
            return value(parameter.withoutSearch(p));
        if (kind == Kind::Eased)
            return KFShape::eased(easing, p, a, b);
        return shapeAt(p);
    }

private:
    double shapeAt(double p) const noexcept;
};
