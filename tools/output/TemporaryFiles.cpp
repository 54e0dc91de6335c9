#include "tools/output/TemporaryFiles.h"

#include <array>
#include <atomic>
#include <climits>
#include <csignal>
#include <cstring>
#include <fcntl.h>
#include <poll.h>
#include <unistd.h>
#include <utility>

namespace lumenkey::tools {

namespace {

enum class Use { Free, BeingMade, Alive };

/// Names lie in static memory, so that a handler never follows a pointer that is being freed. At worst it
/// finds a name whose file is gone, and nobody else gives that name to one.
struct Slot {
    std::atomic<Use> use = Use::Free;
    char name[PATH_MAX];
};

constexpr std::size_t kSlots = 64;
std::array<Slot, kSlots> slots;
/// Whether a signal is ending the program: no more files are made then.
std::atomic<bool> isEnding = false;
static_assert(std::atomic<Use>::is_always_lock_free, "a handler may use nothing else");

void removeAndEnd(int signal) {
    isEnding = true;
    for (Slot const& slot : slots) {
        // By another thread: one that makes a file holds signals up.
        while (slot.use == Use::BeingMade) {
            ::poll(nullptr, 0, 1);
        }
        if (slot.use == Use::Alive) {
            ::unlink(slot.name);
        }
    }
    // What the handler was for comes back with its end, since the signal is held up until then.
    std::signal(signal, SIG_DFL);
    ::raise(signal);
}

/// Keeps signals from this thread.
class SignalsHeldUp {
public:
    SignalsHeldUp() {
        sigset_t all;
        ::sigfillset(&all);
        ::pthread_sigmask(SIG_SETMASK, &all, &_before);
    }
    ~SignalsHeldUp() { ::pthread_sigmask(SIG_SETMASK, &_before, nullptr); }
    SignalsHeldUp(SignalsHeldUp const&) = delete;
    SignalsHeldUp& operator=(SignalsHeldUp const&) = delete;

private:
    sigset_t _before{};
};

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

int TemporaryName::makeFile(std::string& pattern) {
    SignalsHeldUp const held;
    for (std::size_t i = 0; i < kSlots && _slot == kNone && pattern.size() < PATH_MAX; ++i) {
        Use free = Use::Free;
        _slot = slots[i].use.compare_exchange_strong(free, Use::BeingMade) ? i : kNone;
    }
    if (_slot == kNone) {
        return ::mkostemp(pattern.data(), O_CLOEXEC);
    }
    Slot& slot = slots[_slot];
    if (isEnding) {
        slot.use = Use::Free;
        for (;;) {
            ::pause(); // for the end
        }
    }
    int const descriptor = ::mkostemp(pattern.data(), O_CLOEXEC);
    if (descriptor >= 0) {
        std::memcpy(slot.name, pattern.c_str(), pattern.size() + 1);
    }
    slot.use = descriptor >= 0 ? Use::Alive : Use::Free;
    _slot = descriptor >= 0 ? _slot : kNone;
    return descriptor;
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
