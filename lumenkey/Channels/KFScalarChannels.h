#pragma once

#include "lumenkey/Channels/KFChannel.h"
#include "lumenkey/Channels/KFChannelImpl.h"
#include "lumenkey/Channels/KFChannelInfo.h"
#include "lumenkey/foundation/BXSingleton.h"

// The scalar types: the leaves of the tree. Each is a `KFChannel` with nothing of its own but a factory and the two
// records that all channels of the class share; the records' numbers stand in one table, in KFScalarChannels.cpp.
//
//     class                 curve            keyframable   default and initial   unit
//     KFChannelDouble       KFCurveDouble    yes           0
//     KFChannelAngle        KFCurveAngle     yes           0                     radians, shown in degrees
//     KFChannelShearAngle   KFCurveAngle     yes           0                     radians, shown in degrees
//     KFChannelPercent      KFCurvePercent   yes           1, 0.5 or 0           a fraction, shown in percent
//     KFChannelUint32       KFCurveInt       yes           0
//     KFChannelUint16       KFCurveInt       yes           0
//     KFChannelBool         KFCurveBool      no            0 or 1
//     KFChannelSeed         KFCurveEnum      no            0
//     KFChannelDecibel      KFCurveDouble    yes           0                     dB
//     KFChannelFrame        KFCurveDouble    yes           0
//     KFChannelTimecode     KFCurveDouble    yes           0
//     KFChannelAspectRatio, KFChannelAspectRatioFootage
//                           KFCurveDouble    no            1
//     KFChannelGammaFootage KFCurveDouble    no            0
//     KFChannelProgress     KFCurveDouble    no            0
//     KFChannelChrono       as KFChannelDouble
//
// Constructors take the records to use, or null for the class's own, which are made on first use by any thread. A
// record that is given is used as it is: a shared one is never freed, a local one belongs to the channel.

#define KF_DECLARE_CLASS_INFO(Channel)                                                                       \
    class LUMENKEY_API Channel##Info : public KFChannelInfo, public BXSingleton {                            \
    public:                                                                                                  \
        static Channel##Info& getInstance();                                                                 \
                                                                                                             \
    private:                                                                                                 \
        Channel##Info();                                                                                     \
        ~Channel##Info() override;                                                                           \
        template <class T> friend T& BXSingletonInstance();                                                  \
    }
#define KF_DECLARE_CLASS_IMPL(Channel)                                                                       \
    class LUMENKEY_API Channel##Impl : public KFChannelImpl, public BXSingleton {                            \
    public:                                                                                                  \
        static Channel##Impl& getInstance();                                                                 \
                                                                                                             \
    private:                                                                                                 \
        Channel##Impl();                                                                                     \
        ~Channel##Impl() override;                                                                           \
        template <class T> friend T& BXSingletonInstance();                                                  \
    }

// The part that is alike in all of them: the named and the factory form, copies, the records.
#define KF_SCALAR_CHANNEL_BODY(Channel)                                                                      \
public:                                                                                                      \
    Channel(BXString const& name, KFChannelFolder* parent, unsigned int id, unsigned int flags,              \
            KFChannelImpl* impl = nullptr, KFChannelInfo* info = nullptr);                                   \
    Channel(KFFactory* factory, BXString const& name, unsigned int id, KFChannelImpl* impl = nullptr,        \
            KFChannelInfo* info = nullptr);                                                                  \
    Channel(Channel const& other);                                                                           \
    Channel(Channel const& other, KFChannelFolder* parent);                                                  \
    Channel& operator=(Channel const& other);                                                                \
    ~Channel() override;                                                                                     \
    char const* getFacadeWrapperName() override;                                                             \
    KFChannelBase* clone() const override;                                                                   \
    static KFChannelInfo* create##Channel##Info()

#define KF_DECLARE_SCALAR_CHANNEL(Channel)                                                                   \
    KF_DECLARE_CLASS_INFO(Channel);                                                                          \
    KF_DECLARE_CLASS_IMPL(Channel);                                                                          \
    class LUMENKEY_API Channel : public KFChannel {                                                          \
        KF_SCALAR_CHANNEL_BODY(Channel);                                                                     \
        static KFChannelImpl* create##Channel##Impl();                                                       \
    }

