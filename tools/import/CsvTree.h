#pragma once

#include "tools/import/CsvFile.h"
#include "tools/tree/ChannelTree.h"

#include <memory>

namespace lumenkey::tools {

/// A `KFChannelDouble` for each column, with a linear keypoint for each cell that isn't empty.
std::unique_ptr<ChannelTree> treeOfCsv(CsvFile const& table);

/// The time between rows where that is always the same; else invalid.
Tempus rowDuration(CsvFile const& table);

} // namespace lumenkey::tools
