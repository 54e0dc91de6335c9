// Internal: not installed.
#pragma once

// How a class of value channels defines the records that all its channels share. The class's constants stand in one row
// of a table (`KF_CLASS_CONSTANTS`); the other macros define what KFScalarChannels.h declares.

#include "lumenkey/Channels/KFScalarChannels.h"
#include "lumenkey/curves/KFTypedCurves.h"

/// Below that of the curves' shared settings (200), which the curve of a record still reads when it is destroyed.
inline constexpr int kClassRecordRank = 100;

struct KFClassConstants {
    KFCurve* (*newCurve)(double value);
    unsigned int curveType; ///< 1: a spline that takes keypoints; 0: a constant that takes none
    double value;           ///< default and initial value
    double sliderMin;
    double sliderMax;
    double coarseDelta;
    double fineDelta;
    double scale;
    char const* suffix;
};

template <class Channel> struct KFClassConstantsOf;

template <class Curve> KFCurve* KFNewCurve(double value) { return new Curve(value); }

/// A row of the table of classes.
#define KF_CLASS_CONSTANTS(Channel, Curve, curveType, value, min, max, coarse, fine, scale, suffix)          \
    template <> struct KFClassConstantsOf<Channel> {                                                         \
        static constexpr KFClassConstants constants{                                                         \
            &KFNewCurve<Curve>, curveType, value, min, max, coarse, fine, scale, suffix};                    \
    };

template <class Channel> KFCurve* KFNewClassCurve(double value) {
    return KFClassConstantsOf<Channel>::constants.newCurve(value);
}

#define KF_DEFINE_CLASS_INFO(Channel)                                                                        \
    Channel##Info::Channel##Info()                                                                           \
        : KFChannelInfo(KFClassConstantsOf<Channel>::constants.sliderMin,                                    \
                        KFClassConstantsOf<Channel>::constants.sliderMax,                                    \
                        KFClassConstantsOf<Channel>::constants.coarseDelta,                                  \
                        KFClassConstantsOf<Channel>::constants.fineDelta,                                    \
                        KFClassConstantsOf<Channel>::constants.scale,                                        \
                        KFClassConstantsOf<Channel>::constants.suffix),                                      \
          BXSingleton(kClassRecordRank) {}                                                                   \
    Channel##Info::~Channel##Info() = default;                                                               \
    Channel##Info& Channel##Info::getInstance() { return BXSingletonInstance<Channel##Info>(); }             \
    KFChannelInfo* Channel::create##Channel##Info() { return &Channel##Info::getInstance(); }

#define KF_DEFINE_CLASS_IMPL(Channel)                                                                        \
    Channel##Impl::Channel##Impl()                                                                           \
        : KFChannelImpl(KFNewClassCurve<Channel>(KFClassConstantsOf<Channel>::constants.value),              \
                        KFClassConstantsOf<Channel>::constants.value,                                        \
                        KFClassConstantsOf<Channel>::constants.curveType, true),                             \
          BXSingleton(kClassRecordRank) {}                                                                   \
    Channel##Impl::~Channel##Impl() = default;                                                               \
    Channel##Impl& Channel##Impl::getInstance() { return BXSingletonInstance<Channel##Impl>(); }             \
    KFChannelImpl* Channel::create##Channel##Impl() { return &Channel##Impl::getInstance(); }

/// The forms of the constructor; `newImpl` makes the class's record for that form. `extra` is a statement behind it.
#define KF_DEFINE_NAMED_FORM(Channel, newImpl, extra)                                                        \
    Channel::Channel(BXString const& name, KFChannelFolder* parent, unsigned int id, unsigned int flags,     \
                     KFChannelImpl* impl, KFChannelInfo* info)                                               \
        : KFChannel(get##Channel##_FactoryBase(), name, parent, id, flags, impl, info) {                     \
        usePrototypes(newImpl, create##Channel##Info());                                                     \
        extra;                                                                                               \
    }
#define KF_DEFINE_FACTORY_FORM(Channel, newImpl, extra)                                                      \
    Channel::Channel(KFFactory* factory, BXString const& name, unsigned int id, KFChannelImpl* impl,         \
                     KFChannelInfo* info)                                                                    \
        : KFChannel(factory, name, id, impl, info) {                                                         \
        usePrototypes(newImpl, create##Channel##Info());                                                     \
        extra;                                                                                               \
    }
#define KF_DEFINE_FACTORY_WITH_PARENT_FORM(Channel, newImpl, extra)                                          \
    Channel::Channel(KFFactory* factory, BXString const& name, KFChannelFolder* parent, unsigned int id,     \
                     unsigned int flags, KFChannelImpl* impl, KFChannelInfo* info)                           \
        : KFChannel(factory, name, parent, id, flags, impl, info) {                                          \
        usePrototypes(newImpl, create##Channel##Info());                                                     \
        extra;                                                                                               \
    }
#define KF_DEFINE_VALUE_FORM(Channel, Value, newImpl)                                                        \
    Channel::Channel(Value value, BXString const& name, KFChannelFolder* parent, unsigned int id,            \
                     unsigned int flags, KFChannelImpl* impl, KFChannelInfo* info)                           \
        : KFChannel(get##Channel##_FactoryBase(), name, parent, id, flags, impl, info) {                     \
        usePrototypes(newImpl, create##Channel##Info());                                                     \
        setDefaultValue(value);                                                                              \
        setInitialValue(value, false);                                                                       \
    }

#define KF_DEFINE_COPIES_AND_NAME(Channel, wrapperName, extra)                                               \
    Channel::Channel(Channel const& other) : KFChannel(other) { extra; }                                     \
    Channel::Channel(Channel const& other, KFChannelFolder* parent) : KFChannel(other, parent) { extra; }    \
    Channel& Channel::operator=(Channel const& other) {                                                      \
        KFChannelBase::operator=(other);                                                                     \
        return *this;                                                                                        \
    }                                                                                                        \
    Channel::~Channel() = default;                                                                           \
    char const* Channel::getFacadeWrapperName() { return wrapperName; }                                      \
    KFChannelBase* Channel::clone() const { return new Channel(*this, nullptr); }

/// A class with the two forms that all have, and one record.
#define KF_DEFINE_SCALAR_CHANNEL(Channel, wrapperName)                                                       \
    KF_DEFINE_CLASS_INFO(Channel)                                                                            \
    KF_DEFINE_CLASS_IMPL(Channel)                                                                            \
    KF_DEFINE_NAMED_FORM(Channel, create##Channel##Impl(), )                                                 \
    KF_DEFINE_FACTORY_FORM(Channel, create##Channel##Impl(), )                                               \
    KF_DEFINE_COPIES_AND_NAME(Channel, wrapperName, )
