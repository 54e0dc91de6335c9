#include "lumenkey/curves/KFCurveInterface.h"

KFCurveInterface::~KFCurveInterface() = default;
