#include "lumenkey/foundation/BXSerializer.h"

BXSerializer::~BXSerializer() = default;

bool BXSerializer::readSignificantWhiteSpace() { return false; }
