#include "lumenkey/Channels/KFChanObjectRef.h"

#include "lumenkey/Channels/KFChannelFactories.h"
#include "lumenkey/Channels/KFClassRecords.h"

namespace {

/// The second has no name: it counts as state and is the host's.
constexpr KFChannelFlags kObjectRefFlags = kChannelFlagTimeIndependent | 0x1000000000;

} // namespace

// clang-format off
//                 class            curve        type value slider min  slider max    coarse fine scale suffix
KF_CLASS_CONSTANTS(KFChanObjectRef, KFCurveEnum, 0,   0.0,  0.0,        4294967295.0, 1.0,   1.0, 1.0,  "")
// clang-format on

KF_DEFINE_CLASS_INFO(KFChanObjectRef)
KF_DEFINE_CLASS_IMPL(KFChanObjectRef)
KF_DEFINE_NAMED_FORM(KFChanObjectRef, createKFChanObjectRefImpl(), storeFlags(getFlags() | kObjectRefFlags))
KF_DEFINE_FACTORY_FORM(KFChanObjectRef, createKFChanObjectRefImpl(), storeFlags(getFlags() | kObjectRefFlags))
// There is no facade class of its own: the host's subclass names one.
KF_DEFINE_COPIES_AND_NAME(KFChanObjectRef, "KWChannel", storeFlags(getFlags() | kObjectRefFlags))

bool KFChanObjectRef::isObjectRef() const { return true; }
void* KFChanObjectRef::getObjectRef() const { return nullptr; }
void KFChanObjectRef::setObjectRef(void*, bool) {}
