#include "tests/splines/museum.h"

#include <algorithm>
#include <cmath>

namespace {

Tempus s(std::int64_t value, std::int32_t timescale = 1) { return TempusMake(value, timescale); }

/// Handles in seconds and values, as a user sees them.
void setHandles(MuseumSpline& curve, KFVertex* vertex, Sides const& handles) {
    curve->setVertexInputHandles(vertex, handles[0], handles[1], kTempusZero, true);
    curve->setVertexOutputHandles(vertex, handles[2], handles[3], kTempusZero, true);
}

/// Handles of a part of the distance to each neighbour, all rising by `rise`.
void stretchHandles(MuseumSpline& curve, double part, double rise) {
    auto const vertices = museumVertices(*curve);
    for (std::size_t i = 0; i < vertices.size(); ++i) {
        auto const reach = [&](std::size_t a, std::size_t b) {
            return part * TempusGetSeconds(vertices[b]->getValueU() - vertices[a]->getValueU());
        };
        double const before = i > 0 ? reach(i - 1, i) : 0.0;
        double const after = i + 1 < vertices.size() ? reach(i, i + 1) : 0.0;
        setHandles(curve, vertices[i], {-before, -rise, after, rise});
    }
}

/// Seven vertices at uneven distances, in several timescales: rising, falling, level, crossing zero, with biases.
void zigzag(MuseumSpline& curve, std::uint32_t type) {
    struct Stop {
        Tempus u;
        double v, bias;
    };
    Stop const stops[] = {{s(5, 24), 1.0, 1.0},
                          {s(10010, 30000), 4.0, 0.3},
                          {s(1), -2.0, 2.0},
                          {s(7, 5), -2.0, 0.0},
                          {s(2), 3.0, 1.7},
                          {s(58, 25), 0.5, 1.0},
                          {s(1000001, 262144), 2.75, 0.6}};
    for (Stop const& stop : stops) {
        curve.append(stop.u, stop.v, type)->setBias(stop.bias, kTempusZero);
    }
    stretchHandles(curve, 0.21, 0.7);
}

/// A vertex for each frame, of types that change, with some disabled, some at one place.
void many(MuseumSpline& curve, int count) {
    auto const& types = museumSegmentTypes();
    for (int i = 0; i < count; ++i) {
        Tempus const u = i % 3 == 0   ? s(i, 24)
                         : i % 3 == 1 ? s(i, 24) + s(1, 240)
                                      : s(std::int64_t{i} * 1250, 30000);
        double const value = std::sin(i * 0.7) * 10.0 + i % 4;
        KFVertex* const vertex =
            curve.append(u, value, types[static_cast<std::size_t>(i / 2) % types.size()]);
        setHandles(curve, vertex, {-0.013, 0.2, 0.019, -0.3});
        if (i % 11 == 5) {
            curve.append(u, value + 1.0, kKFInterpolationEaseOut);
        }
        if (i % 7 == 3) {
            curve->disableVertex(vertex, kTempusZero);
        }
    }
}

/// Vertices at each of these positions, of alternating values.
void keysAt(MuseumSpline& curve, std::vector<Tempus> const& positions, std::uint32_t type) {
    double value = 1.0;
    for (Tempus const& u : positions) {
        curve.append(u, value, type);
        value = 1.5 - value * 1.25;
    }
    stretchHandles(curve, 0.4, 0.2);
}

/// Two vertices a second apart, the handles of the segment between them being out (a, b) and in (c, d).
void oneSegment(MuseumSpline& curve, double a, double b, double c, double d) {
    setHandles(curve, curve.append(s(1), 2.0, kKFInterpolationBezier), {0.0, 0.0, a, b});
    setHandles(curve, curve.append(s(2), 5.0, kKFInterpolationBezier), {c, d, 0.0, 0.0});
}

void disable(MuseumSpline& curve, std::vector<std::size_t> const& indices) {
    auto const vertices = museumVertices(*curve);
    for (std::size_t const i : indices) {
        curve->disableVertex(vertices[i], kTempusZero);
    }
}

/// Control points of a whole-curve type, one at each whole second.
void controlPoints(MuseumSpline& curve, std::uint32_t type, int count, bool closed) {
    curve.state->parametric = true;
    curve.state->interpolation = type;
    for (int i = 0; i < count; ++i) {
        curve.append(s(i), std::cos(i * 1.3) * 4.0, type)->setBias(i % 3 == 2 ? -0.4 : 0.25 * i, kTempusZero);
    }
    if (closed) {
        curve->setClosed(true, nullptr);
    }
}

class Builder {
public:
    void add(std::string const& name, std::function<void(MuseumSpline&)> const& fill) {
        all.push_back({name, fill});
    }
    void addKeys(std::string const& name, std::vector<Tempus> const& positions, std::uint32_t type) {
        add(name, [=](MuseumSpline& c) { keysAt(c, positions, type); });
    }
    void addZigzag(std::string const& name, std::uint32_t type,
                   std::function<void(MuseumSpline&)> const& change) {
        add(name, [=](MuseumSpline& c) {
            zigzag(c, type);
            change(c);
        });
    }

