#include "lumenkey/foundation/BXSerializerStreams.h"

BXSerializerWriteStream::~BXSerializerWriteStream() = default;
BXSerializerReadStream::~BXSerializerReadStream() = default;
BXStreamElement::~BXStreamElement() = default;

bool BXSerializerWriteStream::isHashStream() const { return false; }
