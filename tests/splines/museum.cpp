#include "tests/splines/museum.h"

#include "lumenkey/splines/KFInterpolation.h"

#include <algorithm>
#include <array>
#include <cmath>
#include <iterator>

namespace {

Tempus s(std::int64_t value, std::int32_t timescale = 1) { return TempusMake(value, timescale); }

/// Puts a vertex behind the others.
KFVertex& key(MuseumSpline& curve, Tempus const& u, double value,
              std::uint32_t type = kKFInterpolationLinear) {
    auto& vertex = *static_cast<KFVertex*>(curve->appendVertexNoTangents(u, value, kTempusZero));
    vertex.setInterpolation(type);
    return vertex;
}

struct Handles {
    double inU, inV, outU, outV;
};

/// Handles in seconds and values, as a user sees them.
void setHandles(MuseumSpline& curve, KFVertex& vertex, Handles const& handles) {
    curve->setVertexInputHandles(&vertex, handles.inU, handles.inV, kTempusZero, true);
    curve->setVertexOutputHandles(&vertex, handles.outU, handles.outV, kTempusZero, true);
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
        setHandles(curve, *vertices[i], {-before, -rise, after, rise});
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
        key(curve, stop.u, stop.v, type).setBias(stop.bias, kTempusZero);
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
        KFVertex& vertex = key(curve, u, value, types[static_cast<std::size_t>(i / 2) % types.size()]);
        setHandles(curve, vertex, {-0.013, 0.2, 0.019, -0.3});
        if (i % 11 == 5) {
            key(curve, u, value + 1.0, kKFInterpolationEaseOut);
        }
        if (i % 7 == 3) {
            curve->disableVertex(&vertex, kTempusZero);
        }
    }
}

/// Vertices at each of these positions, of alternating values.
void keysAt(MuseumSpline& curve, std::vector<Tempus> const& positions, std::uint32_t type) {
    double value = 1.0;
    for (Tempus const& u : positions) {
        key(curve, u, value, type);
        value = 1.5 - value * 1.25;
    }
    stretchHandles(curve, 0.4, 0.2);
}

/// Two vertices a second apart, the handles of the segment between them being out (a, b) and in (c, d).
void oneSegment(MuseumSpline& curve, double a, double b, double c, double d) {
    setHandles(curve, key(curve, s(1), 2.0, kKFInterpolationBezier), {0.0, 0.0, a, b});
    setHandles(curve, key(curve, s(2), 5.0, kKFInterpolationBezier), {c, d, 0.0, 0.0});
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
        key(curve, s(i), std::cos(i * 1.3) * 4.0, type).setBias(i % 3 == 2 ? -0.4 : 0.25 * i, kTempusZero);
    }
    if (closed) {
        curve->setClosed(true, nullptr);
    }
}

using Exhibits = std::vector<Exhibit>;

void addTypes(Exhibits& all) {
    for (std::uint32_t const type : museumSegmentTypes()) {
        std::string const name = "type " + std::to_string(type);
        all.push_back({name, "each way to draw a segment, up, down and level",
                       [=](MuseumSpline& c) { zigzag(c, type); }});
        all.push_back({"closed " + name, "the segment behind the last vertex is short, and neighbours wrap",
                       [=](MuseumSpline& c) {
                           zigzag(c, type);
                           c->setClosed(true, nullptr);
                       }});
        all.push_back({"parametric " + name, "handles are a third of a tangent and U is the parameter",
                       [=](MuseumSpline& c) {
                           c.state->parametric = true;
                           zigzag(c, type);
                       }});
    }
    all.push_back({"all types in turn", "the type is that of the vertex in front", [](MuseumSpline& c) {
                       int i = 0;
                       for (std::uint32_t const type : museumSegmentTypes()) {
                           key(c, s(i, 3), (i * 7) % 5 - 2.0, type);
                           ++i;
                       }
                       stretchHandles(c, 0.5, -0.4);
                   }});
}

