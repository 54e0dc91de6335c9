#pragma once

#include "lumenkey/Channels/KFCompoundChannel.h"
#include "lumenkey/Channels/KFScalarChannels.h"
#include "lumenkey/foundation/BXVector3.h"

// The plain vector compounds. Their components are members with the IDs 1, 2, 3 and the names of the bundle's texts
// "Channel X", "Channel Y", "Channel Z".
//
// Constructors give the records, or null for the components' own, to every component. A shared record is used as it
// is; of a local one the first component becomes the owner, and each further one gets a copy. `capacity` is the number
// of children for which the list makes room. The forms with a factory and a parent are for derived classes. Copies have
// copies of the components. `copy` takes over the components that the other has too if it is of these classes.
//
// Setting goes component by component, x first: each announces itself, obeys its own lock, and hands its write to the
// compound while that is linked.

// The part that is alike in all of them.
#define KF_VECTOR_CHANNEL_BODY(Channel, components)                                                          \
public:                                                                                                      \
    static constexpr unsigned int kNumberOfComponents = components;                                          \
    Channel(BXString const& name, KFChannelFolder* parent, unsigned int id, unsigned int flags,              \
            unsigned int capacity = components, KFChannelImpl* impl = nullptr,                               \
            KFChannelInfo* info = nullptr);                                                                  \
    Channel(KFFactory* factory, BXString const& name, unsigned int id, unsigned int capacity,                \
            KFChannelImpl* impl = nullptr, KFChannelInfo* info = nullptr);                                   \
    Channel(KFFactory* factory, BXString const& name, KFChannelFolder* parent, unsigned int id,              \
            unsigned int flags, unsigned int capacity, KFChannelImpl* impl = nullptr,                        \
            KFChannelInfo* info = nullptr);                                                                  \
    Channel(Channel const& other);                                                                           \
    Channel(Channel const& other, KFChannelFolder* parent);                                                  \
    ~Channel() override;                                                                                     \
    char const* getFacadeWrapperName() override;                                                             \
    void copy(KFChannelBase const* other, bool silent) override;                                             \
    KFChannelBase* clone() const override;                                                                   \
    using KFCompoundChannel::setValue

class LUMENKEY_API KFChannel2D : public KFCompoundChannel {
    KF_VECTOR_CHANNEL_BODY(KFChannel2D, 2);
    /// With names of its own for the components.
    KFChannel2D(BXString const& xName, BXString const& yName, BXString const& name, KFChannelFolder* parent,
                unsigned int id, unsigned int flags, unsigned int capacity = kNumberOfComponents,
                KFChannelImpl* impl = nullptr, KFChannelInfo* info = nullptr);

    /// Each component by itself, then the components are aligned: where one has a keypoint from curve time
    /// `a` to `b` and the other has none, the other is keyed at its value. In the mode
    /// `KFCurve::kSimplifyToExtremes` what stays instead are the keypoints in front of `a`, behind `b`, at
    /// both ends, and those where the path turns: where `y` over `x` goes from rising to falling or back. The
    /// one behind a removed keypoint isn't looked at. Before that the compound is keyed (`addKeypointAt`)
    /// where not all components have keypoints.
    void simplify(Tempus const& a, Tempus const& b, Tempus const& step, double percent, unsigned int mode1,
                  unsigned int mode2, bool clampToCoarse) override;

    // Slots behind those of KFCompoundChannel. In curve time, on x and y; a component that is locked or has no
    // keypoint at `t` stays as it is.

    /// Handles of length 0 on both sides, which are joined. Announces nothing.
    virtual void flattenAtTime(Tempus const& t);
    /// Announces each component that it changes.
    virtual void setLinearAtTime(Tempus const& t);

    /// Gives the keypoints at curve time `t` handles along the path of x and y together; keys a component that has
    /// none there at its value. Uses the previous and next keypoint of either component, and announces nothing.
    void deriveChannel(Tempus const& t);
    void setValue(Tempus const& t, double xValue, double yValue, bool silent);
    /// So that the values behind the processing nodes become these. All is read before anything is written.
    void setValueOffsetByBehaviors(Tempus const& t, double xValue, double yValue);

    KFChannelDouble x;
    KFChannelDouble y;
};

/// `flattenAtTime` and `setLinearAtTime` are for x and y alone here.
class LUMENKEY_API KFChannel3D : public KFChannel2D {
    KF_VECTOR_CHANNEL_BODY(KFChannel3D, 3);
    using KFChannel2D::simplify;

    /// The slot behind those of KFChannel2D: nothing here.
    virtual void simplify(double a, double b, double step, unsigned int mode, bool unused);

    /// Nothing: a path in space isn't derived.
    void deriveChannel(Tempus const& t);
    /// Announces each component.
    void setValue(Tempus const& t, double xValue, double yValue, double zValue);
    /// As in KFChannel2D.
    void setValueOffsetByBehaviors(Tempus const& t, double xValue, double yValue, double zValue);
    /// At global time `t`; `input` goes to the processing nodes. Outputs may be null.
    void getValue(Tempus const& t, double* xValue, double* yValue, double* zValue, double input) const;

    KFChannelDouble z;
};

/// Three switches, such as one for each axis. A component is on where its value isn't 0.
class LUMENKEY_API KFChannelBool3D : public KFCompoundChannel {
    KF_VECTOR_CHANNEL_BODY(KFChannelBool3D, 3);

    // At global time `t`; `input` goes to the processing nodes. Outputs may be null. As a vector, on is 1 and off 0.
    bool getX(Tempus const& t, double input) const;
    bool getY(Tempus const& t, double input) const;
    bool getZ(Tempus const& t, double input) const;
    void getValue(Tempus const& t, bool* xOn, bool* yOn, bool* zOn, double input) const;
    void getValue(Tempus const& t, BXVector3<double>* value, double input) const;
    // Each announces what it sets.
    void setX(Tempus const& t, bool on);
    void setY(Tempus const& t, bool on);
    void setZ(Tempus const& t, bool on);
    void setValue(Tempus const& t, bool xOn, bool yOn, bool zOn);
    void setValue(Tempus const& t, BXVector3<double> const& value);
    void setDefaultValue(bool xOn, bool yOn, bool zOn);

    KFChannelBool x;
    KFChannelBool y;
    KFChannelBool z;
};

#undef KF_VECTOR_CHANNEL_BODY
