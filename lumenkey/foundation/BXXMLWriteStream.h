#pragma once

#include "lumenkey/foundation/BXExport.h"
#include "lumenkey/foundation/BXSerializerStreams.h"
#include "lumenkey/foundation/BXStream.h"

#include <memory>
#include <string>

/// Writes a document as XML text in UTF-8:
///
///     <?xml version="1.0" encoding="UTF-8"?>
///     <kfml version="5.13">
///       <keypoint flags="0">
///         <time>48/24</time>
///         <closed/>
///       </keypoint>
///     </kfml>
///
/// Two spaces for each level, line feeds, attributes in the order of the calls, a value directly in its
/// element. The root element is the stream's own. The text goes out in blocks; memory follows the depth of
/// elements only. The same calls give the same bytes everywhere, whatever the locale.
///
/// Values as text: bool 1 or 0; whole numbers in decimal; a double as the shortest decimal that gives the
/// same bits again, or inf, -inf, nan; a time as VALUE/TIMESCALE with @EPOCH behind it unless that is 0 and ~
/// at the end if it has been rounded (48/24, 1/3~), or as invalid, indefinite, +infinity, -infinity; a UUID
/// in upper case. A string stands as it is, but for XML's own escapes; a byte that XML can't hold, such as a
/// zero or one that is no valid UTF-8, is \xHH, and a backslash that would read as the start of that is \x5C,
/// so that every string comes back byte for byte.
///
/// What has no place is left out, and the text stays well-formed: an element whose tag has no name in the
/// scopes in force, with all inside it; an attribute without a name, behind content, or that its element has
/// already; a value outside any element or behind a child; anything behind `close`. An `endElement` too many
/// does nothing. An element holds either children or a value: readers give nobody the value in front of a
/// child. What `BXXMLReadStream` would refuse is left out too: elements for their depth, nodes
/// (`allowsNode`), attributes beyond the thousandth, and strings that are too long, one by itself or those of
/// a tag together (64 MiB).
///
/// One object belongs to one thread at a time.
class LUMENKEY_API BXXMLWriteStream final : public BXSerializerWriteStream {
public:
    /// The sink isn't owned and must stay until `close`. The numbers are those of the document's version.
    BXXMLWriteStream(BXStream& sink, unsigned int major, unsigned int minor);
    /// Doesn't close: a document that wasn't stays cut off.
    ~BXXMLWriteStream() override;

    BXXMLWriteStream(BXXMLWriteStream const&) = delete;
    BXXMLWriteStream& operator=(BXXMLWriteStream const&) = delete;

    /// Ends the elements that are open and the root. True if the sink took everything and nothing was left
    /// out. Further calls only answer.
    bool close();

    /// Why `close` isn't true, as far as is known by now: the first that was left out, or that the sink has
    /// refused. Empty while all is well. Lives as long as the stream.
    std::string const& failure() const;

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
    /// Every element stands on a line of its own anyway.
    void endLine() override;
    bool allowsNode() override;
    void writeElement(std::uint32_t tag, double value) override;
    void writeElement(std::uint32_t tag, Tempus const& value) override;

private:
    class Writer;
    std::unique_ptr<Writer> _writer;
};