void addSizes(Exhibits& all) {
    all.push_back({"empty", "nothing to find", [](MuseumSpline&) {}});
    all.push_back({"one vertex", "no segment, no range", [](MuseumSpline& c) { key(c, s(2), 5.0); }});
    all.push_back({"two vertices", "the smallest curve", [](MuseumSpline& c) {
                       keysAt(c, {s(0), s(1)}, 1);
                   }});
    for (int const count : {300, 600, 5000}) {
        all.push_back({std::to_string(count) + " vertices", "several blocks of the store",
                       [=](MuseumSpline& c) { many(c, count); }});
    }
    for (std::uint32_t const type : {1u, 4u, 6u, 15u}) {
        std::string const name = ", type " + std::to_string(type);
        all.push_back(
            {"shortest spans" + name, "a tick apart, and below the least duration of a cubic segment",
             [=](MuseumSpline& c) {
                 keysAt(c, {s(0), s(1, 3000000), s(2, 3000000), s(30, 3000000), s(31, 3000000), s(1, 10)},
                        type);
             }});
        all.push_back({"longest spans" + name, "ten hours of film between two frames", [=](MuseumSpline& c) {
                           keysAt(c,
                                  {s(0), s(1001, 24000), s(std::int64_t{863136} * 1001, 24000),
                                   s(std::int64_t{863137} * 1001, 24000),
                                   s(std::int64_t{5000000} * 1001, 24000)},
                                  type);
                       }});
    }
    all.push_back({"huge values", "products of values near the end of the doubles", [](MuseumSpline& c) {
                       double const values[] = {1e300, -1e300, 1e300, 1e-300, -1e-300, 0.0, 1e300};
                       int i = 0;
                       for (std::uint32_t const type : museumSegmentTypes()) {
                           key(c, s(i, 2), values[i % 7], type);
                           ++i;
                       }
                   }});
    all.push_back({"tiny values", "differences at the start of the doubles", [](MuseumSpline& c) {
                       int i = 0;
                       for (std::uint32_t const type : museumSegmentTypes()) {
                           key(c, s(i, 2), i % 2 == 0 ? 1e-300 : 3e-308, type);
                           ++i;
                       }
                   }});
}

void addHandles(Exhibits& all) {
    struct Shape {
        char const *name, *why;
        double a, b, c, d;
    };
    Shape const shapes[] = {
        {"flat handles", "no tangents: a cubic in U too", 0.0, 0.0, 0.0, 0.0},
        {"handles at thirds", "U is the parameter itself", 1.0 / 3.0, 4.0, -1.0 / 3.0, 2.0},
        {"handles nearly at thirds", "a leading coefficient that counts as none", 1.0 / 3.0 + 1e-9, 4.0,
         -1.0 / 3.0, 2.0},
        {"gentle handles", "two steps find the parameter", 0.3, 1.0, -0.4, 1.0},
        {"short handles", "three steps find the parameter", 0.15, 1.0, -0.2, -1.0},
        {"free handles", "a steep curve that needs a search", 0.8, -3.0, -0.7, 6.0},
        {"vertical handle at the start", "the slope at the vertex is infinite", 0.0, 3.0, -0.3, 0.0},
        {"vertical handle at the end", "the slope at the vertex is infinite", 0.5, 0.0, 0.0, -7.0},
        {"vertical in the middle", "U stands still at one parameter", 1.0, 0.5, -1.0, 0.5},
        {"handles past the neighbours", "shortened, in U and V, so that time doesn't fold", 2.5, 4.0, -1.7,
         1.0},
        {"one handle past its neighbour", "shortened by a very unequal pair", 3.9, -2.0, -0.01, 1.0},
    };
    for (Shape const& shape : shapes) {
        all.push_back({shape.name, shape.why,
                       [=](MuseumSpline& c) { oneSegment(c, shape.a, shape.b, shape.c, shape.d); }});
    }
    all.push_back({"a fold", "the same, left to fold back in time", [](MuseumSpline& c) {
                       c.state->sanitizeBezier = false;
                       oneSegment(c, 2.5, 4.0, -1.7, 1.0);
                   }});
    all.push_back({"S of neighbours", "tangents that come from far and near vertices", [](MuseumSpline& c) {
                       keysAt(c, {s(0), s(10), s(101, 10), s(103, 10), s(30)}, kKFInterpolationCatmullRom);
                   }});
    all.push_back(
        {"derived tangents", "as a user sets keys: tangents follow from the neighbours", [](MuseumSpline& c) {
             c.state->deriveTangents = true;
             c.state->interpolation = kKFInterpolationBezier;
             for (int const frame : {30, 0, 12, 90, 48, 47, 60}) {
                 c->addVertex(s(frame, 24), std::sin(frame * 0.1), kTempusZero, true);
             }
         }});
}

