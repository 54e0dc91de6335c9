#pragma once

#include "lumenkey/foundation/BXExport.h"
#include "lumenkey/foundation/BXSerializer.h"

class KFChannelBase;

/// The outermost handler of a document: reads its version and its factories, and hands its node to a channel.
///
/// The channel takes the ID of the node, and what stands inside it, flags too; its name and factory stay.
/// Factories that aren't registered are passed by. The version goes to the stream.
class LUMENKEY_API ChannelParser : public BXSerializer {
public:
    /// Not owned, not null.
    explicit ChannelParser(KFChannelBase* channel) noexcept : _channel(channel) {}
    ~ChannelParser() override;

    // Nothing is written.
    void writeHeader(BXSerializerWriteStream& stream, bool full) override;
    void writeBody(BXSerializerWriteStream& stream, bool full, bool children, bool all) override;
    void markFactoriesForSerialization(BXSerializerWriteStream& stream, bool all) override;
    /// Announces a change of data on the channel.
    bool parseBegin(BXSerializerReadStream& stream) override;
    bool parseEnd(BXSerializerReadStream& stream) override;
    bool parseElement(BXSerializerReadStream& stream, BXStreamElement& element) override;

    /// Whether the document has held a node.
    bool hasFoundChannel() const noexcept { return _found; }

private:
    KFChannelBase* _channel;
    bool _found = false;
};
