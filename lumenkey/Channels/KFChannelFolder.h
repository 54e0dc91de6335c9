#pragma once

#include "lumenkey/Channels/KFChannelBase.h"

#include <cstddef>
#include <memory>

class KFChildIndex;

/// An inner node of the tree: an ordered list of children, for which it answers together and to which it
/// passes most operations on.
///
/// The folder owns the list and never the children: composites hold theirs as members, and every other child
/// belongs to whoever made it, who removes it (`removeDescendant`) before destroying it. The destructor
/// leaves the children's parents as they are.
///
/// Cost: appending, and looking up a child by ID, don't depend on the number of children (beyond 32 of them
/// an index is kept); inserting and removing are linear in it. An index relies on children telling of a new
/// ID through their parent, so a listed child's parent must be this folder.
///
/// A child may change the list while an operation is passed on: the operation goes on behind that child and
/// reaches each one that is listed when its turn comes.
///
/// Null: a null child or channel does nothing, gives null, or false.
///
/// Threads: one thread changes a tree; any number may look children up and ask questions as long as none
/// changes it.
class LUMENKEY_API KFChannelFolder : public KFChannelBase {
public:
    KFChannelFolder(KFFactory* factory, BXString const& name, KFChannelFolder* parent, unsigned int id,
                    unsigned int flags, unsigned int capacity);
    KFChannelFolder(KFFactory* factory, BXString const& name, unsigned int id, unsigned int capacity);
    /// With the class's own factory.
    KFChannelFolder(BXString const& name, KFChannelFolder* parent, unsigned int id, unsigned int flags,
                    unsigned int capacity);
    /// Without children.
    KFChannelFolder(KFChannelFolder const& other);
    KFChannelFolder(KFChannelFolder const& other, KFChannelFolder* parent);
    ~KFChannelFolder() override;

    // Of KFChannelBase --------------------------------------------------------------------------------------

    void finishInitializing() override;
    char const* getFacadeWrapperName() override;
    /// Also locks or unlocks the visible children, as `lockFromParent`.
    void lock(bool on, bool checkAncestors) override;
    void saveStateAsDefault() override;
    void setDefaultToCurrentValue() override;
    bool saveWhenAtDefaultState() const override;
    bool isStateModified() override;
    void beginPlayback(Tempus const& t, unsigned int scope, unsigned int mode,
                       Tempus const& resolution) override;
    void endPlayback(Tempus const& t) override;
    void beginRecording(Tempus const& t) override;
    void endRecording(Tempus const& t) override;
    void updateCurrentRecordingTime(Tempus const& t) override;
    void registerRecordingCallback(RecordingCallback function, void* context, bool wantsWrapper) override;
    void unregisterRecordingCallback(RecordingCallback function, void* context) override;
    void copy(KFChannelBase const* other, bool silent) override;
    bool compare(KFChannelBase const* other) const override;
    KFChannelBase* clone() const override;
    void assign(KFChannelBase const* other) override;
    bool allowsAssignment(KFChannelBase const* other) override;
    void resetToDefault(bool silent) override;
    /// Leaves this folder's own lock. Visible children are locked if `on`, or if this folder (with
    /// `checkAncestors` also one above it) is locked; else unlocked.
    void lockFromParent(bool on, bool checkAncestors) override;
    void copyKeyframesFromChannel(Tempus const& t, KFChannelBase* other) override;
    void setValue(KFChannelBase const& other) override;
    void undoWillReplace() override;
    void undoDidReplace() override;
    void bake(BXTimeRange const& range, Tempus const& step) override;
    void simplify(Tempus const& a, Tempus const& b, Tempus const& step, double percent, unsigned int mode1,
                  unsigned int mode2, bool clampToCoarse) override;
    void setExtrapolation(unsigned int mode, unsigned int which) override;
    void generateKeys(unsigned int first, unsigned int second) override;
    /// Children that stay out of documents (bit 3) aren't written, without `all` also those that are at their
    /// defaults.
    void writeBody(BXSerializerWriteStream& stream, bool full, bool children, bool all) override;
    void markFactoriesForSerialization(BXSerializerWriteStream& stream, bool all) override;
    bool parseBegin(BXSerializerReadStream& stream) override;
    bool parseEnd(BXSerializerReadStream& stream) override;
    /// A child is the one of that ID, else a new one by its factory, which then belongs to whoever owns the
    /// others; without either the element is passed over.
    bool parseElement(BXSerializerReadStream& stream, BXStreamElement& element) override;
    void calcHashForState(BXSerializerWriteStream& stream, Tempus const& t) override;
    void setIsSpline(bool on) override;
    bool isSpline() const override;
    bool isModified(bool skipHidden) const override;
    void setKeyframable(bool on, bool force) override;
    bool isKeyframable() const override;
    void keyframesWithChannels(TempusRange range, KeyframesByChannel& out) override;
    bool hasKeypoints(unsigned int mask) const override;
    bool hasMoreThanOneKeypoint() const override;
    bool hasKeypointAt(Tempus const& t, unsigned int mask) const override;
    bool allHaveKeypointsAt(Tempus const& t) const override;
    bool hasOnlyOneKeypointAt(Tempus const& t) const override;
    unsigned int numberOfKeypointsAt(Tempus const& t) const override;
    void addKeypointAt(Tempus const& t) override;
    void deleteKeypointAt(Tempus const& t) override;
    /// Keeps the keypoint from passing its neighbours, a frame apart.
    Tempus moveKeypointTo(Tempus const& from, Tempus const& to, bool a, bool b) override;
    bool previousKeypoint(Tempus* t, unsigned int mask) const override;
    bool nextKeypoint(Tempus* t, unsigned int mask) const override;
    void retimeKeypoints(double factor, Tempus const& t) override;
    void adjustToFrameDuration(Tempus const& frameDuration) override;
    void setInterpolation(unsigned int type) override;
    bool hasFadeHandles() const override;
    void scaleFadeHandles(double factor) override;
    void deleteKeypoints(Tempus const& from, Tempus const& to) override;

