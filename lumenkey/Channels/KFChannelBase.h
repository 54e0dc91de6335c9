#pragma once

#include "lumenkey/Channels/KFChannelFlags.h"
#include "lumenkey/Channels/KFChannelRef.h"
#include "lumenkey/Channels/KFFactoryBase.h"
#include "lumenkey/Channels/KFKeyframeInfo.h"
#include "lumenkey/foundation/BXExport.h"
#include "lumenkey/foundation/BXSerializer.h"
#include "lumenkey/foundation/BXString.h"
#include "lumenkey/foundation/Tempus.h"

#include <array>
#include <cstdint>
#include <map>
#include <memory>
#include <utility>
#include <vector>

class BXURL;
class KFChannel;
class KFChannelFolder;
class KFChannelObjectRootBase;
class KFChannelTimeConverter;
class KFResetCallbackDataTable;
class KWChannelBase;

/// A node of the parameter tree: a parameter, a folder of parameters or an object root.
///
/// It has an identity (a 32-bit ID, unique among the children of one folder, and a name), a place (one parent
/// folder), a flag word, a factory that says which class it is, a route from global to local time, and the
/// protocol by which every change is announced. It holds no value: what only makes sense for a value or for
/// children is declared here with a neutral result, so that any node can be asked.
///
/// Ownership: a node belongs to whoever made it; a folder only lists its children. Whoever destroys a child
/// of a folder that lives on first calls `removeDescendant`. The factory, the parent and the time converter
/// aren't owned.
///
/// Threads: a tree is changed by one thread at a time and nothing of it is locked, apart from the ID
/// generator, which is atomic, and the table of reset callbacks.
///
/// Hosts derive from the classes of the tree: the order of the virtual operations is the interface.
class LUMENKEY_API KFChannelBase : public KFFactoryBase, public BXSerializer {
public:
    using RecordingCallback = void (*)(KFChannelBase*, Tempus const&, void*);
    using ResetCallback = void (*)(KFChannelBase*, void*);
    using ResetCallbackDataTable = KFResetCallbackDataTable;
    using KeyframesByChannel = std::vector<std::pair<KFChannel*, std::vector<_KFKeyframeInfo>>>;
    using KeyframesByRef = std::map<KFChannelRef, std::vector<_KFKeyframeInfo>>;
    /// How `writeFlags` writes.
    enum WriteFlagType { kWriteFlagsAsAttribute = 0, kWriteFlagsAsElement = 1 };

    /// Enters the parent's list unless the parent is null. Bit 4 is added to the flags; bits 32 and up start
    /// clear.
    KFChannelBase(KFFactory* factory, BXString const& name, KFChannelFolder* parent, unsigned int id,
                  unsigned int flags);
    KFChannelBase(KFFactory* factory, BXString const& name, unsigned int id);
    /// Factory, ID, flags and default flags as they stand, names, controller names and time converter;
    /// without parent and wrapper. The bits that say which class a node is of are set by that class's
    /// constructors only.
    KFChannelBase(KFChannelBase const& other);
    /// The same, at the end of the parent's list.
    KFChannelBase(KFChannelBase const& other, KFChannelFolder* parent);
    ~KFChannelBase() override;

    // Slots -------------------------------------------------------------------------------------------------

    // Of KFFactoryBase.
    unsigned int getInstanceID() const override;
    BXSerializer* getSerializer() override;

    /// To be called on the top node when a tree has been built: from now on a changed default counts as a
    /// change.
    virtual void finishInitializing();
    /// Name of the facade's class for this one.
    virtual char const* getFacadeWrapperName();
    /// Announces `kModifyState`, then writes bit 2. The second argument has no effect here.
    virtual void lock(bool on, bool passDown);
    /// Unless silent announces `kModifyState`; then writes bit 15.
    virtual void enable(bool on, bool silent);
    virtual bool isObjectRef() const;
    virtual bool isCompoundChannel() const;

    /// The present state flags become the default ones.
    virtual void saveStateAsDefault();
    virtual void setDefaultToCurrentValue();
    /// Whether the channel is written although nothing differs from its default: bit 32.
    virtual bool saveWhenAtDefaultState() const;
    virtual bool isStateModified();

