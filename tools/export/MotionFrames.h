#pragma once

#include "tools/export/ChannelFileWriter.h"

namespace lumenkey::tools {

/// The motion that a file is as its tree is now, for `writeChannelFile` only.
WrittenRows writeMotionOf(FileToWrite const& wanted, OutputSink& out, ReadingProgress const& progress);

} // namespace lumenkey::tools
