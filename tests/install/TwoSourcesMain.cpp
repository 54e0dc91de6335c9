#include "lumenkey/lumenkey.h"

#include <cstring>

double versionNumberSeenFromOtherSource();

int main() {
    bool const same = versionNumberSeenFromOtherSource() == LumenkeyVersionNumber;
    int const builtWith =
        LUMENKEY_VERSION_MAJOR * 10000 + LUMENKEY_VERSION_MINOR * 100 + LUMENKEY_VERSION_PATCH;
    bool const hasText = std::strchr(LumenkeyVersionString, '.') != nullptr;
    return same && LumenkeyVersionNumber == builtWith && hasText ? 0 : 1;
}
