#include "lumenkey/Channels/KFChannelFactories.h"

#include "lumenkey/Channels/KFChanObjectRef.h"
#include "lumenkey/Channels/KFChannelFactoryTable.h"
#include "lumenkey/Channels/KFChannelObjectRootBase.h"
#include "lumenkey/Channels/KFCompoundChannel.h"
#include "lumenkey/Channels/KFScalarChannels.h"
#include "lumenkey/Channels/KFVectorChannels.h"

#include <type_traits>

namespace {
/// For the host; the library doesn't read it.
constexpr std::uint32_t kUsualKind = 1;

/// Number of children for which a class with children makes room.
template <class Channel> constexpr unsigned int kCapacity = 0;
template <> constexpr unsigned int kCapacity<KFChannel2D> = KFChannel2D::kNumberOfComponents;
template <> constexpr unsigned int kCapacity<KFChannel3D> = KFChannel3D::kNumberOfComponents;
template <> constexpr unsigned int kCapacity<KFChannelBool3D> = KFChannelBool3D::kNumberOfComponents;

template <class Channel> Channel* make(KFFactory* factory, BXString const& name, unsigned int id) {
    if constexpr (std::is_base_of_v<KFChannelFolder, Channel>) {
        return new Channel(factory, name, id, kCapacity<Channel>);
    } else if constexpr (std::is_base_of_v<KFChannel, Channel>) {
        return new Channel(factory, name, id, nullptr, nullptr);
    } else {
        return new Channel(factory, name, id);
    }
}

/// Value channels have a plain copy constructor that leaves the identity out, so the form with a parent is used.
template <class Channel> Channel* makeCopy(KFFactoryBase* source) {
    auto const* const channel = dynamic_cast<Channel const*>(source);
    return channel == nullptr ? nullptr : new Channel(*channel, static_cast<KFChannelFolder*>(nullptr));
}

KFChannelFactoryRow const& rowOf(char const* className) noexcept { return KFChannelFactoryRowOf(className); }
} // namespace

#define KF_DEFINE_FACTORY_IDENTITY(Channel)                                                                  \
    Channel##_Factory& Channel##_Factory::getInstance() { return BXSingletonInstance<Channel##_Factory>(); } \
    Channel##_Factory::Channel##_Factory()                                                                   \
        : KFChannelFactory(rowOf(#Channel).identity(), KFChannelFactoryUUID(rowOf(#Channel).superClassName), \
                           kUsualKind),                                                                      \
          BXSingleton(0) {}                                                                                  \
    Channel##_Factory::~Channel##_Factory() = default;                                                       \
    KFFactory* get##Channel##_FactoryBase() { return &Channel##_Factory::getInstance(); }

#define KF_DEFINE_CHANNEL_FACTORY(Channel)                                                                   \
    KF_DEFINE_FACTORY_IDENTITY(Channel)                                                                      \
    KFFactoryBase* Channel##_Factory::create(BXString const& name, unsigned int id) {                        \
        return make<Channel>(this, name, id);                                                                \
    }                                                                                                        \
    KFFactoryBase* Channel##_Factory::createCopy(KFFactoryBase* source, unsigned int) {                      \
        return makeCopy<Channel>(source);                                                                    \
    }                                                                                                        \
    KFChannelBase* Channel##_Factory::createChannel(BXString const& name, unsigned int id) {                 \
        return make<Channel>(this, name, id);                                                                \
    }                                                                                                        \
    KFChannelBase* Channel##_Factory::createChannelCopy(KFChannelBase* source, unsigned int) {               \
        return makeCopy<Channel>(source);                                                                    \
    }

KF_DEFINE_FACTORY_IDENTITY(KFChannel)

KF_DEFINE_CHANNEL_FACTORY(KFChannelBase)
KF_DEFINE_CHANNEL_FACTORY(KFChannelDouble)
KF_DEFINE_CHANNEL_FACTORY(KFChannelBool)
KF_DEFINE_CHANNEL_FACTORY(KFChannelUint32)
KF_DEFINE_CHANNEL_FACTORY(KFChannelAngle)
KF_DEFINE_CHANNEL_FACTORY(KFChannelPercent)
KF_DEFINE_CHANNEL_FACTORY(KFChannelShearAngle)
KF_DEFINE_CHANNEL_FACTORY(KFChannelAspectRatio)
KF_DEFINE_CHANNEL_FACTORY(KFChannelAspectRatioFootage)
KF_DEFINE_CHANNEL_FACTORY(KFChannelGammaFootage)
KF_DEFINE_CHANNEL_FACTORY(KFChannelFolder)
KF_DEFINE_CHANNEL_FACTORY(KFCompoundChannel)
KF_DEFINE_CHANNEL_FACTORY(KFChannel2D)
KF_DEFINE_CHANNEL_FACTORY(KFChannelBool3D)
KF_DEFINE_CHANNEL_FACTORY(KFChannel3D)
KF_DEFINE_CHANNEL_FACTORY(KFChannelObjectRootBase)
KF_DEFINE_CHANNEL_FACTORY(KFChannelUint16)
KF_DEFINE_CHANNEL_FACTORY(KFChannelSeed)
KF_DEFINE_CHANNEL_FACTORY(KFChannelDecibel)
KF_DEFINE_CHANNEL_FACTORY(KFChannelFrame)
KF_DEFINE_CHANNEL_FACTORY(KFChannelTimecode)
KF_DEFINE_CHANNEL_FACTORY(KFChannelProgress)
KF_DEFINE_CHANNEL_FACTORY(KFChanObjectRef)
KF_DEFINE_CHANNEL_FACTORY(KFChannelChrono)
