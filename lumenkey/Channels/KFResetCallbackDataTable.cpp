#include "lumenkey/Channels/KFResetCallbackDataTable.h"

#include <atomic>

namespace {

constinit std::atomic<bool> tableIsGone{false};

// The size of the map, changed under the table's lock. Whoever entered a channel comes before all that is
// done with that channel later, so a later reader sees at least 1 while the entry stands: a relaxed 0 proves
// that there is none, without the lock and without making the table.
constinit std::atomic<std::size_t> numberOfEntries{0};

bool hasNoEntries() noexcept { return numberOfEntries.load(std::memory_order_relaxed) == 0; }

} // namespace

KFResetCallbackDataTable::KFResetCallbackDataTable() : BXSingleton(200) {}

KFResetCallbackDataTable::~KFResetCallbackDataTable() { invalidateResetCallbackDataTable(); }

KFResetCallbackDataTable* KFResetCallbackDataTable::getResetCallbackDataTable() {
    return isResetCallbackDataTableValid() ? &BXSingletonInstance<KFResetCallbackDataTable>() : nullptr;
}

bool KFResetCallbackDataTable::isResetCallbackDataTableValid() noexcept {
    return !tableIsGone.load(std::memory_order_acquire);
}

void KFResetCallbackDataTable::invalidateResetCallbackDataTable() noexcept {
    tableIsGone.store(true, std::memory_order_release);
}

KFResetCallbackDataTable::Entry const*
KFResetCallbackDataTable::getResetCallbackDataForChannel(KFChannelBase const* channel) const {
    BXLockSentry const sentry(_lock);
    auto const found = _entries.find(channel);
    return found != _entries.end() ? &found->second : nullptr;
}

bool KFResetCallbackDataTable::copyEntry(KFChannelBase const* channel, Entry* out) const {
    BXLockSentry const sentry(_lock);
    auto const found = _entries.find(channel);
    if (found == _entries.end()) {
        return false;
    }
    *out = found->second;
    return true;
}

void KFResetCallbackDataTable::setResetCallbackForChannel(KFChannelBase* channel,
                                                          KFChannelBase::ResetCallback function,
                                                          void* context, bool wantsWrapper) {
    BXLockSentry const sentry(_lock);
    if (function != nullptr) {
        _entries.insert_or_assign(channel, Entry{function, context, wantsWrapper});
    } else {
        _entries.erase(channel);
    }
    numberOfEntries.store(_entries.size(), std::memory_order_relaxed);
}

// The channel's side ----------------------------------------------------------------------------------------

void KFChannelBase::setResetCallback(ResetCallback function, void* context, bool wantsWrapper) {
    if (function == nullptr && hasNoEntries()) {
        return; // nearly every channel's destructor
    }
    if (KFResetCallbackDataTable* const table = getResetCallbackDataTable()) {
        table->setResetCallbackForChannel(this, function, context, wantsWrapper);
    }
}

bool KFChannelBase::getResetCallback(ResetCallback* function, void** context, bool* wantsWrapper) const {
    KFResetCallbackDataTable const* const table = hasNoEntries() ? nullptr : getResetCallbackDataTable();
    KFResetCallbackDataTable::Entry entry;
    if (table == nullptr || !table->copyEntry(this, &entry)) {
        return false;
    }
    if (function != nullptr) {
        *function = entry.function;
    }
    if (context != nullptr) {
        *context = entry.context;
    }
    if (wantsWrapper != nullptr) {
        *wantsWrapper = entry.wantsWrapper;
    }
    return true;
}

void KFChannelBase::reset(bool silent) {
    if (!isResetCallbackDataTableValid()) {
        return;
    }
    ResetCallback function = nullptr;
    void* context = nullptr;
    if (getResetCallback(&function, &context, nullptr)) {
        function(this, context);
    } else {
        resetToDefault(silent);
    }
}

KFResetCallbackDataTable* KFChannelBase::getResetCallbackDataTable() {
    return KFResetCallbackDataTable::getResetCallbackDataTable();
}

void KFChannelBase::invalidateResetCallbackDataTable() noexcept {
    KFResetCallbackDataTable::invalidateResetCallbackDataTable();
}

bool KFChannelBase::isResetCallbackDataTableValid() noexcept {
    return KFResetCallbackDataTable::isResetCallbackDataTableValid();
}
