#include "lumenkey/version.h"

#define LUMENKEY_TEXT_OF(number) #number
#define LUMENKEY_VERSION_TEXT(major, minor, patch)                                                           \
    LUMENKEY_TEXT_OF(major) "." LUMENKEY_TEXT_OF(minor) "." LUMENKEY_TEXT_OF(patch)

double const LumenkeyVersionNumber =
    LUMENKEY_VERSION_MAJOR * 10000 + LUMENKEY_VERSION_MINOR * 100 + LUMENKEY_VERSION_PATCH;

char const* const LumenkeyVersionString =
    LUMENKEY_VERSION_TEXT(LUMENKEY_VERSION_MAJOR, LUMENKEY_VERSION_MINOR, LUMENKEY_VERSION_PATCH);
