#pragma once

#include "lumenkey/Channels/KFChannelBase.h"
#include "lumenkey/foundation/BXExport.h"
#include "lumenkey/foundation/BXLocks.h"
#include "lumenkey/foundation/BXSingleton.h"

#include <unordered_map>

/// Which host function `KFChannelBase::reset` calls for a channel. Channels leave it in their destructor.
///
/// Threads: the map is guarded by the table's spin lock. The pointer of `getResetCallbackDataForChannel` is
/// good until that channel's entry changes, and is read outside the lock.
class LUMENKEY_API KFResetCallbackDataTable : public BXSingleton {
public:
    struct Entry {
        KFChannelBase::ResetCallback function = nullptr;
        void* context = nullptr;
        bool wantsWrapper = false;
    };

    /// The table, made on first use; null once it has been torn down at the end of the process.
    static KFResetCallbackDataTable* getResetCallbackDataTable();
    /// False from teardown or invalidation on; true before first use, since the table can be had then.
    static bool isResetCallbackDataTableValid() noexcept;
    /// From now on and for good there is no table, and `reset` on a channel does nothing.
    static void invalidateResetCallbackDataTable() noexcept;

    /// Null for a channel without an entry.
    Entry const* getResetCallbackDataForChannel(KFChannelBase const* channel) const;
    /// The same, read under the lock. False for a channel without an entry; `*out` is then as it was.
    bool copyEntry(KFChannelBase const* channel, Entry* out) const;
    /// Enters or replaces; a null function removes.
    void setResetCallbackForChannel(KFChannelBase* channel, KFChannelBase::ResetCallback function,
                                    void* context, bool wantsWrapper);

private:
    KFResetCallbackDataTable();
    ~KFResetCallbackDataTable() override;
    template <class T> friend T& BXSingletonInstance();

    mutable BXSpinLock _lock;
    std::unordered_map<KFChannelBase const*, Entry> _entries;
};
