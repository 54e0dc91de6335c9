// The folder: which children an operation reaches, answers over children, the list and its look-up by ID,
// copies, counterparts in other trees.

#include "lumenkey/Channels/KFCompoundChannel.h"
#include "lumenkey/Channels/KFScalarChannels.h"
#include "tests/Channels/RecordingRoot.h"
#include "tests/curves/CountedMemory.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <bit>
#include <cstdint>
#include <deque>
#include <map>
#include <memory>
#include <random>
#include <utility>

namespace {

#define NOTES(operation, ...)                                                                                \
    void operation(__VA_ARGS__) override { reached[#operation] += getName().str(); }
#define ANSWERS(question, ...)                                                                               \
    bool question(__VA_ARGS__) const override { return answer; }
using Time = Tempus const&;

/// Notes which operations reach it, and answers as told.
struct Probe : KFChannelBase {
    Probe(KFChannelFolder* parent, char const* name, unsigned int id, KFChannelFlags flags = 0)
        : KFChannelBase(nullptr, name, parent, id, 0) {
        storeFlags(getFlags() | flags);
    }
    // clang-format off
    NOTES(finishInitializing) NOTES(setDefaultToCurrentValue) NOTES(undoWillReplace) NOTES(undoDidReplace)
    NOTES(beginPlayback, Time, unsigned, unsigned, Time) NOTES(endPlayback, Time) NOTES(beginRecording, Time)
    NOTES(endRecording, Time) NOTES(updateCurrentRecordingTime, Time) NOTES(reset, bool)
    NOTES(registerRecordingCallback, RecordingCallback, void*, bool) NOTES(addKeypointAt, Time)
    NOTES(unregisterRecordingCallback, RecordingCallback, void*) NOTES(deleteKeypointAt, Time)
    NOTES(copyKeyframesFromChannel, Time, KFChannelBase*) NOTES(retimeKeypoints, double, Time)
    NOTES(bake, BXTimeRange const&, Time) NOTES(simplify, Time, Time, Time, double, unsigned, unsigned, bool)
    NOTES(setExtrapolation, unsigned, unsigned) NOTES(generateKeys, unsigned, unsigned)
    NOTES(setIsSpline, bool) NOTES(setKeyframable, bool, bool) NOTES(setInterpolation, unsigned)
    NOTES(keyframesWithChannels, TempusRange, KeyframesByChannel&) NOTES(deleteKeypoints, Time, Time)
    NOTES(adjustToFrameDuration, Time) NOTES(scaleFadeHandles, double)
    ANSWERS(isModified, bool) ANSWERS(isSpline) ANSWERS(isKeyframable) ANSWERS(hasFadeHandles)
    ANSWERS(hasMoreThanOneKeypoint) ANSWERS(allHaveKeypointsAt, Time);
    // clang-format on
    bool hasKeypoints(unsigned mask) const override { return answer && mask == 0; }
    bool hasKeypointAt(Time, unsigned mask) const override { return answer && mask == 0; }
    unsigned numberOfKeypointsAt(Time) const override { return answer ? 1 : 0; }
    void lockFromParent(bool on, bool) override {
        reached["lockFromParent"] += getName().str() + (on ? '+' : '-');
    }

    static inline std::map<std::string, std::string> reached; // by operation, the names of the channels
    bool answer = false;
};

TEST(KFChannelFolder, PassesEachOperationToTheChildrenItIsFor) {
    KFChannelFolder f("Folder", nullptr, 1, 0, 0);
    Probe plain(&f, "p", 1), hidden(&f, "h", 2, kChannelFlagHidden),
        notRetimed(&f, "n", 3, kChannelFlagNotRetimed), kept(&f, "k", 4, kChannelFlagKeepOnFolderReset),
        both(&f, "b", 5, kChannelFlagHidden | kChannelFlagNotRetimed);
    auto const expectReached = [](char const* names, std::size_t operations) {
        EXPECT_EQ(Probe::reached.size(), operations);
        for (auto const& [operation, reached] : Probe::reached) {
            EXPECT_EQ(reached, names) << operation;
        }
        Probe::reached.clear();
    };
    f.finishInitializing(), f.setDefaultToCurrentValue(), f.undoWillReplace(), f.undoDidReplace();
    f.copyKeyframesFromChannel(s(1), &f), f.bake({s(0), s(1)}, s(1)), f.setExtrapolation(0, 0);
    f.simplify(s(0), s(1), s(1), 0.0, 0, 0, false), f.generateKeys(0, 0), f.setKeyframable(true, true);
    f.adjustToFrameDuration(s(1, 24));
    expectReached("phnkb", 11);
    KFChannelBase::KeyframesByChannel keyframes;
    f.setKeyframable(true, false), f.setIsSpline(true), f.setInterpolation(1), f.scaleFadeHandles(2.0);
    f.addKeypointAt(s(1)), f.deleteKeypointAt(s(1)), f.deleteKeypoints(s(1), s(2));
    f.keyframesWithChannels({s(0), s(1)}, keyframes), f.updateCurrentRecordingTime(s(1));
    f.beginPlayback(s(1), 0, 0, s(1)), f.endPlayback(s(1)), f.beginRecording(s(1)), f.endRecording(s(1));
    f.registerRecordingCallback(nullptr, nullptr, false), f.unregisterRecordingCallback(nullptr, nullptr);
    expectReached("pnk", 15);
    f.lock(true, false), f.lock(false, false), f.lockFromParent(true, false);
    expectReached("p+n+k+p-n-k-p+n+k+", 1);
    f.retimeKeypoints(2.0, s(1));
    expectReached("phk", 1);
    f.resetToDefault(true);
    expectReached("phnb", 1);
}

TEST(KFChannelFolder, KeepsChildrenOfALockedFolderLocked) {
    KFChannelFolder top("Top", nullptr, 1, 0, 0), lower("Lower", &top, 2, 0, 0);
    Probe child(&lower, "c", 1);
    top.lock(true, true);
    EXPECT_TRUE(top.isLocked(false) && !lower.isLocked(false));
    lower.lockFromParent(false, true);
    lower.lockFromParent(false, false);
    EXPECT_EQ(std::exchange(Probe::reached, {})["lockFromParent"], "c+c+c-");
}

/// Takes the other and itself out of the list, or brings the other in.
struct Changer : Probe {
    using Probe::Probe;
    void reset(bool silent) override {
        Probe::reset(silent);
        leaves ? getParent()->removeDescendant(other) : getParent()->push_front(other);
        leaves ? getParent()->removeDescendant(this) : void();
    }
    KFChannelBase* other = nullptr;
    bool leaves = false;
};

TEST(KFChannelFolder, ReachesEachSiblingOnceWhenOneChangesTheList) {
    RecordingRoot root;
    Changer a(&root, "a", 1), b(&root, "b", 2), c(&root, "c", 3), d(&root, "d", 4), e(nullptr, "e", 5);
    b.leaves = d.leaves = true;
    b.other = &a;
    c.other = &e;
    root.takeAnnounced();
    root.resetToDefault(true);
    EXPECT_EQ(std::exchange(Probe::reached, {})["reset"], "abcd");
    EXPECT_EQ(*root.getDescendants(), (std::vector<KFChannelBase*>{&e, &c}));
    EXPECT_EQ(root.takeAnnounced().size(), 1U); // silent or not
}

TEST(KFChannelFolder, AnswersForItsVisibleChildren) {
    KFChannelFolder folder("Folder", nullptr, 1, 0, 0);
    auto const answers = [&f = std::as_const(folder)] {
        std::vector<bool> const all{f.isSpline(),
                                    f.isKeyframable(),
                                    f.hasMoreThanOneKeypoint(),
                                    f.hasFadeHandles(),
                                    f.hasKeypoints(0),
                                    f.hasKeypointAt(s(1), 0),
                                    f.allHaveKeypointsAt(s(1)),
                                    f.hasOnlyOneKeypointAt(s(1)),
                                    f.isModified(true)};
        std::string text;
        std::transform(all.begin(), all.end(), std::back_inserter(text),
                       [](bool is) { return is ? 'y' : 'n'; });
        return text;
    };
    EXPECT_EQ(answers(), "nnnnnnnyn");
    Probe hidden(&folder, "h", 1, kChannelFlagHidden);
    hidden.answer = true;
    EXPECT_EQ(answers(), "nnnnnnnyy");
    Probe a(&folder, "a", 2, kChannelFlagDisabled), b(&folder, "b", 3);
    a.answer = true;
    EXPECT_EQ(answers(), "yyyyyynyy");
    unsigned const mask = kChannelFlagDisabled;
    EXPECT_FALSE(folder.hasKeypoints(mask) || folder.hasKeypointAt(s(1), mask));
    b.answer = true;
    EXPECT_EQ(answers(), "yyyyyyyny");
    EXPECT_TRUE(folder.hasKeypoints(mask) && folder.hasKeypointAt(s(1), mask));
    EXPECT_EQ(folder.numberOfKeypointsAt(s(1)), 2U);

    folder.setFlag(kChannelFlagHidden, false);
    EXPECT_TRUE(!folder.isModified(true) && folder.isModified(false));
    folder.setFoldFlag(kFoldFlagModifiedIsEnabled);
    folder.enable(false, false);
    EXPECT_FALSE(folder.isModified(false) || folder.saveWhenAtDefaultState());
    hidden.setFlag(kChannelFlagSaveWhenAtDefault, false);
    EXPECT_TRUE(folder.saveWhenAtDefaultState());
}

TEST(KFChannelFolder, KeepsAMovedKeypointFromPassingItsNeighbours) {
    RecordingRoot root;
    KFChannelFolder folder("Folder", &root, 2, 0, 0);
    KFChannelDouble a("a", &folder, 1, 0), b("b", &folder, 2, 0), hidden("h", &folder, 3, kChannelFlagHidden);
    a.addKeypointAt(s(1)), b.addKeypointAt(s(3)), hidden.addKeypointAt(s(2));
    Tempus t = s(9);
    b.setFlag(kChannelFlagDisabled, true);
    EXPECT_TRUE(folder.previousKeypoint(&t, kChannelFlagDisabled) && t == s(1));
    Tempus const moves[][3] = {
        {s(1), s(5), s(89, 30)}, {s(89, 30), s(0), s(0)}, {s(3), s(-1), s(1, 30)}, {s(0), s(0), s(0)}};
    for (auto const& [from, to, result] : moves) {
        EXPECT_EQ(folder.moveKeypointTo(from, to, false, false), result);
        EXPECT_TRUE(folder.hasKeypointAt(result, 0)) << TempusGetSeconds(result);
    }
    EXPECT_TRUE(hidden.hasKeypointAt(s(2), 0));
    root.removeDescendant(&folder);
    EXPECT_EQ(folder.moveKeypointTo(s(0), s(1), false, false), s(1, 30)); // no frame without a root
}

// The list --------------------------------------------------------------------------------------------------

TEST(KFChannelFolder, KeepsItsOrderAndFindsTheFirstChildOfAnID) {
    unsigned const seed = std::random_device()();
    SCOPED_TRACE("seed " + std::to_string(seed));
    std::mt19937 random(seed);
    auto const below = [&random](unsigned n) { return static_cast<unsigned>(random() % n); };
    using List = std::vector<KFChannelBase*>; // what each list should be, searched by a plain scan
    auto const remove = [](List& list, KFChannelBase* child) {
        auto const found = std::find(list.begin(), list.end(), child);
        list.erase(found, found == list.end() ? found : found + 1);
    };
    KFChannelFolder folders[2] = {{"A", nullptr, 1, 0, 0}, {"B", nullptr, 2, 0, 0}};
    List lists[2];
    std::deque<Probe> children;
    for (unsigned i = 0; i < 120; ++i) {
        children.emplace_back(nullptr, "c", below(70));
    }
    for (int step = 0; step < 6000; ++step) {
        unsigned const which = below(10) == 0 ? 1 : 0;
        KFChannelFolder &folder = folders[which], &elsewhere = folders[1 - which];
        List& list = lists[which];
        KFChannelBase *const child = &children[below(120)], *const anchor = &children[below(120)];
        unsigned const operation = below(1000);
        bool const isOurs = child->getParent() == &folder && !elsewhere.hasDescendant(child);
        if (operation < 600 && (!folder.hasDescendant(child) || below(20) == 0)) {
            if (child->getParent() == &elsewhere) {
                remove(lists[1 - which], child);
            }
            auto const place = std::find(list.begin(), list.end(), anchor);
            if (operation % 2 == 0) {
                list.insert(place, child), folder.insertDescendantBefore(anchor, child);
            } else {
                list.insert(place == list.end() ? list.begin() : place + 1, child);
                folder.insertDescendantAfter(anchor, child);
            }
        } else if (operation < 750) {
            if (operation < 610 && isOurs) {
                child->unregisterParent(&folder); // and so nobody hears of the new ID
                child->setID(below(70));
            }
            remove(list, child), folder.removeDescendant(child);
        } else if (operation >= 990) {
            list.clear(), folder.removeAllDescendants(true);
        } else if (isOurs) {
            child->setID(below(70));
        }
        for (int i = 0; i < 2; ++i) {
            ASSERT_TRUE(folders[i].getDescendants() == nullptr || *folders[i].getDescendants() == lists[i]);
            for (unsigned id = 0; id < 70; ++id) {
                auto const found = std::find_if(lists[i].begin(), lists[i].end(),
                                                [id](KFChannelBase* each) { return each->getID() == id; });
                ASSERT_EQ(folders[i].getDescendant(id), found != lists[i].end() ? *found : nullptr) << step;
            }
        }
    }
}

TEST(KFChannelFolder, FindsItsChildrenWithoutMemoryForAnIndex) {
    for (unsigned const indexed : {32U, 33U}) { // the index isn't made, or doesn't grow
        KFChannelFolder folder("f", nullptr, 1, 0, 0);
        std::deque<KFChannelDouble> children;
        for (unsigned id = 1; id <= 300; ++id) {
            KFChannelDouble& child = children.emplace_back(0.0, "c", nullptr, id, 0);
            if (id > indexed)
                refuseAllocationsAfter(std::has_single_bit(id - 1) ? 1 : 0); // what the list grows by
            folder.push_back(&child);
            refuseAllocationsAfter(SIZE_MAX);
        }
        for (KFChannelDouble& child : children)
            EXPECT_EQ(folder.getDescendant(child.getID()), &child);
        folder.removeAllDescendants(false);
    }
}

TEST(KFChannelFolder, ListsItsChildren) {
    KFChannelFolder a("A", nullptr, 1, 0, 0), b("B", nullptr, 2, 0, 4);
    a.push_back(nullptr);
    EXPECT_TRUE(a.getDescendants() == nullptr && b.getDescendants() != nullptr);
    Probe first(&a, "f", 1, kChannelFlagHidden), second(&a, "s", 2);
    EXPECT_EQ(a.getNumberOfVisibleDescendants(), 1U);
    b.push_back(&first); // moves it
    b.removeAllDescendants(false);
    EXPECT_TRUE(a.getNumberOfDescendants() == 1 && first.getParent() == &b);
    a.removeAllDescendants(true);
    EXPECT_TRUE(second.getParent() == nullptr && a.getDescendants() != nullptr);

    KFChannelFolder top("Top", nullptr, 20000, 0, 0), below("Below", &top, 20001, 0, 0);
    RecordingRoot object("Object", 3, &top);
    KFChannelDouble x("x", &below, 1, 0), y("y", &object, 2, kChannelFlagHidden);
    Probe noValue(&below, "n", 3);
    std::vector<unsigned> ids;
    top.getDescendantObjects(&ids);
    EXPECT_EQ(ids, (std::vector<unsigned>{20000, 20001, 20001}));
    EXPECT_TRUE(top.hasDescendant(&x) && !below.hasDescendant(&y) && !below.hasDescendant(&below));
    auto const flattened = [&top](KFChannelFlags mask, bool stopAtRoots) {
        std::vector<KFChannelBase*> out;
        top.getAllDescendantsFlattened(out, mask, stopAtRoots);
        return out;
    };
    using List = std::vector<KFChannelBase*>;
    EXPECT_EQ(flattened(0, false), (List{&x, &y}));
    EXPECT_EQ(flattened(0, true), List{&x});
    EXPECT_EQ(flattened(kChannelFlagHidden, false), List{&x});
    below.setFlag(kChannelFlagHidden, true);
    EXPECT_TRUE(flattened(kChannelFlagHidden, false).empty());
}

TEST(KFChannelFolder, AnnouncesChangesOfItsStateFlags) {
    RecordingRoot root;
    KFChannelFolder folder("Folder", &root, 2, 0, 0);
    folder.setFoldFlag(kFoldNonStateFlags);
    EXPECT_TRUE(root.takeAnnounced().empty() && !folder.isStateModified());
    folder.setFoldFlag(kFoldFlagLinked | 1);
    EXPECT_TRUE(root.takeAnnounced().size() == 1 && folder.isStateModified());
    folder.saveStateAsDefault();
    EXPECT_TRUE(folder.getDefaultFoldFlags() == kFoldFlagLinked && !folder.isStateModified());
    folder.resetFoldFlag(kFoldFlagLinked);
    folder.setFoldFlags(kFoldFlagChildrenNotSaved);
    EXPECT_EQ(root.takeAnnounced().size(), 2U);
}

// Copies and counterparts -----------------------------------------------------------------------------------

TEST(KFChannelFolder, ComparesAndAssignsPairByPair) {
    KFChannelFolder a("F", nullptr, 1, 0, 0), b("f", nullptr, 1, 0, 0);
    EXPECT_TRUE(a != b && a.allowsAssignment(&b)); // without lists
    EXPECT_FALSE(a.allowsAssignment(&a) || a.allowsAssignment(nullptr));
    a.allocateDescendants();
    EXPECT_FALSE(a.allowsAssignment(&b) || b.allowsAssignment(&a) || a == b);
    b.allocateDescendants();
    EXPECT_TRUE(a == b && a.allowsAssignment(&b));
    KFChannelDouble ax("x", &a, 1, 0), bx("other", &b, 2, 0);
    bx.setInitialValue(4.0, true);
    EXPECT_FALSE(a == b);
    a.assign(&b);
    EXPECT_TRUE(a == b && ax.getInitialValue() == 4.0);
    bx.setInitialValue(5.0, true);
    static_cast<KFChannelBase&>(a).setValue(static_cast<KFChannelBase const&>(b));
    EXPECT_EQ(ax.getInitialValue(), 5.0);
    Probe extra(&b, "e", 3);
    bx.setInitialValue(6.0, true);
    EXPECT_FALSE(a == b || a.allowsAssignment(&b));
    a.assign(&b);
    b.setFoldFlags(kFoldFlagChildrenNotSaved);
    a.copy(&b, true);
    EXPECT_TRUE(a.getFoldFlags() == kFoldFlagChildrenNotSaved && ax.getInitialValue() == 5.0);
    std::unique_ptr<KFChannelBase> const copy(b.clone());
    ASSERT_TRUE(copy->testFlag(kChannelFlagIsFolder));
    EXPECT_EQ(static_cast<KFChannelFolder&>(*copy).getNumberOfDescendants(), 0U);
}

/// A compound with two components.
struct Pair : KFCompoundChannel {
    Pair(char const* name, KFChannelFolder* parent, unsigned id)
        : KFCompoundChannel(nullptr, name, parent, id, 0, false, 2) {}
    KFChannelDouble x{"X", this, 1, 0}, y{"Y", this, 2, 0};
};

TEST(KFChannelFolder, FindsTheCounterpartOfAChannelFromElsewhere) {
    RecordingRoot root;
    KFChannelFolder above("Above", &root, 2, 0, 0), folder("Folder", &above, 3, 0, 0);
    KFChannelDouble sameID("Opacity", &folder, 7, 0), sameName("y", &folder, 8, 0);
    Pair size("Size", &folder, 9), position("Position", &folder, 10);
    auto const counterpartOf = [](KFChannelFolder& tree, char const* name, unsigned id) {
        KFChannelDouble const channel(name, nullptr, id, 0);
        return tree.findMatchingDescendant(&channel);
    };
    EXPECT_EQ(counterpartOf(root, "Y", 7), &sameName); // the name before the ID
    EXPECT_EQ(counterpartOf(root, "none", 8), &sameName);
    EXPECT_EQ(counterpartOf(root, "none", 99), nullptr);
    EXPECT_EQ(counterpartOf(root, "folder.position.Y", 1), &position.y);
    EXPECT_EQ(counterpartOf(root, "Other.Y", 99), nullptr);

    Pair pasted("POSITION", nullptr, 10);
    EXPECT_EQ(root.findMatchingDescendant(&pasted), &position);
    EXPECT_EQ(root.findMatchingDescendant(&pasted.y), &position.y);
    EXPECT_EQ(size.findMatchingDescendant(&pasted), &size); // allows the assignment itself
    above.removeDescendant(&folder);
    EXPECT_EQ(counterpartOf(folder, "Position.X", 99), &position.x);
}

} // namespace