    // The slot behind those of KFChannelBase.
    /// Walks the tree for classes that override it; changes no flag here.
    virtual void resetTimeIndependentFlagIfNeeded(bool downward, bool upward);

    // Children ----------------------------------------------------------------------------------------------

    /// Appends. Null does nothing. A child of another folder leaves that one; a child of this folder is
    /// listed twice.
    void push_back(KFChannelBase* child);
    void push_front(KFChannelBase* child);
    /// At the end if the anchor is null or no child of this folder.
    void insertDescendantBefore(KFChannelBase const* anchor, KFChannelBase* child);
    /// At the front if the anchor is null or no child of this folder.
    void insertDescendantAfter(KFChannelBase const* anchor, KFChannelBase* child);
    /// Takes the first entry of the child out of the list and clears its parent. Nothing if it isn't listed.
    void removeDescendant(KFChannelBase* child);
    /// Empties the list; with `detach` the children's parents are cleared.
    void removeAllDescendants(bool detach);
    void allocateDescendants();

    /// The first child with that ID; null for none. Children of children aren't searched.
    KFChannelBase* getDescendant(unsigned int id) const;
    /// Anywhere below.
    bool hasDescendant(KFChannelBase const* channel) const;
    /// Null until the first child or a capacity. The list changes with the folder.
    std::vector<KFChannelBase*> const* getDescendants() const noexcept { return _descendants.get(); }
    std::size_t getNumberOfDescendants() const noexcept;
    unsigned int getNumberOfVisibleDescendants() const noexcept;
    /// IDs from 10000 up: this folder's, then each child's, and those below child folders (whose own so come
    /// twice).
    void getDescendantObjects(std::vector<unsigned int>* out) const;
    /// The value channels below without a bit of `mask`, passing by folders with one. With `stopAtRoots`,
    /// object roots among the direct children are passed by too.
    void getAllDescendantsFlattened(std::vector<KFChannelBase*>& out, KFChannelFlags mask,
                                    bool stopAtRoots) const;

    // The counterpart, below this folder, of a channel from elsewhere, such as a pasted one.
    /// This folder itself if it allows the assignment; else the best match below: equal name and ID, then
    /// equal name, then equal ID. A component is looked for in the counterpart of its compound. A channel
    /// without parent whose name reads `Compound.component` or `Folder.Compound.component` is looked for in
    /// the compound of that full name.
    KFChannelBase* findMatchingDescendant(KFChannelBase const* channel);
    /// Fills empty slots with channels that allow the assignment: by index, 1 for an equal ID plus 2 for an
    /// equal name. `slots` has room for four.
    void findMatchingDescendant(KFChannelBase const* channel, KFChannelBase** slots);
    /// The first compound below with that full display name, regardless of case.
    KFChannelBase* findMatchingCompoundChannel(BXString const& fullDisplayName);

