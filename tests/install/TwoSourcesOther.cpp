#include "lumenkey/lumenkey.h"

double versionNumberSeenFromOtherSource();

double versionNumberSeenFromOtherSource() { return LumenkeyVersionNumber; }
