// The keypoint by itself.

#include "lumenkey/splines/KFStaticVertex.h"

#include "tests/splines/museum.h"
#include "tests/splines/slots.h"

#include <gtest/gtest.h>

#include <cmath>
#include <limits>
#include <memory>
#include <string>

namespace {

Tempus const kAny = TempusMake(7, 3);

/// A vertex none of whose fields has its default.
KFStaticVertex unusual() {
    KFStaticVertex vertex(TempusMake(1, 2), 3.0);
    vertex.setBias(0.25, kAny);
    setSides(vertex, {-1.0, 2.0, 3.0, 4.0});
    vertex.setNormal(5.0, kAny);
    vertex.setInterpolation(13);
    vertex.setFlags(0x40000091);
    return vertex;
}

struct Setter {
    char const* name;
    void (*apply)(KFStaticVertex&);
    bool writesLocked;
    bool writesDisabled;
};

Setter const kSetters[] = {
    {"setValueU", [](KFStaticVertex& v) { v.setValueU(TempusMake(9, 1)); }, false, true},
    {"setValueV", [](KFStaticVertex& v) { v.setValueV(9.0, kAny); }, false, true},
    {"setBias", [](KFStaticVertex& v) { v.setBias(1.5, kAny); }, false, true},
    {"setInputTangents, u", [](KFStaticVertex& v) { v.setInputTangents(-9.0, 2.0, kAny); }, false, false},
    {"setInputTangents, v", [](KFStaticVertex& v) { v.setInputTangents(-1.0, 9.0, kAny); }, false, false},
    {"setOutputTangents, u", [](KFStaticVertex& v) { v.setOutputTangents(9.0, 4.0, kAny); }, false, false},
    {"setOutputTangents, v", [](KFStaticVertex& v) { v.setOutputTangents(3.0, 9.0, kAny); }, false, false},
    {"flattenTangents", [](KFStaticVertex& v) { v.flattenTangents(kAny); }, false, false},
    {"resetTangents", [](KFStaticVertex& v) { v.resetTangents(); }, false, false},
    {"setNormal", [](KFStaticVertex& v) { v.setNormal(9.0, kAny); }, true, true},
    {"swapTangents", [](KFStaticVertex& v) { v.swapTangents(); }, true, true},
    {"setEnabled", [](KFStaticVertex& v) { v.setEnabled(!v.isEnabled(kAny), kAny); }, true, true},
    {"setFlag", [](KFStaticVertex& v) { v.setFlag(0x104); }, true, true},
    {"resetFlag", [](KFStaticVertex& v) { v.resetFlag(0x81); }, true, true},
    {"setFlags", [](KFStaticVertex& v) { v.setFlags(0x20); }, true, true},
    {"setInterpolation", [](KFStaticVertex& v) { v.setInterpolation(100); }, true, true},
    {"offsetVertexInTime", [](KFStaticVertex& v) { v.offsetVertexInTime(TempusMake(1, 3)); }, true, true},
};

} // namespace

// Each setter changes one thing that equality sees, or, where a vertex is guarded, nothing at all.
TEST(KFStaticVertex, GuardsWhatALockedOrDisabledVertexKeeps) {
    for (Setter const& setter : kSetters) {
        for (bool const locked : {false, true}) {
            for (bool const enabled : {false, true}) {
                KFStaticVertex vertex = unusual();
                vertex.setFlag(locked ? 0x2 : 0);
                vertex.setEnabled(enabled, kAny);
                KFStaticVertex const before(vertex);
                EXPECT_TRUE(vertex == before && before == vertex);
                std::uint32_t const revision = vertex.getRevision();
                setter.apply(vertex);
                bool const writes = (!locked || setter.writesLocked) && (enabled || setter.writesDisabled);
                EXPECT_EQ(vertex == before, !writes)
                    << setter.name << ", locked " << locked << ", enabled " << enabled;
                bool const isRead = std::string(setter.name).find("Flag") == std::string::npos &&
                                    std::string(setter.name) != "setNormal";
                if (writes && isRead) {
                    EXPECT_NE(vertex.getRevision(), revision) << setter.name;
                }
            }
        }
    }
}

TEST(KFStaticVertex, KeepsTangentsOnTheirSides) {
    KFStaticVertex vertex = unusual();
    setSides(vertex, {0.5, 2.0, -0.5, 2.5});
    EXPECT_EQ(sidesOf(vertex), (Sides{0.0, 2.0, 0.0, 2.5}));
    double const nan = std::numeric_limits<double>::quiet_NaN();
    setSides(vertex, {nan, 2.0, nan, 2.5});
    EXPECT_TRUE(std::isnan(sidesOf(vertex)[0]) && std::isnan(sidesOf(vertex)[2]));

    // Swapping looks at no side.
    vertex = unusual();
    vertex.swapTangents();
    EXPECT_EQ(sidesOf(vertex), (Sides{3.0, 4.0, -1.0, 2.0}));

    vertex.flattenTangents(kAny);
    EXPECT_EQ(sidesOf(vertex), Sides{});
    EXPECT_EQ(vertex.getFlags(), 0x40000090u);
}

TEST(KFStaticVertex, StandsAtAnExactTime) {
    KFStaticVertex vertex(TempusMake(1, 2), 0.0);
    vertex.setValueU(TempusMake(2, 4)); // where it is
    EXPECT_EQ(vertex.getValueU().timescale, 2);
    vertex.offsetVertexInTime(TempusMake(1, 3));
    EXPECT_EQ(vertex.getValueU(), TempusMake(5, 6));
    KFStaticVertex const later(TempusMake(5001, 6000), 0.0);
    EXPECT_TRUE(vertex < later);
    EXPECT_FALSE(later < vertex);
    EXPECT_FALSE(vertex < vertex);

    // Equality looks at the time, not at how it is written; every other field counts as it is.
    KFStaticVertex const one(TempusMake(1, 2), 1.0);
    EXPECT_TRUE(one == KFStaticVertex(TempusMake(2, 4), 1.0));
    EXPECT_FALSE(one.isEqual(nullptr));
}

TEST(KFStaticVertex, IsCopiedWhole) {
    KFStaticVertex const original = unusual();
    std::unique_ptr<KFVertex> const clone(original.clone());
    EXPECT_TRUE(*clone == original);
    KFStaticVertex assigned(kTempusZero, 0.0);
    assigned = original;
    EXPECT_TRUE(assigned == original);
}

#ifdef LUMENKEY_KNOWS_SLOTS
// Hosts derive from vertices: the slots of the virtual operations are the interface.
TEST(KFVertex, KeepsTheSlotsOfItsOperations) {
    using V = KFVertex;
    expectSlots(&V::setValueU, &V::getValueV, &V::setValueV, &V::getBias, &V::setBias, &V::getInputTangents,
                &V::getOutputTangents, &V::setInputTangents, &V::setOutputTangents, &V::flattenTangents,
                &V::resetTangents, &V::setNormal, &V::getNormal, &V::swapTangents, &V::setEnabled,
                &V::isEnabled, &V::isFlat, &V::setFlag, &V::resetFlag, &V::getFlags, &V::setFlags,
                &V::testFlag, &V::setDefaultAtCurrentTime, &V::setInterpolation, &V::getInterpolation,
                &V::clone, &V::updateBias, &V::enableBehavior, &V::enabledBehavior, &V::offsetVertexInTime,
                &V::isEqual, &KFStaticVertex::getValue);
}
#endif