KF_DECLARE_SCALAR_CHANNEL(KFChannelUint32);
KF_DECLARE_SCALAR_CHANNEL(KFChannelUint16);
KF_DECLARE_SCALAR_CHANNEL(KFChannelSeed);
KF_DECLARE_SCALAR_CHANNEL(KFChannelDecibel);
KF_DECLARE_SCALAR_CHANNEL(KFChannelFrame);
KF_DECLARE_SCALAR_CHANNEL(KFChannelTimecode);
KF_DECLARE_SCALAR_CHANNEL(KFChannelAspectRatio);
KF_DECLARE_SCALAR_CHANNEL(KFChannelAspectRatioFootage);
KF_DECLARE_SCALAR_CHANNEL(KFChannelGammaFootage);

// The forms from a value set it as default and as initial value; those with a factory and a parent are for derived
// classes.
#define KF_SCALAR_CHANNEL_FORM(Channel, first)                                                               \
    Channel(first, BXString const& name, KFChannelFolder* parent, unsigned int id, unsigned int flags,       \
            KFChannelImpl* impl = nullptr, KFChannelInfo* info = nullptr)

KF_DECLARE_CLASS_INFO(KFChannelDouble);
KF_DECLARE_CLASS_IMPL(KFChannelDouble);
class LUMENKEY_API KFChannelDouble : public KFChannel {
    KF_SCALAR_CHANNEL_BODY(KFChannelDouble);
    KF_SCALAR_CHANNEL_FORM(KFChannelDouble, KFFactory* factory);
    KF_SCALAR_CHANNEL_FORM(KFChannelDouble, double value);
    static KFChannelImpl* createKFChannelDoubleImpl();
    /// A new curve, which the caller owns.
    static KFCurve* createKFChannelDoubleCurve(double value);
};

KF_DECLARE_CLASS_INFO(KFChannelAngle);
KF_DECLARE_CLASS_IMPL(KFChannelAngle);
class LUMENKEY_API KFChannelAngle : public KFChannel {
    KF_SCALAR_CHANNEL_BODY(KFChannelAngle);
    KF_SCALAR_CHANNEL_FORM(KFChannelAngle, KFFactory* factory);
    KF_SCALAR_CHANNEL_FORM(KFChannelAngle, double value);
    static KFChannelImpl* createKFChannelAngleImpl();
    static KFCurve* createKFChannelAngleCurve(double value);
};

KF_DECLARE_CLASS_INFO(KFChannelShearAngle);
KF_DECLARE_CLASS_IMPL(KFChannelShearAngle);
class LUMENKEY_API KFChannelShearAngle : public KFChannel {
    KF_SCALAR_CHANNEL_BODY(KFChannelShearAngle);
    KF_SCALAR_CHANNEL_FORM(KFChannelShearAngle, double value);
    static KFChannelImpl* createKFChannelShearAngleImpl();
};

/// Its class has three records, so that the usual values need no local one: the named form and that with factory
/// and parent start at 1, the factory form at 0, the form from a value at the nearest record's and then at the value.
KF_DECLARE_CLASS_INFO(KFChannelPercent);
class LUMENKEY_API KFChannelPercent : public KFChannel {
    KF_SCALAR_CHANNEL_BODY(KFChannelPercent);
    KF_SCALAR_CHANNEL_FORM(KFChannelPercent, KFFactory* factory);
    KF_SCALAR_CHANNEL_FORM(KFChannelPercent, double value);
    static KFChannelImpl* createKFChannelPercent100Impl();
    static KFChannelImpl* createKFChannelPercent50Impl();
    static KFChannelImpl* createKFChannelPercent0Impl();
};

/// Its class has two records, one for each value.
KF_DECLARE_CLASS_INFO(KFChannelBool);
class LUMENKEY_API KFChannelBool : public KFChannel {
    KF_SCALAR_CHANNEL_BODY(KFChannelBool);
    KF_SCALAR_CHANNEL_FORM(KFChannelBool, KFFactory* factory);
    KF_SCALAR_CHANNEL_FORM(KFChannelBool, int value);
    static KFChannelImpl* createKFChannelBoolTrueImpl();
    static KFChannelImpl* createKFChannelBoolFalseImpl();
    static KFCurve* createKFChannelBoolCurve(double value);
};

