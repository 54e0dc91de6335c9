// Random trees, written, read and written again: the same bytes, the same digest.

#include "lumenkey/Channels/KFChannel.h"
#include "lumenkey/curves/KFCurve.h"
#include "tests/persistence/RandomTree.h"
#include "tests/support/AtOnce.h"

#include <gtest/gtest.h>

#include <cstdlib>

namespace {

std::uint64_t numberOfSeeds() { return std::getenv("LUMENKEY_TEST_LONG") != nullptr ? 5000 : 200; }

/// Where two documents differ first.
std::string difference(std::string const& a, std::string const& b) {
    std::size_t i = 0;
    while (i < a.size() && i < b.size() && a[i] == b[i])
        ++i;
    std::size_t const from = i > 300 ? i - 300 : 0;
    return a.substr(from, 400) + "\n--- instead of ---\n" + b.substr(from, 400);
}

bool comesBack(std::uint64_t seed) {
    OwnedTree const tree = randomTree(seed);
    std::string const document = documentOf(*tree);
    OwnedTree const fresh(new KFChannelObjectRootBase("Root", nullptr, 1, 0, 0));
    EXPECT_TRUE(readDocument(*fresh, document)) << "seed " << seed;
    std::string const again = documentOf(*fresh);
    EXPECT_TRUE(again == document) << "seed " << seed << ": " << difference(again, document);
    EXPECT_EQ(fresh->getHash(), tree->getHash()) << "seed " << seed;
    return !testing::Test::HasFailure();
}

} // namespace

TEST(RoundTrip, GivesTheSameBytesInAFreshTree) {
    for (std::uint64_t seed = 1; seed <= numberOfSeeds() && comesBack(seed); ++seed) {
    }
}

TEST(RoundTrip, GivesTheSameBytesInPlace) {
    // Into the tree itself, where channels have been given other constants, and the keyed ones other
    // keypoints.
    for (std::uint64_t seed = 1; seed <= numberOfSeeds(); ++seed) {
        OwnedTree const tree = randomTree(seed);
        std::string const document = documentOf(*tree);
        std::vector<KFChannelBase*> channels;
        tree->getAllDescendantsFlattened(channels, 0, false);
        for (KFChannelBase* const node : channels) {
            auto& channel = static_cast<KFChannel&>(*node);
            KFCurve& curve = *channel.getCurveInterface();
            if (channel.getNumberOfKeyframes() != 0)
                curve.setKeypoint(TempusMake(7, 1), 3.0, true);
            curve.setCurveInitialValue(channel.getInitialValue() / 2 + 1);
            curve.setCurveDefaultValue(channel.getDefaultValue() / 2 + 1);
            channel.setFadeInOffset(TempusMake(3, 7), false);
        }
        ASSERT_TRUE(readDocument(*tree, document));
        std::string const again = documentOf(*tree);
        ASSERT_TRUE(again == document) << "seed " << seed << ": " << difference(again, document);
    }
}

TEST(RoundTripThreads, SaveAndLoadDifferentTreesAtOnce) {
    atOnce(8, [](int worker) {
        for (int i = 0; i < 10; ++i)
            comesBack(static_cast<std::uint64_t>(1000 + worker * 10 + i));
    });
}
