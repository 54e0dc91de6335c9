// Internal: not installed.
#pragma once

#include <utility>

/// This thread's one T, made on first use and freed when the thread ends. It can be had behind that too, as from
/// the destructors of static objects, which run after those of the main thread's own: it then starts anew, and is
/// freed with the process.
template <class T> T& KFThreadState() {
    // Neither has a destructor, so both outlast the owner.
    constinit thread_local T* state = nullptr;
    constinit thread_local bool hasOwner = false;
    struct Owner {
        ~Owner() { delete std::exchange(state, nullptr); }
    };
    if (state == nullptr) {
        state = new T();
        if (!hasOwner) {
            hasOwner = true;
            [[maybe_unused]] thread_local Owner const owner;
        }
    }
    return *state;
}
