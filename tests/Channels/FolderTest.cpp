// The folder: which children an operation reaches, answers over children, the list and its look-up by ID,
// copies, counterparts in other trees.

#include "lumenkey/Channels/KFCompoundChannel.h"
#include "lumenkey/Channels/KFScalarChannels.h"
#include "tests/Channels/RecordingRoot.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <deque>
#include <memory>
#include <random>

namespace {

Tempus s(std::int64_t value, std::int32_t timescale = 1) { return TempusMake(value, timescale); }

/// Notes which operations reach it, as "operation:name ", and answers as told.
class Probe : public KFChannelBase {
public:
    Probe(KFChannelFolder* parent, char const* name, unsigned int id, KFChannelFlags flags = 0)
        : KFChannelBase(nullptr, name, parent, id, 0) {
        storeFlags(getFlags() | flags);
    }

    void finishInitializing() override { note("finishInitializing"); }
    void setDefaultToCurrentValue() override { note("setDefaultToCurrentValue"); }
    void beginPlayback(Tempus const&, unsigned, unsigned, Tempus const&) override { note("beginPlayback"); }
    void endPlayback(Tempus const&) override { note("endPlayback"); }
    void beginRecording(Tempus const&) override { note("beginRecording"); }
    void endRecording(Tempus const&) override { note("endRecording"); }
    void updateCurrentRecordingTime(Tempus const&) override { note("updateCurrentRecordingTime"); }
    void registerRecordingCallback(RecordingCallback, void*, bool) override {
        note("registerRecordingCallback");
    }
    void unregisterRecordingCallback(RecordingCallback, void*) override {
        note("unregisterRecordingCallback");
    }
    void reset(bool silent) override {
        note("reset");
        KFChannelBase::reset(silent);
    }
    void lockFromParent(bool on, bool) override {
        note("lockFromParent");
        lockedFromParent = on;
    }
    void copyKeyframesFromChannel(Tempus const&, KFChannelBase*) override {
        note("copyKeyframesFromChannel");
    }
    void undoWillReplace() override { note("undoWillReplace"); }
    void undoDidReplace() override { note("undoDidReplace"); }
    void bake(BXTimeRange const&, Tempus const&) override { note("bake"); }
    void simplify(Tempus const&, Tempus const&, Tempus const&, double, unsigned, unsigned, bool) override {
        note("simplify");
    }
    void setExtrapolation(unsigned, unsigned) override { note("setExtrapolation"); }
    void generateKeys(unsigned, unsigned) override { note("generateKeys"); }
    void setIsSpline(bool) override { note("setIsSpline"); }
    void setKeyframable(bool, bool) override { note("setKeyframable"); }
    void keyframesWithChannels(TempusRange, KeyframesByChannel&) override { note("keyframesWithChannels"); }
    void addKeypointAt(Tempus const&) override { note("addKeypointAt"); }
    void deleteKeypointAt(Tempus const&) override { note("deleteKeypointAt"); }
    Tempus moveKeypointTo(Tempus const&, Tempus const& to, bool, bool) override {
        note("moveKeypointTo");
        return to;
    }
    void retimeKeypoints(double, Tempus const&) override { note("retimeKeypoints"); }
    void adjustToFrameDuration(Tempus const&) override { note("adjustToFrameDuration"); }
    void setInterpolation(unsigned) override { note("setInterpolation"); }
    void scaleFadeHandles(double) override { note("scaleFadeHandles"); }
    void deleteKeypoints(Tempus const&, Tempus const&) override { note("deleteKeypoints"); }

    bool isModified(bool) const override { return answer; }
    bool isSpline() const override { return answer; }
    bool isKeyframable() const override { return answer; }
    bool hasFadeHandles() const override { return answer; }
    bool hasMoreThanOneKeypoint() const override { return answer; }
    bool hasKeypoints(unsigned mask) const override { return answer && mask == 0; }
    bool hasKeypointAt(Tempus const&, unsigned mask) const override { return answer && mask == 0; }
    bool allHaveKeypointsAt(Tempus const&) const override { return answer; }
    unsigned int numberOfKeypointsAt(Tempus const&) const override { return answer ? 1 : 0; }

