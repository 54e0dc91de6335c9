#include "tools/output/CsvWriter.h"

#include "tools/output/TextForms.h"

#include <cmath>

namespace lumenkey::tools {

namespace {

bool isBlank(char c) { return c == ' ' || c == '\t'; }

} // namespace

void CsvWriter::separate() {
    constexpr std::size_t enough = 65'536; // a row may be as long as a file
    if (_pending.size() >= enough) {
        finish();
    }
    if (_hasField) {
        _pending += ',';
    }
    _hasField = true;
}

void CsvWriter::field(std::string_view text) {
    separate();
    bool const hasOuterBlank = !text.empty() && (isBlank(text.front()) || isBlank(text.back()));
    if (!hasOuterBlank && text.find_first_of(",\"\r\n") == std::string_view::npos) {
        _pending += text;
        return;
    }
    _pending += '"';
    for (char const c : text) {
        _pending += c;
        if (c == '"') {
            _pending += c;
        }
    }
    _pending += '"';
}

void CsvWriter::name(std::string_view text) {
    field(text);
    _pending += text.empty() ? "\"\"" : "";
}

void CsvWriter::number(double value) {
    separate();
    if (std::isfinite(value)) {
        appendShortest(_pending, value);
    }
}

void CsvWriter::endRow() {
    _pending += '\n';
    _hasField = false;
}

void CsvWriter::finish() {
    _out.write(_pending);
    _pending.clear();
}

} // namespace lumenkey::tools
