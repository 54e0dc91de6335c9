#include "lumenkey/splines/KFThreadSegments.h"

constinit thread_local KFSegmentPlace KFThreadSegments::_places[KFThreadSegments::kPlaces];
