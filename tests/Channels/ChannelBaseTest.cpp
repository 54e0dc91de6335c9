// What every node of the tree does: identity, flags, announcements, solo, the route of time, IDs and reset
// callbacks.

#include "lumenkey/Channels/KFChannelTimeConverter.h"
#include "lumenkey/Channels/KFResetCallbackDataTable.h"
#include "tests/Channels/RecordingRoot.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <barrier>
#include <cstdlib>
#include <functional>
#include <memory>
#include <new>
#include <set>
#include <thread>

namespace {

using Announced = std::vector<std::pair<KFChannelBase*, unsigned>>;

class Leaf : public KFChannelBase {
public:
    explicit Leaf(char const* name = "Leaf", unsigned int id = 2, KFChannelFolder* parent = nullptr,
                  unsigned int flags = 0)
        : KFChannelBase(nullptr, name, parent, id, flags) {}
    void resetToDefault(bool) override { ++resets; }
    bool shouldIgnoreDynamicIDs() const override { return ignoresIDs; }
    int resets = 0;
    bool ignoresIDs = false;
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

/// Half the speed above, with a shift that tells which channel asked.
class HalfSpeed : public KFChannelTimeConverter {
public:
    Tempus globalToLocalTime(KFChannelBase const* channel, Tempus const& t) const override {
        return t * TempusMake(1, 2) + TempusMake(channel->getID(), 1);
    }
    Tempus localToGlobalTime(KFChannelBase const* channel, Tempus const& t) const override {
        return (t - TempusMake(channel->getID(), 1)) * TempusMake(2, 1);
    }
    bool extentIsLocal() const override { return false; }
};

Tempus s(std::int64_t seconds) { return TempusMake(seconds, 1); }

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
        Announced const expected =
            nonState.count(bit) != 0 ? Announced{} : Announced{{&channel, kModifyState}};
        channel.resetFlag(mask, true);
        root.takeAnnounced();
        channel.setFlag(mask, false);
        EXPECT_EQ(root.takeAnnounced(), expected);
        if (!expected.empty()) {
            EXPECT_EQ(root.flagsWhenAnnounced & mask, 0U);
        }
        EXPECT_TRUE(channel.testFlag(mask));
        EXPECT_EQ(channel.isStateModified(), !expected.empty());
        channel.resetFlag(mask, false);
        EXPECT_EQ(root.takeAnnounced(), expected);
        EXPECT_FALSE(channel.testFlag(mask));
        channel.setFlag(mask, true);
        channel.resetFlag(mask, true);
        EXPECT_TRUE(root.takeAnnounced().empty());
        root.removeDescendant(&channel);
    }
}

TEST(KFChannelBase, AnnouncesEachKindOfChange) {
    RecordingRoot root;
    Leaf leaf("before", 2, &root);
    Announced const none;
    Announced const data{{&leaf, kModifyData}};
    Announced const state{{&leaf, kModifyState}};
    struct {
        char const* what;
        std::function<void()> change;
        Announced expected;
    } const cases[] = {
        {"name", [&] { leaf.setName("after", false); }, data},
        {"name, silent", [&] { leaf.setName("silent", true); }, none},
        {"name unset", [&] { leaf.setNameUnset(true); }, none},
        {"internal name", [&] { leaf.setInternalName("internal"); }, data},
        {"id", [&] { leaf.setID(9); }, none},
        {"disable", [&] { leaf.enable(false, false); }, state},
        {"enable, silent", [&] { leaf.enable(true, true); }, none},
        {"lock", [&] { leaf.lock(true, true); }, state},
        {"solo where not soloable", [&] { leaf.solo(true); }, none},
        {"soloable with a state bit", [&] { leaf.setFlag(kChannelFlagSoloable | kChannelFlagHidden, false); },
         state},
        {"solo", [&] { leaf.solo(true); }, state},
        {"child solo", [&] { leaf.setChildSolo(false); }, none},
        {"the same word", [&] { leaf.setFlags(leaf.getFlags()); }, state},
        {"a word without state", [&] { leaf.setFlags(kChannelFlagHostOption4); }, none},
        {"copy",
         [&] {
             leaf.copy(&root, false);
             leaf.setID(2);
         },
         none},
    };
    for (auto const& row : cases) {
        root.takeAnnounced();
        row.change();
        EXPECT_EQ(root.takeAnnounced(), row.expected) << row.what;
        if (row.what == std::string("name")) {
            EXPECT_EQ(root.nameWhenAnnounced, "before");
        }
    }
    EXPECT_EQ(root.getDescendant(2), &leaf); // through all changes of ID
    EXPECT_EQ(root.getDescendant(9), nullptr);
    EXPECT_TRUE(leaf.hasBeenModified(nullptr));

    Leaf alone;
    alone.setFlag(kChannelFlagHidden, false); // nobody to tell
    EXPECT_FALSE(alone.hasBeenModified(nullptr));
    EXPECT_EQ(alone.getFrameDuration(), TempusMake(1, 30));
}

