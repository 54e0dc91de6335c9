#pragma once

#include "lumenkey/Channels/KFChannelFolder.h"

class KFChannel;

/// The folder at the top of one object's channels: it has the object's offset and extent in time, and is what
/// every channel below talks to about the host. The host derives from it and overrides what it needs.
///
/// Ownership and threads are those of the folder. Null in a copy, assignment or comparison does nothing, or
/// gives false.
class LUMENKEY_API KFChannelObjectRootBase : public KFChannelFolder {
public:
    KFChannelObjectRootBase(KFFactory* factory, BXString const& name, KFChannelFolder* parent,
                            unsigned int id, unsigned int flags, unsigned int capacity);
    KFChannelObjectRootBase(KFFactory* factory, BXString const& name, unsigned int id, unsigned int capacity);
    /// With the class's own factory.
    KFChannelObjectRootBase(BXString const& name, KFChannelFolder* parent, unsigned int id,
                            unsigned int flags, unsigned int capacity);
    /// Without children.
    KFChannelObjectRootBase(KFChannelObjectRootBase const& other);
    KFChannelObjectRootBase(KFChannelObjectRootBase const& other, KFChannelFolder* parent);
    ~KFChannelObjectRootBase() override;

    char const* getFacadeWrapperName() override;
    void copy(KFChannelBase const* other, bool silent) override;
    bool compare(KFChannelBase const* other) const override;
    KFChannelBase* clone() const override;
    /// Takes the name too, and as internal name the other's internal name, or its name where it has none.
    void assign(KFChannelBase const* other) override;
    Tempus getTimeOffset() const override;
    Tempus globalToLocalTime(Tempus const& t) const override;
    Tempus localToGlobalTime(Tempus const& t) const override;
    using KFChannelFolder::globalToLocalTime;
    using KFChannelFolder::localToGlobalTime;
    /// The time of the object and its state in front of what a folder writes.
    void writeBody(BXSerializerWriteStream& stream, bool full, bool children, bool all) override;
    bool parseBegin(BXSerializerReadStream& stream) override;
    /// Locks a root that the document has locked, now that its children have been read.
    bool parseEnd(BXSerializerReadStream& stream) override;
    /// Time and state are taken without an announcement of data. The flags above the low word end up clear,
    /// unless the document stands alone.
    bool parseElement(BXSerializerReadStream& stream, BXStreamElement& element) override;
    /// Also multiplies the start and the duration of the extent.
    void adjustToFrameDuration(Tempus const& frameDuration) override;

    // Slots behind those of KFChannelFolder: what the library asks and tells the host -----------------------

    virtual BXTimeRange getTimeExtent() const;
    virtual BXTimeRange getTimeExtentForChannel(KFChannelBase const* channel) const;
    virtual void channelValueWillBeSet(KFChannel* channel, Tempus const& t, double value);
    virtual void didBeginRecording(KFChannelBase* channel, Tempus const& t);
    virtual void didEndRecording(KFChannelBase* channel, Tempus const& t);
    virtual void addToUndo(KFChannelBase const* channel, BXString const& text) const;
    virtual void rootUndoDidReplace(KFChannelBase* channel);
    virtual void rootUndoWillReplace(KFChannelBase* channel);
    /// A channel below is about to change; `kind` is `kModifyData` or `kModifyState`.
    virtual void willModifyChannel(KFChannelBase* channel, unsigned int kind);
    virtual bool wasChannelModified(KFChannelBase* channel, bool* out);
    /// Whether any channel of the object is soloed.
    virtual bool checkSolo();
    /// Whether the first value set on a channel, at `t`, is to leave the old one in a keypoint at the start
    /// of the extent.
    virtual bool shouldAddKeypointAt0(Tempus const& t);
    virtual bool isChannelAffectedByBehaviors(KFChannelBase const* channel, bool selectedOnly) const;
    virtual bool isChannelAffectedBySelectedBehaviors(KFChannelBase const* channel) const;
    virtual bool isChannelRigged(KFChannelBase const* channel);
    virtual bool isObjectSelected();
    virtual void* getManipulator() const;
    virtual Tempus getCurrentTime(bool local);
    virtual BXTimeRange getGlobalTimeRange();
    virtual unsigned int getDefaultParameterColorSpaceID() const;
    virtual unsigned int getWorkingGamut() const;
    virtual Tempus getFrameDuration() const;
    using KFChannelFolder::addToUndo;

    // Time of the object ------------------------------------------------------------------------------------

    /// Unless silent announces `kModifyData`.
    void setTimeOffset(Tempus const& offset, bool silent);
    /// Unless silent announces `kModifyData`. Fades below keep their share of the extent; they stay as they
    /// are where the new duration is no finite multiple of the old one, as when the old one was zero or infinite.
    void setTimeExtent(BXTimeRange const& range, bool silent);
    /// Whether documents hold the extent; true at first.
    bool writesTimeRange() const noexcept { return _writesTimeRange; }
    void setWritesTimeRange(bool writes) noexcept { _writesTimeRange = writes; }

    // Documents ---------------------------------------------------------------------------------------------

    /// What `writeBody` writes, without children; the two last arguments aren't used.
    void serializeSelfOnly(BXSerializerWriteStream& stream, bool full, bool all);
    /// Marks what a reader can't make up by itself: the folders below whose children aren't fixed by their
    /// class.
    void markChannelFactoriesForSerialization(BXSerializerWriteStream& stream);
    /// The same below a folder; null does nothing. Roots below it are passed by.
    void markVaryingFolderFactoriesForSerialization(KFChannelFolder* folder, BXSerializerWriteStream& stream);
    /// A digest of the root itself; the time has no effect.
    void calcHashForStateSelfOnly(BXSerializerWriteStream& stream, Tempus const& t);

    /// `assign`.
    KFChannelObjectRootBase& operator=(KFChannelObjectRootBase const& other);
    bool operator==(KFChannelObjectRootBase const& other) const { return compare(&other); }

private:
    void writeTiming(BXSerializerWriteStream& stream) const;
    void writeState(BXSerializerWriteStream& stream) const;
    void parseTiming(BXSerializerReadStream const& stream, BXStreamElement const& element);

    Tempus _timeOffset = kTempusZero;
    BXTimeRange _timeExtent{kTempusZero, kTempusZero};
    bool _writesTimeRange = true;
    bool _locksAfterParse = false;
};