    std::vector<Exhibit> all;
};

void close(MuseumSpline& curve) { curve->setClosed(true, nullptr); }

void addTypes(Builder& build) {
    for (std::uint32_t const type : museumSegmentTypes()) {
        std::string const name = "type " + std::to_string(type);
        build.addZigzag(name, type, [](MuseumSpline&) {});
        // The segment behind the last vertex is short, and neighbours wrap.
        build.addZigzag("closed " + name, type, close);
        // Handles are a third of a tangent and U is the parameter.
        build.addZigzag("parametric " + name, type, [](MuseumSpline& c) { c.state->parametric = true; });
    }
    // One type after the other, plain, and with differences and products near the ends of the doubles.
    std::vector<double> const values[] = {
        {-2.0, 0.0, 2.0, -1.0, 1.0}, {1e300, -1e300, 1e300, 1e-300, -1e-300, 0.0}, {1e-300, 3e-308}};
    for (auto const& cycle : values) {
        build.add("all types, from " + std::to_string(cycle[0]),
                  [&types = museumSegmentTypes(), cycle](MuseumSpline& c) {
                      for (std::size_t i = 0; i < types.size(); ++i) {
                          c.append(s(static_cast<int>(i), 3), cycle[i % cycle.size()], types[i]);
                      }
                      stretchHandles(c, 0.5, -0.4 * std::fabs(cycle[1]));
                  });
    }
}

void addSizes(Builder& build) {
    for (int const count : {0, 1, 2}) {
        build.addKeys(std::to_string(count) + " vertices",
                      std::vector<Tempus>(static_cast<std::size_t>(count), s(2)), 1);
    }
    build.addKeys("the smallest curve", {s(0), s(1)}, 1);
    // Several blocks of the store.
    for (int const count : {300, 600, 5000}) {
        build.add(std::to_string(count) + " vertices", [=](MuseumSpline& c) { many(c, count); });
    }
    for (std::uint32_t const type : {1u, 4u, 6u, 15u}) {
        // A tick apart, and below the least duration of a cubic segment; ten hours of film between two frames.
        int const fine = 3000000;
        std::int64_t const frame = 1001;
        build.addKeys("shortest spans, type " + std::to_string(type),
                      {s(0), s(1, fine), s(2, fine), s(30, fine), s(31, fine), s(1, 10)}, type);
        build.addKeys("longest spans, type " + std::to_string(type),
                      {s(0), s(frame, 24000), s(863136 * frame, 24000), s(863137 * frame, 24000),
                       s(5000000 * frame, 24000)},
                      type);
    }
}

void addHandles(Builder& build) {
    // The handles of one segment: out (a, b) and in (c, d).
    struct Shape {
        char const* name;
        double a, b, c, d;
    };
    Shape const shapes[] = {
        {"flat handles", 0.0, 0.0, 0.0, 0.0},
        {"handles at thirds", 1.0 / 3.0, 4.0, -1.0 / 3.0, 2.0},
        {"handles nearly at thirds", 1.0 / 3.0 + 1e-9, 4.0, -1.0 / 3.0, 2.0},
        // Each finds the parameter by another method.
        {"gentle handles", 0.3, 1.0, -0.4, 1.0},
        {"short handles", 0.15, 1.0, -0.2, -1.0},
        {"free handles", 0.8, -3.0, -0.7, 6.0},
        {"vertical handle at the start", 0.0, 3.0, -0.3, 0.0},
        {"vertical handle at the end", 0.5, 0.0, 0.0, -7.0},
        {"vertical in the middle", 1.0, 0.5, -1.0, 0.5},
        // Shortened, in U and V, so that time doesn't fold.
        {"handles past the neighbours", 2.5, 4.0, -1.7, 1.0},
        {"one handle past its neighbour", 3.9, -2.0, -0.01, 1.0},
    };
    for (Shape const& shape : shapes) {
        build.add(shape.name, [=](MuseumSpline& c) { oneSegment(c, shape.a, shape.b, shape.c, shape.d); });
    }
    build.add("a fold", [](MuseumSpline& c) {
        c.state->sanitizeBezier = false;
        oneSegment(c, 2.5, 4.0, -1.7, 1.0);
    });
    // Tangents that come from far and near vertices.
    build.addKeys("S of neighbours", {s(0), s(10), s(101, 10), s(103, 10), s(30)},
                  kKFInterpolationCatmullRom);
    build.add("derived tangents", [](MuseumSpline& c) {
        c.state->deriveTangents = true;
        c.state->interpolation = kKFInterpolationBezier;
        for (int const frame : {30, 0, 12, 90, 48, 47, 60}) {
            c->addVertex(s(frame, 24), std::sin(frame * 0.1), kTempusZero, true);
        }
    });
}

void addPlaces(Builder& build) {
    // Of several at one place the first counts there, the last behind.
    for (std::uint32_t const type : {1u, 4u, 6u}) {
        build.add("several at one place, type " + std::to_string(type), [=](MuseumSpline& c) {
            keysAt(c, {s(0), s(0), s(1), s(1), s(1), s(2), s(3), s(3)}, type);
            disable(c, {2});
            museumVertices(*c)[3]->setInterpolation(kKFInterpolationEaseIn);
        });
    }
    std::vector<std::size_t> const absents[] = {{0}, {2, 3}, {6}, {0, 1, 2, 4, 5, 6}, {0, 1, 2, 3, 4, 5, 6}};
    for (auto const& absent : absents) {
        std::string const name =
            std::to_string(absent.size()) + " disabled from " + std::to_string(absent[0]);
        auto const change = [absent](MuseumSpline& c) { disable(c, absent); };
        build.addZigzag(name, kKFInterpolationCatmullRom, change);
        build.addZigzag("closed, " + name, kKFInterpolationCatmullRom, [=](MuseumSpline& c) {
            change(c);
            close(c);
        });
    }
    build.addZigzag("locked", kKFInterpolationBezier, [](MuseumSpline& c) { c->lockSpline(true); });
    build.addKeys("mixed timescales",
                  {s(1001, 30000), s(1, 24), s(100000, 262144), s(48000, 90000), s(44100, 44100), s(7, 6)},
                  4);
    // No common timescale fits, so that positions are compared exactly; or one that fits few positions asked for.
    std::int32_t const primes[] = {2147483647, 2147483629, 2147483587, 2147483579, 2147483563};
    std::vector<Tempus> positions;
    for (std::int32_t const prime : primes) {
        positions.push_back(s(static_cast<std::int64_t>(positions.size()) * prime + 1, prime));
    }
    build.addKeys("incommensurable", positions, 4);
    build.addKeys("two large primes", {s(1, primes[0]), s(primes[1], primes[1]), s(2)}, 15);
    build.addKeys("negative times", {s(-1001 * 99, 30000), s(-5, 3), s(-1, primes[0]), s(0), s(0), s(1, 24)},
                  4);
    // Positions whose ticks overflow in finer timescales, and a segment of more ticks than a double counts.
    std::int64_t const age = std::int64_t{1} << 45;
    build.addKeys("ages", {s(-age), s(0), s(age), s((std::int64_t{1} << 61) - 3)}, 7);
    build.addKeys("fine and long", {s(1, primes[0]), s(9000000), s(9000001)}, 8);
}

void addWholeCurves(Builder& build) {
    for (std::uint32_t const type : {10u, 12u}) {
        std::string const number = "type " + std::to_string(type);
        for (bool const closed : {false, true}) {
            std::string const name = (closed ? "closed whole " : "open whole ") + number;
            for (int const count : {1, 3, 9}) {
                build.add(name + " of " + std::to_string(count),
                          [=](MuseumSpline& c) { controlPoints(c, type, count, closed); });
            }
            // Drawn segment by segment, each as the whole.
            build.add(name + " under a plain state", [=](MuseumSpline& c) {
                controlPoints(c, type, 6, closed);
                c.state->interpolation = kKFInterpolationLinear;
            });
            build.add(name + " with a vertex disabled", [=](MuseumSpline& c) {
                controlPoints(c, type, 7, closed);
                disable(c, {0, 3});
            });
        }
        // Meaningless on a curve over time, but it must not spread.
        build.addZigzag(number + " inside", kKFInterpolationLinear,
                        [=](MuseumSpline& c) { museumVertices(*c)[3]->setInterpolation(type); });
        // The range is asked of the types at the ends.
        build.addZigzag(number + " at the ends", kKFInterpolationLinear, [=](MuseumSpline& c) {
            auto const vertices = museumVertices(*c);
            vertices.front()->setInterpolation(type);
            vertices.back()->setInterpolation(type);
        });
        build.addZigzag("state of " + number, kKFInterpolationEaseOut, [=](MuseumSpline& c) {
            c.state->interpolation = type;
            c.state->parametric = true;
        });
    }
}

void addExtrapolations(Builder& build) {
    for (std::uint32_t const mode : {0u, 1u, 2u, 3u, 4u, 9u}) {
        for (bool const retiming : {false, true}) {
            std::string const name = (retiming ? "retimed mode " : "mode ") + std::to_string(mode);
            auto const set = [=](MuseumSpline& c) {
                c.state->retimingExtrapolation = retiming;
                c.state->preExtrapolation = mode;
                c.state->postExtrapolation = mode;
            };
            build.addZigzag(name, kKFInterpolationBezier, set);
            // A curve shorter than the step and the reach of a slope; several vertices at each end.
            build.add(name + ", short", [=](MuseumSpline& c) {
                keysAt(c, {s(1), s(1001, 1000), s(1004, 1000)}, kKFInterpolationLinear);
                set(c);
            });
            build.add(name + ", ends shared", [=](MuseumSpline& c) {
                keysAt(c, {s(0), s(0), s(1), s(2), s(2)}, kKFInterpolationEase);
                set(c);
            });
        }
    }
}

} // namespace

