// The pieces of a curve over a stretch of time, and what is made of them: extremes, and the times of a value.

#include "lumenkey/Channels/KFChannelSegmentVisitor.h"
#include "lumenkey/Channels/KFScalarChannels.h"
#include "lumenkey/curves/KFCurve.h"
#include "lumenkey/splines/KFBasicInterpolators.h"
#include "lumenkey/splines/KFSplineInterpolator.h"
#include "tests/Channels/RecordingRoot.h"
#include "tests/splines/museum.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <limits>
#include <locale>
#include <random>
#include <sstream>
#include <string>

namespace {

using Time = Tempus const&;
constexpr double kMost = std::numeric_limits<double>::max();

struct Piece {
    std::uint32_t type;
    std::pair<double, double> (*minMax)(Piece const&);
    KFSpline& spline;
    void* first;
    void* second;
    Tempus sourceStart, sourceEnd, targetStart, targetEnd;
    double offset;
};

template <class Interpolator> std::pair<double, double> minMaxOf(Piece const& p) {
    double low = 0.0, high = 0.0;
    Interpolator().getMinMaxValues(p.spline, p.first, p.second, std::min(p.sourceStart, p.sourceEnd),
                                   std::max(p.sourceStart, p.sourceEnd), &low, &high);
    return {low + p.offset, high + p.offset};
}

class PieceVisitor : public KFChannelSegmentVisitor {
public:
    virtual void piece(Piece const& piece) = 0;

#define VISIT_PIECE(Type, number)                                                                            \
    void visit##Type(KFSpline& k, void* a, void* b, Time c, Time d, Time e, Time f, double o) final {        \
        piece({number, minMaxOf<KF##Type##Interpolator>, k, a, b, c, d, e, f, o});                           \
    }
    VISIT_PIECE(Linear, 1)
    VISIT_PIECE(Bezier, 4)
    VISIT_PIECE(CatmullRom, 6)
    VISIT_PIECE(EaseIn, 7)
    VISIT_PIECE(EaseOut, 8)
    VISIT_PIECE(Exponential, 13)
    VISIT_PIECE(Logarithmic, 14)
    VISIT_PIECE(Ease, 15)
    VISIT_PIECE(Accelerate, 16)
    VISIT_PIECE(Decelerate, 17)
};

/// The extremes piece by piece, each as its interpolator has them: what a host could write.
class ExtremesVisitor : public PieceVisitor {
public:
    double min = kMost, max = -kMost;
    int visits = 0;

    void visitConstant(double value, Time, Time) override { include(value, value); }
    void piece(Piece const& p) override {
        if (p.first == nullptr || p.second == nullptr) {
            for (Tempus const& t : {p.targetStart, p.targetEnd}) {
                double const value = p.spline.getVertexValue(t, kTempusZero, false);
                include(value, value);
            }
            return;
        }
        auto const [low, high] = p.minMax(p);
        include(low, high);
    }

private:
    void include(double low, double high) {
        ++visits;
        min = low < min ? low : min;
        max = high > max ? high : max;
    }
};

/// Writes the visits down: "value@time", "value@start..end", "type:source..source@start..end+offset".
class Notes : public PieceVisitor {
public:
    std::ostringstream text;

    Notes() { text.imbue(std::locale::classic()); }
    void visitConstant(double value, Time start, Time end) override {
        text << value << '@' << seconds(start) << (start == end ? "" : "..");
        start == end ? text << ' ' : text << seconds(end) << ' ';
    }
    void piece(Piece const& p) override {
        text << (p.first == nullptr ? "<" : "") << (p.second == nullptr ? ">" : "") << p.type << ':'
             << seconds(p.sourceStart) << ".." << seconds(p.sourceEnd) << '@' << seconds(p.targetStart)
             << ".." << seconds(p.targetEnd);
        p.offset == 0.0 ? text << ' ' : text << '+' << p.offset << ' ';
    }

private:
    static double seconds(Time t) { return TempusGetSeconds(t); }
};

/// A channel whose curve is a copy of a spline.
struct Shown {
    KFChannelDouble channel{"", nullptr, 1, 0};
    KFSpline* spline = nullptr;

    explicit Shown(MuseumSpline const& curve) {
        channel.createLocalChannelImplementation();
        KFCurve& own = *channel.getCurveInterface();
        own.setIsSpline(true, kTempusZero);
        own.setSplineState(new KFSplineState(*curve.state));
        auto* const node = dynamic_cast<KFSplineNode*>(own.getRootNode());
        node->allocKFSpline(curve.spline.get());
        spline = node->getSpline();
    }

