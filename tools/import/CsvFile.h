#pragma once

#include "lumenkey/foundation/Tempus.h"
#include "tools/import/InputText.h"

#include <cstddef>
#include <string>
#include <string_view>
#include <vector>

namespace lumenkey::tools {

/// A table of values over time as its file has it.
struct CsvFile {
    std::string file;
    /// Of the columns with values.
    std::vector<std::string> names;
    /// Of the rows, strictly ascending.
    std::vector<Tempus> times;
    /// Row by row: `values[row * names.size() + column]`, finite, or not a number where the cell is empty.
    std::vector<double> values;
};

/// Reads comma-separated values (RFC 4180): a row of names, then rows of numbers. Throws `InputError` for
/// what is unsound anywhere.
///
/// The first column is the time in seconds, whatever its name: a decimal, taken as it stands where exact time
/// can hold it and else rounded at the finest timescale, or `VALUE/TIMESCALE`, with a `~` behind it where
/// that was rounded. If the first two columns are called `time` and `seconds`, the second repeats the first
/// and is skipped.
///
/// Taken are a byte-order mark, all three kinds of line ends (carriage returns alone where there are no line
/// feeds; those within quotation marks become line feeds then), a last line without one, blank lines, blanks
/// around cells without quotation marks, a plus sign before a number, and empty cells (no value at that
/// time). A column may have an empty name in quotation marks, but not none. Only commas part cells.
CsvFile readCsvFile(std::string const& file, ReadingProgress const& progress = {});

/// The same for the content of a file; `file` is only its name.
CsvFile readCsvText(std::string_view text, std::string const& file, ReadingProgress const& progress = {});

} // namespace lumenkey::tools
