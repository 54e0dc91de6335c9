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
#include <sstream>

namespace {

using Time = Tempus const&;
constexpr double kMost = std::numeric_limits<double>::max();

Tempus s(std::int64_t value, std::int32_t timescale = 1) { return TempusMake(value, timescale); }

struct Piece {
    std::uint32_t type;
    KFSpline& spline;
    void* first;
    void* second;
    Tempus sourceStart, sourceEnd, targetStart, targetEnd;
    double offset;
};

class PieceVisitor : public KFChannelSegmentVisitor {
public:
    virtual void piece(Piece const& piece) = 0;

    void visitLinear(KFSpline& k, void* a, void* b, Time c, Time d, Time e, Time f, double o) final {
        piece({1, k, a, b, c, d, e, f, o});
    }
    void visitBezier(KFSpline& k, void* a, void* b, Time c, Time d, Time e, Time f, double o) final {
        piece({4, k, a, b, c, d, e, f, o});
    }
    void visitCatmullRom(KFSpline& k, void* a, void* b, Time c, Time d, Time e, Time f, double o) final {
        piece({6, k, a, b, c, d, e, f, o});
    }
    void visitEaseIn(KFSpline& k, void* a, void* b, Time c, Time d, Time e, Time f, double o) final {
        piece({7, k, a, b, c, d, e, f, o});
    }
    void visitEaseOut(KFSpline& k, void* a, void* b, Time c, Time d, Time e, Time f, double o) final {
        piece({8, k, a, b, c, d, e, f, o});
    }
    void visitExponential(KFSpline& k, void* a, void* b, Time c, Time d, Time e, Time f, double o) final {
        piece({13, k, a, b, c, d, e, f, o});
    }
    void visitLogarithmic(KFSpline& k, void* a, void* b, Time c, Time d, Time e, Time f, double o) final {
        piece({14, k, a, b, c, d, e, f, o});
    }
    void visitEase(KFSpline& k, void* a, void* b, Time c, Time d, Time e, Time f, double o) final {
        piece({15, k, a, b, c, d, e, f, o});
    }
    void visitAccelerate(KFSpline& k, void* a, void* b, Time c, Time d, Time e, Time f, double o) final {
        piece({16, k, a, b, c, d, e, f, o});
    }
    void visitDecelerate(KFSpline& k, void* a, void* b, Time c, Time d, Time e, Time f, double o) final {
        piece({17, k, a, b, c, d, e, f, o});
    }
};

/// The extremes piece by piece, each as its interpolator has them: what a host could write.
class ExtremesVisitor : public PieceVisitor {
public:
    double min = kMost, max = -kMost;

    void visitConstant(double value, Time, Time) override { include(value, value); }
    void piece(Piece const& p) override {
        switch (p.type) {
        case 1:
            return linear(p);
        case 4:
            return ask<KFBezierInterpolator>(p);
        case 6:
            return ask<KFCatmullRomInterpolator>(p);
        case 7:
            return ask<KFEaseInInterpolator>(p);
        case 8:
            return ask<KFEaseOutInterpolator>(p);
        case 13:
            return ask<KFExponentialInterpolator>(p);
        case 14:
            return ask<KFLogarithmicInterpolator>(p);
        case 15:
            return ask<KFEaseInterpolator>(p);
        case 16:
            return ask<KFAccelerateInterpolator>(p);
        default:
            return ask<KFDecelerateInterpolator>(p);
        }
    }

private:
    void include(double low, double high) {
        min = low < min ? low : min;
        max = high > max ? high : max;
    }
    void linear(Piece const& p) {
        bool const isOutside = p.first == nullptr || p.second == nullptr;
        for (bool const end : {false, true}) {
            double const value =
                isOutside
                    ? p.spline.getVertexValue(end ? p.targetEnd : p.targetStart, kTempusZero, false)
                    : KFLinearInterpolator().interpolate(p.spline, kTempusZero, p.first, p.second,
                                                         end ? p.sourceEnd : p.sourceStart, false, false) +
                          p.offset;
            include(value, value);
        }
    }
    template <class Interpolator> void ask(Piece const& p) {
        double low = 0.0, high = 0.0;
        Interpolator().getMinMaxValues(p.spline, p.first, p.second, std::min(p.sourceStart, p.sourceEnd),
                                       std::max(p.sourceStart, p.sourceEnd), &low, &high);
        include(low + p.offset, high + p.offset);
    }
};

/// Writes the visits down: "value@time", "value@start..end", "type:source..source@start..end+offset".
class Notes : public PieceVisitor {
public:
    std::ostringstream text;

