#include "lumenkey/foundation/BXUUID.h"

std::string BXUUID::text() const {
    static constexpr char kDigits[] = "0123456789ABCDEF";
    std::string made;
    made.reserve(36);
    for (unsigned digit = 0; digit < 32; ++digit) {
        if (digit == 8 || digit == 12 || digit == 16 || digit == 20) {
            made += '-';
        }
        made += kDigits[words[digit / 8] >> (28 - 4 * (digit % 8)) & 0xF];
    }
    return made;
}
