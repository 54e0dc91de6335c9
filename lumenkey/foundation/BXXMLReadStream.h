#pragma once

#include "lumenkey/foundation/BXExport.h"
#include "lumenkey/foundation/BXSerializer.h"
#include "lumenkey/foundation/BXSerializerStreams.h"
#include "lumenkey/foundation/BXURL.h"

#include <cstdint>
#include <functional>
#include <memory>
#include <span>
#include <string>

/// Why a document could not be read, and where that was noticed.
struct BXReadFailure {
    /// Both counted from 1, columns in characters, a byte order mark being none; 0 for what concerns the file
    /// and no place in it.
    std::uint64_t line = 0;
    std::uint64_t column = 0;
    std::string reason;
};

/// Reads an XML document, block by block as the parser needs it, and gives it to handlers.
///
///     BXXMLReadStream stream(BXURL("walk.kfml"));
///     stream.pushHandler(&parser);
///     if (!stream.parse()) { std::cerr << stream.failure()->line << ": " << stream.failure()->reason; }
///
/// The text may be UTF-8, UTF-16, ISO-8859-1 or US-ASCII, as a byte order mark or the declaration tells. Text
/// beside elements in an element counts nowhere, so `readSignificantWhiteSpace` is never asked. Namespaces
/// are no more than parts of names. What is read may be hostile: document type declarations, and so entities
/// but XML's own, are refused; elements lie at most 1,000 deep, the root counted, and those that something is
/// made for (`allowsNode`) at most 990, so that it can be written and read again; a text, or a tag with all
/// its attributes, is at most 64 MiB long. Memory follows the longest of those and the number of different
/// names, not the document.
///
/// The first failure stops the reading; what handlers did until then stays. A handler that answers false is a
/// failure too, and what one throws comes out of `parse`. One object belongs to one thread; any number may
/// read at once.
class LUMENKEY_API BXXMLReadStream final : public BXSerializerReadStream {
public:
    /// Not copied: the bytes must stay until `parse` returns.
    explicit BXXMLReadStream(BXData const& data);
    explicit BXXMLReadStream(std::span<std::uint8_t const> bytes);
    explicit BXXMLReadStream(BXData&&) = delete;
    /// A file that can't be opened or read is a failure of `parse`.
    explicit BXXMLReadStream(BXURL const& url);
    ~BXXMLReadStream() override;

    BXXMLReadStream(BXXMLReadStream const&) = delete;
    BXXMLReadStream& operator=(BXXMLReadStream const&) = delete;

    /// A document of more bytes is a failure. 4 GiB unless set.
    void setSizeLimit(std::uint64_t bytes);
    /// Called with the bytes that have been read, after every block of some 64 KiB.
    void setProgress(std::function<void(std::uint64_t bytes)> progress);

    /// Handlers that are pushed before stand below all others and get the root element; scopes that are
    /// pushed before the first handler hold for the whole document. At the end, after a failure too, all
    /// handlers that haven't ended get their `parseEnd`, the last one first. A stream reads once: further
    /// calls give the same answer and do nothing, and a call by a handler answers false.
    bool parse();

    /// Null while nothing failed. Lives as long as the stream.
    BXReadFailure const* failure() const;

    void pushScope(BXScope const* scope) override;
    void pushHandler(BXSerializer* handler) override;
    void skipElement() override;
    bool allowsNode() override;

private:
    class Reading;
    std::unique_ptr<Reading> _reading;
};
