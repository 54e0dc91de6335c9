// Named curves, each there for a reason that its builder tells. Properties run over all of them, so that a new
// exhibit tests everything.
#pragma once

#include "lumenkey/splines/KFInterpolation.h"
#include "lumenkey/splines/KFSpline.h"
#include "lumenkey/splines/KFSplineOwner.h"
#include "lumenkey/splines/KFSplineState.h"
#include "lumenkey/splines/KFVertex.h"

#include <array>
#include <cstring>
#include <functional>
#include <memory>
#include <random>
#include <string>
#include <vector>

/// A spline with the state that it needs, so that both can be handed around. Its state derives no tangents unless
/// the exhibit says otherwise.
struct MuseumSpline {
    std::unique_ptr<KFSplineState> state;
    std::unique_ptr<KFSpline> spline;

    MuseumSpline();
    /// A deep copy with a state of its own.
    explicit MuseumSpline(MuseumSpline const& other);
    MuseumSpline(MuseumSpline&&) = default;

    KFSpline* operator->() const { return spline.get(); }
    KFSpline& operator*() const { return *spline; }
    double at(Tempus const& u, bool lock = true) const {
        return spline->getVertexValue(u, kTempusZero, lock);
    }
    double slopeAt(Tempus const& u, bool lock = true) const {
        return spline->getDerivativeValue(u, kTempusZero, lock);
    }
    /// What all vertices have in common.
    std::uint32_t typeOfAll() const {
        std::uint32_t type = 0;
        spline->getInterpolation(&type, nullptr, nullptr);
        return type;
    }
    /// The first vertex there, or null.
    KFVertex* vertexAt(Tempus const& u) const {
        void* handle = nullptr;
        spline->getVertexHandle(u, &handle, true);
        return static_cast<KFVertex*>(handle);
    }
    /// Puts a vertex behind the others.
    KFVertex* append(Tempus const& u, double value, std::uint32_t type = kKFInterpolationLinear) const;
    /// Of these types, at uneven distances, with tangents that are unlike on the two sides.
    void appendAtRandom(std::mt19937& random, int count, std::vector<std::uint32_t> const& types) const;
};

/// An owner that answers as the test says.
struct TestOwner : KFSplineOwner {
    double getInitialValue() const override { return initialValue; }
    Tempus getFrameDuration() const override { return frame; }

    double initialValue = 0.0;
    Tempus frame = TempusMake(1, 25);
};

/// The tangents of a vertex: U and V of the input, and of the output.
using Sides = std::array<double, 4>;
Sides sidesOf(KFVertex const& vertex);
void setSides(KFVertex& vertex, Sides const& sides);

struct Exhibit {
    std::string name;
    std::function<void(MuseumSpline&)> fill;

    MuseumSpline build() const;
};

std::vector<Exhibit> const& museum();

/// Every type that draws segments, an unknown number among them.
std::vector<std::uint32_t> const& museumSegmentTypes();

/// In their order.
std::vector<KFVertex*> museumVertices(KFSpline& spline);

/// Where an exhibit is looked at, in ascending order: at its vertices, just beside them, inside each segment (of a
/// long spline, of some) and far outside, in many timescales.
std::vector<Tempus> museumPositions(KFSpline& spline);

/// The same bits, or both not a number.
inline bool isSameDouble(double a, double b) {
    return std::memcmp(&a, &b, sizeof a) == 0 || (a != a && b != b);
}

/// For messages: VALUE/TIMESCALE.
std::string museumText(Tempus const& t);
