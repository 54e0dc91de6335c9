#pragma once

#include "lumenkey/Channels/KFChannelBase.h"
#include "tools/import/DocumentFile.h"
#include "tools/import/InputText.h"
#include "tools/output/OutputSink.h"

#include <cstddef>

namespace lumenkey::tools {

/// Writes a channel, and all below it, as a document, block by block. What the sink throws comes out again.
/// Throws `OutputError` where the text would not hold everything. `progress` is told the share of the
/// channels and keypoints that are out, of which there are `count`.
void writeDocument(KFChannelBase& top, OutputSink& out, std::size_t count = 0,
                   ReadingProgress const& progress = {});

} // namespace lumenkey::tools
