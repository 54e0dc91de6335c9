// Internal: not installed.
#pragma once

#include "lumenkey/persistence/KFDocumentScopes.h"

/// An element that holds nothing but a value.
template <class Value>
void KFWriteElement(BXSerializerWriteStream& stream, std::uint32_t tag, Value const& value) {
    stream.startElement(tag);
    stream.writeValue(value);
    stream.endElement();
}

/// The UUID of a class as it stands in documents; not for texts that are none.
consteval BXUUID KFClassUUID(std::string_view text) {
    BXUUID uuid;
    if (!BXUUID::fromText(text, &uuid))
        throw "not a UUID";
    return uuid;
}