    // Takes. Nothing here.
    virtual void beginPlayback(Tempus const& t, unsigned int scope, unsigned int mode,
                               Tempus const& resolution);
    virtual void endPlayback(Tempus const& t);
    virtual void beginRecording(Tempus const& t);
    virtual void endRecording(Tempus const& t);
    virtual void updateCurrentRecordingTime(Tempus const& t);
    virtual void registerRecordingCallback(RecordingCallback function, void* context, bool wantsWrapper);
    virtual void unregisterRecordingCallback(RecordingCallback function, void* context);

    virtual BXString getRangeName();
    virtual void setRangeName(BXString const& name);

    // Copies. `copy` takes identity and content and sets bit 6; `assign` takes content and leaves the
    // identity and bit 6. Neither announces anything, changes what class a node is (bits 12 and 13), or does
    // anything for null.
    virtual void copy(KFChannelBase const* other, bool silent);
    /// Equal IDs, flags and names, these regardless of case. False for null.
    virtual bool compare(KFChannelBase const* other) const;
    /// A copy without parent, which the caller owns.
    virtual KFChannelBase* clone() const;
    virtual void assign(KFChannelBase const* other);
    /// False for this node itself.
    virtual bool allowsAssignment(KFChannelBase const* other);
    virtual bool allowsDrag(KFChannelBase const* other);
    virtual void resetToDefault(bool silent);
    /// The host's callback, if one is set, and nothing else; else `resetToDefault`. Nothing once the table of
    /// callbacks is gone.
    virtual void reset(bool silent);
    virtual void lockFromParent(bool on, bool passDown);
    virtual void copyKeyframesFromChannel(Tempus const& t, KFChannelBase* other);
    virtual void setValue(KFChannelBase const& other);

    // The route of time: by whatever comes first on the way up, a time converter or an object root's offset
    // (a root asks no converter of its own). Without either, times are the same and the offset is zero.
    virtual Tempus getTimeOffset() const;
    virtual Tempus globalToLocalTime(Tempus const& t) const;
    virtual Tempus localToGlobalTime(Tempus const& t) const;

    /// Passes on to the nearest object root.
    virtual void addToUndo(BXString const& text) const;
    virtual void undoWillReplace();
    virtual void undoDidReplace();

    virtual void bake(BXTimeRange const& range, Tempus const& step);
    virtual void simplify(Tempus const& a, Tempus const& b, Tempus const& step, double percent,
                          unsigned int mode1, unsigned int mode2, bool clampToCoarse);
    virtual void setExtrapolation(unsigned int mode, unsigned int which);
    virtual void generateKeys(unsigned int first, unsigned int second);

    // Of BXSerializer, with the digest of the state and the state blob.
    //
    // A document is written by `markFactoriesForSerialization`, `KFFactories::saveFactories`, `writeHeader`,
    // `writeBody` and the end of the element, in this order. Reading keeps what it finds: the flags of a
    // class, children that the document doesn't mention, and what it can't read stays as it was. A locked
    // node is read like any other.
    void writeHeader(BXSerializerWriteStream& stream, bool full) override;
    void writeBody(BXSerializerWriteStream& stream, bool full, bool children, bool all) override;
    void markFactoriesForSerialization(BXSerializerWriteStream& stream, bool all) override;
    bool parseBegin(BXSerializerReadStream& stream) override;
    bool parseEnd(BXSerializerReadStream& stream) override;
    bool parseElement(BXSerializerReadStream& stream, BXStreamElement& element) override;
    /// A digest of what is seen at `t`; names, IDs and keypoints don't enter.
    virtual void calcHashForState(BXSerializerWriteStream& stream, Tempus const& t);
    /// Reads a document into this channel, which takes its ID; false where it is broken or holds no channel.
    /// What was read until then stays. So do names of children, whatever the document says, and what it doesn't
    /// say, but for fades: children, keypoints where its curve has none, limits and ways to go on that are as
    /// usual in it. Only in a channel made anew is all as it was written. The numbers that an earlier document
    /// gave to factories on this thread are forgotten.
    virtual bool configureWithState(BXData const& state);

