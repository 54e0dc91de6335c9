#include "lumenkey/splines/KFSplineOwner.h"

KFSplineOwner::~KFSplineOwner() = default;
