#include "lumenkey/foundation/BXSerializerStreams.h"

#include "lumenkey/foundation/BXTextForms.h"

namespace {

template <typename Value> bool readIfThere(std::optional<std::string_view> const& text, Value* out) {
    return text && BXText::read(*text, out);
}

} // namespace

BXSerializerWriteStream::~BXSerializerWriteStream() = default;
BXSerializerReadStream::~BXSerializerReadStream() = default;
BXStreamElement::~BXStreamElement() = default;

bool BXSerializerWriteStream::isHashStream() const { return false; }
bool BXSerializerWriteStream::allowsNode() { return true; }
bool BXSerializerReadStream::allowsNode() { return true; }

void BXSerializerWriteStream::writeElement(std::uint32_t tag, double value) {
    startElement(tag);
    writeValue(value);
    endElement();
}

void BXSerializerWriteStream::writeElement(std::uint32_t tag, Tempus const& value) {
    startElement(tag);
    writeValue(value);
    endElement();
}

bool BXStreamElement::getAsString(BXString* out) const { return readIfThere(text(), out); }
bool BXStreamElement::getAsUInt32(std::uint32_t* out) const { return readIfThere(text(), out); }
bool BXStreamElement::getAsInt32(std::int32_t* out) const { return readIfThere(text(), out); }
bool BXStreamElement::getAsUInt64(std::uint64_t* out) const { return readIfThere(text(), out); }
bool BXStreamElement::getAsBool(bool* out) const { return readIfThere(text(), out); }
bool BXStreamElement::getAsDouble(double* out) const { return readIfThere(text(), out); }
bool BXStreamElement::getAsTime(Tempus* out) const { return readIfThere(text(), out); }

bool BXStreamElement::getAttributeAsString(std::uint32_t tag, BXString* out) const {
    return readIfThere(attributeText(tag), out);
}
bool BXStreamElement::getAttributeAsUInt32(std::uint32_t tag, std::uint32_t* out) const {
    return readIfThere(attributeText(tag), out);
}
bool BXStreamElement::getAttributeAsUInt64(std::uint32_t tag, std::uint64_t* out) const {
    return readIfThere(attributeText(tag), out);
}
bool BXStreamElement::getAttributeAsBool(std::uint32_t tag, bool* out) const {
    return readIfThere(attributeText(tag), out);
}
bool BXStreamElement::getAttributeAsDouble(std::uint32_t tag, double* out) const {
    return readIfThere(attributeText(tag), out);
}
bool BXStreamElement::getAttributeAsTime(std::uint32_t tag, Tempus* out) const {
    return readIfThere(attributeText(tag), out);
}

BXUUID* BXStreamElement::getAttributeAsUUID(std::uint32_t tag) const {
    BXUUID uuid;
    return readIfThere(attributeText(tag), &uuid) ? new BXUUID(uuid) : nullptr;
}