    /// Announces a change before it is made, to the nearest object root; nothing without one.
    virtual void willBeModified(unsigned int kind);
    /// What the nearest object root answers; false without one. The library never asks.
    virtual bool hasBeenModified(bool* out);

    virtual void setIsSpline(bool on);
    virtual bool isSpline() const;
    virtual bool isModified(bool skipHidden) const;
    virtual void setKeyframable(bool on, bool force);
    virtual bool isKeyframable() const;

    // Gathering of keypoints, in a range of global time (its start and end included). With neighbours the lists also
    // hold the keypoint in front and the one behind, the former, in `keypoints`, behind one at the start, which then
    // stands in the list twice. Records have their channel's curve time; references are relative to this node, and an
    // entry that is in `out` already is replaced. Hidden children give no records.
    virtual std::vector<Tempus> keypoints(TempusRange range, bool withNeighbours, unsigned int mask);
    virtual std::vector<Tempus> visibleKeypoints(TempusRange range, bool withNeighbours, unsigned int mask);
    virtual void keyframesWithChannels(TempusRange range, KeyframesByChannel& out);
    virtual void keyframesWithChannelRef(TempusRange range, KeyframesByRef& out);

    // Keypoints, in global time.
    virtual bool hasKeypoints(unsigned int mask) const;
    virtual bool hasMoreThanOneKeypoint() const;
    virtual bool hasKeypointAt(Tempus const& t, unsigned int mask) const;
    virtual bool allHaveKeypointsAt(Tempus const& t) const;
    virtual bool hasOnlyOneKeypointAt(Tempus const& t) const;
    virtual unsigned int numberOfKeypointsAt(Tempus const& t) const;
    virtual void addKeypointAt(Tempus const& t);
    virtual void deleteKeypointAt(Tempus const& t);
    /// The time at which the keypoint then stands; `to` here.
    virtual Tempus moveKeypointTo(Tempus const& from, Tempus const& to, bool a, bool b);
    virtual bool previousKeypoint(Tempus* t, unsigned int mask) const;
    virtual bool nextKeypoint(Tempus* t, unsigned int mask) const;
    virtual void retimeKeypoints(double factor, Tempus const& t);
    virtual void adjustToFrameDuration(Tempus const& frameDuration);
    virtual void setInterpolation(unsigned int type);
    virtual bool hasFadeHandles() const;
    virtual void scaleFadeHandles(double factor);
    virtual void deleteKeypoints(Tempus const& from, Tempus const& to);
    /// Moves the keypoints from `start` to `end`; the offset by which it did, zero if there were none. With `constrain`
    /// the offset is lowered to what leaves `gap` to the neighbour ahead; `a` and it go to `moveKeypointTo`.
    virtual Tempus offsetKeyframesInRange(Tempus const& start, Tempus const& end, Tempus const& offset,
                                          Tempus const& gap, bool a, bool constrain);
    /// Whether the ID generator passes this node and what lies below by.
    virtual bool shouldIgnoreDynamicIDs() const;

    // Identity ----------------------------------------------------------------------------------------------

    unsigned int getID() const noexcept { return _id; }
    /// Without an announcement; the parent's look-up by ID follows.
    void setID(unsigned int id);
    BXString const& getName() const noexcept { return _name; }
    /// Unless silent announces `kModifyData`. Flags are untouched.
    void setName(BXString const& name, bool silent);
    void setNameUnset(bool unset) noexcept;
    /// Null until `setInternalName`, which always announces `kModifyData`.
    BXString const* getInternalName() const noexcept { return _internalName.get(); }
    void setInternalName(BXString const& name);
    /// `Root.Folder.Compound.name`, in which only the name is always there: the compound if the parent is
    /// one; the folder above unless it or what stands above it is missing or a root without bit 26, unless
    /// the text so far holds the nearest root's name, and never in a tree without a root; and what stands
    /// above the folder, if that has bit 26.
    BXString getFullDisplayName() const;