TEST(KFChannelBase, IsEnabledFollowsSoloOnlyWhereTheRootHasSome) {
    // The channel's own bits and those of the folder above it: D disabled, S solo, A soloable, C a child is
    // soloed.
    struct {
        char const* own;
        char const* above;
        bool anySolo, checkAncestors, honourSolo, expected;
    } const cases[] = {
        {"", "", false, true, true, true},    {"D", "", false, false, false, false},
        {"", "D", false, false, false, true}, {"", "D", false, true, false, false},
        {"", "D", true, true, true, false},   {"", "S", true, false, true, true}, // not soloable
        {"A", "", true, true, false, true},   {"A", "", false, true, true, true},
        {"A", "", true, true, true, false},   {"AS", "", true, true, true, true},
        {"AC", "", true, true, true, true},   {"ADS", "D", true, true, true, true},
        {"ADC", "D", true, true, true, true}, {"A", "S", true, true, true, true},
        {"AD", "S", true, true, true, false}, {"ADSC", "S", true, true, true, false},
        {"A", "SD", true, true, true, true},  {"AD", "", true, true, true, false},
    };
    auto const bits = [](std::string const& letters) {
        KFChannelFlags flags = 0;
        for (char const letter : letters) {
            flags |= letter == 'D'   ? kChannelFlagDisabled
                     : letter == 'S' ? kChannelFlagSolo
                     : letter == 'A' ? kChannelFlagSoloable
                                     : kChannelFlagChildSolo;
        }
        return flags;
    };
    for (auto const& row : cases) {
        RecordingRoot root;
        Folder folder("f", 3, &root);
        Leaf leaf("l", 2, &folder);
        root.anySolo = row.anySolo;
        leaf.setFlag(bits(row.own), true);
        folder.setFlag(bits(row.above), true);
        EXPECT_EQ(leaf.isEnabled(row.checkAncestors, row.honourSolo), row.expected)
            << row.own << " below " << row.above;
    }

    RecordingRoot root;
    Folder folder("f", 3, &root);
    Leaf leaf("l", 2, &folder, kChannelFlagSoloable);
    root.setFlag(kChannelFlagSoloable, true);
    leaf.setChildSolo(true);
    EXPECT_TRUE(root.testFlag(kChannelFlagChildSolo));
    EXPECT_FALSE(folder.testFlag(kChannelFlagChildSolo) || leaf.testFlag(kChannelFlagChildSolo));
}

