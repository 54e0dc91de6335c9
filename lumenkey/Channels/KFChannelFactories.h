#pragma once

#include "lumenkey/Channels/KFFactory.h"
#include "lumenkey/foundation/BXSingleton.h"

// The factories of the library's classes: KFChannelDouble_Factory for KFChannelDouble, and so on. Each is made on
// first use by any thread, and lives for the process. Their UUIDs and superclasses stand in one table, in
// KFChannelFactoryTable.cpp. `create` makes a channel with the class's own records and without a parent,
// `createCopy` a parentless copy; the caller owns both. `createCopy` of null or of another class gives null.

#define KF_DECLARE_CHANNEL_FACTORY(Channel)                                                                  \
    class LUMENKEY_API Channel##_Factory : public KFChannelFactory, public BXSingleton {                     \
    public:                                                                                                  \
        static Channel##_Factory& getInstance();                                                             \
        KFFactoryBase* create(BXString const& name, unsigned int id) override;                               \
        KFFactoryBase* createCopy(KFFactoryBase* source, unsigned int id) override;                          \
        KFChannelBase* createChannel(BXString const& name, unsigned int id) override;                        \
        KFChannelBase* createChannelCopy(KFChannelBase* source, unsigned int id) override;                   \
                                                                                                             \
    private:                                                                                                 \
        Channel##_Factory();                                                                                 \
        ~Channel##_Factory() override;                                                                       \
        template <class T> friend T& BXSingletonInstance();                                                  \
    };                                                                                                       \
    LUMENKEY_API KFFactory* get##Channel##_FactoryBase()

KF_DECLARE_CHANNEL_FACTORY(KFChannelBase);
KF_DECLARE_CHANNEL_FACTORY(KFChannelDouble);
KF_DECLARE_CHANNEL_FACTORY(KFChannelBool);
KF_DECLARE_CHANNEL_FACTORY(KFChannelUint32);
KF_DECLARE_CHANNEL_FACTORY(KFChannelAngle);
KF_DECLARE_CHANNEL_FACTORY(KFChannelPercent);
KF_DECLARE_CHANNEL_FACTORY(KFChannelShearAngle);
KF_DECLARE_CHANNEL_FACTORY(KFChannelAspectRatio);
KF_DECLARE_CHANNEL_FACTORY(KFChannelAspectRatioFootage);
KF_DECLARE_CHANNEL_FACTORY(KFChannelGammaFootage);
KF_DECLARE_CHANNEL_FACTORY(KFChannelFolder);
KF_DECLARE_CHANNEL_FACTORY(KFCompoundChannel);
KF_DECLARE_CHANNEL_FACTORY(KFChannel2D);
KF_DECLARE_CHANNEL_FACTORY(KFChannelBool3D);
KF_DECLARE_CHANNEL_FACTORY(KFChannel3D);
KF_DECLARE_CHANNEL_FACTORY(KFChannelObjectRootBase);
KF_DECLARE_CHANNEL_FACTORY(KFChannelUint16);
KF_DECLARE_CHANNEL_FACTORY(KFChannelSeed);
KF_DECLARE_CHANNEL_FACTORY(KFChannelDecibel);
KF_DECLARE_CHANNEL_FACTORY(KFChannelFrame);
KF_DECLARE_CHANNEL_FACTORY(KFChannelTimecode);
KF_DECLARE_CHANNEL_FACTORY(KFChannelProgress);
KF_DECLARE_CHANNEL_FACTORY(KFChanObjectRef);
/// Not in the registry unless the host adds it.
KF_DECLARE_CHANNEL_FACTORY(KFChannelChrono);

/// Stands for what all value channels are; it makes none.
class LUMENKEY_API KFChannel_Factory : public KFChannelFactory, public BXSingleton {
public:
    static KFChannel_Factory& getInstance();

private:
    KFChannel_Factory();
    ~KFChannel_Factory() override;
    template <class T> friend T& BXSingletonInstance();
};
LUMENKEY_API KFFactory* getKFChannel_FactoryBase();