    // Names of the host's controller classes; null for none. They are shared by the process and never freed.
    char const* getLabelCtlrClassName() const noexcept;
    char const* getParameterCtlrClassName() const noexcept;
    char const* getInspectorCtlrClassName() const noexcept;
    void setLabelCtlrClassName(char const* name);
    void setParameterCtlrClassName(char const* name);
    void setInspectorCtlrClassName(char const* name);

    // Flags -------------------------------------------------------------------------------------------------

    KFChannelFlags getFlags() const noexcept { return _flags; }
    KFChannelFlags getDefaultFlags() const noexcept { return _defaultFlags; }
    /// Set or clear bits; announce `kModifyState` first if the mask touches a state bit and not silent.
    void setFlag(KFChannelFlags mask, bool silent);
    void resetFlag(KFChannelFlags mask, bool silent);
    /// Replaces the word; announces `kModifyState` first if the new one holds a state bit.
    void setFlags(KFChannelFlags flags);
    /// Whether any bit of the mask is set.
    bool testFlag(KFChannelFlags mask) const noexcept { return (_flags & mask) != 0; }
    bool testDefaultFlag(KFChannelFlags mask) const noexcept { return (_defaultFlags & mask) != 0; }

    bool isLocked(bool checkAncestors) const noexcept;
    bool isAnyAncestorLocked() const noexcept;
    bool isAnyAncestorDisabled() const noexcept;
    bool isAnyAncestorSolo() const noexcept;
    /// With `honourSolo`, on a soloable channel under a root that has a soloed channel, solo decides; else
    /// bit 15 of this node, and of the ancestors if asked.
    bool isEnabled(bool checkAncestors, bool honourSolo) const;
    bool isDisabled(bool checkAncestors, bool unused) const noexcept;
    bool isSolo() const noexcept { return testFlag(kChannelFlagSolo); }
    /// Announces `kModifyState`; nothing on a channel that isn't soloable.
    void solo(bool on);
    /// Sets bit 20 on each soloable node from here (or the parent) to the top of the tree.
    void setChildSolo(bool skipSelf) noexcept;

    // Place -------------------------------------------------------------------------------------------------

    KFChannelFolder* getParent() const noexcept { return _parent; }
    /// Whether this is a `KFChannel`, so that walks over many nodes needn't cast to find out.
    bool isValueChannel() const noexcept { return _isValueChannel; }
    /// Leaves another parent's list first and stores the new one; false if it had another.
    bool registerParent(KFChannelFolder* parent);
    /// False if there was none.
    bool unregisterParent(KFChannelFolder* parent) noexcept;
    /// A node is no descendant of itself.
    bool isDescendantOf(KFChannelFolder const& folder) const noexcept;
    /// The nearest object root, starting with this node; null for none.
    KFChannelObjectRootBase* getChannelRootBase() const noexcept;
    KFChannelObjectRootBase* getChannelRoot() const noexcept { return getChannelRootBase(); }
    /// The topmost object root on the way up.
    KFChannelObjectRootBase* getAncestorRootBase() const noexcept;
    void* getObjectManipulator() const;
    /// From the nearest root, if asked and there is one; else from the top of the tree.
    KFChannelRef getRef(bool relativeToRoot) const;

    // Time --------------------------------------------------------------------------------------------------

    /// Of the nearest root; 1/30 s without one.
    Tempus getFrameDuration() const;
    void setTimeConverterDelegate(KFChannelTimeConverter* converter) noexcept { _timeConverter = converter; }
    KFChannelTimeConverter* getTimeConverterDelegate() const noexcept { return _timeConverter; }
    static Tempus globalToLocalTime(Tempus const& t, Tempus const& offset);
    static Tempus localToGlobalTime(Tempus const& t, Tempus const& offset);

    // Keyframes ---------------------------------------------------------------------------------------------

    /// Pastes what `keyframesWithChannelRef` gathered, with the channels' offsets to each other and the earliest
    /// keypoint of all at curve time `t`. With `clear` each channel first loses its keypoints over that stretch,
    /// but for one at `t` itself. Entries that don't lead to a value channel are passed by.
    void setKeyframesWithChannelRef(Tempus const& t, Tempus const& unused, KeyframesByRef const& keyframes,
                                    bool clear);

