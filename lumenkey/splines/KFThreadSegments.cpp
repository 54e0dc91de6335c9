#include "lumenkey/splines/KFThreadSegments.h"

constinit thread_local KFThreadSegments::ZeroedPlace KFThreadSegments::_places[KFThreadSegments::kPlaces]{};