MuseumSpline::MuseumSpline() : state(std::make_unique<KFSplineState>()) {
    state->deriveTangents = false;
    spline = std::make_unique<KFSpline>(state.get());
}

MuseumSpline::MuseumSpline(MuseumSpline const& other)
    : state(std::make_unique<KFSplineState>(*other.state)),
      spline(std::make_unique<KFSpline>(*other.spline, state.get())) {}

KFVertex* MuseumSpline::append(Tempus const& u, double value, std::uint32_t type) const {
    auto* const vertex = static_cast<KFVertex*>(spline->appendVertexNoTangents(u, value, kTempusZero));
    vertex->setInterpolation(type);
    return vertex;
}

void MuseumSpline::appendAtRandom(std::mt19937& random, int count,
                                  std::vector<std::uint32_t> const& types) const {
    auto const number = [&random](int low, int high) {
        return low + static_cast<int>(random() % static_cast<unsigned>(high - low + 1));
    };
    int u = number(-50, 50);
    for (int i = 0; i < count; ++i, u += number(10, 40)) {
        KFVertex* const vertex = append(TempusMake(u, 30), number(-9, 9), types[random() % types.size()]);
        setSides(*vertex,
                 {-number(0, 9) / 100.0, number(-9, 9) / 30.0, number(0, 9) / 100.0, number(-9, 9) / 30.0});
    }
}