void addPlaces(Exhibits& all) {
    for (std::uint32_t const type : {1u, 4u, 6u}) {
        all.push_back({"several at one place, type " + std::to_string(type),
                       "the first counts there, the last behind", [=](MuseumSpline& c) {
                           keysAt(c, {s(0), s(0), s(1), s(1), s(1), s(2), s(3), s(3)}, type);
                           disable(c, {2});
                           museumVertices(*c)[3]->setInterpolation(kKFInterpolationEaseIn);
                       }});
    }
    all.push_back({"all at one place", "no range though several vertices", [](MuseumSpline& c) {
                       keysAt(c, {s(1), s(1), s(1)}, 1);
                   }});
    struct Absent {
        char const* name;
        std::vector<std::size_t> indices;
    };
    Absent const absents[] = {{"first disabled", {0}},
                              {"middle disabled", {2, 3}},
                              {"last disabled", {6}},
                              {"only one enabled", {0, 1, 2, 4, 5, 6}},
                              {"all disabled", {0, 1, 2, 3, 4, 5, 6}}};
    for (Absent const& absent : absents) {
        for (bool const closed : {false, true}) {
            all.push_back({(closed ? "closed, " : "") + std::string(absent.name),
                           "the curve passes by what is disabled", [=](MuseumSpline& c) {
                               zigzag(c, kKFInterpolationCatmullRom);
                               disable(c, absent.indices);
                               if (closed) {
                                   c->setClosed(true, nullptr);
                               }
                           }});
        }
    }
    all.push_back({"locked", "the lock of vertices doesn't change what is read", [](MuseumSpline& c) {
                       zigzag(c, kKFInterpolationBezier);
                       c->lockSpline(true);
                   }});
    all.push_back(
        {"mixed timescales", "a common timescale of all positions fits", [](MuseumSpline& c) {
             keysAt(c,
                    {s(1001, 30000), s(1, 24), s(100000, 262144), s(48000, 90000), s(44100, 44100), s(7, 6)},
                    4);
         }});
    all.push_back(
        {"incommensurable", "no common timescale fits: positions are compared exactly", [](MuseumSpline& c) {
             std::int32_t const primes[] = {2147483647, 2147483629, 2147483587, 2147483579, 2147483563};
             std::vector<Tempus> positions;
             for (std::int32_t const prime : primes) {
                 positions.push_back(s(static_cast<std::int64_t>(positions.size()) * prime + 1, prime));
             }
             keysAt(c, positions, 4);
         }});
    all.push_back({"two large primes",
                   "a common timescale fits, but not with that of most positions asked for",
                   [](MuseumSpline& c) {
                       keysAt(c, {s(1, 2147483647), s(2147483629, 2147483629), s(2)}, 15);
                   }});
    all.push_back(
        {"negative times", "before zero, with a vertex at zero", [](MuseumSpline& c) {
             keysAt(c, {s(-1001 * 99, 30000), s(-5, 3), s(-1, 2147483647), s(0), s(0), s(1, 24)}, 4);
         }});
    all.push_back({"ages", "positions whose ticks overflow in finer timescales", [](MuseumSpline& c) {
                       keysAt(c,
                              {s(-(std::int64_t{1} << 45)), s(0), s(std::int64_t{1} << 45),
                               s((std::int64_t{1} << 61) - 3)},
                              7);
                   }});
    all.push_back({"fine and long", "a segment of more ticks than a double counts", [](MuseumSpline& c) {
                       keysAt(c, {s(1, 2147483647), s(9000000), s(9000001)}, 8);
                   }});
}

