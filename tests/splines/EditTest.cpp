#include "tests/splines/SlowSpline.h"
#include "tests/splines/museum.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <functional>
#include <map>
#include <numeric>
#include <random>

namespace {

struct LockOwner : TestOwner {
    LockOwner() { _customLock = &lock; }
    bool lockIsFree() {
        bool const isFree = lock.tryLock();
        if (isFree) {
            lock.unlock();
        }
        return isFree;
    }

    BXSpinLock lock;
};

bool agree(double a, double b) {
    return a == b || (std::isnan(a) && std::isnan(b)) ||
           std::fabs(a - b) <= 1e-9 * std::max({1.0, std::fabs(a), std::fabs(b)});
}

/// A spline and its slow twin, edited side by side.
class Twins {
public:
    Twins(unsigned seed, bool derive, bool roundingInUSpace) : _random(seed) {
        state.deriveTangents = derive;
        state.setRoundingInUSpace(roundingInUSpace);
        spline.setNode(&owner);
        slow.derive = derive;
        slow.step = state.roundingDelta;
    }

    /// One random edit of both; what it was, for messages.
    std::string edit();
    void expectAgreement();

    KFSplineState state;
    LockOwner owner;
    KFSpline spline{&state};
    SlowSpline slow;

private:
    int pick(int count) { return std::uniform_int_distribution<int>(0, count - 1)(_random); }
    bool flip() { return pick(2) == 0; }
    /// Few positions, so that vertices meet.
    Tempus pickU() { return TempusMake(pick(17) - 4, flip() ? 2 : 3); }
    double pickValue() { return pick(4) - 1.0; }
    std::pair<SlowKey*, KFVertex*> pickKey() {
        auto const index = static_cast<std::size_t>(pick(static_cast<int>(slow.keys.size())));
        return {slow.keys[index].get(), museumVertices(spline)[index]};
    }
    void add(bool tangents);
    void relocate(bool tangents);
    void move();
    void erase();
    void mark();
    void expectSame(SlowKey const* key, void const* handle) {
        _expected = key;
        _answer = handle;
    }

