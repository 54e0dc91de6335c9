#include "tools/tree/ChannelTree.h"
#include "lumenkey/Channels/KFVectorChannels.h"
#include "tests/tools/MotionSamples.h"
#include "tools/curve/SampleTimes.h"
#include "tools/import/MotionTree.h"

#include <cmath>
#include <gtest/gtest.h>

namespace lumenkey::tools {
namespace {

using samples::kSmallMotion;

std::string const kJoint = "{ OFFSET 0 0 0 CHANNELS 1 Xrotation ";

/// A file with a joint for each name; children are what stands between braces.
std::unique_ptr<ChannelTree> treeOfJoints(std::string const& joints) {
    std::string text = "HIERARCHY\nROOT " + joints + "MOTION\nFrames: 0\nFrame Time: 0.04\n";
    return treeOfMotion(readMotionText(text, "folder/odd.name.bvh")).tree;
}

/// Path, name and type of all nodes.
std::string listing(ChannelTree const& tree) {
    std::string text;
    for (ChannelTree::Node node = 0; node < tree.count(); ++node) {
        text += tree.path(node) + " " + tree.base(node).getName().str() + " " + tree.typeName(node) + "\n";
    }
    return text;
}

TEST(ChannelTree, HoldsTheJointsInTheOrderOfTheFile) {
    std::unique_ptr<ChannelTree> const tree = treeOfMotion(readMotionText(kSmallMotion, "small.bvh")).tree;
    EXPECT_EQ(listing(*tree),
              "./ small ObjectRoot\n./1 Hips Folder\n./1/1 Xposition Double\n./1/2 Yposition Double\n"
              "./1/3 Zposition Double\n./1/4 Zrotation Angle\n./1/5 Xrotation Angle\n"
              "./1/6 Yrotation Angle\n./1/7 LeftLeg Folder\n./1/7/1 Zrotation Angle\n"
              "./1/7/2 Xrotation Angle\n./1/7/3 Yrotation Angle\n");
    EXPECT_EQ(tree->base(2).getFrameDuration(), TempusMake(1, 120));
    EXPECT_EQ(tree->channelsBelow(8), (std::vector<ChannelTree::Node>{9, 10, 11}));
    EXPECT_EQ(tree->channelsBelow(ChannelTree::kTop).size(), 9U);

    // Child joints follow the channels also where the file lists them first.
    std::unique_ptr<ChannelTree> const late =
        treeOfMotion(readMotionText("HIERARCHY\nROOT A{ OFFSET 0 0 0 JOINT B" + kJoint + "} JOINT C" +
                                        kJoint +
                                        "} CHANNELS 1 Yposition }\nMOTION\nFrames: 0\nFrame Time: 1\n",
                                    "late"))
            .tree;
    EXPECT_EQ(listing(*late).substr(19),
              "./1 A Folder\n./1/1 Yposition Double\n./1/2 B Folder\n./1/2/1 Xrotation "
              "Angle\n./1/3 C Folder\n./1/3/1 Xrotation Angle\n");
}

TEST(ChannelTree, FindsNodesByNameAndPath) {
    std::unique_ptr<ChannelTree> const tree = treeOfJoints(
        "Hips" + kJoint + "JOINT L.Leg" + kJoint + "JOINT Toe" + kJoint + "}} JOINT Right" + kJoint +
        "JOINT Toe" + kJoint + "} JOINT Toe" + kJoint + "}}}\nROOT Toe" + kJoint + "}\n");
    struct {
        char const* text;
        char const* first;
        char const* second;
    } const cases[] = {
        {"Hips.Xrotation", "./1/1", ""},
        {"Leg.Xrotation", "./1/2/1", ""}, // a dot inside a name
        {"Leg.Toe", "./1/2/2", ""},
        {"Right.Toe.Xrotation", "./1/3/2/1", "./1/3/3/1"},
        {"Toe.Xrotation", "./2/1", ""}, // a whole name goes before the ends of others
        {"Xrotation", "./1/1", "./1/2/1"},
        {"./", "./", ""},
        {"./1/4", "", ""},
        {"", "", ""},
        {"hips", "", ""},
        {"eg.Xrotation", "", ""},
        {".Xrotation", "", ""},
        {"Hips.", "", ""},
        {"Hips..Xrotation", "", ""},
    };
    auto const pathOf = [&tree](std::optional<ChannelTree::Node> node) {
        return node ? tree->path(*node) : "";
    };
    for (auto const& each : cases) {
        ChannelTree::Match const match = tree->find(each.text);
        EXPECT_EQ(pathOf(match.first), each.first) << each.text;
        EXPECT_EQ(pathOf(match.second), each.second) << each.text;
    }
    for (ChannelTree::Node node = 1; node < tree->count(); ++node) {
        EXPECT_EQ(tree->find(tree->path(node)).first, node);
        std::string const name = tree->dottedName(node);
        EXPECT_EQ(tree->dottedName(*tree->find(name).first), name);
        EXPECT_TRUE(name.ends_with(tree->trailingName(node, 2, 100)));
    }
    EXPECT_EQ(tree->trailingName(*tree->find("./1/3/2/1").first, 3, 100), "Right.Toe.Xrotation");
    EXPECT_EQ(tree->trailingName(*tree->find("./1/3/2/1").first, 3, 10), "");
    EXPECT_EQ(tree->base(0).getName().str(), "odd.name");
}

TEST(ChannelTree, KeepsItsOrderWhereNodesComeAndGo) {
    std::unique_ptr<ChannelTree> const tree =
        treeOfJoints("A" + kJoint + "JOINT B" + kJoint + "}}\nROOT C" + kJoint + "}\n");
    ChannelTree::Node const added =
        tree->append(1, std::make_unique<KFChannel3D>("P", nullptr, 3, 0)); // with three components
    EXPECT_EQ(tree->path(added), "./1/3");
    std::string const all = "./ odd.name ObjectRoot\n./1 A Folder\n./1/1 Xrotation Angle\n./1/2 B Folder\n"
                            "./1/2/1 Xrotation Angle\n./1/3 P 3D\n./1/3/1 X Double\n./1/3/2 Y Double\n"
                            "./1/3/3 Z Double\n./2 C Folder\n./2/1 Xrotation Angle\n";
    EXPECT_EQ(listing(*tree), all);
    auto const ends = [&] {
        std::string text;
        for (ChannelTree::Node node = 0; node < tree->count(); ++node) {
            text += std::to_string(tree->parent(node)) + "-" + std::to_string(tree->end(node)) + " ";
        }
        return text;
    };
    EXPECT_EQ(ends(), "0-11 0-9 1-3 1-5 3-5 1-9 5-7 5-8 5-9 0-11 9-11 ");
    tree->erase(*tree->find("B").first);
    EXPECT_EQ(ends(), "0-9 0-7 1-3 1-7 3-5 3-6 3-7 0-9 7-9 ");
    EXPECT_EQ(tree->dottedName(*tree->find("./2/1").first), "C.Xrotation");
    EXPECT_EQ(tree->dottedName(*tree->find("Z").first), "A.P.Z");
}

TEST(SampleTimes, ReadsCurvesAtExactTimes) {
    std::unique_ptr<ChannelTree> const tree = treeOfMotion(readMotionText(kSmallMotion, "f.bvh")).tree;
    std::vector<ChannelTree::Node> const channels = tree->channelsBelow(ChannelTree::kTop);
    struct {
        char const* what;
        SampleTimes times;
    } const cases[] = {
        {"a row", SampleTimes::row(TempusMake(-1, 120), TempusMake(1, 1'000), 40)},
        {"a spread", SampleTimes::spread(kTempusZero, TempusMake(1, 60), 12)},
        {"a spread that no step serves",
         SampleTimes::spread(TempusMake(1, 2'147'483'647), TempusMake(1, 60), 1'000)},
        {"a list", SampleTimes::list({TempusMake(1, 240), TempusMake(7, 1'000), kTempusZero})},
    };
    for (auto const& each : cases) {
        SCOPED_TRACE(each.what);
        for (ChannelTree::Node const channel : channels) {
            std::vector<double> const values = each.times.values(tree->curve(channel));
            ASSERT_EQ(values.size(), each.times.count());
            for (std::size_t i = 0; i < values.size(); ++i) {
                double const expected =
                    tree->spline(channel)->getVertexValue(each.times.at(i), kTempusZero, true);
                EXPECT_NEAR(values[i], expected, 1e-12 * std::max(1.0, std::abs(expected)));
            }
            // In blocks the same to the bit.
            std::vector<double> blocks(values.size());
            for (std::size_t first = 0; first < values.size(); first += 7) {
                each.times.readValues(tree->curve(channel), first,
                                      std::min<std::size_t>(7, values.size() - first), blocks.data() + first);
            }
            EXPECT_EQ(blocks, values);
        }
    }
    EXPECT_EQ(cases[2].times.at(0), TempusMake(1, 2'147'483'647));
    EXPECT_EQ(cases[2].times.at(999), TempusMake(1, 60));
    EXPECT_EQ(SampleTimes::spread(TempusMake(1, 3), TempusMake(1, 2), 1).at(0), TempusMake(1, 3));

    // Slopes between keypoints 0, 1, 4 at 120 frames a second, and behind them.
    std::vector<double> const slopes =
        SampleTimes::list({TempusMake(1, 240), TempusMake(3, 240), TempusMake(1, 1)})
            .slopes(tree->spline(channels[0]));
    EXPECT_NEAR(slopes[0], 120, 1e-6);
    EXPECT_NEAR(slopes[1], 360, 1e-6);
    EXPECT_EQ(slopes[2], 0);
}

} // namespace
} // namespace lumenkey::tools
