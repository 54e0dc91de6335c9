#pragma once

#include "lumenkey/Channels/KFChannelBase.h"
#include "tools/output/OutputSink.h"

namespace lumenkey::tools {

/// Writes a channel, and all below it, as a document of the version that the library writes, block by block. What the
/// sink throws comes out again. Throws `OutputError` where the text would not hold everything.
void writeDocument(KFChannelBase& top, OutputSink& out);

} // namespace lumenkey::tools