    std::mt19937 _random;
    std::map<SlowKey const*, void const*> _handles;
    SlowKey const* _expected = nullptr;
    void const* _answer = nullptr;
};

std::string Twins::edit() {
    expectSame(nullptr, nullptr);
    std::pair<char const*, std::function<void()>> const edits[] = {
        {"add", [this] { add(true); }},      {"addNoTangents", [this] { add(false); }},
        {"set", [this] { relocate(true); }}, {"setNoTangents", [this] { relocate(false); }},
        {"move", [this] { move(); }},        {"erase", [this] { erase(); }},
        {"mark", [this] { mark(); }},
    };
    int const kinds[] = {0, 1, 0, 2, 3, 4, 4, 4, 5, 5, 6, 6};
    auto const& [name, apply] = edits[kinds[slow.keys.empty() ? pick(2) : pick(12)]];
    apply();
    return name;
}

void Twins::add(bool tangents) {
    Tempus const u = pickU();
    double const value = pickValue();
    bool const replace = pick(3) == 0;
    if (tangents) {
        expectSame(slow.add(u, value, replace), spline.addVertex(u, value, kTempusZero, replace));
    } else {
        expectSame(slow.addNoTangents(u, value, replace),
                   spline.addVertexNoTangents(u, value, kTempusZero, replace));
    }
}

void Twins::relocate(bool tangents) {
    auto const [key, handle] = pickKey();
    Tempus const u = flip() ? key->u : pickU();
    double const value = pickValue();
    bool const survives = (tangents ? slow.set(key, u, value) : slow.setNoTangents(key, u, value)) != nullptr;
    EXPECT_EQ(survives, tangents ? spline.setVertex(handle, u, value, kTempusZero)
                                 : spline.setVertexNoTangents(handle, u, value, kTempusZero));
}

void Twins::move() {
    auto const [key, handle] = pickKey();
    Tempus const u = flip() ? key->u + TempusMake(pick(5) - 2, 8) : pickU();
    bool const clone = pick(4) == 0;
    bool const replace = flip();
    bool const constrain = flip();
    expectSame(slow.move(key, u, clone, replace, constrain),
               spline.moveVertex(handle, u, kTempusZero, clone, replace, constrain));
}

void Twins::erase() {
    auto const [key, handle] = pickKey();
    Tempus const u = pickU();
    bool const scale = flip();
    switch (pick(4)) {
    case 0:
        EXPECT_EQ(slow.eraseAt(u, scale), spline.deleteVertex(u, scale, kTempusZero));
        break;
    case 1: {
        Tempus const to = u + TempusMake(pick(3), 2);
        EXPECT_EQ(slow.eraseBetween(u, to), spline.deleteVertices(u, to));
        break;
    }
    default:
        EXPECT_EQ(slow.erase(key, scale), spline.deleteVertex(handle, scale, kTempusZero));
    }
}

/// Changes what the edits look at: locks, enabled states, edited handles, types.
void Twins::mark() {
    auto const [picked, pickedVertex] = pickKey();
    SlowKey& key = *picked;
    KFVertex& vertex = *pickedVertex;
    switch (pick(5)) {
    case 0:
        key.flags ^= kKFVertexFlagLocked;
        vertex.setFlags(key.flags);
        break;
    case 1:
        key.flags ^= kKFVertexFlagHandlesEdited;
        vertex.setFlags(key.flags);
        break;
    case 2:
        key.type = 1 - key.type;
        vertex.setInterpolation(key.type);
        break;
    case 3: // slopes that no derivation gave
        key.setIn({-0.5, 2.0});
        key.setOut({0.25, -1.0});
        setSides(vertex, {-0.5, 2.0, 0.25, -1.0});
        break;
    default:
        key.enabled = !key.enabled;
        key.enabled ? spline.enableVertex(&vertex, kTempusZero) : spline.disableVertex(&vertex, kTempusZero);
    }
}

void Twins::expectAgreement() {
    ASSERT_TRUE(owner.lockIsFree());
    auto const vertices = museumVertices(spline);
    ASSERT_EQ(slow.keys.size(), vertices.size());
    std::map<SlowKey const*, void const*> handles;
    for (std::size_t i = 0; i < vertices.size(); ++i) {
        SlowKey const& key = *slow.keys[i];
        KFVertex const& vertex = *vertices[i];
        ASSERT_TRUE(_handles.count(&key) == 0 || _handles[&key] == &vertex)
            << "another vertex at index " << i;
        handles[&key] = &vertex;
        Sides const sides{key.in.u, key.in.v, key.out.u, key.out.v};
        ASSERT_EQ(TempusCompare(key.u, vertex.getValueU()), 0) << i;
        ASSERT_TRUE(agree(key.v, vertex.getValueV(kTempusZero))) << i;
        ASSERT_EQ(key.type, vertex.getInterpolation()) << i;
        ASSERT_EQ(key.flags, vertex.getFlags()) << i;
        ASSERT_EQ(key.enabled, vertex.isEnabled(kTempusZero)) << i;
        for (std::size_t side = 0; side < 4; ++side) {
            ASSERT_TRUE(agree(sides[side], sidesOf(vertex)[side])) << i << ", " << side;
        }
    }
    _handles = handles;
    ASSERT_EQ(_answer == nullptr, _expected == nullptr);
    ASSERT_TRUE(_expected == nullptr || _handles[_expected] == _answer) << "the answer is another vertex";
}

TEST(KFSplineEdit, RandomEditsAgreeWithPlainWalks) {
    unsigned const firstSeed = std::random_device{}();
    for (unsigned round = 0; round < 600; ++round) {
        // The smallest step is for the positions of moves only: a slope over 1/3000000 s is a difference of
        // nearly equal values, and its noise would have to be tolerated everywhere.
        bool const derive = round % 4 != 0;
        Twins twins(firstSeed + round, derive, derive || round % 8 != 0);
        std::string history;
        for (int step = 0; step < 60; ++step) {
            history += " " + twins.edit();
            twins.expectAgreement();
            if (HasFatalFailure() || HasNonfatalFailure()) {
                FAIL() << "seed " << firstSeed + round << ":" << history;
            }
        }
    }
}

class KFSplineEditFixture : public testing::Test {
protected:
    KFSplineEditFixture() { spline.setNode(&owner); }
    ~KFSplineEditFixture() override { EXPECT_TRUE(owner.lockIsFree()); }

    KFVertex* add(int seconds, double value) {
        return static_cast<KFVertex*>(spline.addVertex(TempusMake(seconds, 1), value, kTempusZero, false));
    }