    bool answer = false;
    bool lockedFromParent = false;
    static inline std::string log;

private:
    void note(char const* operation) const { log += std::string(operation) + ":" + getName().str() + " "; }
};

TEST(KFChannelFolder, PassesEachOperationToTheChildrenItIsFor) {
    KFChannelFolder folder("Folder", nullptr, 1, 0, 0);
    Probe plain(&folder, "p", 1), hidden(&folder, "h", 2, kChannelFlagHidden);
    Probe notRetimed(&folder, "n", 3, kChannelFlagNotRetimed);
    Probe kept(&folder, "k", 4, kChannelFlagKeepOnFolderReset);
    Probe both(&folder, "b", 5, kChannelFlagHidden | kChannelFlagNotRetimed);
    using Folder = KFChannelFolder;
    struct {
        char const* operation;
        char const* reached;
        void (*call)(Folder&);
    } const rows[] = {
        {"finishInitializing", "phnkb", [](Folder& f) { f.finishInitializing(); }},
        {"setDefaultToCurrentValue", "phnkb", [](Folder& f) { f.setDefaultToCurrentValue(); }},
        {"copyKeyframesFromChannel", "phnkb", [](Folder& f) { f.copyKeyframesFromChannel(s(1), &f); }},
        {"undoWillReplace", "phnkb", [](Folder& f) { f.undoWillReplace(); }},
        {"undoDidReplace", "phnkb", [](Folder& f) { f.undoDidReplace(); }},
        {"bake", "phnkb",
         [](Folder& f) {
             f.bake({s(0), s(1)}, s(1));
         }},
        {"simplify", "phnkb", [](Folder& f) { f.simplify(s(0), s(1), s(1), 0.0, 0, 0, false); }},
        {"setExtrapolation", "phnkb", [](Folder& f) { f.setExtrapolation(0, 0); }},
        {"generateKeys", "phnkb", [](Folder& f) { f.generateKeys(0, 0); }},
        {"adjustToFrameDuration", "phnkb", [](Folder& f) { f.adjustToFrameDuration(s(1, 24)); }},
        {"lockFromParent", "pnk", [](Folder& f) { f.lock(false, false); }},
        {"lockFromParent", "pnk", [](Folder& f) { f.lockFromParent(false, false); }},
        {"setIsSpline", "pnk", [](Folder& f) { f.setIsSpline(true); }},
        {"setInterpolation", "pnk", [](Folder& f) { f.setInterpolation(1); }},
        {"addKeypointAt", "pnk", [](Folder& f) { f.addKeypointAt(s(1)); }},
        {"deleteKeypointAt", "pnk", [](Folder& f) { f.deleteKeypointAt(s(1)); }},
        {"deleteKeypoints", "pnk", [](Folder& f) { f.deleteKeypoints(s(1), s(2)); }},
        {"scaleFadeHandles", "pnk", [](Folder& f) { f.scaleFadeHandles(2.0); }},
        {"moveKeypointTo", "pnk", [](Folder& f) { f.moveKeypointTo(s(1), s(2), false, false); }},
        {"keyframesWithChannels", "pnk",
         [](Folder& f) {
             Folder::KeyframesByChannel out;
             f.keyframesWithChannels({s(0), s(1)}, out);
         }},
        {"beginPlayback", "pnk", [](Folder& f) { f.beginPlayback(s(1), 0, 0, s(1)); }},
        {"endPlayback", "pnk", [](Folder& f) { f.endPlayback(s(1)); }},
        {"beginRecording", "pnk", [](Folder& f) { f.beginRecording(s(1)); }},
        {"endRecording", "pnk", [](Folder& f) { f.endRecording(s(1)); }},
        {"updateCurrentRecordingTime", "pnk", [](Folder& f) { f.updateCurrentRecordingTime(s(1)); }},
        {"registerRecordingCallback", "pnk",
         [](Folder& f) { f.registerRecordingCallback(nullptr, nullptr, false); }},
        {"unregisterRecordingCallback", "pnk",
         [](Folder& f) { f.unregisterRecordingCallback(nullptr, nullptr); }},
        {"setKeyframable", "pnk", [](Folder& f) { f.setKeyframable(true, false); }},
        {"setKeyframable", "phnkb", [](Folder& f) { f.setKeyframable(true, true); }},
        {"retimeKeypoints", "phk", [](Folder& f) { f.retimeKeypoints(2.0, s(1)); }},
        {"reset", "phnb", [](Folder& f) { f.resetToDefault(true); }},
    };
    for (auto const& row : rows) {
        std::string expected;
        for (char const* name = row.reached; *name != 0; ++name) {
            expected += std::string(row.operation) + ":" + *name + " ";
        }
        Probe::log.clear();
        row.call(folder);
        EXPECT_EQ(Probe::log, expected);
    }
    EXPECT_TRUE(folder.testFlag(kChannelFlagInitialized));
}

TEST(KFChannelFolder, KeepsChildrenOfALockedFolderLocked) {
    KFChannelFolder top("Top", nullptr, 1, 0, 0), lower("Lower", &top, 2, 0, 0);
    Probe child(&lower, "c", 1);
    top.lock(true, true);
    EXPECT_TRUE(top.isLocked(false) && child.lockedFromParent);
    EXPECT_FALSE(lower.isLocked(false));
    lower.lockFromParent(false, true);
    EXPECT_TRUE(child.lockedFromParent);
    lower.lockFromParent(false, false);
    EXPECT_FALSE(child.lockedFromParent);
}

TEST(KFChannelFolder, ReachesAllSiblingsWhenAResetCallbackChangesTheList) {
    RecordingRoot root;
    KFChannelFolder folder("Folder", &root, 2, 0, 0);
    Probe a(&folder, "a", 1), b(&folder, "b", 2), c(&folder, "c", 3);
    auto const leave = [](KFChannelBase* channel, void*) { channel->getParent()->removeDescendant(channel); };
    a.setResetCallback(leave, nullptr, false);
    c.setResetCallback(leave, nullptr, false);
    root.takeAnnounced();
    Probe::log.clear();
    folder.resetToDefault(true);
    EXPECT_EQ(Probe::log, "reset:a reset:b reset:c ");
    EXPECT_EQ(folder.getNumberOfDescendants(), 1U);
    EXPECT_EQ(root.takeAnnounced().size(), 1U); // silent or not
}

TEST(KFChannelFolder, AnswersForItsVisibleChildren) {
    KFChannelFolder folder("Folder", nullptr, 1, 0, 0);
    auto const answers = [&folder] {
        KFChannelFolder const& f = folder;
        return std::vector<bool>{f.isSpline(),
                                 f.isKeyframable(),
                                 f.hasMoreThanOneKeypoint(),
                                 f.hasFadeHandles(),
                                 f.hasKeypoints(0),
                                 f.hasKeypointAt(s(1), 0),
                                 f.allHaveKeypointsAt(s(1)),
                                 f.hasOnlyOneKeypointAt(s(1)),
                                 f.isModified(true)};
    };
    std::vector<bool> const none{false, false, false, false, false, false, false, true, false};
    EXPECT_EQ(answers(), none);
    Probe hidden(&folder, "h", 1, kChannelFlagHidden), a(&folder, "a", 2, kChannelFlagDisabled),
        b(&folder, "b", 3);
    hidden.answer = true;
    EXPECT_EQ(answers(), (std::vector<bool>{false, false, false, false, false, false, false, true, true}));
    a.answer = true;
    EXPECT_EQ(answers(), (std::vector<bool>{true, true, true, true, true, true, false, true, true}));
    unsigned const mask = kChannelFlagDisabled;
    EXPECT_FALSE(folder.hasKeypoints(mask) || folder.hasKeypointAt(s(1), mask));
    b.answer = true;
    EXPECT_EQ(answers(), (std::vector<bool>{true, true, true, true, true, true, true, false, true}));
    EXPECT_TRUE(folder.hasKeypoints(mask) && folder.hasKeypointAt(s(1), mask));
    EXPECT_EQ(folder.numberOfKeypointsAt(s(1)), 2U);

    folder.setFlag(kChannelFlagHidden, false);
    EXPECT_FALSE(folder.isModified(true));
    EXPECT_TRUE(folder.isModified(false));
    folder.setFoldFlag(kFoldFlagModifiedIsEnabled);
    folder.enable(false, false);
    EXPECT_FALSE(folder.isModified(false));
    EXPECT_FALSE(folder.saveWhenAtDefaultState());
    hidden.setFlag(kChannelFlagSaveWhenAtDefault, false);
    EXPECT_TRUE(folder.saveWhenAtDefaultState());
}

TEST(KFChannelFolder, KeepsAMovedKeypointFromPassingItsNeighbours) {
    RecordingRoot root;
    KFChannelFolder folder("Folder", &root, 2, 0, 0);
    KFChannelDouble a("a", &folder, 1, 0), b("b", &folder, 2, 0), hidden("h", &folder, 3, kChannelFlagHidden);
    a.addKeypointAt(s(1));
    b.addKeypointAt(s(3));
    hidden.addKeypointAt(s(2));
    Tempus t = s(1);
    EXPECT_TRUE(folder.nextKeypoint(&t, 0));
    EXPECT_EQ(t, s(3));
    EXPECT_FALSE(folder.nextKeypoint(&t, 0));
    t = s(9);
    EXPECT_TRUE(folder.previousKeypoint(&t, 0));
    EXPECT_EQ(t, s(3));
    t = s(9);
    b.setFlag(kChannelFlagDisabled, true);
    EXPECT_TRUE(folder.previousKeypoint(&t, kChannelFlagDisabled));
    EXPECT_EQ(t, s(1));

    struct {
        Tempus from, to, result;
    } const moves[] = {
        {s(1), s(5), s(89, 30)},
        {s(89, 30), s(0), s(0)},
        {s(3), s(-1), s(1, 30)},
        {s(0), s(0), s(0)},
    };
    for (auto const& move : moves) {
        EXPECT_EQ(folder.moveKeypointTo(move.from, move.to, false, false), move.result);
        EXPECT_TRUE(folder.hasKeypointAt(move.result, 0)) << TempusGetSeconds(move.result);
    }
    EXPECT_TRUE(hidden.hasKeypointAt(s(2), 0));
    root.removeDescendant(&folder);
    EXPECT_EQ(folder.moveKeypointTo(s(0), s(1), false, false), s(1, 30)); // no frame without a root
}

// The list --------------------------------------------------------------------------------------------------

/// What the list should be, and a plain scan over it.
struct ListModel {
    std::vector<KFChannelBase*> list;
    void remove(KFChannelBase* child) {
        auto const found = std::find(list.begin(), list.end(), child);
        if (found != list.end()) {
            list.erase(found);
        }
    }
    KFChannelBase* find(unsigned id) const {
        auto const found = std::find_if(list.begin(), list.end(), [id](auto* c) { return c->getID() == id; });
        return found != list.end() ? *found : nullptr;
    }
};

TEST(KFChannelFolder, KeepsItsOrderAndFindsTheFirstChildOfAnID) {
    unsigned const seed = std::random_device()();
    SCOPED_TRACE("seed " + std::to_string(seed));
    std::mt19937 random(seed);
    auto const below = [&random](unsigned n) { return static_cast<unsigned>(random() % n); };

    KFChannelFolder folders[2] = {{"A", nullptr, 1, 0, 0}, {"B", nullptr, 2, 0, 0}};
    ListModel models[2];
    std::deque<Probe> children;
    for (unsigned i = 0; i < 120; ++i) {
        children.emplace_back(nullptr, "c", below(70));
    }
    for (int step = 0; step < 6000; ++step) {
        unsigned const which = below(10) == 0 ? 1 : 0;
        KFChannelFolder& folder = folders[which];
        auto& list = models[which].list;
        KFChannelBase* const child = &children[below(120)];
        KFChannelBase* const anchor = &children[below(120)];
        unsigned const operation = below(1000);
        bool const isListed = std::find(list.begin(), list.end(), child) != list.end();
        if (operation < 600 && (!isListed || below(20) == 0)) {
            for (int i = 0; i < 2; ++i) {
                if (child->getParent() == &folders[i] && i != static_cast<int>(which)) {
                    models[i].remove(child);
                }
            }
            auto const place = std::find(list.begin(), list.end(), anchor);
            switch (operation % 4) {
            case 0:
                list.push_back(child), folder.push_back(child);
                break;
            case 1:
                list.insert(list.begin(), child), folder.push_front(child);
                break;
            case 2:
                list.insert(place, child), folder.insertDescendantBefore(anchor, child);
                break;
            default:
                list.insert(place == list.end() ? list.begin() : place + 1, child);
                folder.insertDescendantAfter(anchor, child);
            }
            ASSERT_EQ(child->getParent(), &folder);
        } else if (operation < 750) {
            models[which].remove(child);
            folder.removeDescendant(child);
        } else if (operation < 998) {
            // Beyond its parent nobody hears of a new ID, and a child taken out by one entry has no parent.
            bool const isHeard = std::none_of(folders, folders + 2, [&](KFChannelFolder const& f) {
                return child->getParent() == nullptr && f.hasDescendant(child);
            });
            if (isHeard) {
                child->setID(below(70));
            }
        } else {
            list.clear();
            folder.removeAllDescendants(true);
        }
        for (int i = 0; i < 2; ++i) {
            ASSERT_TRUE(folders[i].getDescendants() == nullptr ||
                        *folders[i].getDescendants() == models[i].list);
            for (unsigned id = 0; id < 70; ++id) {
                ASSERT_EQ(folders[i].getDescendant(id), models[i].find(id)) << step;
            }
        }
    }
}

TEST(KFChannelFolder, ListsItsChildren) {
    KFChannelFolder a("A", nullptr, 1, 0, 0), b("B", nullptr, 2, 0, 4);
    EXPECT_EQ(a.getDescendants(), nullptr);
    ASSERT_NE(b.getDescendants(), nullptr);
    a.push_back(nullptr);
    EXPECT_EQ(a.getDescendants(), nullptr);
    Probe first(&a, "f", 1), second(&a, "s", 2);
    first.setFlag(kChannelFlagHidden, true);
    EXPECT_EQ(a.getNumberOfVisibleDescendants(), 1U);
    b.push_back(&first); // moves it
    EXPECT_EQ(a.getNumberOfDescendants(), 1U);
    b.removeAllDescendants(false);
    EXPECT_EQ(first.getParent(), &b);
    a.removeAllDescendants(true);
    EXPECT_EQ(second.getParent(), nullptr);
    EXPECT_NE(a.getDescendants(), nullptr);

    KFChannelFolder top("Top", nullptr, 20000, 0, 0), below("Below", &top, 20001, 0, 0);
    RecordingRoot object("Object", 3, &top);
    KFChannelDouble x("x", &below, 1, 0), y("y", &object, 2, kChannelFlagHidden);
    Probe noValue(&below, "n", 3);
    std::vector<unsigned> ids;
    top.getDescendantObjects(&ids);
    EXPECT_EQ(ids, (std::vector<unsigned>{20000, 20001, 20001}));
    EXPECT_TRUE(top.hasDescendant(&x));
    EXPECT_FALSE(below.hasDescendant(&y) || below.hasDescendant(&below));
    auto const flattened = [&top](KFChannelFlags mask, bool stopAtRoots) {
        std::vector<KFChannelBase*> out;
        top.getAllDescendantsFlattened(out, mask, stopAtRoots);
        return out;
    };
    EXPECT_EQ(flattened(0, false), (std::vector<KFChannelBase*>{&x, &y}));
    EXPECT_EQ(flattened(0, true), (std::vector<KFChannelBase*>{&x}));
    EXPECT_EQ(flattened(kChannelFlagHidden, false), (std::vector<KFChannelBase*>{&x}));
    below.setFlag(kChannelFlagHidden, true);
    EXPECT_TRUE(flattened(kChannelFlagHidden, false).empty());
}

TEST(KFChannelFolder, AnnouncesChangesOfItsStateFlags) {
    RecordingRoot root;
    KFChannelFolder folder("Folder", &root, 2, 0, 0);
    folder.setFoldFlag(kFoldNonStateFlags);
    EXPECT_TRUE(root.takeAnnounced().empty());
    EXPECT_FALSE(folder.isStateModified());
    folder.setFoldFlag(kFoldFlagLinked | 1);
    EXPECT_TRUE(folder.isStateModified());
    EXPECT_EQ(root.takeAnnounced().size(), 1U);
    folder.saveStateAsDefault();
    EXPECT_EQ(folder.getDefaultFoldFlags(), kFoldFlagLinked);
    EXPECT_FALSE(folder.isStateModified());
    folder.resetFoldFlag(kFoldFlagLinked);
    folder.setFoldFlags(kFoldFlagChildrenNotSaved);
    EXPECT_EQ(root.takeAnnounced().size(), 2U);
    EXPECT_EQ(folder.getFoldFlags(), kFoldFlagChildrenNotSaved);
}

// Copies and counterparts -----------------------------------------------------------------------------------

TEST(KFChannelFolder, ComparesAndAssignsPairByPair) {
    KFChannelFolder a("F", nullptr, 1, 0, 0), b("f", nullptr, 1, 0, 0);
    EXPECT_FALSE(a == b); // without lists
    EXPECT_TRUE(a.allowsAssignment(&b));
    EXPECT_FALSE(a.allowsAssignment(&a) || a.allowsAssignment(nullptr));
    a.allocateDescendants();
    EXPECT_FALSE(a.allowsAssignment(&b) || b.allowsAssignment(&a) || a == b);
    b.allocateDescendants();
    EXPECT_TRUE(a == b && a.allowsAssignment(&b));
    KFChannelDouble ax("x", &a, 1, 0), bx("other", &b, 2, 0);
    EXPECT_TRUE(a == b);
    bx.setInitialValue(4.0, true);
    EXPECT_FALSE(a == b);
    a.assign(&b);
    EXPECT_EQ(ax.getInitialValue(), 4.0);
    bx.setInitialValue(5.0, true);
    static_cast<KFChannelBase&>(a).setValue(static_cast<KFChannelBase const&>(b));
    EXPECT_EQ(ax.getInitialValue(), 5.0);
    Probe extra(&b, "e", 3);
    EXPECT_FALSE(a == b || a.allowsAssignment(&b));
    bx.setInitialValue(6.0, true);
    a.assign(&b);
    EXPECT_EQ(ax.getInitialValue(), 5.0);
    b.setFoldFlags(kFoldFlagChildrenNotSaved);
    a.copy(&b, true);
    EXPECT_EQ(a.getFoldFlags(), kFoldFlagChildrenNotSaved);
    EXPECT_EQ(ax.getInitialValue(), 5.0);
    std::unique_ptr<KFChannelBase> const copy(b.clone());
    EXPECT_TRUE(copy->testFlag(kChannelFlagIsFolder));
    EXPECT_EQ(static_cast<KFChannelFolder&>(*copy).getNumberOfDescendants(), 0U);
}

/// A compound with two components.
struct Pair : KFCompoundChannel {
    Pair(char const* name, KFChannelFolder* parent, unsigned id)
        : KFCompoundChannel(nullptr, name, parent, id, 0, false, 2) {}
    KFChannelDouble x{"X", this, 1, 0};
    KFChannelDouble y{"Y", this, 2, 0};
};

TEST(KFChannelFolder, FindsTheCounterpartOfAChannelFromElsewhere) {
    RecordingRoot root;
    KFChannelFolder above("Above", &root, 2, 0, 0), folder("Folder", &above, 3, 0, 0);
    KFChannelDouble sameID("Opacity", &folder, 7, 0), sameName("y", &folder, 8, 0);
    Pair size("Size", &folder, 9), position("Position", &folder, 10);

    KFChannelDouble plain("Y", nullptr, 7, 0), byID("none", nullptr, 8, 0), unknown("none", nullptr, 99, 0);
    EXPECT_EQ(root.findMatchingDescendant(&plain), &sameName); // the name before the ID
    EXPECT_EQ(root.findMatchingDescendant(&byID), &sameName);
    EXPECT_EQ(root.findMatchingDescendant(&unknown), nullptr);

    Pair pasted("POSITION", nullptr, 10);
    EXPECT_EQ(root.findMatchingDescendant(&pasted), &position);
    EXPECT_EQ(root.findMatchingDescendant(&pasted.y), &position.y);
    EXPECT_EQ(size.findMatchingDescendant(&pasted), &size); // allows the assignment itself

    EXPECT_EQ(position.getFullDisplayName().str(), "Folder.Position");
    KFChannelDouble named("folder.position.Y", nullptr, 1, 0), elsewhere("Other.Y", nullptr, 99, 0);
    EXPECT_EQ(root.findMatchingDescendant(&named), &position.y);
    EXPECT_EQ(root.findMatchingDescendant(&elsewhere), nullptr);
    above.removeDescendant(&folder);
    KFChannelDouble shortName("Position.X", nullptr, 99, 0);
    EXPECT_EQ(folder.findMatchingDescendant(&shortName), &position.x);
    EXPECT_EQ(shortName.getName().str(), "Position.X");
}

} // namespace
