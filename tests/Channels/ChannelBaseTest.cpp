// What every node of the tree does: flags, announcements, solo, copies, the route of time, IDs, reset callbacks.

#include "lumenkey/Channels/KFResetCallbackDataTable.h"
#include "tests/Channels/LinearConverter.h"
#include "tests/Channels/RecordingRoot.h"

#include <gtest/gtest.h>

#include <cstdlib>
#include <new>
#include <set>
#include <thread>

namespace {

class Leaf : public KFChannelBase {
public:
    explicit Leaf(char const* name = "Leaf", unsigned int id = 2, KFChannelFolder* parent = nullptr,
                  unsigned int flags = 0)
        : KFChannelBase(nullptr, name, parent, id, flags) {}
    void resetToDefault(bool) override { ++resets; }
    int resets = 0;
};

class Folder : public KFChannelFolder {
public:
    explicit Folder(char const* name, unsigned int id = 3, KFChannelFolder* parent = nullptr)
        : KFChannelFolder(nullptr, name, parent, id, 0, 0) {}
    bool isCompoundChannel() const override { return isCompound; }
    bool shouldIgnoreDynamicIDs() const override { return ignoresIDs; }
    bool isCompound = false;
    bool ignoresIDs = false;
};

TEST(KFChannelBase, AnnouncesStateBitsOnlyAndBeforeItChangesThem) {
    std::set<int> const nonState{0, 3, 4, 5, 6, 12, 13, 16, 17, 19, 20, 22, 24, 25, 28, 33};
    RecordingRoot root;
    for (int bit = 0; bit < 64; ++bit) {
        SCOPED_TRACE(bit);
        KFChannelFlags const mask = 1ULL << bit;
        if (mask == kChannelFlagIsObjectRoot) {
            continue; // it belongs to roots: the walks take its word
        }
        Folder channel("f", 3, &root);
        bool const isState = nonState.count(bit) == 0;
        Announced const expected = isState ? Announced{{&channel, kModifyState}} : Announced{};
        channel.resetFlag(mask, true);
        root.flagsWhenAnnounced = 0;
        channel.setFlag(mask, false);
        EXPECT_EQ(root.takeAnnounced(), expected);
        EXPECT_EQ(root.flagsWhenAnnounced & mask, 0U);
        EXPECT_EQ(channel.isStateModified(), isState);
        channel.resetFlag(mask, false);
        EXPECT_EQ(root.takeAnnounced(), expected);
        root.removeDescendant(&channel);
    }
}

TEST(KFChannelBase, AnnouncesEachKindOfChange) {
    RecordingRoot root;
    Leaf leaf("before", 2, &root);
    auto const told = [&root] {
        unsigned const kind = root.announced.empty() ? 0 : root.announced.back().second;
        return root.takeAnnounced().size() > 1 ? 99 : kind;
    };
    leaf.setName("after", false);
    EXPECT_EQ(root.nameWhenAnnounced, "before");
    EXPECT_EQ(told(), kModifyData);
    leaf.setInternalName("internal");
    EXPECT_EQ(told(), kModifyData);
    leaf.enable(false, false);
    EXPECT_EQ(told(), kModifyState);
    leaf.lock(true, true);
    EXPECT_EQ(told(), kModifyState);
    leaf.setFlag(kChannelFlagSoloable | kChannelFlagHidden, false); // one bit is state
    EXPECT_EQ(told(), kModifyState);
    leaf.solo(true);
    EXPECT_EQ(told(), kModifyState);
    leaf.setFlags(leaf.getFlags()); // the same word
    EXPECT_EQ(told(), kModifyState);

    leaf.setFlags(kChannelFlagHostOption4); // no state in it
    leaf.setName("silent", true);
    leaf.setNameUnset(true);
    leaf.enable(true, true);
    leaf.setFlag(kChannelFlagHidden, true);
    leaf.solo(true); // not soloable
    leaf.setID(9);
    leaf.copy(&root, false);
    EXPECT_TRUE(root.takeAnnounced().empty());
    EXPECT_TRUE(leaf.hasBeenModified(nullptr));
    EXPECT_FALSE(Leaf().hasBeenModified(nullptr)); // nobody to ask
}

TEST(KFChannelBase, IsEnabledFollowsSoloOnlyWhereTheRootHasSome) {
    constexpr KFChannelFlags D = kChannelFlagDisabled;
    constexpr KFChannelFlags S = kChannelFlagSolo;
    constexpr KFChannelFlags A = kChannelFlagSoloable;
    constexpr KFChannelFlags C = kChannelFlagChildSolo;
    struct {
        KFChannelFlags own, above;
        bool anySolo, checkAncestors, honourSolo, expected;
    } const cases[] = {
        {0, 0, false, true, true, true},
        {D, 0, false, false, false, false},
        {0, D, false, false, false, true},
        {0, D, false, true, false, false},
        {0, S, true, false, true, true},
        {A, 0, true, true, false, true},
        {A, 0, false, true, true, true},
        {A, 0, true, true, true, false},
        {A | D | S, D, true, true, true, true},
        {A | D | C, D, true, true, true, true},
        {A | D | S | C, S, true, true, true, false},
        {A, S | D, true, true, true, true},
    };
    for (auto const& row : cases) {
        RecordingRoot root;
        Folder folder("f", 3, &root);
        Leaf leaf("l", 2, &folder);
        root.anySolo = row.anySolo;
        leaf.setFlag(row.own, true);
        folder.setFlag(row.above, true);
        EXPECT_EQ(leaf.isEnabled(row.checkAncestors, row.honourSolo), row.expected) << &row - cases;
    }
}

TEST(KFChannelBase, CopyTakesIdentityAndAssignContent) {
    RecordingRoot root;
    Leaf source("Source", 7, nullptr, kChannelFlagHidden);
    source.setInternalName("internal");
    source.setLabelCtlrClassName("LabelController");
    source.setFlag(kChannelFlagFadesOff, true);
    Leaf target("Target", 8, &root);

    target.assign(&source);
    EXPECT_TRUE(target.getID() == 8 && target.getName() == BXString("Target") && !target.getInternalName());
    EXPECT_EQ(target.getFlags(), source.getFlags());
    EXPECT_STREQ(target.getLabelCtlrClassName(), "LabelController");
    target.copy(&source, true);
    EXPECT_EQ(target.getFlags(), source.getFlags() | kChannelFlagNameUnset);
    EXPECT_EQ(target.getDefaultFlags(), source.getDefaultFlags());
    EXPECT_EQ(*target.getInternalName(), BXString("internal"));
    target.assign(&source);
    EXPECT_FALSE(target == source); // by bit 6
    target.setNameUnset(false);
    target.setName("sOURCE", true);
    target.setInternalName("another");
    EXPECT_TRUE(target == source);

    // A node stays what its class is, whatever it is copied from; else the walks would cast it to what it isn't.
    target.copy(&root, true);
    static_cast<KFChannelBase&>(target) = root;
    KFChannelBase const sliced(root, &root);
    EXPECT_FALSE(target.testFlag(kChannelFlagIsFolder | kChannelFlagIsObjectRoot));
    EXPECT_FALSE(sliced.testFlag(kChannelFlagIsFolder | kChannelFlagIsObjectRoot));
    root.copy(&source, true);
    root.assign(&source);
    EXPECT_TRUE(root.testFlag(kChannelFlagIsFolder) && root.testFlag(kChannelFlagIsObjectRoot));
}

TEST(KFChannelBase, NamesItselfByWhatStandsAbove) {
    RecordingRoot root("Root");
    Folder outer("Outer", 3, &root);
    Folder inner("Inner", 4, &outer);
    Leaf leaf("leaf", 5, &inner);
    EXPECT_EQ(leaf.getFullDisplayName(), BXString("Inner.leaf"));
    inner.isCompound = true;
    EXPECT_EQ(leaf.getFullDisplayName(), BXString("Inner.leaf")); // above Outer stands a root without bit 26
    root.setFlag(kChannelFlagRootInFullName, true);
    EXPECT_EQ(leaf.getFullDisplayName(), BXString("Root.Outer.Inner.leaf"));
    EXPECT_EQ(outer.getFullDisplayName(), BXString("Outer"));
    inner.setName("My Root", true);
    EXPECT_EQ(leaf.getFullDisplayName(), BXString("My Root.leaf"));
    root.removeDescendant(&outer);
    inner.isCompound = false;
    EXPECT_EQ(leaf.getFullDisplayName(), BXString("leaf")); // no root
}

TEST(KFChannelBase, RoutesTimeToTheNearestConverterOrRoot) {
    RecordingRoot world("World", 1);
    RecordingRoot object("Object", 2, &world);
    Folder folder("f", 3, &object);
    Leaf leaf("l", 4, &folder);
    world.setTimeOffset(s(100), true);
    object.setTimeOffset(s(10), true);
    auto const expectRoute = [&](Tempus const& local, Tempus const& offset) {
        EXPECT_EQ(leaf.globalToLocalTime(s(30)), local);
        EXPECT_EQ(leaf.localToGlobalTime(local), s(30));
        EXPECT_EQ(leaf.getTimeOffset(), offset);
    };
    LinearConverter converter(TempusMake(1, 2), s(3));
    object.setTimeConverterDelegate(&converter); // a root doesn't ask its own
    expectRoute(s(20), s(10));
    folder.setTimeConverterDelegate(&converter);
    expectRoute(s(18), s(10)); // 30 / 2 + 3
    EXPECT_EQ(converter.asked, &folder);
    folder.removeDescendant(&leaf);
    expectRoute(s(30), kTempusZero);
    EXPECT_TRUE(folder.getChannelRootBase() == &object && folder.getAncestorRootBase() == &world);
    EXPECT_TRUE(folder.isDescendantOf(world) && !folder.isDescendantOf(folder));
}

TEST(KFChannelTimeConverter, SentriesNestAndBindOneThread) {
    {
        KFChannelTimeConverterDisableSentry const outer;
        { KFChannelTimeConverterDisableSentry const inner; }
        EXPECT_FALSE(KFChannelTimeConverter::IsEnabledForCurrentThread());
        std::thread([] { EXPECT_TRUE(KFChannelTimeConverter::IsEnabledForCurrentThread()); }).join();
    }
    EXPECT_TRUE(KFChannelTimeConverter::IsEnabledForCurrentThread());
}

TEST(KFChannelIDThreads, HandOutEachIDOnceWhileOthersRaiseTheGenerator) {
    constexpr int count = 20000;
    std::vector<unsigned int> taken;
    std::thread other([&taken] {
        for (int i = 0; i < count; ++i) {
            taken.push_back(KFChannelBase::getNextUniqueID());
        }
    });
    std::set<unsigned int> all;
    for (int i = 0; i < count; ++i) {
        unsigned int const foreign = KFChannelBase::getLastUsedUniqueID() + 3;
        KFChannelBase::updateIDGenerator(foreign);
        unsigned int const next = KFChannelBase::getNextUniqueID();
        EXPECT_GT(next, foreign);
        all.insert(next);
    }
    other.join();
    all.insert(taken.begin(), taken.end());
    EXPECT_EQ(all.size(), 2U * count);
}

/// In a process of its own, since the generator only grows.
[[noreturn]] void checkLimitsOfTheIDGenerator() {
    bool good = KFChannelBase::getNextUniqueID() == 10000;
    Folder top("top", 4000000);
    Folder inner("inner", 20000, &top);
    Leaf deep("deep", 30000, &inner);
    Leaf foreign("foreign", 3500000000, &top);
    Folder ignored("ignored", 5000000, &top);
    ignored.ignoresIDs = true;
    Leaf belowIgnored("below", 6000000, &ignored);
    KFChannelBase::updateIDGenerator(top);
    KFChannelBase::updateIDGenerator(20000);
    good = good && KFChannelBase::getLastUsedUniqueID() == 30001;
    KFChannelBase::updateIDGenerator(3499999999);
    good = good && KFChannelBase::getLastUsedUniqueID() == 3500000000;
    std::_Exit(good ? 0 : 1);
}

TEST(KFChannelID, GeneratorStaysBelowForeignIDs) {
    testing::GTEST_FLAG(death_test_style) = "threadsafe"; // starts anew, with an unused generator
    EXPECT_EXIT(checkLimitsOfTheIDGenerator(), testing::ExitedWithCode(0), "");
}

void count(KFChannelBase*, void* context) { ++*static_cast<int*>(context); }

TEST(KFResetCallbackDataTable, CallbackStandsInForTheResetWhileTheChannelLives) {
    int first = 0;
    int second = 0;
    alignas(Leaf) unsigned char place[sizeof(Leaf)];
    Leaf* leaf = new (place) Leaf();
    leaf->setResetCallback(nullptr, nullptr, false);
    leaf->reset(true);
    leaf->setResetCallback(count, &first, false);
    leaf->reset(true);
    leaf->setResetCallback(count, &second, true); // replaces
    leaf->reset(true);
    EXPECT_EQ(std::vector({leaf->resets, first, second}), std::vector({1, 1, 1}));
    Leaf other;
    other.setResetCallback(count, &first, false); // so that the table isn't empty
    leaf->~Leaf();
    leaf = new (place) Leaf(); // another channel at the same address
    leaf->reset(true);
    EXPECT_EQ(leaf->resets, 1);
    leaf->~Leaf();
}

TEST(KFResetCallbackDataTable, ThreadsEnterAndLeaveSideBySide) {
    auto const enterAndLeave = [] {
        int calls = 0;
        for (int i = 0; i < 2000; ++i) {
            Leaf leaf;
            leaf.setResetCallback(count, &calls, false);
            leaf.reset(true);
        }
        EXPECT_EQ(calls, 2000);
    };
    std::thread other(enterAndLeave);
    enterAndLeave();
    other.join();
}

/// A channel with an entry that is reset without the table and, being older than it, destroyed behind it.
[[noreturn]] void resetBehindTheTable() {
    static int calls = 0;
    static Leaf leaf;
    leaf.setResetCallback(count, &calls, false);
    KFChannelBase::invalidateResetCallbackDataTable();
    leaf.reset(true);
    bool const nothingHappened = calls == 0 && leaf.resets == 0;
    std::exit(nothingHappened && KFChannelBase::getResetCallbackDataTable() == nullptr ? 0 : 1);
}

TEST(KFResetCallbackDataTable, NothingIsResetOnceItIsGone) {
    testing::GTEST_FLAG(death_test_style) = "threadsafe";
    EXPECT_EXIT(resetBehindTheTable(), testing::ExitedWithCode(0), "");
}

} // namespace
