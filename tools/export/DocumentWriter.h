#pragma once

#include "lumenkey/Channels/KFChannelBase.h"
#include "tools/output/OutputSink.h"

namespace lumenkey::tools {

/// The version of the documents that are written.
inline constexpr unsigned int kWrittenMajor = 5;
inline constexpr unsigned int kWrittenMinor = 13;

/// Writes a channel, and all below it, as a document, block by block. What the
/// sink throws comes out again. Throws `OutputError` where the text would not hold everything.
void writeDocument(KFChannelBase& top, OutputSink& out);

} // namespace lumenkey::tools
