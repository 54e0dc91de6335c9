#include "lumenkey/splines/KFCoreGlobals.h"

KFCoreGlobals::KFCoreGlobals() : BXSingleton(0) {}
KFCoreGlobals::~KFCoreGlobals() = default;

KFCoreGlobals& KFCoreGlobals::getInstance() { return BXSingletonInstance<KFCoreGlobals>(); }
