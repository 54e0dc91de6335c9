#include "lumenkey/splines/KFCubic.h"

#include "lumenkey/splines/KFBezierUtil.h"

double KFCubicInverse::search(double p) const noexcept { return KFBezierFindParameter(_polygon, p); }
