#pragma once

#include "lumenkey/Channels/KFChannelFolder.h"

class KFChannel;

/// A folder that behaves as one value of several components, such as a position.
///
/// With the fold flag `kFoldFlagLinked` an edit of one component is an edit of all, so that all have
/// keypoints at the same times: a component hands its edit to its linked compound, which clears the flag,
/// does the operation on every component, announces itself and sets the flag again.
class LUMENKEY_API KFCompoundChannel : public KFChannelFolder {
public:
    /// Sets the fold flags 0xF. The bool is the host's and plays no part.
    KFCompoundChannel(KFFactory* factory, BXString const& name, KFChannelFolder* parent, unsigned int id,
                      unsigned int flags, bool unused, unsigned int capacity);
    KFCompoundChannel(KFFactory* factory, BXString const& name, unsigned int id, unsigned int capacity);
    /// Without children.
    KFCompoundChannel(KFCompoundChannel const& other);
    KFCompoundChannel(KFCompoundChannel const& other, KFChannelFolder* parent);
    ~KFCompoundChannel() override;

    char const* getFacadeWrapperName() override;
    bool isCompoundChannel() const override;
    void copy(KFChannelBase const* other, bool silent) override;
    bool compare(KFChannelBase const* other) const override;
    KFChannelBase* clone() const override;
    /// Marks its own class alone, which makes its children. Those of others that it may have are marked by
    /// `createChannelState`; who writes in another way marks them too, else they can't be read anew.
    void markFactoriesForSerialization(BXSerializerWriteStream& stream, bool all) override;
    void willBeModified(unsigned int kind) override;
    bool hasOnlyOneKeypointAt(Tempus const& t) const override;
    unsigned int numberOfKeypointsAt(Tempus const& t) const override;
    using KFChannelFolder::setValue;

    // Slots behind those of KFChannelFolder. An index outside the list or a null child does nothing, unless
    // the operation is for all children alike. Children that have no value are passed by, apart from compounds
    // in `remove...`.

    /// False, and nothing, here.
    virtual bool setKeypointInterpolation(KFChannel* child, void* handle, unsigned int type, bool force);
    virtual void setCurveInterpolation(unsigned int type);

    /// Sets one component, by its place in the list; the others are keyed at `t` if linked.
    virtual void setValue(unsigned int index, Tempus const& t, double value);
    /// Keys the component, or all if linked, at its current value.
    virtual void setValue(unsigned int index, Tempus const& t);
    /// What a component of a linked compound hands over.
    virtual void setValue(KFChannel* child, Tempus const& t, double value);

    // Linked edits, which reach all children if the compound is linked or `force` is set, and the given one
    // alone else. `force` leaves the compound linked.
    virtual void compoundAddKeypointAt(KFChannel* child, Tempus const& t, bool force);
    /// The others follow to where the child's keypoint came to stand. Answers `to` for a linked edit, else
    /// what the child answers.
    virtual Tempus compoundMoveKeypointTo(KFChannel* child, Tempus const& from, Tempus const& to, bool a,
                                          bool b, bool force);
    virtual void compoundDeleteKeypointAt(KFChannel* child, Tempus const& t, bool force);
    virtual void compoundReset(KFChannel* child, bool force);
    virtual void compoundSetIsSpline(KFChannel* child, bool on, bool force);

    // Removal at `t` from one component, or from all if linked or no index is given.
    /// Whether the component at the index had a keypoint there.
    virtual bool removeValue(unsigned int index, Tempus const& t);
    /// Whether any had one.
    virtual bool removeValue(Tempus const& t);
    virtual void removeAllValues(Tempus const& t, unsigned int index);
    virtual void removeAllValues(Tempus const& t);

private:
    bool isLinked() const noexcept { return testFoldFlag(kFoldFlagLinked); }
    /// Null behind the end.
    KFChannelBase* childAt(unsigned int index) const noexcept;
    /// Keys each value child but `except` at its current value.
    void keyChildren(KFChannelBase const* except, Tempus const& t);
    template <class Edit> void editUnlinked(Edit const& edit);
    /// The operation on all children if linked or forced, else on the child alone.
    template <class Operation> void editLinked(KFChannel* child, bool force, Operation const& operation);
};
