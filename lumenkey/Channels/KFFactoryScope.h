// Internal: not installed.
#pragma once

#include "lumenkey/foundation/BXSerializerStreams.h"

inline constexpr std::uint32_t kFactoryElement = 92;
inline constexpr std::uint32_t kFactoryDescriptionElement = 93;
inline constexpr std::uint32_t kFactoryVersionElement = 94;
inline constexpr std::uint32_t kFactoryManufacturerElement = 95;
inline constexpr std::uint32_t kFactoryIDAttribute = 111;
inline constexpr std::uint32_t kFactoryUUIDAttribute = 117;

/// The names of the elements in which a document lists its factories.
inline constexpr BXScope KFFactoryScope[] = {
    BXScope::element("factory", kFactoryElement),
    BXScope::attribute("id", kFactoryElement, kFactoryIDAttribute),
    BXScope::attribute("uuid", kFactoryElement, kFactoryUUIDAttribute),
    BXScope::element("description", kFactoryDescriptionElement),
    BXScope::element("version", kFactoryVersionElement),
    BXScope::element("manufacturer", kFactoryManufacturerElement),
    BXScope::end(),
};
