#include "lumenkey/foundation/BXSerializerStreams.h"

BXSerializerWriteStream::~BXSerializerWriteStream() = default;

bool BXSerializerWriteStream::isHashStream() const { return false; }