TEST(KFChannelBase, CopyTakesIdentityAndAssignContent) {
    RecordingRoot root;
    Leaf source("Source", 7, nullptr, kChannelFlagHidden);
    source.setInternalName("internal");
    source.setLabelCtlrClassName("LabelController");
    source.setFlag(kChannelFlagFadesOff, true);
    Leaf target("Target", 8, &root);
    target.saveStateAsDefault();

    target.assign(&source);
    EXPECT_TRUE(target.getID() == 8 && target.getName() == BXString("Target") && !target.getInternalName());
    EXPECT_EQ(target.getFlags(), source.getFlags());
    EXPECT_TRUE(target.isStateModified());
    EXPECT_STREQ(target.getLabelCtlrClassName(), "LabelController");

    target.copy(&source, true);
    EXPECT_EQ(target.getFlags(), source.getFlags() | kChannelFlagNameUnset);
    EXPECT_EQ(target.getDefaultFlags(), source.getDefaultFlags());
    EXPECT_EQ(*target.getInternalName(), BXString("internal"));
    EXPECT_EQ(root.getDescendant(7), &target);
    target.assign(&source);
    EXPECT_TRUE(target.testFlag(kChannelFlagNameUnset));
    EXPECT_FALSE(target == source); // by bit 6
    target.setNameUnset(false);
    target.setName("sOURCE", true);
    target.setInternalName("another");
    EXPECT_TRUE(target == source);

    // A node stays what its class is, whatever it is copied from; else the walks would cast it to what it
    // isn't.
    target.copy(&root, true);
    static_cast<KFChannelBase&>(target) = root;
    std::unique_ptr<KFChannelBase> const sliced(new KFChannelBase(root, &root));
    for (KFChannelBase const* const node : std::initializer_list<KFChannelBase*>{&target, sliced.get()}) {
        EXPECT_FALSE(node->testFlag(kChannelFlagIsFolder | kChannelFlagIsObjectRoot));
        EXPECT_EQ(node->getChannelRootBase(), &root);
    }
    root.copy(&source, true);
    root.assign(&source);
    EXPECT_TRUE(root.testFlag(kChannelFlagIsFolder) && root.testFlag(kChannelFlagIsObjectRoot));
    EXPECT_EQ(root.getNumberOfDescendants(), 2U);
    EXPECT_EQ(std::unique_ptr<KFChannelBase>(source.clone())->getParent(), nullptr);
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
    EXPECT_EQ(inner.getFullDisplayName(), BXString("Root.Outer.Inner"));
    EXPECT_EQ(outer.getFullDisplayName(), BXString("Outer"));
    inner.setName("My Root", true);
    EXPECT_EQ(leaf.getFullDisplayName(), BXString("My Root.leaf"));
    root.removeDescendant(&outer);
    EXPECT_EQ(leaf.getFullDisplayName(), BXString("My Root.leaf"));
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
    expectRoute(s(20), s(10));
    HalfSpeed converter;
    object.setTimeConverterDelegate(&converter); // a root doesn't ask its own
    expectRoute(s(20), s(10));
    folder.setTimeConverterDelegate(&converter);
    expectRoute(s(18), s(10)); // 30 / 2 + 3
    leaf.setTimeConverterDelegate(&converter);
    expectRoute(s(19), s(10));
    EXPECT_EQ(KFChannelBase(leaf).getTimeConverterDelegate(), &converter);
    leaf.setTimeConverterDelegate(nullptr);
    folder.removeDescendant(&leaf);
    expectRoute(s(30), kTempusZero);

    EXPECT_EQ(folder.getChannelRootBase(), &object);
    EXPECT_EQ(folder.getAncestorRootBase(), &world);
    EXPECT_EQ(object.getChannelRootBase(), &object);
    EXPECT_TRUE(folder.isDescendantOf(world) && !folder.isDescendantOf(folder) &&
                !leaf.isDescendantOf(world));
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
    std::vector<unsigned int> ids[2];
    std::barrier start(3);
    std::vector<std::thread> threads;
    for (auto& taken : ids) {
        threads.emplace_back([&start, &taken] {
            start.arrive_and_wait();
            for (int i = 0; i < count; ++i) {
                taken.push_back(KFChannelBase::getNextUniqueID());
            }
        });
    }
    start.arrive_and_wait();
    for (int i = 0; i < count; ++i) {
        unsigned int const foreign = KFChannelBase::getLastUsedUniqueID() + 3;
        KFChannelBase::updateIDGenerator(foreign);
        EXPECT_GT(KFChannelBase::getNextUniqueID(), foreign);
    }
    for (std::thread& thread : threads) {
        thread.join();
    }
    std::set<unsigned int> all(ids[0].begin(), ids[0].end());
    all.insert(ids[1].begin(), ids[1].end());
    EXPECT_EQ(all.size(), 2U * count);
    EXPECT_GE(*all.begin(), 10000U);
    EXPECT_TRUE(std::is_sorted(ids[0].begin(), ids[0].end()) && std::is_sorted(ids[1].begin(), ids[1].end()));
}