    // State ---------------------------------------------------------------------------------------------------

    /// The channel as a document of its own, in a blob; with `children` those of a folder, with `all` also
    /// those that are at their defaults. What lies deeper than documents are read (`BXXMLWriteStream`) isn't
    /// in it. Not beside changes of the tree.
    BXData createChannelState(bool children, bool all);
    /// Reads such a document from a file, as `configureWithState` does, but keeps the ID.
    bool configureWithURL(BXURL const& url);
    /// A digest of the state of the channel and all that lies below it, names and IDs included: equal for
    /// equal state. Flags that aren't state, defaults and children that stay out of documents don't enter,
    /// nor the value of a channel with bit 7.
    std::array<std::uint8_t, 16> getHash();

    // The ID generator. Any thread.
    static unsigned int getNextUniqueID() noexcept;
    /// The ID that will be handed out next.
    static unsigned int getLastUsedUniqueID() noexcept;
    /// Raises the generator above `id`; IDs from `kFirstForeignChannelID` up are ignored.
    static void updateIDGenerator(unsigned int id) noexcept;
    /// The same for all that lies below the folder, except below nodes with `shouldIgnoreDynamicIDs`.
    static void updateIDGenerator(KFChannelFolder const& folder);

    // Reset callbacks ---------------------------------------------------------------------------------------

    /// What `reset` calls instead of resetting, with this channel and the context. `wantsWrapper` asks for
    /// the facade's object in place of the channel; where no facade has made one, the channel itself is
    /// given. A null function removes the entry. Takes the table's spin lock, except to remove from an empty
    /// table.
    void setResetCallback(ResetCallback function, void* context, bool wantsWrapper);
    /// False if there is none; outputs may be null.
    bool getResetCallback(ResetCallback* function, void** context, bool* wantsWrapper) const;
    /// The table of all entries, made on first use; null once it is gone.
    static ResetCallbackDataTable* getResetCallbackDataTable();
    static void invalidateResetCallbackDataTable() noexcept;
    /// False once the table is gone; true before its first use.
    static bool isResetCallbackDataTableValid() noexcept;

    // The facade's object for this channel; null while the facade hasn't made one.
    KWChannelBase* getFacadeWrapper() const noexcept { return _wrapper; }

    bool operator==(KFChannelBase const& other) const { return compare(&other); }
    bool operator!=(KFChannelBase const& other) const { return !compare(&other); }
    /// `assign`, if `allowsAssignment` says yes.
    KFChannelBase& operator=(KFChannelBase const& other);

protected:
    /// Nothing for a word of 0. Into a digest go the state bits, into a document all but bit 6.
    void writeFlags(BXSerializerWriteStream& stream, WriteFlagType type) const;
    /// The flag word, without an announcement: for constructors.
    void storeFlags(KFChannelFlags flags) noexcept { _flags = flags; }
    /// For `KFChannel` alone, while it is one.
    void setValueChannel(bool on) noexcept { _isValueChannel = on; }
    /// Of the keypoints from `from` to `to`, both in global time, in ascending order.
    std::vector<Tempus> keypointTimesInRange(Tempus const& from, Tempus const& to) const;
    /// Without an announcement.
    void storeInternalName(BXString const& name);

private:
    void enterParent(KFChannelFolder* parent);
    void copyNames(KFChannelBase const& other);
    void copyControllerNames(KFChannelBase const& other) noexcept;

    unsigned int _id;
    bool _isValueChannel = false;
    BXString _name;
    std::unique_ptr<BXString> _internalName;
    KFChannelFolder* _parent = nullptr;
    KFChannelFlags _flags;
    KFChannelFlags _defaultFlags = 0;
    KWChannelBase* _wrapper = nullptr;
    BXString const* _labelCtlrClassName = nullptr;
    BXString const* _parameterCtlrClassName = nullptr;
    BXString const* _inspectorCtlrClassName = nullptr;
    KFChannelTimeConverter* _timeConverter = nullptr;
};