/// How far a task of the host is; never saved, and without limits. The form from a value takes no notice of it.
KF_DECLARE_CLASS_INFO(KFChannelProgress);
KF_DECLARE_CLASS_IMPL(KFChannelProgress);
class LUMENKEY_API KFChannelProgress : public KFChannel {
public:
    KFChannelProgress(BXString const& name, KFChannelFolder* parent, unsigned int id, unsigned int flags);
    KFChannelProgress(KFFactory* factory, BXString const& name, unsigned int id,
                      KFChannelImpl* impl = nullptr, KFChannelInfo* info = nullptr);
    KF_SCALAR_CHANNEL_FORM(KFChannelProgress, KFFactory* factory);
    KF_SCALAR_CHANNEL_FORM(KFChannelProgress, double value);
    KFChannelProgress(KFChannelProgress const& other);
    KFChannelProgress(KFChannelProgress const& other, KFChannelFolder* parent);
    KFChannelProgress& operator=(KFChannelProgress const& other);
    ~KFChannelProgress() override;
    char const* getFacadeWrapperName() override;
    KFChannelBase* clone() const override;
    static KFChannelInfo* createKFChannelProgressInfo();
    static KFChannelImpl* createKFChannelProgressImpl();

    // The host's; false at first.
    bool getHostOption(unsigned int index) const noexcept { return index < 2 && _hostOptions[index]; }
    void setHostOption(unsigned int index, bool on) noexcept;

private:
    bool _hostOptions[2] = {false, false};
};

/// Holds a time, as a number of units of 1/timeScale seconds. The forms from a time store its seconds as default and
/// initial value: what `getValueAsChrono` then reads is that number of units, rounded toward zero.
///
/// `assign` leaves the timescale as it is, `copy` takes it over.
class LUMENKEY_API KFChannelChrono : public KFChannelDouble {
public:
    KFChannelChrono(BXString const& name, KFChannelFolder* parent, unsigned int id, unsigned int flags);
    KFChannelChrono(KFFactory* factory, BXString const& name, unsigned int id, KFChannelImpl* impl = nullptr,
                    KFChannelInfo* info = nullptr);
    KFChannelChrono(KFFactory* factory, BXString const& name, KFChannelFolder* parent, unsigned int id,
                    unsigned int flags, KFChannelImpl* impl = nullptr, KFChannelInfo* info = nullptr);
    KFChannelChrono(Tempus const& value, BXString const& name, KFChannelFolder* parent, unsigned int id,
                    unsigned int flags, KFChannelImpl* impl = nullptr, KFChannelInfo* info = nullptr);
    KFChannelChrono(Tempus const& value, KFFactory* factory, BXString const& name, KFChannelFolder* parent,
                    unsigned int id, unsigned int flags, KFChannelImpl* impl = nullptr,
                    KFChannelInfo* info = nullptr);
    KFChannelChrono(KFChannelChrono const& other);
    KFChannelChrono(KFChannelChrono const& other, KFChannelFolder* parent);
    KFChannelChrono& operator=(KFChannelChrono const& other);
    ~KFChannelChrono() override;

    char const* getFacadeWrapperName() override;
    void copy(KFChannelBase const* other, bool silent) override;
    bool compare(KFChannelBase const* other) const override;
    KFChannelBase* clone() const override;

    int getTimeScale() const noexcept { return _timeScale; }
    void setTimeScale(int timeScale) noexcept { _timeScale = timeScale; }
    /// Rounded down to a whole number of units. What is no number counts as 0, an infinity as the most units that
    /// there are, and a timescale that isn't above 0 gives 0.
    void setValueAsChrono(Tempus const& t, Tempus const& value, bool silent);
    /// Invalid for a timescale that isn't above 0.
    Tempus getValueAsChrono(Tempus const& t, double input) const;

private:
    int _timeScale = 600;
};
