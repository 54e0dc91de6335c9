#pragma once

#include "lumenkey/foundation/BXExport.h"

/// Base of the objects that exist once in a process. Each is made on first use by `BXSingletonInstance` and
/// destroyed at the end of the process. The rank orders that teardown only: a lower rank goes earlier, and among
/// equal ranks the one made last. A singleton that others use in their destructors therefore has the higher rank.
///
/// Teardown runs on the thread that ends the process, as a handler registered with std::atexit when the first
/// singleton is made; a singleton made by another's destructor is destroyed with the rest. Nobody may use one
/// after it is gone, as from the destructor of a static object that was constructed before the first singleton.
class LUMENKEY_API BXSingleton {
public:
    BXSingleton(BXSingleton const&) = delete;
    BXSingleton& operator=(BXSingleton const&) = delete;

    int rank() const noexcept { return _rank; }

    /// Takes the object, which must be on the heap, for the ordered teardown. Any thread; for `BXSingletonInstance`.
    static void adopt(BXSingleton* singleton) noexcept;

protected:
    explicit BXSingleton(int rank) noexcept : _rank(rank) {}
    virtual ~BXSingleton();

private:
    static void tearDown() noexcept;
    static BXSingleton* detachNext() noexcept;

    int const _rank;
    BXSingleton* _older = nullptr; // the list of living singletons, newest first
};

/// The one T, made on first use by whichever thread comes first while the others wait. T derives from BXSingleton
/// and makes this function a friend if its constructor is not public. A class that is used from several shared
/// objects wraps the call in a `getInstance` of its own, defined in one source file.
template <class T> T& BXSingletonInstance() {
    static T& instance = []() -> T& {
        T* const made = new T();
        BXSingleton::adopt(made);
        return *made;
    }();
    return instance;
}
