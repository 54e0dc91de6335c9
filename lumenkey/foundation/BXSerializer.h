#pragma once

#include "lumenkey/foundation/BXExport.h"

#include <cstdint>
#include <vector>

class BXSerializerReadStream;
class BXSerializerWriteStream;
class BXStreamElement;

/// A blob of bytes.
using BXData = std::vector<std::uint8_t>;

/// What a stream of documents calls back on reading, and what a class writes of itself.
///
/// Writing: whoever calls `writeHeader`, which leaves its element open, then calls `writeBody` and closes the
/// element. `full` asks for the form that stands alone, `children` for the children of a folder at all, `all` for
/// every child, modified or not. Reading: `parseBegin` when this object begins to receive elements, `parseElement`
/// for each of them, `parseEnd` when the enclosing element closes.
class LUMENKEY_API BXSerializer {
public:
    virtual ~BXSerializer();

    virtual void writeHeader(BXSerializerWriteStream& stream, bool full) = 0;
    virtual void writeBody(BXSerializerWriteStream& stream, bool full, bool children, bool all) = 0;
    virtual void markFactoriesForSerialization(BXSerializerWriteStream& stream, bool all) = 0;
    virtual bool parseBegin(BXSerializerReadStream& stream) = 0;
    virtual bool parseEnd(BXSerializerReadStream& stream) = 0;
    virtual bool parseElement(BXSerializerReadStream& stream, BXStreamElement& element) = 0;
    /// Whether white space between elements counts; here false.
    virtual bool readSignificantWhiteSpace();
};