    // Fold flags: set, add, clear. Announce `kModifyData` first if the argument has a state bit.
    void setFoldFlags(std::uint32_t flags);
    void setFoldFlag(std::uint32_t mask);
    void resetFoldFlag(std::uint32_t mask);
    bool testFoldFlag(std::uint32_t mask) const noexcept { return (_foldFlags & mask) != 0; }
    std::uint32_t getFoldFlags() const noexcept { return _foldFlags; }
    std::uint32_t getDefaultFoldFlags() const noexcept { return _defaultFoldFlags; }

    /// A child's ID has changed: what `KFChannelBase::setID` tells its parent.
    void descendantIDChanged(KFChannelBase* child, unsigned int oldID);

protected:
    /// Calls `visit(KFChannelBase&)` for each child in list order. A visit may change the list.
    template <class Visit> void forEachChild(Visit const& visit) const;
    /// The same without hidden children.
    template <class Visit> void forEachVisibleChild(Visit const& visit) const;
    /// Whether a child, in list order, answers true to `question(KFChannelBase const&)`.
    template <class Question> bool anyChild(Question const& question) const;
    template <class Question> bool anyVisibleChild(Question const& question) const;
    void storeFoldFlags(std::uint32_t flags) noexcept { _foldFlags = flags; }

private:
    KFChannelBase* childForElement(BXStreamElement const& element);
    void parseChild(BXSerializerReadStream& stream, BXStreamElement& element);
    void insertAt(std::size_t position, KFChannelBase* child);
    std::size_t positionOf(KFChannelBase const* child) const noexcept;
    /// Where a walk goes on that visited `child` at `position`, in front of `next`. Either may be gone.
    std::size_t positionBehind(KFChannelBase const* child, KFChannelBase const* next,
                               std::size_t position) const noexcept;
    bool comesFirst(KFChannelBase const* child, KFChannelBase const* other) const noexcept;
    void buildIndex();
    /// Changes the index; without memory for that there is none, and the list is searched.
    template <class Change> void tryOnIndex(Change const& change) noexcept;
    void enterIndex(KFChannelBase* child, std::size_t position);
    void leaveIndex(KFChannelBase const* child, unsigned int id, unsigned int count, std::size_t oldPosition);
    /// The other's children, if it is a folder with as many as this one; null else, and for folders without a
    /// list.
    std::vector<KFChannelBase*> const* matchingList(KFChannelBase const& other) const noexcept;

    std::unique_ptr<std::vector<KFChannelBase*>> _descendants;
    std::unique_ptr<KFChildIndex> _index; // the first child of each ID, once there are many children
    std::uint32_t _foldFlags = 0;
    std::uint32_t _defaultFoldFlags = 0;
};

template <class Visit> void KFChannelFolder::forEachChild(Visit const& visit) const {
    for (std::size_t i = 0; i < getNumberOfDescendants();) {
        KFChannelBase* const child = (*_descendants)[i];
        KFChannelBase const* const next = i + 1 < _descendants->size() ? (*_descendants)[i + 1] : nullptr;
        visit(*child);
        i = positionBehind(child, next, i);
    }
}

template <class Visit> void KFChannelFolder::forEachVisibleChild(Visit const& visit) const {
    forEachChild([&visit](KFChannelBase& child) {
        if (!child.testFlag(kChannelFlagHidden)) {
            visit(child);
        }
    });
}

template <class Question> bool KFChannelFolder::anyChild(Question const& question) const {
    for (std::size_t i = 0; i < getNumberOfDescendants(); ++i) {
        if (question(*(*_descendants)[i])) {
            return true;
        }
    }
    return false;
}

template <class Question> bool KFChannelFolder::anyVisibleChild(Question const& question) const {
    return anyChild([&question](KFChannelBase const& child) {
        return !child.testFlag(kChannelFlagHidden) && question(child);
    });
}
