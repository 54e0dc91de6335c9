#include "tools/output/TemporaryFiles.h"

#include <array>
#include <atomic>
#include <climits>
#include <csignal>
#include <cstring>
#include <unistd.h>
#include <utility>

namespace lumenkey::tools {

namespace {

enum class Use { Free, Taken, Alive };

/// Names lie in static memory, so that a handler never follows a pointer that is being freed. At worst it
/// finds a name whose file is gone, and nobody else gives that name to one.
struct Slot {
    std::atomic<Use> use = Use::Free;
    char name[PATH_MAX];
};

constexpr std::size_t kSlots = 64;
std::array<Slot, kSlots> slots;
static_assert(std::atomic<Use>::is_always_lock_free, "a handler may use nothing else");

void removeAndEnd(int signal) {
    for (Slot const& slot : slots) {
        if (slot.use.load(std::memory_order_acquire) == Use::Alive) {
            ::unlink(slot.name);
        }
    }
    // What the handler was for comes back with its end, since the signal is held up until then.
    std::signal(signal, SIG_DFL);
    ::raise(signal);
}

} // namespace

void removeTemporariesOnSignals() {
    for (int const signal : {SIGINT, SIGTERM, SIGHUP}) {
        struct sigaction before {};
        if (::sigaction(signal, nullptr, &before) == 0 && before.sa_handler == SIG_DFL) {
            struct sigaction action {};
            action.sa_handler = removeAndEnd;
            ::sigaction(signal, &action, nullptr);
        }
    }
}

TemporaryName::TemporaryName(std::string const& name) {
    for (std::size_t i = 0; i < kSlots && _slot == kNone && name.size() < PATH_MAX; ++i) {
        Use free = Use::Free;
        if (slots[i].use.compare_exchange_strong(free, Use::Taken)) {
            std::memcpy(slots[i].name, name.c_str(), name.size() + 1);
            slots[i].use.store(Use::Alive, std::memory_order_release);
            _slot = i;
        }
    }
}

TemporaryName::TemporaryName(TemporaryName&& other) noexcept : _slot(std::exchange(other._slot, kNone)) {}

TemporaryName& TemporaryName::operator=(TemporaryName&& other) noexcept {
    std::swap(_slot, other._slot);
    return *this;
}

TemporaryName::~TemporaryName() {
    if (_slot != kNone) {
        slots[_slot].use.store(Use::Free, std::memory_order_release);
    }
}

} // namespace lumenkey::tools
