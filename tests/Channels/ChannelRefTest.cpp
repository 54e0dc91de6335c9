// Paths to channels: what they are made of, what they find, and what malformed ones do.

#include "tests/Channels/RecordingRoot.h"

#include <gtest/gtest.h>

#include <climits>

namespace {

/// 7 / 12 / 5 / 3, with a root at 12.
struct Tree {
    KFChannelFolder top{nullptr, "top", nullptr, 7, 0, 0};
    RecordingRoot object{"object", 12, &top};
    KFChannelFolder folder{nullptr, "folder", &object, 5, 0, 0};
    KFChannelBase leaf{nullptr, "leaf", &folder, 3, 0};
};

TEST(KFChannelRef, NamesAChannelFromARootOrFromTheTop) {
    Tree tree;
    Tree copy;
    KFChannelBase largest(nullptr, "largest", &tree.folder, UINT_MAX, 0);
    struct {
        KFChannelRef ref;
        char const* text;
        KFChannelBase* from;
        KFChannelBase* found;
    } const cases[] = {
        {tree.leaf.getRef(true), "./5/3", &tree.object, &tree.leaf},
        {tree.leaf.getRef(true), "./5/3", &copy.object, &copy.leaf},
        {tree.leaf.getRef(false), "7/12/5/3", &tree.top, &tree.leaf},
        {tree.leaf.getRef(false), "7/12/5/3", &tree.object, nullptr},
        {tree.object.getRef(true), "12", &tree.object, &tree.object},
        {tree.top.getRef(true), "7", &tree.top, &tree.top},               // no root above
        {KFChannelRef(&tree.top, &tree.leaf), "7", &tree.top, &tree.top}, // not above it
        {KFChannelRef(&largest, &tree.folder), "./4294967295", &tree.folder, &largest},
        {KFChannelRef(nullptr, nullptr), "", &tree.top, nullptr},
        {tree.leaf.getRef(true), "./5/3", nullptr, nullptr},
    };
    for (auto const& row : cases) {
        EXPECT_EQ(row.ref, row.text);
        EXPECT_EQ(row.ref.getChannel(row.from), row.found) << row.text;
    }
}

TEST(KFChannelRef, MalformedTextFindsNothing) {
    Tree tree;
    KFChannelBase zero(nullptr, "zero", &tree.object, 0, 0); // what an empty or wrapped number would find
    for (char const* text : {"./5/3/", "./5/0003", ".5/3", "./", "."}) {
        EXPECT_NE(KFChannelRef(text).getChannel(&tree.object), nullptr) << text;
    }
    for (char const* text :
         {"/", "/5/3", "./5//3", "././5", "../5", "./5/3//", "./5/x", "./5/3x", "./5/ 3", "./5/+3", "./5/-3",
          "./5/3/0", "./4294967296", "./18446744073709551616", "12//", "0"}) {
        EXPECT_EQ(KFChannelRef(text).getChannel(&tree.object), nullptr) << text;
    }
    for (char const byte : {'/', '.', '9', '\0'}) {
        KFChannelRef const huge(BXString(std::string(1 << 20, byte)));
        EXPECT_EQ(huge.getChannel(&tree.object), nullptr);
        EXPECT_EQ(huge.getID(), 0U);
        EXPECT_LT(huge.getCobaltOnlyPath() - huge.c_str(), 1 << 20);
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
        {"./4/9999/3", 3, "./4/9999/9", "9999/3"},
        {"./4/99990/19999", 19999, "./4/99990/9", "19999"},
        {"./4/3/", 0, "./4/3/9", "./4/3/"},
        {"./9999/", 0, "./9999/9", "9999/"},
        {".", 0, ".9", "."},
    };
    for (auto const& row : cases) {
        KFChannelRef ref(row.text);
        EXPECT_EQ(ref.getID(), row.id) << row.text;
        EXPECT_STREQ(ref.getCobaltOnlyPath(), row.cut) << row.text;
        ref.setID(9);
        EXPECT_EQ(ref, row.with9);
    }
    EXPECT_TRUE(KFChannelRef("./10") < KFChannelRef("./10/1") && KFChannelRef("./2") < KFChannelRef("\xff"));
}

TEST(KFChannelRef, ReadsOnlyWhatLiesWithinTheData) {
    BXData data;
    EXPECT_TRUE(KFChannelRef("./1").writeToData(data) && KFChannelRef("7/2").writeToData(data));
    KFChannelRef ref;
    EXPECT_EQ(ref.readFromData(data, 0), 7);
    EXPECT_EQ(ref, "./1");
    EXPECT_EQ(ref.readFromData(data, 7), 14);
    EXPECT_EQ(ref, "7/2");

    BXData const huge(8, 0xFF);
    BXData const cut(data.begin(), data.begin() + 6);
    BXData const none;
    std::pair<BXData const*, int> const outside[] = {{&data, -1}, {&data, INT_MIN}, {&data, 11},
                                                     {&data, 14}, {&data, INT_MAX}, {&huge, 0},
                                                     {&cut, 0},   {&none, 0}};
    for (auto const& [from, offset] : outside) {
        EXPECT_EQ(ref.readFromData(*from, offset), offset);
        EXPECT_EQ(ref, "7/2") << offset;
    }
}

} // namespace
