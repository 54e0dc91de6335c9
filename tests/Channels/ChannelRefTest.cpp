// Paths to channels: what they are made of, what they find, and what malformed ones do.

#include "tests/Channels/RecordingRoot.h"

#include <gtest/gtest.h>

#include <climits>
#include <map>

namespace {

/// 7 / 12 / 3, with a root at 12 if asked.
struct Tree {
    KFChannelFolder top{nullptr, "top", nullptr, 7, 0, 0};
    RecordingRoot object{"object", 12, &top};
    KFChannelFolder folder{nullptr, "folder", &object, 5, 0, 0};
    KFChannelBase leaf{nullptr, "leaf", &folder, 3, 0};
};

TEST(KFChannelRef, NamesAChannelFromARootOrFromTheTop) {
    Tree tree;
    struct {
        KFChannelRef ref;
        char const* text;
        KFChannelBase* from;
        KFChannelBase* found;
    } const cases[] = {
        {KFChannelRef(&tree.leaf, &tree.object), "./5/3", &tree.object, &tree.leaf},
        {KFChannelRef(&tree.leaf, &tree.top), "./12/5/3", &tree.top, &tree.leaf},
        {KFChannelRef(&tree.leaf, nullptr), "7/12/5/3", &tree.top, &tree.leaf},
        {KFChannelRef(&tree.leaf, nullptr), "7/12/5/3", &tree.object, nullptr},
        {KFChannelRef(&tree.leaf, &tree.leaf), "3", &tree.leaf, &tree.leaf},
        {KFChannelRef(&tree.top, nullptr), "7", &tree.top, &tree.top},
        {KFChannelRef(&tree.top, &tree.leaf), "7", &tree.top, &tree.top}, // not above it
        {KFChannelRef(&tree.object, &tree.leaf), "7/12", &tree.top, &tree.object},
        {tree.leaf.getRef(true), "./5/3", &tree.object, &tree.leaf},
        {tree.leaf.getRef(false), "7/12/5/3", &tree.top, &tree.leaf},
        {tree.object.getRef(true), "12", &tree.object, &tree.object},
        {tree.top.getRef(true), "7", &tree.top, &tree.top}, // no root above
        {KFChannelRef(nullptr, nullptr), "", &tree.top, nullptr},
        {KFChannelRef(&tree.leaf, &tree.object), "./5/3", nullptr, nullptr},
    };
    for (auto const& row : cases) {
        EXPECT_EQ(row.ref, row.text);
        EXPECT_EQ(row.ref.getChannel(row.from), row.found) << row.text;
    }
}

TEST(KFChannelRef, SurvivesRenamingAndMovingAndFindsTheCopy) {
    Tree tree;
    KFChannelRef const ref = tree.leaf.getRef(true);
    tree.leaf.setName("renamed", true);
    KFChannelBase sibling(nullptr, "sibling", 4);
    tree.folder.push_front(&sibling);
    tree.top.removeDescendant(&tree.object);
    EXPECT_EQ(ref.getChannel(&tree.object), &tree.leaf);
    Tree copy;
    EXPECT_EQ(ref.getChannel(&copy.object), &copy.leaf);
    tree.leaf.setID(30);
    EXPECT_EQ(ref.getChannel(&tree.object), nullptr);
    sibling.setID(3);
    EXPECT_EQ(ref.getChannel(&tree.object), &sibling);

    KFChannelBase largest(nullptr, "largest", &tree.folder, UINT_MAX, 0);
    EXPECT_EQ(KFChannelRef(&largest, &tree.folder), "./4294967295");
    EXPECT_EQ(KFChannelRef(&largest, &tree.folder).getChannel(&tree.folder), &largest);
    tree.folder.removeDescendant(&sibling);
}

TEST(KFChannelRef, MalformedTextFindsNothing) {
    Tree tree;
    KFChannelBase zero(nullptr, "zero", &tree.object, 0, 0); // what an empty or wrapped number would find
    for (char const* text : {"./5/3/", "./5/0003", ".5/3", "./", "."}) {
        EXPECT_NE(KFChannelRef(text).getChannel(&tree.object), nullptr) << text;
    }
    EXPECT_EQ(KFChannelRef("./").getChannel(&tree.object), &tree.object);
    for (char const* text :
         {"", "/", "/5/3", "./5//3", "././5", "../5", "./5/3//", "./5/x", "./5/3x", "./5/ 3", "./5/+3",
          "./5/-3", "./5/3/0", "./4294967296", "./18446744073709551616", "12//", "13", "0", "//"}) {
        EXPECT_EQ(KFChannelRef(text).getChannel(&tree.object), nullptr) << text;
    }
    KFChannelRef withZeroByte(BXString(std::string_view("./5/3\0", 6)));
    EXPECT_EQ(withZeroByte.getChannel(&tree.object), nullptr);
    for (char const byte : {'/', '.', '9', '0'}) {
        KFChannelRef huge(BXString(std::string(1 << 20, byte)));
        EXPECT_EQ(huge.getChannel(&tree.object), nullptr);
        EXPECT_EQ(huge.getID(), 0U);
        EXPECT_GE(huge.getCobaltOnlyPath(), huge.c_str());
        EXPECT_LT(huge.getCobaltOnlyPath(), huge.c_str() + huge.size());
    }
}

TEST(KFChannelRef, ReadsReplacesAndCutsComponents) {
    struct {
        char const* text;
        unsigned int id;
        char const* with9;
        char const* cut;
    } const cases[] = {
        {"", 0, "", ""},
        {"7", 0, "7", "7"},
        {"./12/3", 3, "./12/9", "3"},
        {"7/12", 12, "7/9", "12"},
        {"./4/9999/3", 3, "./4/9999/9", "9999/3"},
        {"9999/9999", 9999, "9999/9", "9999/9999"},
        {"./4/99990/19999", 19999, "./4/99990/9", "19999"},
        {"./4/3/", 0, "./4/3/9", "./4/3/"},
        {"./9999/", 0, "./9999/9", "9999/"},
        {"./4294967296", 0, "./9", "4294967296"},
        {".", 0, ".9", "."},
    };
    for (auto const& row : cases) {
        KFChannelRef ref(row.text);
        EXPECT_EQ(ref.getID(), row.id) << row.text;
        EXPECT_STREQ(ref.getCobaltOnlyPath(), row.cut) << row.text;
        ref.setID(9);
        EXPECT_EQ(ref, row.with9);
    }
    std::map<KFChannelRef, int> const ordered{{"./2", 2}, {"./10", 1}, {"./10/1", 3}, {"\xff", 4}};
    std::vector<int> order;
    for (auto const& entry : ordered) {
        order.push_back(entry.second);
    }
    EXPECT_EQ(order, std::vector({1, 3, 2, 4}));
}

TEST(KFChannelRef, ReadsOnlyWhatLiesWithinTheData) {
    BXData data;
    EXPECT_TRUE(KFChannelRef("./1").writeToData(data));
    EXPECT_EQ(data.size(), 7U);
    EXPECT_TRUE(KFChannelRef("").writeToData(data));
    EXPECT_TRUE(KFChannelRef("7/2").writeToData(data));
    KFChannelRef ref("kept");
    EXPECT_EQ(ref.readFromData(data, 0), 7);
    EXPECT_EQ(ref, "./1");
    EXPECT_EQ(ref.readFromData(data, 7), 11);
    EXPECT_EQ(ref, "");
    EXPECT_EQ(ref.readFromData(data, 11), 18);
    EXPECT_EQ(ref, "7/2");

    BXData huge = data;
    std::fill_n(huge.begin(), 4, std::uint8_t{0xFF});
    BXData const cut(data.begin(), data.begin() + 6);
    BXData const tiny(3);
    BXData const none;
    std::pair<BXData const*, int> const outside[] = {
        {&data, -1}, {&data, INT_MIN}, {&data, 15}, {&data, 18}, {&data, INT_MAX},
        {&huge, 0},  {&cut, 0},        {&tiny, 0},  {&none, 0},  {&none, -4}};
    for (auto const& [from, offset] : outside) {
        EXPECT_EQ(ref.readFromData(*from, offset), offset);
        EXPECT_EQ(ref, "7/2") << offset;
    }
}

} // namespace