    KFSplineState state;
    LockOwner owner;
    KFSpline spline{&state};
};

TEST_F(KFSplineEditFixture, RefusesWhatItCannotEdit) {
    KFSpline other(&state);
    void* const stranger = other.addVertex(kTempusZero, 1.0, kTempusZero, false);
    for (void* handle : {static_cast<void*>(nullptr), stranger}) {
        EXPECT_FALSE(spline.setVertex(handle, TempusMake(1, 1), 1.0, kTempusZero));
        EXPECT_FALSE(spline.setVertexNoTangents(handle, TempusMake(1, 1), 1.0, kTempusZero));
        EXPECT_EQ(spline.moveVertex(handle, TempusMake(1, 1), kTempusZero, false, false, false), nullptr);
        EXPECT_FALSE(spline.deleteVertex(handle, true, kTempusZero));
        EXPECT_TRUE(owner.lockIsFree());
    }
    EXPECT_FALSE(spline.deleteVertex(kTempusZero, true, kTempusZero));
    EXPECT_FALSE(spline.deleteVertices(kTempusZero, TempusMake(9, 1)));
    EXPECT_FALSE(spline.deleteAllVertices());
    EXPECT_TRUE(spline.appendVertexesNoTangents(0, nullptr, nullptr, kTempusZero).empty());

    // A locked vertex that shares its U isn't merged away.
    KFVertex* const locked = add(2, 1.0);
    add(2, 5.0);
    locked->setFlag(kKFVertexFlagLocked);
    EXPECT_TRUE(spline.setVertex(locked, TempusMake(3, 1), 7.0, kTempusZero));
    EXPECT_TRUE(spline.setVertexNoTangents(locked, TempusMake(2, 1), 7.0, kTempusZero));
    EXPECT_EQ(spline.getNumberOfVertices(), 2u);
    EXPECT_EQ(locked->getValueV(kTempusZero), 1.0);
    EXPECT_TRUE(spline.deleteVertex(TempusMake(2, 1), true, kTempusZero));
    EXPECT_TRUE(spline.isValidHandle(locked));
    EXPECT_TRUE(spline.deleteAllVertices());
    EXPECT_EQ(spline.getNumberOfVertices(), 0u);
}

TEST_F(KFSplineEditFixture, OpensWhenTheLastVertexGoes) {
    std::function<bool(KFVertex*)> const ways[] = {
        [&](KFVertex* vertex) { return spline.deleteVertex(vertex, true, kTempusZero); },
        [&](KFVertex*) { return spline.deleteVertex(TempusMake(1, 1), true, kTempusZero); },
        [&](KFVertex*) { return spline.deleteVertices(kTempusZero, TempusMake(1, 1)); },
        [&](KFVertex*) { return spline.deleteAllVertices(); }};
    for (auto const& removes : ways) {
        KFVertex* const vertex = add(1, 1.0);
        spline.setClosed(true, nullptr);
        spline.setDirty(false);
        EXPECT_TRUE(removes(vertex));
        EXPECT_FALSE(spline.isClosed()) << &removes - ways;
        EXPECT_TRUE(spline.isDirty()) << &removes - ways;
    }
}

// Each of these orders took minutes if one edit cost time in proportion to the vertices: 10^10 steps.
TEST(KFSplineEdit, EditsHundredThousandVertices) {
    constexpr int count = 100000;
    std::mt19937 random(7);
    std::vector<int> order(count);
    for (int pass = 0; pass < 3; ++pass) {
        std::iota(order.begin(), order.end(), 0);
        if (pass == 1) {
            std::reverse(order.begin(), order.end());
        } else if (pass == 2) {
            std::shuffle(order.begin(), order.end(), random);
        }
        KFSplineState state;
        KFSpline spline(&state);
        std::vector<void*> handles(count);
        for (int const i : order) {
            handles[static_cast<std::size_t>(i)] =
                spline.addVertex(TempusMake(i, 24), i % 7, kTempusZero, false);
        }
        auto const vertices = museumVertices(spline);
        ASSERT_TRUE(std::equal(vertices.begin(), vertices.end(), handles.begin(), handles.end())) << pass;
        // Swap neighbours, then delete alternately from both ends.
        for (int i = 1; i + 1 < count; i += 2) {
            ASSERT_NE(spline.moveVertex(handles[static_cast<std::size_t>(i)], TempusMake(3 * i + 4, 72),
                                        kTempusZero, false, false, false),
                      nullptr);
        }
        while (spline.getNumberOfVertices() > 0) {
            ASSERT_TRUE(spline.deleteVertex(spline.getFirstVertex(), true, kTempusZero));
            ASSERT_TRUE(spline.getNumberOfVertices() == 0 ||
                        spline.deleteVertex(spline.getLastVertex(), false, kTempusZero));
        }
    }
}

} // namespace