    void visitConstant(double value, Time start, Time end) override {
        text << value << '@' << seconds(start);
        if (start != end)
            text << ".." << seconds(end);
        text << ' ';
    }
    void piece(Piece const& p) override {
        text << (p.first == nullptr ? "<" : "") << (p.second == nullptr ? ">" : "") << p.type << ':'
             << seconds(p.sourceStart) << ".." << seconds(p.sourceEnd) << '@' << seconds(p.targetStart)
             << ".." << seconds(p.targetEnd);
        if (p.offset != 0.0)
            text << '+' << p.offset;
        text << ' ';
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
    template <class Visitor> Visitor visited(Time start, Time end) {
        Visitor visitor;
        KFChannelSegmentVisitor::visitSegments(channel, start, end, visitor);
        return visitor;
    }
    std::string notes(Time start, Time end) {
        Notes notes;
        KFChannelSegmentVisitor::visitSegments(channel, start, end, notes);
        std::string text = notes.text.str();
        return text.empty() ? text : text.substr(0, text.size() - 1);
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
        static_cast<KFVertex*>(curve->appendVertexNoTangents(u, value, kTempusZero))->setInterpolation(type);
    curve.state->preExtrapolation = curve.state->postExtrapolation = mode;
    curve.state->retimingExtrapolation = retiming;
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
    struct Case {
        Keys keys;
        std::uint32_t mode;
        Tempus start, end;
        char const* visits;
    };
    Case const cases[] = {
        {{}, 3, s(1), s(2), "0@1..2"},
        {{{s(5), 3.0, 1}}, 1, s(1), s(2), "3@1..2"},
        // Inside: ends on keypoints and between them, no length, ends exchanged.
        {three, 0, s(0), s(3), "0@0 1:0..1@0..1 4@1 4:1..3@1..3 1@3"},
        {three, 0, s(1, 2), s(2), "1:0.5..1@0.5..1 4@1 4:1..2@1..2"},
        {three, 0, s(1), s(1), "4@1"},
        {three, 0, s(1, 2), s(1, 2), "1:0.5..0.5@0.5..0.5"},
        {three, 0, s(2), s(1, 2), ""},
        {{{s(0), 2.0, 0}, {s(0), 7.0, 0}, {s(1), 4.0, 19}, {s(2), 5.0, 1}},
         0,
         s(0),
         s(2),
         "2@0 7@0..1 4@1 5@2"},
        // Outside.
        {three, 0, s(-2), s(-1), "0@-2..-1"},
        {three, 0, s(-1), s(0), "0@-1..0 0@0"},
        {three, 0, s(2), s(5), "4:2..3@2..3 1@3 1@3..5"},
        {three, 1, s(-2), s(-1), "<1:-2..-1@-2..-1"},
        {three, 1, s(4), s(5), ">1:4..5@4..5"},
        {three, 9, s(-2), s(5), "0@0 1:0..1@0..1 4@1 4:1..3@1..3 1@3"},
        {three, 2, s(-4), s(-1), "4:2..3@-4..-3 1@-3 4:3..1@-3..-1 4@-1"},
        {three, 2, s(3), s(10),
         "1@3 4:3..1@3..5 4@5 1:1..0@5..6 0@6 1:0..1@6..7 4@7 4:1..3@7..9 1@9 4:3..2@9..10"},
        {three, 3, s(-4), s(0), "4:2..3@-4..-3 1@-3 1:0..1@-3..-2 4@-2 4:1..3@-2..0 0@0"},
        {three, 3, s(5), s(13, 2), "4:2..3@5..6 0@6 1:0..0.5@6..6.5"},
        {three, 4, s(-7), s(-2),
         "4:2..3@-7..-6+-3 -2@-6 1:0..1@-6..-5+-2 2@-5 4:1..3@-5..-3+-2 -1@-3 1:0..1@-3..-2+-1 3@-2"},
        {three, 4, s(3), s(7), "1@3 1:0..1@3..4+1 5@4 4:1..3@4..6+1 2@6 1:0..1@6..7+2 6@7"},
        // What repeats without end, in no time, or from a time that is none.
        {three, 3, kTempusNegativeInfinity, s(0), "0@0"},
        {three, 3, s(3), kTempusPositiveInfinity, "1@3"},
        {{{s(1), 5.0, 1}, {s(1), 6.0, 1}}, 2, s(2), s(4), "6@2..4"},
    };
    for (Case const& c : cases) {
        EXPECT_EQ(shown(c.keys, c.mode).notes(c.start, c.end), c.visits)
            << "mode " << c.mode << " from " << museumText(c.start) << " to " << museumText(c.end);
    }
}

/// Every piece in the order of target times, one behind the other; its source where the mapping has it.
class Checks : public PieceVisitor {
public:
    Tempus firstTime, minTime, maxTime, lastTime, step;
    std::uint32_t mode = 0;
    bool retiming = false;
    Tempus reached = kTempusNegativeInfinity;
    std::int64_t visits = 0;
    std::int64_t misplaced = 0;
    std::int64_t misread = 0;

    void visitConstant(double, Time start, Time end) override { follow(start, end); }
    void piece(Piece const& p) override {
        follow(p.targetStart, p.targetEnd);
        bool const isOutside = p.targetStart < firstTime || p.targetStart >= lastTime;
        if (p.first == nullptr || p.second == nullptr || !isOutside)
            return;
        bool backwards = false;
        long cycles = 0;
        bool const retimed = retiming && p.targetStart >= lastTime;
        Tempus mapped = mode == 2 ? KFChannelSegmentVisitor::mapPingPong(p.targetStart, minTime, maxTime,
                                                                         step, retimed, &backwards)
                                  : KFChannelSegmentVisitor::mapProgressiveRepeat(p.targetStart, minTime,
                                                                                  maxTime, retimed, &cycles);
        if (mode != 2 && mapped == maxTime) // where two cycles meet the next one goes on
            mapped = minTime;
        auto const u = [](void* vertex) { return static_cast<KFVertex*>(vertex)->getValueU(); };
        auto const [low, high] = std::minmax(p.sourceStart, p.sourceEnd);
        misread += mapped != p.sourceStart || backwards != (p.sourceEnd < p.sourceStart) ||
                   u(p.first) > low || u(p.second) < high || high - low != p.targetEnd - p.targetStart;
    }

private:
    void follow(Time start, Time end) {
        visits += 1;
        misplaced += start < reached || end < start;
        reached = end;
    }
};

/// Times that can't be written exactly, so that a keypoint of a repeat is met beside where it is.
bool isInexact(std::string const& name) {
    return name == "incommensurable" || name == "two large primes" || name == "fine and long" ||
           name == "ages" || name == "negative times";
}

TEST(KFChannelSegmentVisitorMuseum, GivesOnePieceAfterTheOther) {
    for (Exhibit const& exhibit : museum()) {
        Shown curve(exhibit.build());
        auto const vertices = museumVertices(*curve.spline);
        if (vertices.size() < 2 || vertices.size() > 1000)
            continue;
        for (std::uint32_t const mode : {0u, 1u, 2u, 3u, 4u}) {
            curve.setModes(mode);
            auto const at = ends(*curve.spline);
            Checks checks;
            checks.minTime = curve.spline->getMinValueU(kTempusZero, true);
            checks.maxTime = curve.spline->getMaxValueU(kTempusZero, true);
            checks.firstTime = vertices.front()->getValueU();
            checks.lastTime = vertices.back()->getValueU();
            checks.step = curve.spline->getStep();
            checks.retiming = curve.spline->getState()->retimingExtrapolation;
            checks.mode = mode;
            KFChannelSegmentVisitor::visitSegments(curve.channel, at.front(), at.back(), checks);
            std::string const what = exhibit.name + ", mode " + std::to_string(mode);
            EXPECT_EQ(checks.misplaced, 0) << what;
            EXPECT_TRUE(checks.misread == 0 || isInexact(exhibit.name)) << what << ": " << checks.misread;
            EXPECT_LE(checks.visits, static_cast<std::int64_t>(vertices.size()) * 2 * 22 + 4) << what;
        }
    }
}

TEST(KFChannelSegmentVisitorMuseum, FindsTheSameExtremesAsAHost) {
    for (Exhibit const& exhibit : museum()) {
        Shown curve(exhibit.build());
        for (std::uint32_t const mode : {0u, 1u, 2u, 3u, 4u, 9u}) {
            curve.setModes(mode);
            auto const at = ends(*curve.spline);
            std::size_t const stride = curve.spline->getNumberOfVertices() > 1000 ? 5 : 1;
            for (std::size_t i = 0; i < at.size(); i += stride) {
                for (std::size_t j = i; j < at.size(); j += stride) {
                    auto const host = curve.visited<ExtremesVisitor>(at[i], at[j]);
                    auto const [low, high] = curve.extremes(at[i], at[j]);
                    bool const isSame = isSameDouble(low, host.min) && isSameDouble(high, host.max);
                    double const slack = isInexact(exhibit.name) ? 1e-12 : 0.0;
                    ASSERT_TRUE(isSame ||
                                (std::fabs(low - host.min) <= slack && std::fabs(high - host.max) <= slack))
                        << exhibit.name << ", mode " << mode << ", " << museumText(at[i]) << " to "
                        << museumText(at[j]) << ": " << low << ' ' << host.min << ", " << high << ' '
                        << host.max;
                }
            }
        }
    }
}

/// Whether each segment has a visit, and is where its keypoints say. What a disabled keypoint cuts isn't the curve, of
/// several keypoints at one end others continue the curve than end it, and of a fold a part lies aside of time.
bool isWhollyVisited(Shown& curve) {
    auto const vertices = museumVertices(*curve.spline);
    for (std::size_t i = 0; i < vertices.size(); ++i) {
        std::uint32_t const type = vertices[i]->getInterpolation();
        bool const hasVisit = type < 2 || type == 4 || (type > 5 && type < 9) || (type > 12 && type < 18);
        bool const isShared = i > 0 && vertices[i - 1]->getValueU() == vertices[i]->getValueU();
        if (!hasVisit || !vertices[i]->isEnabled(kTempusZero) || isShared)
            return false;
    }
    return vertices.size() > 1 && vertices.size() < 100 && !curve.spline->isClosed() &&
           curve.spline->getState()->sanitizeBezier;
}

/// In every segment and all its images, to and fro.
std::vector<Tempus> samplePositions(KFSpline& spline) {
    auto const vertices = museumVertices(spline);
    Tempus const first = vertices.front()->getValueU();
    Tempus const last = vertices.back()->getValueU();
    std::vector<Tempus> positions;
    for (std::size_t i = 0; i + 1 < vertices.size(); ++i) {
        Tempus const u = vertices[i]->getValueU();
        Tempus const length = vertices[i + 1]->getValueU() - u;
        for (int part = 0; part <= 40; ++part) {
            Tempus const x = u + length * s(part, 40);
            for (int cycle = -10; cycle <= 10; ++cycle) {
                positions.push_back(x + (last - first) * cycle);
                positions.push_back(first + last - x + (last - first) * cycle);
            }
        }
    }
    return positions;
}

TEST(KFChannelSegmentVisitorMuseum, FindsTheExtremesOfTheSamples) {
    int compared = 0;
    for (Exhibit const& exhibit : museum()) {
        Shown curve(exhibit.build());
        // Cubic segments of less than a hundredth of a millisecond are read in part.
        bool const isTooShort = exhibit.name.starts_with("shortest spans");
        if (!isWhollyVisited(curve) || isInexact(exhibit.name) || isTooShort)
            continue;
        auto const at = ends(*curve.spline);
        auto const positions = samplePositions(*curve.spline);
        for (std::uint32_t const mode : {0u, 1u, 2u, 3u, 4u}) {
            // The frames of a retimed ping-pong are mapped a step away from where the curve has them.
            if (mode == 2 && curve.spline->getState()->retimingExtrapolation)
                continue;
            curve.setModes(mode);
            for (auto const& [i, j] :
                 {std::pair<std::size_t, std::size_t>{0, at.size() - 1}, {3, 7}, {6, 12}}) {
                double min = kMost, max = -kMost;
                auto const include = [&](Time t) {
                    double const value = curve.spline->getVertexValue(t, kTempusZero, true);
                    min = std::min(min, value);
                    max = std::max(max, value);
                };
                include(at[i]);
                include(at[j]);
                for (Tempus const& t : positions) {
                    if (at[i] <= t && t <= at[j])
                        include(t);
                }
                auto const [low, high] = curve.extremes(at[i], at[j]);
                double const span = std::max(max - min, 1e-12);
                std::string const what = exhibit.name + ", mode " + std::to_string(mode) + ", " +
                                         museumText(at[i]) + " to " + museumText(at[j]);
                EXPECT_LE(low, min + span * 1e-9) << what;
                EXPECT_GE(high, max - span * 1e-9) << what;
                // Between two samples a curve rises by a small part only.
                EXPECT_GE(low, min - span * 1e-2) << what;
                EXPECT_LE(high, max + span * 1e-2) << what;
                ++compared;
            }
        }
    }
    EXPECT_GT(compared, 500);
}

TEST(KFChannelSegmentVisitor, FindsExtremesOfAnyNumberOfRepeats) {
    Keys const keys{{s(0), 0.0, 4}, {s(1, 3), 5.0, 7}, {s(5, 6), -1.0, 0}, {s(1), 1.0, 1}};
    for (std::uint32_t const mode : {2u, 3u, 4u}) {
        Shown curve = shown(keys, mode);
        for (std::int64_t const reach : {7, 8, 20, 1000}) {
            for (auto const& [from, to] :
                 {std::pair{s(-reach), s(reach)}, {s(3 * reach + 1, 3), s(5 * reach)}}) {
                auto const host = curve.visited<ExtremesVisitor>(from, to);
                EXPECT_EQ(curve.extremes(from, to), std::pair(host.min, host.max)) << mode << ' ' << reach;
            }
        }
        // One by one these would take years.
        std::int64_t const many = std::int64_t{1} << 50;
        auto const all = curve.extremes(s(-many), s(many));
        auto const some = curve.extremes(s(-9), s(9));
        double const rise = mode == 4 ? static_cast<double>(many - 9) : 0.0;
        EXPECT_EQ(all, std::pair(some.first - rise, some.second + rise));
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
    EXPECT_EQ(curve.notes(s(9), s(8)), "1@9..8");
    delete curve.channel.releaseCurveInterface();
    EXPECT_EQ(curve.notes(s(0), s(1)), "");
    EXPECT_EQ(curve.extremes(s(0), s(1)), std::pair(kMost, -kMost));
    std::vector<Tempus> times;
    EXPECT_FALSE(curve.channel.getTimeForValue(1.0, times, {s(0), s(1)}, s(1, 30), 0));
}

// --- Mapping, against a walk in ticks ---

/// One point that moves to and fro between 0 and a range, or runs from 0 to the range again and again.
struct Walker {
    std::int64_t range, step;
    std::int64_t at = 0;
    bool back = false;
    long cycles = 0;

    void pingPong() {
        at += back ? -1 : 1;
        if (at == 0 || at == range)
            back = at == range;
    }
    void retimedPingPong() {
        at += back ? -1 : 1;
        if (at == (back ? 0 : range)) {
            at = back ? step : range - step;
            back = !back;
        }
    }
};

TEST(KFChannelSegmentVisitor, MapsTimesLikeAWalker) {
    constexpr std::int64_t origin = -13;
    auto const time = [](std::int64_t tick) { return s(tick * 1001, 30000); };
    Tempus const minTime = time(origin);
    bool reversed = false;
    long cycles = 0;
    for (std::int64_t const range : {1, 2, 5, 12}) {
        Tempus const maxTime = time(origin + range);
        for (std::int64_t const step : {1, 2, 5}) {
            Walker plain{range, step};
            Walker retimed{range, step, range - step, true};
            for (std::int64_t tick = 0; tick < 60; ++tick, plain.pingPong()) {
                for (bool const retiming : {false, true}) {
                    Tempus const t = time(origin + tick);
                    Tempus const mapped = KFChannelSegmentVisitor::mapPingPong(
                        t, minTime, maxTime, time(step), retiming, &reversed);
                    Walker expected = plain;
                    if (retiming && tick >= range && range >= step) {
                        expected = range == step ? Walker{range, step} : retimed;
                        if (range != step)
                            retimed.retimedPingPong();
                    }
                    EXPECT_EQ(mapped, time(origin + expected.at)) << range << ' ' << step << ' ' << tick;
                    EXPECT_EQ(reversed, expected.back) << range << ' ' << step << ' ' << tick;
                }
                // The other way from the start the same places are passed, in the other direction.
                Tempus const mapped = KFChannelSegmentVisitor::mapPingPong(
                    time(origin - tick), minTime, maxTime, time(step), true, &reversed);
                EXPECT_EQ(mapped, time(origin + plain.at));
                EXPECT_EQ(reversed, plain.at == range || (plain.at != 0 && !plain.back));
            }
        }
        for (std::int64_t tick = -60; tick < 60; ++tick) {
            for (bool const retiming : {false, true}) {
                std::int64_t place = tick;
                long passed = 0;
                if (tick > range || (retiming && tick == range)) {
                    for (; place >= range; ++passed)
                        place -= range;
                } else if (tick < 0) {
                    for (; place <= 0; ++passed)
                        place += range;
                }
                Tempus const t = time(origin + tick);
                EXPECT_EQ(
                    KFChannelSegmentVisitor::mapProgressiveRepeat(t, minTime, maxTime, retiming, &cycles),
                    time(origin + place));
                EXPECT_EQ(cycles, passed) << range << ' ' << tick;
                EXPECT_EQ(KFChannelSegmentVisitor::mapRepeat(t, minTime, maxTime, retiming),
                          time(origin + place));
            }
        }
    }
}

TEST(KFChannelSegmentVisitor, MapsWhatHasNoCyclesToTheStart) {
    struct Case {
        Tempus t, minTime, maxTime;
    };
    Tempus const foreign{5, 1, kTempusFlagValid, -1};
    Case const cases[] = {{s(5), s(2), s(2)},
                          {s(5), s(2), s(1)},
                          {s(5), s(2), kTempusPositiveInfinity},
                          {kTempusPositiveInfinity, s(2), s(3)},
                          {kTempusNegativeInfinity, s(2), s(3)},
                          {kTempusInvalid, s(2), s(3)},
                          {foreign, s(2), s(3)}};
    for (Case const& c : cases) {
        bool reversed = true;
        long cycles = 9;
        EXPECT_EQ(KFChannelSegmentVisitor::mapPingPong(c.t, c.minTime, c.maxTime, s(1, 30), true, &reversed),
                  s(2));
        EXPECT_EQ(KFChannelSegmentVisitor::mapProgressiveRepeat(c.t, c.minTime, c.maxTime, true, &cycles),
                  s(2));
        EXPECT_FALSE(reversed);
        EXPECT_EQ(cycles, 0);
    }
    // A quotient of rounded seconds would count one cycle less.
    long cycles = 0;
    EXPECT_EQ(KFChannelSegmentVisitor::mapProgressiveRepeat(s(3, 10), s(0), s(1, 10), false, &cycles), s(0));
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
