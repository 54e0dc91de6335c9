#include "tools/output/CsvWriter.h"

namespace lumenkey::tools {

void CsvWriter::field(std::string_view text) {
    _row += _hasField ? "," : "";
    _hasField = true;
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

void CsvWriter::endRow() {
    _row += '\n';
    _out.write(_row);
    _row.clear();
    _hasField = false;
}

} // namespace lumenkey::tools