    void setModes(std::uint32_t mode) {
        spline->setExtrapolation(mode, 0);
        spline->setExtrapolation(mode, 1);
    }
    template <class Visitor> Visitor&& visit(Visitor&& visitor, Time start, Time end) {
        KFChannelSegmentVisitor::visitSegments(channel, start, end, visitor);
        return std::forward<Visitor>(visitor);
    }
    std::pair<double, double> extremes(Time start, Time end) {
        double low = 0.0, high = 0.0;
        EXPECT_TRUE(channel.getCurrentMinAndMax(start, end, &low, &high));
        return {low, high};
    }
};

using Keys = std::vector<std::tuple<Tempus, double, std::uint32_t>>;

Shown shown(Keys const& keys, std::uint32_t mode = 0, bool retiming = false) {
    MuseumSpline curve;
    for (auto const& [u, value, type] : keys)
        curve.append(u, value, type);
    curve.state->preExtrapolation = curve.state->postExtrapolation = mode;
    curve.state->retimingExtrapolation = curve.state->parametric = retiming; // a frame is 1 then
    return Shown(curve);
}

/// Positions around and between the vertices, and the repeats next to them.
std::vector<Tempus> ends(KFSpline& spline) {
    Tempus const first = spline.getMinValueU(kTempusZero, true);
    Tempus const last = spline.getMaxValueU(kTempusZero, true);
    Tempus const range = last - first;
    std::vector<Tempus> at{first, last, first + range * s(37, 100), first + range * s(83, 100)};
    for (Tempus const& cycles : {s(21, 100), s(1), s(2), s(13, 5), s(19, 2)}) {
        at.push_back(first - range * cycles);
        at.push_back(last + range * cycles);
    }
    auto const vertices = museumVertices(spline);
    for (std::size_t i = 0; i < vertices.size(); i += 1 + vertices.size() / 4)
        at.push_back(vertices[i]->getValueU());
    std::sort(at.begin(), at.end());
    return at;
}

TEST(KFChannelSegmentVisitor, VisitsPieceByPiece) {
    Keys const three{{s(0), 0.0, 1}, {s(1), 4.0, 4}, {s(3), 1.0, 1}};
    Keys const mixed{{s(0), 2.0, 1}, {s(0), 7.0, 0}, {s(1), 4.0, 19}, {s(2), 5.0, 1}};
    struct Case {
        Keys keys;
        std::uint32_t mode;
        Tempus start, end;
        char const* visits;
        bool retiming = false;
    };
    Case const cases[] = {
        {{}, 3, s(1), s(2), "0@1..2 "},
        {{{s(5), 3.0, 1}}, 1, s(1), s(2), "3@1..2 "},
        // Inside: ends on keypoints and between them, no length, ends exchanged.
        {three, 0, s(0), s(3), "0@0 1:0..1@0..1 4@1 4:1..3@1..3 1@3 "},
        {three, 0, s(1, 2), s(2), "1:0.5..1@0.5..1 4@1 4:1..2@1..2 "},
        {three, 0, s(1), s(1), "4@1 "},
        {three, 0, s(1, 2), s(1, 2), "1:0.5..0.5@0.5..0.5 "},
        {three, 0, s(2), s(1, 2), ""},
        // Of two at one time the first has the value, and the second begins the segment.
        {mixed, 0, s(-1), s(2), "2@-1..0 2@0 7@0..1 4@1 5@2 "},
        // Outside.
        {three, 0, s(-2), s(-1), "0@-2..-1 "},
        {three, 0, s(-1), s(0), "0@-1..0 0@0 "},
        {three, 0, s(2), s(5), "4:2..3@2..3 1@3 1@3..5 "},
        {three, 1, s(-2), s(-1), "<1:-2..-1@-2..-1 "},
        {three, 1, s(4), s(5), ">1:4..5@4..5 "},
        {three, 9, s(-2), s(5), "0@0 1:0..1@0..1 4@1 4:1..3@1..3 1@3 "},
        {three, 2, s(-4), s(-1), "4:2..3@-4..-3 1@-3 4:3..1@-3..-1 4@-1 "},
        {three, 2, s(3), s(10),
         "1@3 4:3..1@3..5 4@5 1:1..0@5..6 0@6 1:0..1@6..7 4@7 4:1..3@7..9 1@9 4:3..2@9..10 "},
        {three, 3, s(-4), s(0), "4:2..3@-4..-3 1@-3 1:0..1@-3..-2 4@-2 4:1..3@-2..0 0@0 "},
        {three, 3, s(5), s(13, 2), "4:2..3@5..6 0@6 1:0..0.5@6..6.5 "},
        {three, 4, s(-7), s(-2),
         "4:2..3@-7..-6+-3 -2@-6 1:0..1@-6..-5+-2 2@-5 4:1..3@-5..-3+-2 -1@-3 1:0..1@-3..-2+-1 3@-2 "},
        {three, 4, s(3), s(7), "1@3 1:0..1@3..4+1 5@4 4:1..3@4..6+1 2@6 1:0..1@6..7+2 6@7 "},
        // Of two at the end, the first is the rise in front of the keypoints, the second the one behind them.
        {{{s(0), 1.0, 1}, {s(1), 4.0, 1}, {s(1), 9.0, 1}},
         4,
         s(-2),
         s(2),
         "-5@-2 1:0..1@-2..-1+-6 -2@-1 1:0..1@-1..0+-3 1@0 1:0..1@0..1 4@1 1:0..1@1..2+8 17@2 "},
        // What repeats without end, in no time, or from a time that is none.
        {three, 3, kTempusNegativeInfinity, s(0), "0@0 "},
        {three, 3, s(3), kTempusPositiveInfinity, "1@3 "},
        {{{s(1), 5.0, 1}, {s(1), 6.0, 1}}, 2, s(2), s(4), "6@2..4 "},
        // Retimed: the point at the end is read a frame further. One frame starts anew again and again.
        {three, 2, s(3), s(8), "4@3 4:2..1@3..4 1:1..0@4..5 4:1..3@5..7 4:2..1@7..8 ", true},
        {{{s(0), 0.0, 1}, {s(1), 6.0, 1}}, 2, s(2), s(7, 2), "1:0..1@2..3 1:0..0.5@3..3.5 ", true},
        {{{s(0), 0.0, 1}, {s(1, 2), 6.0, 1}}, 2, s(1), s(2), "1:0..0.5@1..1.5 1:0.5..0@1.5..2 ", true},
    };
    for (Case const& c : cases) {
        Shown curve = shown(c.keys, c.mode, c.retiming);
        auto const host = curve.visit(ExtremesVisitor(), c.start, c.end);
        EXPECT_EQ(curve.visit(Notes(), c.start, c.end).text.str(), c.visits)
            << "mode " << c.mode << " from " << museumText(c.start) << " to " << museumText(c.end);
        EXPECT_EQ(curve.extremes(c.start, c.end), std::pair(host.min, host.max)) << c.visits;
    }
    for (std::uint32_t const type : {1u, 4u, 6u, 7u, 8u, 13u, 14u, 15u, 16u, 17u}) {
        Shown curve = shown({{s(0), 0.0, type}, {s(1), 1.0, type}});
        EXPECT_EQ(curve.visit(Notes(), s(0), s(1)).text.str(),
                  "0@0 " + std::to_string(type) + ":0..1@0..1 1@1 ");
    }
}

/// Times that can't be written exactly, so that a keypoint of a repeat is met beside where it is.
bool isInexact(std::string const& name) {
    return name == "incommensurable" || name == "two large primes" || name == "fine and long" ||
           name == "ages" || name == "negative times";
}

/// Whether the pieces are the curve. They aren't where a type has no visit, where a keypoint is disabled,
/// where several at one end continue the curve otherwise than they end it, where a fold lies aside of time,
/// where cubic segments are too short to be read as a whole, and where a spline is closed.
bool isWhollyVisited(Shown& curve, std::string const& name) {
    auto const vertices = museumVertices(*curve.spline);
    for (std::size_t i = 0; i < vertices.size(); ++i) {
        std::uint32_t const type = vertices[i]->getInterpolation();
        bool const hasVisit = type < 2 || type == 4 || (type > 5 && type < 9) || (type > 12 && type < 18);
        bool const isShared = i > 0 && vertices[i - 1]->getValueU() == vertices[i]->getValueU();
        if (!hasVisit || !vertices[i]->isEnabled(kTempusZero) || isShared)
            return false;
    }
    return vertices.size() > 1 && vertices.size() < 100 && !curve.spline->isClosed() && name != "a fold" &&
           !name.starts_with("shortest spans") && !isInexact(name);
}

/// In every segment and all its images, to and fro.
std::vector<Tempus> samplePositions(KFSpline& spline) {
    auto const vertices = museumVertices(spline);
    Tempus const ends = vertices.front()->getValueU() + vertices.back()->getValueU();
    Tempus const range = vertices.back()->getValueU() - vertices.front()->getValueU();
    std::vector<Tempus> positions;
    for (std::size_t i = 0; i + 1 < vertices.size(); ++i) {
        Tempus const u = vertices[i]->getValueU();
        for (int part = 0; part <= 40; ++part) {
            Tempus const x = u + (vertices[i + 1]->getValueU() - u) * s(part, 40);
            for (int cycle = -10; cycle <= 10; ++cycle) {
                positions.push_back(x + range * cycle);
                positions.push_back(ends - x + range * cycle);
            }
        }
    }
    return positions;
}

TEST(KFChannelSegmentVisitorMuseum, FindsTheExtremesOfAHostAndOfTheSamples) {
    for (Exhibit const& exhibit : museum()) {
        Shown curve(exhibit.build());
        auto const at = ends(*curve.spline);
        std::size_t const count = curve.spline->getNumberOfVertices();
        std::size_t const stride = count > 1000 ? 9 : count > 100 ? 4 : 1;
        auto const agree = [slack = isInexact(exhibit.name) ? 1e-12 : 0.0](double a, double b) {
            return isSameDouble(a, b) || std::fabs(a - b) <= slack;
        };
        bool const isSampled = isWhollyVisited(curve, exhibit.name);
        auto positions = isSampled ? samplePositions(*curve.spline) : std::vector<Tempus>();
        positions.insert(positions.end(), at.begin(), at.end());
        auto const stretch = [&](std::size_t i, std::size_t j) {
            return museumText(at[i]) + " to " + museumText(at[j]);
        };
        for (std::uint32_t const mode : {0u, 1u, 2u, 3u, 4u, 9u}) {
            SCOPED_TRACE(exhibit.name + ", mode " + std::to_string(mode));
            curve.setModes(mode);
            for (std::size_t i = 0; i < at.size(); i += stride) {
                for (std::size_t j = i; j < at.size(); j += stride) {
                    auto const host = curve.visit(ExtremesVisitor(), at[i], at[j]);
                    auto const [low, high] = curve.extremes(at[i], at[j]);
                    ASSERT_TRUE(agree(low, host.min) && agree(high, host.max))
                        << stretch(i, j) << ": " << low << ' ' << host.min << ", " << high << ' ' << host.max;
                    EXPECT_LE(host.visits, 22 * 3 * static_cast<int>(count) + 4);
                }
            }
            // The frames of a retimed ping-pong are mapped a step away from where the curve has them.
            if (!isSampled || mode == 9 || (mode == 2 && curve.spline->getState()->retimingExtrapolation))
                continue;
            for (auto const& [i, j] :
                 {std::pair<std::size_t, std::size_t>{0, at.size() - 1}, {3, 7}, {6, 12}}) {
                double lowest = kMost, highest = -kMost;
                for (Tempus const& t : positions) {
                    if (t < at[i] || t > at[j])
                        continue;
                    double const value = curve.spline->getVertexValue(t, kTempusZero, true);
                    lowest = std::min(lowest, value);
                    highest = std::max(highest, value);
                }
                auto const [low, high] = curve.extremes(at[i], at[j]);
                double const rounding = std::max(highest - lowest, 1e-12) * 1e-9;
                double const betweenSamples = rounding * 1e7;
                EXPECT_LE(low, lowest + rounding) << stretch(i, j);
                EXPECT_GE(low, lowest - betweenSamples) << stretch(i, j);
                EXPECT_GE(high, highest - rounding) << stretch(i, j);
                EXPECT_LE(high, highest + betweenSamples) << stretch(i, j);
            }
        }
    }
}

/// Long enough for most segments to lie within the extremes of those before, some by a hair. Some keypoints
/// share a time.
TEST(KFChannelSegmentVisitor, FindsTheSameExtremesOfWildCurves) {
    std::mt19937_64 random(1);
    auto const between = [&random](double low, double high) {
        return std::uniform_real_distribution<double>(low, high)(random);
    };
    double const plateaus[] = {0.1, 0.7, 0.3};
    for (int i = 0; i < 2000; ++i) {
        MuseumSpline curve;
        curve.state->parametric = i % 17 == 0;
        curve.state->retimingExtrapolation = i % 5 == 0;
        bool const isLevel = i % 3 == 0;
        auto const reach = [&] { return between(0.0, i % 2 == 0 ? 0.4 : 2.0); };
        for (int key = 0; key < 30; ++key) {
            double const value = isLevel ? plateaus[random() % 3] : between(-1.0, 1.0);
            Tempus const u = s(12 * key + static_cast<std::int64_t>(random() % 13), 24);
            auto const type = museumSegmentTypes()[random() % museumSegmentTypes().size()];
            KFVertex* const vertex = curve.append(u, value, i % 4 == 3 ? type : i % 4 == 2 ? 6 : 4);
            double const rise = isLevel ? 0.0 : between(-1.0, 1.0);
            curve->setVertexInputHandles(vertex, -reach(), rise * between(0.0, 3.0), kTempusZero, true);
            curve->setVertexOutputHandles(vertex, reach(), rise * between(0.0, 3.0), kTempusZero, true);
        }
        if (i % 7 == 0)
            curve->setClosed(true, nullptr);
        Shown wild(curve);
        for (auto const& [from, to] : {std::pair{s(0), s(15)}, {s(7, 3), s(9)}}) {
            auto const host = wild.visit(ExtremesVisitor(), from, to);
            ASSERT_EQ(wild.extremes(from, to), std::pair(host.min, host.max)) << i;
        }
    }
}

/// One by one they would take years.
TEST(KFChannelSegmentVisitor, FindsExtremesOfAnyNumberOfRepeats) {
    Keys const keys{{s(0), 0.0, 4}, {s(1, 3), 5.0, 7}, {s(5, 6), -1.0, 0}, {s(1), 1.0, 1}};
    std::int64_t const many = std::int64_t{1} << 50;
    for (std::uint32_t const mode : {2u, 3u, 4u}) {
        Shown curve = shown(keys, mode);
        auto const some = curve.visit(ExtremesVisitor(), s(-9), s(9));
        double const rise = mode == 4 ? static_cast<double>(many - 9) : 0.0;
        EXPECT_EQ(curve.extremes(s(-many), s(many)), std::pair(some.min - rise, some.max + rise)) << mode;
    }
}

TEST(KFChannelSegmentVisitor, AnswersWithoutCurveAndWithoutOutputs) {
    Shown curve = shown({{s(0), 1.0, 1}, {s(1), -5.0, 1}});
    double low = 7.0, high = 7.0;
    EXPECT_FALSE(curve.channel.getCurrentMinAndMax(s(0), s(1), nullptr, nullptr));
    EXPECT_TRUE(curve.channel.getCurrentMinAndMax(s(1, 2), s(1), nullptr, &high));
    EXPECT_TRUE(curve.channel.getCurrentMinAndMax(s(1, 2), s(1), &low, nullptr));
    EXPECT_EQ(std::pair(low, high), std::pair(-5.0, -2.0));
    curve.channel.getCurveInterface()->setIsSpline(false, kTempusZero);
    EXPECT_EQ(curve.visit(Notes(), s(9), s(8)).text.str(), "1@9..8 ");
    delete curve.channel.releaseCurveInterface();
    EXPECT_EQ(curve.extremes(s(0), s(1)), std::pair(kMost, -kMost));
    std::vector<Tempus> times;
    EXPECT_FALSE(curve.channel.getTimeForValue(1.0, times, {s(0), s(1)}, s(1, 30), 0));
}

// --- Mapping ---

TEST(KFChannelSegmentVisitor, MapsTimesCycleByCycle) {
    auto const time = [](std::int64_t tick) { return s((tick - 13) * 1001, 30000); };
    constexpr std::int64_t range = 3;
    Tempus const minTime = time(0), maxTime = time(range);
    struct {
        std::int64_t step;
        bool retiming;
        std::int64_t from, to;
        std::string places; // again and again; letters on the way back
    } const cases[] = {
        {1, false, -12, 12, "012dcb"}, {1, true, -12, 2, "012dcb"}, {1, true, 3, 15, "cb12"},
        {2, true, 3, 15, "b2"},        {3, true, 3, 15, "0"},       {4, true, -12, 12, "012dcb"},
    };
    for (auto const& c : cases) {
        for (std::int64_t tick = c.from; tick <= c.to; ++tick) {
            bool reversed = false;
            Tempus const mapped = KFChannelSegmentVisitor::mapPingPong(
                time(tick), minTime, maxTime, s(c.step * 1001, 30000), c.retiming, &reversed);
            char const place = c.places[static_cast<std::size_t>(tick - c.from) % c.places.size()];
            EXPECT_EQ(reversed, place >= 'a') << c.places << ' ' << tick;
            EXPECT_EQ(mapped, time(place - (reversed ? 'a' : '0'))) << c.places << ' ' << tick;
        }
    }
    for (bool const retiming : {false, true}) {
        for (std::int64_t tick = -12; tick <= 12; ++tick) {
            bool const isAfter = tick > range || (retiming && tick == range);
            std::int64_t place = tick;
            long expected = 0, cycles = 9;
            for (; tick < 0 && place <= 0; ++expected)
                place += range;
            for (; isAfter && place >= range; ++expected)
                place -= range;
            EXPECT_EQ(KFChannelSegmentVisitor::mapProgressiveRepeat(time(tick), minTime, maxTime, retiming,
                                                                    &cycles),
                      time(place));
            EXPECT_EQ(cycles, expected) << tick;
            EXPECT_EQ(KFChannelSegmentVisitor::mapRepeat(time(tick), minTime, maxTime, retiming),
                      time(place));
        }
    }
}

TEST(KFChannelSegmentVisitor, MapsWhatHasNoCyclesToTheStart) {
    Tempus const ofAnotherEpoch{5, 1, kTempusFlagValid, -1};
    bool reversed = true;
    long cycles = 9;
    for (auto const& [t, maxTime] : {std::pair{s(5), s(2)},
                                     {s(5), s(1)},
                                     {s(5), kTempusPositiveInfinity},
                                     {kTempusNegativeInfinity, s(3)},
                                     {kTempusInvalid, s(3)},
                                     {ofAnotherEpoch, s(3)}}) {
        EXPECT_EQ(KFChannelSegmentVisitor::mapPingPong(t, s(2), maxTime, s(1, 30), true, &reversed), s(2));
        EXPECT_EQ(KFChannelSegmentVisitor::mapProgressiveRepeat(t, s(2), maxTime, true, &cycles), s(2));
        EXPECT_TRUE(!reversed && cycles == 0);
    }
    // A quotient of rounded seconds would count one cycle less.
    KFChannelSegmentVisitor::mapProgressiveRepeat(s(3, 10), s(0), s(1, 10), false, &cycles);
    EXPECT_EQ(cycles, 3);
    EXPECT_EQ(KFChannelSegmentVisitor::mapPingPong(s(5), s(0), s(2), s(1), false, nullptr), s(1));
}

// --- Times of a value ---

TEST(KFChannelSegmentVisitor, FindsTheTimesOfAValue) {
    RecordingRoot root;
    root.setTimeOffset(s(100), true);
    root.frameDuration = s(1, 2);
    KFChannelDouble channel("", &root, 1, 0);
    channel.willLoadKeyframes(true, 4);
    for (int i = 0; i < 4; ++i)
        channel.appendKeyframe(s(i), i % 2 == 0 ? 0.0 : 8.0, false);
    channel.willLoadKeyframes(false, 0);
    std::vector<Tempus> times{s(1)};
    // The range ends a frame of the root before its end, 103.
    EXPECT_TRUE(channel.getTimeForValue(6.0, times, {s(100), s(3)}, s(1000), 0));
    EXPECT_EQ(times, (std::vector{s(1), s(403, 4), s(405, 4)}));
    times.clear();
    EXPECT_TRUE(channel.getTimeForValue(6.0, times, {s(100), s(4)}, s(1000), 1));
    EXPECT_EQ(times, (std::vector{s(411, 4), s(405, 4), s(403, 4)}));
    for (Tempus const& t : times)
        EXPECT_EQ(channel.getValueAsDouble(t, 0.0), 6.0);
    EXPECT_FALSE(channel.getTimeForValue(9.0, times, {s(100), s(4)}, s(1000), 0));
    EXPECT_EQ(times.size(), 3u);

    KFChannelDouble alone(2.0, "", nullptr, 1, 0);
    times.clear();
    EXPECT_TRUE(alone.getTimeForValue(2.0, times, {s(7), s(1)}, s(1, 30), 0));
    EXPECT_EQ(times, std::vector{s(7)});
}

} // namespace
