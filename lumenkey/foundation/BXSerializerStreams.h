#pragma once

#include "lumenkey/foundation/BXExport.h"
#include "lumenkey/foundation/BXString.h"
#include "lumenkey/foundation/BXUUID.h"
#include "lumenkey/foundation/Tempus.h"

#include <cstdint>

/// A row of a table that gives the names of a document their numbers: the low half of the word is the tag of an
/// element, the high half, if not zero, the tag of an attribute of that element. A null name ends the table.
struct BXScope {
    char const* name;
    std::uint64_t word;

    static constexpr BXScope element(char const* name, std::uint32_t tag) noexcept { return {name, tag}; }
    static constexpr BXScope attribute(char const* name, std::uint32_t element, std::uint32_t tag) noexcept {
        return {name, element | std::uint64_t{tag} << 32};
    }
    static constexpr BXScope end() noexcept { return {nullptr, 0}; }
};

/// Takes a document as elements, attributes and values. The innermost pushed scope gives tags their names. All
/// attributes of an element are written before its content.
class LUMENKEY_API BXSerializerWriteStream {
public:
    virtual ~BXSerializerWriteStream();

    /// The table isn't owned and must outlive its time on the stream.
    virtual void pushScope(BXScope const* scope) = 0;
    virtual void popScope() = 0;
    virtual void startElement(std::uint32_t tag) = 0;
    virtual void endElement() = 0;
    virtual void writeValue(bool value) = 0;
    virtual void writeValue(std::uint32_t value) = 0;
    virtual void writeValue(std::uint64_t value) = 0;
    virtual void writeValue(double value) = 0;
    virtual void writeValue(BXString const& value) = 0;
    virtual void writeValue(BXUUID const& value) = 0;
    virtual void writeValue(Tempus const& value) = 0;
    virtual void writeAttribute(std::uint32_t tag, bool value) = 0;
    virtual void writeAttribute(std::uint32_t tag, std::uint32_t value) = 0;
    virtual void writeAttribute(std::uint32_t tag, std::uint64_t value) = 0;
    virtual void writeAttribute(std::uint32_t tag, double value) = 0;
    virtual void writeAttribute(std::uint32_t tag, BXString const& value) = 0;
    virtual void writeAttribute(std::uint32_t tag, BXUUID const& value) = 0;
    virtual void writeAttribute(std::uint32_t tag, Tempus const& value) = 0;
    virtual void endLine() = 0;
    /// Whether what is written goes into a digest; here false.
    virtual bool isHashStream() const;
};
