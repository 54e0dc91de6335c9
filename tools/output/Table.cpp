#include "tools/output/Table.h"

#include "tools/output/TextForms.h"

#include <algorithm>

namespace lumenkey::tools {

namespace {

/// `text` in a cell of `width`.
std::string padded(std::string const& text, std::size_t width, Align align) {
    std::size_t const own = widthOfText(text);
    std::string const space(width > own ? width - own : 0, ' ');
    return align == Align::Right ? space + text : text + space;
}

} // namespace

void Table::write(OutputSink& out) const {
    std::vector<std::size_t> widths;
    for (TableColumn const& column : columns) {
        widths.push_back(widthOfText(column.title));
    }
    auto const tell = [&](std::size_t rows) {
        if (progress) {
            progress(static_cast<double>(rows) / (2 * static_cast<double>(rowCount)));
        }
    };
    for (std::size_t row = 0; row < rowCount; ++row) {
        tell(row);
        for (std::size_t i = 0; i < columns.size(); ++i) {
            widths[i] = std::max(widths[i], widthOfText(printableText(cell(row, i))));
        }
    }
    auto const writeRow = [&](auto const& textOf) {
        std::string line;
        for (std::size_t i = 0; i < columns.size(); ++i) {
            line += (i == 0 ? "" : "  ");
            line += padded(printableText(textOf(i)), widths[i], columns[i].align);
        }
        line.resize(line.find_last_not_of(' ') + 1); // empty cells at the end
        out.write(line + "\n");
    };
    writeRow([&](std::size_t i) { return columns[i].title; });
    for (std::size_t row = 0; row < rowCount; ++row) {
        tell(rowCount + row);
        writeRow([&](std::size_t i) { return cell(row, i); });
    }
}

} // namespace lumenkey::tools