Sides sidesOf(KFVertex const& vertex) {
    Sides sides{};
    vertex.getInputTangents(&sides[0], &sides[1], kTempusZero);
    vertex.getOutputTangents(&sides[2], &sides[3], kTempusZero);
    return sides;
}

void setSides(KFVertex& vertex, Sides const& sides) {
    vertex.setInputTangents(sides[0], sides[1], kTempusZero);
    vertex.setOutputTangents(sides[2], sides[3], kTempusZero);
}

MuseumSpline Exhibit::build() const {
    MuseumSpline curve;
    fill(curve);
    return curve;
}

std::vector<Exhibit> const& museum() {
    static std::vector<Exhibit> const exhibits = [] {
        Builder build;
        for (auto* const add :
             {addSizes, addTypes, addHandles, addPlaces, addWholeCurves, addExtrapolations}) {
            add(build);
        }
        return build.all;
    }();
    return exhibits;
}

std::vector<std::uint32_t> const& museumSegmentTypes() {
    static std::vector<std::uint32_t> const types{0, 1, 4, 6, 7, 8, 13, 14, 15, 16, 17, 18, 19, 20, 21, 77};
    return types;
}

std::vector<KFVertex*> museumVertices(KFSpline& spline) {
    std::vector<KFVertex*> vertices;
    for (auto place = spline.beginVertices(); !(place == spline.endVertices());
         place = spline.nextPlace(place)) {
        vertices.push_back(spline.vertexAt(place));
    }
    return vertices;
}

