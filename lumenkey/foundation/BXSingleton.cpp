#include "lumenkey/foundation/BXSingleton.h"

#include <cstdlib>
#include <mutex>

namespace {

// Both outlive every static object: neither has a destructor to run.
constinit std::mutex registryLock;
constinit BXSingleton* newestSingleton = nullptr;
constinit bool tearDownIsRegistered = false;

} // namespace

BXSingleton::~BXSingleton() = default;

void BXSingleton::adopt(BXSingleton* singleton) noexcept {
    std::lock_guard const guard(registryLock);
    singleton->_older = newestSingleton;
    newestSingleton = singleton;
    if (!tearDownIsRegistered) {
        // Where no handler can be had the singletons live on to the end, which harms nobody.
        tearDownIsRegistered = std::atexit([] { tearDown(); }) == 0;
    }
}

BXSingleton* BXSingleton::detachNext() noexcept {
    std::lock_guard const guard(registryLock);
    BXSingleton** next = &newestSingleton;
    for (BXSingleton** link = next; *link != nullptr; link = &(*link)->_older) {
        if ((*link)->_rank < (*next)->_rank) {
            next = link;
        }
    }
    BXSingleton* const detached = *next;
    if (detached == nullptr) {
        tearDownIsRegistered =
            false; // one made later, by a static object's destructor, asks for a handler anew
        return nullptr;
    }
    *next = detached->_older;
    return detached;
}

void BXSingleton::tearDown() noexcept {
    // One at a time and outside the lock, since a destructor may make another singleton.
    while (BXSingleton* const singleton = detachNext()) {
        delete singleton;
    }
}
