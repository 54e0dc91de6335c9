#pragma once

#include "lumenkey/splines/KFCoreGlobals.h"

/// While one exists, a value that is set is keyed, also on a curve without keypoints.
struct Animating {
    explicit Animating(bool on = true) { KFCoreGlobals::getInstance().animate = on; }
    ~Animating() { KFCoreGlobals::getInstance().animate = false; }
};