std::vector<Tempus> museumPositions(KFSpline& spline) {
    std::vector<Tempus> positions{kTempusNegativeInfinity,
                                  kTempusPositiveInfinity,
                                  kTempusIndefinite,
                                  kTempusInvalid,
                                  kTempusZero,
                                  s(-3),
                                  s(7, 24)};
    auto const vertices = museumVertices(spline);
    if (!vertices.empty()) {
        std::size_t const stride = 1 + vertices.size() / 60;
        double const parts[] = {1e-9, 0.1, 1.0 / 3.0, 0.5, 0.77, 1.0 - 1e-9};
        Tempus const grids[] = {s(1, 24), s(1, 25), s(1001, 30000), s(1, 48), s(1, 262144)};
        for (std::size_t i = 0; i < vertices.size(); i += stride) {
            Tempus const u = vertices[i]->getValueU();
            positions.push_back(u);
            if (i + 1 == vertices.size()) {
                break;
            }
            Tempus const span = vertices[i + 1]->getValueU() - u;
            for (double const part : parts) {
                positions.push_back(u + span * part);
            }
            for (Tempus const& grid : grids)
                positions.push_back(BX_TempusFloorToSampleDuration(u + span * 0.61, grid));
            positions.push_back(u + span * s(1, 2));
            positions.push_back(
                KFChronoForChannelSeconds(TempusGetSeconds(u + span * 0.29), kKFChannelTimescale));
        }
        Tempus const first = vertices.front()->getValueU();
        Tempus const last = vertices.back()->getValueU();
        positions.push_back(last);
        for (double const reach : {1e-9, 0.3, 1.0, 1.45, 2.0, 2.9}) {
            positions.push_back(first - (last - first) * reach - s(1, 3000000));
            positions.push_back(last + (last - first) * reach + s(1, 3000000));
        }
    }
    std::stable_sort(positions.begin(), positions.end());
    return positions;
}

std::string museumText(Tempus const& t) {
    return TempusIsNumeric(t) ? std::to_string(t.value) + "/" + std::to_string(t.timescale)
                              : "kind " + std::to_string(static_cast<int>(TempusGetKind(t)));
}
