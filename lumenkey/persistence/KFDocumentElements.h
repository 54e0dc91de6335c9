// Internal: not installed.
#pragma once

#include "lumenkey/persistence/KFDocumentScopes.h"

#include <type_traits>

/// Older documents count frames.
inline constexpr std::uint32_t kFirstVersionWithTimes = 5;
/// Of what only goes into a digest.
inline constexpr std::uint32_t kUnnamedElement = 0;

/// An element that holds nothing but a value.
template <class Value>
void KFWriteElement(BXSerializerWriteStream& stream, std::uint32_t tag, Value const& value) {
    if constexpr (std::is_same_v<Value, double> || std::is_same_v<Value, Tempus>) {
        stream.writeElement(tag, value);
    } else {
        stream.startElement(tag);
        stream.writeValue(value);
        stream.endElement();
    }
}

/// The UUID of a class as it stands in documents; not for texts that are none.
consteval BXUUID KFClassUUID(std::string_view text) {
    BXUUID uuid;
    if (!BXUUID::fromText(text, &uuid))
        throw "not a UUID";
    return uuid;
}
