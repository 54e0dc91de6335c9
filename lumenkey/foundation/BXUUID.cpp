#include "lumenkey/foundation/BXUUID.h"

#include "lumenkey/foundation/BXTextForms.h"

std::string BXUUID::text() const {
    char room[BXText::kLongest];
    return {room, BXText::write(room, *this)};
}
