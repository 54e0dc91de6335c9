#include "bench/Report.h"

#include <algorithm>
#include <array>
#include <charconv>
#include <fstream>
#include <iomanip>
#include <ostream>

namespace {

std::string fixed(double value, int digits) {
    std::array<char, 64> text;
    auto const end =
        std::to_chars(text.data(), text.data() + text.size(), value, std::chars_format::fixed, digits);
    return {text.data(), end.ptr};
}

std::string shortest(double value) {
    std::array<char, 64> text;
    auto const end = std::to_chars(text.data(), text.data() + text.size(), value);
    return {text.data(), end.ptr};
}

std::string measured(double value, std::string const& unit) {
    int const digits = value == static_cast<double>(static_cast<long long>(value)) ? 0
                       : value < 100.0                                             ? 2
                                                                                   : 1;
    return fixed(value, digits) + " " + unit;
}

std::string boundText(Bound const& bound) {
    switch (bound.kind) {
    case Bound::Kind::AtMost:
        return "<= " + shortest(bound.value);
    case Bound::Kind::AtLeast:
        return ">= " + shortest(bound.value);
    case Bound::Kind::None:
        break;
    }
    return "-";
}

using Line = std::array<std::string, 7>;

Line lineOf(ReportRow const& row) {
    bool const judged = row.bound.kind != Bound::Kind::None;
    return {row.name,
            measured(row.figure, row.unit),
            measured(row.limit, row.unit),
            row.against,
            fixed(row.ratio, 3),
            boundText(row.bound),
            !judged                        ? "-"
            : row.bound.isMetBy(row.ratio) ? "met"
                                           : "NOT MET"};
}

/// Names are ASCII without quotes, so nothing needs escaping.
std::string jsonOf(ReportRow const& row) {
    bool const judged = row.bound.kind != Bound::Kind::None;
    std::string const sense = row.bound.kind == Bound::Kind::AtLeast ? " (at least)" : "";
    return "{\"name\": \"" + row.name + sense + "\", \"ratio\": " + shortest(row.ratio) +
           ", \"bound\": " + (judged ? shortest(row.bound.value) : "null") + "}";
}

} // namespace

bool Bound::isMetBy(double ratio) const noexcept {
    return kind == Kind::None || (kind == Kind::AtMost ? ratio <= value : ratio >= value);
}

void Report::printTable(std::ostream& out) const {
    std::vector<Line> lines{{"what", "ours", "limit", "against", "ratio", "bound", "met"}};
    for (ReportRow const& row : _rows)
        lines.push_back(lineOf(row));

    std::array<std::size_t, 7> widths{};
    for (Line const& line : lines) {
        for (std::size_t i = 0; i < line.size(); ++i)
            widths[i] = std::max(widths[i], line[i].size());
    }
    for (Line const& line : lines) {
        for (std::size_t i = 0; i < line.size(); ++i) {
            bool const isText = i == 0 || i == 3 || i == 6;
            out << (isText ? std::left : std::right) << std::setw(static_cast<int>(widths[i])) << line[i]
                << (i + 1 < line.size() ? "  " : "\n");
        }
    }
    for (std::string const& line : _notes)
        out << line << '\n';
}

bool Report::writeJson(std::string const& path) const {
    std::ofstream file(path);
    file << "[\n";
    for (std::size_t i = 0; i < _rows.size(); ++i) {
        file << "  " << jsonOf(_rows[i]) << (i + 1 < _rows.size() ? ",\n" : "\n");
    }
    file << "]\n";
    return file.flush().good();
}
