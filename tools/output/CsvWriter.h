#pragma once

#include "tools/output/OutputSink.h"

#include <string>
#include <string_view>

namespace lumenkey::tools {

/// Rows of comma-separated values as RFC 4180 has them, with plain line ends: a field that holds a comma, a
/// quotation mark or a line end, or has a blank at either end, stands in quotation marks, with its own ones
/// doubled.
class CsvWriter {
public:
    explicit CsvWriter(OutputSink& out) : _out(out) {}

    void field(std::string_view text);
    /// Likewise, but in quotation marks where it is empty: there is one.
    void name(std::string_view text);
    /// The shortest decimal that reads back to the same bits; an empty field for what isn't finite, which
    /// tables can't hold.
    void number(double value);
    void endRow();
    /// The last of the text is out only after this.
    void finish();

private:
    void separate();

    OutputSink& _out;
    /// What isn't written yet.
    std::string _pending;
    bool _hasField = false;
};

} // namespace lumenkey::tools
