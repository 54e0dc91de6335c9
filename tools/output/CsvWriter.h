#pragma once

#include "tools/output/OutputSink.h"

#include <string>
#include <string_view>

namespace lumenkey::tools {

/// Rows of comma-separated values as RFC 4180 has them, with plain line ends: a field that holds a comma, a
/// quotation mark or a line end stands in quotation marks, with its own ones doubled.
class CsvWriter {
public:
    explicit CsvWriter(OutputSink& out) : _out(out) {}

    void field(std::string_view text);
    void endRow();

private:
    OutputSink& _out;
    std::string _row;
    bool _hasField = false;
};

} // namespace lumenkey::tools