/// In a process of its own, since the generator only grows.
[[noreturn]] void checkLimitsOfTheIDGenerator() {
    Folder top("top", 4000000);
    Folder inner("inner", 20000, &top);
    Leaf deep("deep", 30000, &inner);
    Leaf foreign("foreign", 3500000000, &top);
    Folder ignored("ignored", 5000000, &top);
    ignored.ignoresIDs = true;
    Leaf belowIgnored("below", 6000000, &ignored);
    KFChannelBase::updateIDGenerator(top);
    bool good = KFChannelBase::getLastUsedUniqueID() == 30001;
    KFChannelBase::updateIDGenerator(30000);
    good = good && KFChannelBase::getLastUsedUniqueID() == 30001;
    KFChannelBase::updateIDGenerator(3500000000);
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
    other.setResetCallback(count, &first, false);
    EXPECT_EQ(KFChannelBase(*leaf).getResetCallback(nullptr, nullptr, nullptr), false); // no copy has it
    leaf->~Leaf();

    leaf = new (place) Leaf(); // another channel at the same address
    void* context = &first;
    EXPECT_FALSE(leaf->getResetCallback(nullptr, &context, nullptr));
    EXPECT_EQ(context, &first);
    leaf->reset(true);
    EXPECT_EQ(leaf->resets, 1);
    leaf->~Leaf();
    bool wantsWrapper = true;
    EXPECT_TRUE(other.getResetCallback(nullptr, &context, &wantsWrapper));
    EXPECT_FALSE(wantsWrapper);
}

TEST(KFResetCallbackDataTable, ThreadsEnterAndLeaveSideBySide) {
    std::vector<std::thread> threads;
    for (int t = 0; t < 3; ++t) {
        threads.emplace_back([] {
            int calls = 0;
            for (int i = 0; i < 2000; ++i) {
                Leaf leaf;
                leaf.setResetCallback(count, &calls, false);
                leaf.reset(true);
                Leaf without;
                without.reset(true);
                EXPECT_EQ(without.resets, 1);
            }
            EXPECT_EQ(calls, 2000);
        });
    }
    for (std::thread& thread : threads) {
        thread.join();
    }
}

/// A channel with an entry that is reset without the table and, being older than it, destroyed behind it.
[[noreturn]] void resetBehindTheTable() {
    static int calls = 0;
    static Leaf leaf;
    leaf.setResetCallback(count, &calls, false);
    KFChannelBase::invalidateResetCallbackDataTable();
    leaf.reset(true);
    leaf.setResetCallback(count, &calls, false);
    bool const nothingHappened =
        calls == 0 && leaf.resets == 0 && KFChannelBase::getResetCallbackDataTable() == nullptr;
    std::exit(nothingHappened && !KFChannelBase::isResetCallbackDataTableValid() ? 0 : 1);
}

TEST(KFResetCallbackDataTable, NothingIsResetOnceItIsGone) {
    testing::GTEST_FLAG(death_test_style) = "threadsafe";
    EXPECT_EXIT(resetBehindTheTable(), testing::ExitedWithCode(0), "");
}

} // namespace
