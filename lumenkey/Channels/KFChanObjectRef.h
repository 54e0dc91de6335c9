#pragma once

#include "lumenkey/Channels/KFScalarChannels.h"

KF_DECLARE_CLASS_INFO(KFChanObjectRef);
KF_DECLARE_CLASS_IMPL(KFChanObjectRef);

/// Refers to an object of the host, by its number. What the number means lies in a subclass of the host's.
class LUMENKEY_API KFChanObjectRef : public KFChannel {
    KF_SCALAR_CHANNEL_BODY(KFChanObjectRef);
    static KFChannelImpl* createKFChanObjectRefImpl();
    bool isObjectRef() const override;

    virtual void* getObjectRef() const;
    virtual void setObjectRef(void* object, bool silent);
};
