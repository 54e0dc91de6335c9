#include "lumenkey/splines/KFThreadSegments.h"

#include <new>

constinit thread_local KFSegmentPlace* KFThreadSegments::_places = nullptr;
constinit thread_local bool KFThreadSegments::_isEnding = false;

/// Frees the places at the end of the thread. What is destroyed after it may still read splines.
struct KFThreadSegments::Keeper {
    ~Keeper() {
        delete[] _places;
        _places = nullptr;
        _isEnding = true;
    }
};

KFSegmentPlace* KFThreadSegments::makePlaces() noexcept {
    if (_isEnding)
        return nullptr;
    static thread_local Keeper const keeper;
    _places = new (std::nothrow) KFSegmentPlace[kPlaces];
    return _places;
}
