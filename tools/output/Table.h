#pragma once

#include "tools/output/OutputSink.h"

#include <cstddef>
#include <functional>
#include <string>
#include <vector>

namespace lumenkey::tools {

enum class Align { Left, Right };

struct TableColumn {
    std::string title;
    Align align = Align::Left;
};

/// A table for people, with its columns aligned and two spaces between them.
struct Table {
    std::vector<TableColumn> columns;
    std::size_t rowCount = 0;
    /// The text of a cell by row and column. Asked for twice, first for its width, so that no table is held
    /// in memory.
    std::function<std::string(std::size_t, std::size_t)> cell;
    /// Told the share of the work done, 0 .. 1, for each row.
    std::function<void(double)> progress;

    void write(OutputSink& out) const;
};

} // namespace lumenkey::tools
