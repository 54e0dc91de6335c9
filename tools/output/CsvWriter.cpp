#include "tools/output/CsvWriter.h"

#include "tools/output/TextForms.h"

namespace lumenkey::tools {

void CsvWriter::separate() {
    constexpr std::size_t enough = 65'536; // a row may be as long as a file
    if (_row.size() >= enough) {
        _out.write(_row);
        _row.clear();
    }
    if (_hasField) {
        _row += ',';
    }
    _hasField = true;
}

void CsvWriter::field(std::string_view text) {
    separate();
    if (text.find_first_of(",\"\r\n") == std::string_view::npos) {
        _row += text;
        return;
    }
    _row += '"';
    for (char const c : text) {
        _row += c;
        if (c == '"') {
            _row += c;
        }
    }
    _row += '"';
}

void CsvWriter::number(double value) {
    separate();
    appendShortest(_row, value);
}

void CsvWriter::endRow() {
    _row += '\n';
    _out.write(_row);
    _row.clear();
    _hasField = false;
}

} // namespace lumenkey::tools