void addWholeCurves(Exhibits& all) {
    for (std::uint32_t const type : {10u, 12u}) {
        for (bool const closed : {false, true}) {
            std::string const name =
                (closed ? "closed " : "open ") + std::string(type == 10 ? "B-spline" : "X-spline");
            for (int const count : {1, 3, 9}) {
                all.push_back({name + " of " + std::to_string(count), "one function of all control points",
                               [=](MuseumSpline& c) { controlPoints(c, type, count, closed); }});
            }
            all.push_back({name + " under a plain state", "drawn segment by segment, each as the whole",
                           [=](MuseumSpline& c) {
                               controlPoints(c, type, 6, closed);
                               c.state->interpolation = kKFInterpolationLinear;
                           }});
            all.push_back({name + " with a vertex disabled", "control points are the valid vertices",
                           [=](MuseumSpline& c) {
                               controlPoints(c, type, 7, closed);
                               disable(c, {0, 3});
                           }});
        }
        std::string const number = "type " + std::to_string(type);
        all.push_back({number + " inside", "meaningless on a curve over time, but it must not spread",
                       [=](MuseumSpline& c) {
                           zigzag(c, kKFInterpolationLinear);
                           museumVertices(*c)[3]->setInterpolation(type);
                       }});
        all.push_back(
            {number + " at the ends", "the range is asked of the types at the ends", [=](MuseumSpline& c) {
                 zigzag(c, kKFInterpolationLinear);
                 auto const vertices = museumVertices(*c);
                 vertices.front()->setInterpolation(type);
                 vertices.back()->setInterpolation(type);
             }});
        all.push_back({"state of " + number, "a state whose type no vertex has", [=](MuseumSpline& c) {
                           c.state->interpolation = type;
                           c.state->parametric = true;
                           zigzag(c, kKFInterpolationEaseOut);
                       }});
    }
}

void addExtrapolations(Exhibits& all) {
    for (std::uint32_t const mode : {0u, 1u, 2u, 3u, 4u, 9u}) {
        for (bool const retiming : {false, true}) {
            std::string const name = (retiming ? "retimed mode " : "mode ") + std::to_string(mode);
            auto const set = [=](MuseumSpline& c) {
                c.state->retimingExtrapolation = retiming;
                c.state->preExtrapolation = mode;
                c.state->postExtrapolation = mode;
            };
            all.push_back({name, "how the curve goes on outside", [=](MuseumSpline& c) {
                               zigzag(c, kKFInterpolationBezier);
                               set(c);
                           }});
            all.push_back({name + ", short", "a curve shorter than the step and the reach of a slope",
                           [=](MuseumSpline& c) {
                               keysAt(c, {s(1), s(1001, 1000), s(1004, 1000)}, kKFInterpolationLinear);
                               set(c);
                           }});
            all.push_back({name + ", ends shared", "several vertices at each end", [=](MuseumSpline& c) {
                               keysAt(c, {s(0), s(0), s(1), s(2), s(2)}, kKFInterpolationEase);
                               set(c);
                           }});
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

MuseumSpline Exhibit::build() const {
    MuseumSpline curve;
    fill(curve);
    return curve;
}

std::vector<Exhibit> const& museum() {
    static std::vector<Exhibit> const exhibits = [] {
        Exhibits all;
        addSizes(all);
        addTypes(all);
        addHandles(all);
        addPlaces(all);
        addWholeCurves(all);
        addExtrapolations(all);
        return all;
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
            for (Tempus const& grid : grids) {
                positions.push_back(BX_TempusFloorToSampleDuration(u + span * 0.61, grid));
            }
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
    switch (TempusGetKind(t)) {
    case TempusKind::Number:
        return std::to_string(t.value) + "/" + std::to_string(t.timescale);
    case TempusKind::NegativeInfinity:
        return "-infinity";
    case TempusKind::PositiveInfinity:
        return "+infinity";
    case TempusKind::Indefinite:
        return "indefinite";
    default:
        return "invalid";
    }
}
