#pragma once

#include "lumenkey/foundation/BXExport.h"
#include "lumenkey/foundation/BXSerializerStreams.h"

#include <array>
#include <cstdint>
#include <memory>

/// Makes a digest of all that is written, in constant memory and without a text: the 128-bit XXH3 of the
/// calls, by kind, tag and value, in one order of bytes, so that it is the same on every machine. It tells
/// states apart; it isn't proof against forgery.
///
/// Calls that differ in a tag, in the type or in a bit of a value give another input: "ab" and "c" aren't "a"
/// and "bc", a 32-bit 1 isn't a 64-bit one, 0.0 isn't -0.0. Only what is no number is the same whatever its
/// bits, as in a text. What lies inside what is told by how many scopes
/// are in force when an element starts, since everything that writes children pushes its scope around them.
/// So the end of an element gives nothing, and one that never started leaves no trace. Names and line ends
/// don't enter.
///
/// One object belongs to one thread at a time.
class LUMENKEY_API BXHashWriteStream final : public BXSerializerWriteStream {
public:
    BXHashWriteStream();
    ~BXHashWriteStream() override;

    BXHashWriteStream(BXHashWriteStream const&) = delete;
    BXHashWriteStream& operator=(BXHashWriteStream const&) = delete;

    /// Of all so far, the high byte first. Writing may go on behind it.
    std::array<std::uint8_t, 16> getHash();

    void pushScope(BXScope const* scope) override;
    void popScope() override;
    void startElement(std::uint32_t tag) override;
    void endElement() override;
    void writeValue(bool value) override;
    void writeValue(std::uint32_t value) override;
    void writeValue(std::uint64_t value) override;
    void writeValue(double value) override;
    void writeValue(BXString const& value) override;
    void writeValue(BXUUID const& value) override;
    void writeValue(Tempus const& value) override;
    void writeAttribute(std::uint32_t tag, bool value) override;
    void writeAttribute(std::uint32_t tag, std::uint32_t value) override;
    void writeAttribute(std::uint32_t tag, std::uint64_t value) override;
    void writeAttribute(std::uint32_t tag, double value) override;
    void writeAttribute(std::uint32_t tag, BXString const& value) override;
    void writeAttribute(std::uint32_t tag, BXUUID const& value) override;
    void writeAttribute(std::uint32_t tag, Tempus const& value) override;
    void endLine() override;
    void writeElement(std::uint32_t tag, double value) override;
    void writeElement(std::uint32_t tag, Tempus const& value) override;
    bool isHashStream() const override;

private:
    class Digest;
    std::unique_ptr<Digest> _digest;
};
