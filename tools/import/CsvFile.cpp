#include "tools/import/CsvFile.h"

#include "tools/import/MotionScanner.h"
#include "tools/output/TextForms.h"
#include "tools/time/ExactDecimal.h"
#include "tools/time/TimeFraction.h"

#include <algorithm>
#include <limits>
#include <optional>

namespace lumenkey::tools {

namespace {

bool isBlank(char c) { return c == ' ' || c == '\t'; }

/// A cell, and where it starts in the text. It is valid until the next one is read.
struct Cell {
    std::string_view text;
    std::size_t position;
    bool isQuoted = false;
};

/// Takes the cells of a text one by one.
class CellReader {
public:
    CellReader(std::string_view text, std::string const& file) : _text(text), _places(text, file) {}

    std::size_t position() const { return _position; }
    bool atEnd() const { return _position >= _text.size(); }
    /// Finds places for errors, and reads numbers.
    MotionScanner const& places() const { return _places; }

    /// To be called at the start of a line: steps over lines of blanks alone.
    void skipBlankLines() {
        for (std::size_t place = _position; place < _text.size(); ++place) {
            if (_text[place] == '\n') {
                _position = place + 1;
            } else if (!isBlank(_text[place]) && _text[place] != '\r') {
                return;
            }
        }
        _position = _text.size();
    }

    /// The next cell of the line, behind which another or the end of the line stands.
    Cell cell() { return !atEnd() && _text[_position] == '"' ? quotedCell() : plainCell(); }

    /// Steps over the comma behind a cell; false, having stepped over the line end, where the line is over.
    bool continueLine() {
        bool const continues = !atEnd() && _text[_position] == ',';
        _position += atEnd() ? 0 : 1;
        return continues;
    }

private:
    Cell plainCell() {
        std::size_t begin = _position;
        while (!atEnd() && _text[_position] != ',' && _text[_position] != '\n') {
            if (_text[_position] == '"') {
                _places.fail(_position, "a quotation mark inside a cell that doesn't start with one");
            }
            ++_position;
        }
        std::size_t end = _position;
        bool const endsLine = atEnd() || _text[_position] == '\n';
        end -= endsLine && end > begin && _text[end - 1] == '\r' ? 1 : 0;
        while (begin < end && isBlank(_text[begin])) {
            ++begin;
        }
        while (begin < end && isBlank(_text[end - 1])) {
            --end;
        }
        std::string_view const text = _text.substr(begin, end - begin);
        if (std::size_t const stray = text.find('\r'); stray != std::string_view::npos) {
            _places.fail(begin + stray, "a carriage return inside a line; lines end in another way here");
        }
        return {text, begin};
    }

    Cell quotedCell() {
        std::size_t const start = _position;
        _unquoted.clear();
        for (;;) {
            std::size_t const mark = _text.find('"', ++_position);
            if (mark == std::string_view::npos) {
                _places.fail(start, "this quotation mark is never closed");
            }
            _unquoted += _text.substr(_position, mark - _position);
            _position = mark + 1;
            if (atEnd() || _text[_position] != '"') {
                break;
            }
            _unquoted += '"';
        }
        if (_text.substr(_position, 2) == "\r\n" || _text.substr(_position) == "\r") {
            ++_position;
        }
        if (!atEnd() && _text[_position] != ',' && _text[_position] != '\n') {
            _places.fail(_position, "more stands here, behind the closing quotation mark");
        }
        return {_unquoted, start, true};
    }

    std::string_view _text;
    MotionScanner _places;
    std::size_t _position = 0;
    std::string _unquoted;
};

class TableReader {
public:
    TableReader(std::string_view text, CsvFile& table, ReadingProgress const& progress)
        : _size(text.size()), _cells(text, table.file), _table(table), _progress(progress) {}

    void read() {
        _cells.skipBlankLines();
        readNames();
        _cells.skipBlankLines();
        while (!_cells.atEnd()) {
            readRow();
            if (_progress && _table.times.size() % 64 == 0) {
                _progress(static_cast<double>(_cells.position()) / static_cast<double>(_size));
            }
            _cells.skipBlankLines();
        }
    }

private:
    void readNames() {
        std::size_t const start = _cells.position();
        bool isTime = false;
        do {
            Cell const cell = _cells.cell();
            if (_columns == 0) {
                bool const isNumber =
                    timeFromFraction(withoutMark(cell.text)).timescale > 0 || ExactDecimal::parse(cell.text);
                if (isNumber && !cell.isQuoted) {
                    _cells.places().fail(cell.position, quoted(cell.text) +
                                                            " is a time, where the first line "
                                                            "names the columns");
                }
                isTime = cell.text == "time";
            } else if (_columns == 1 && isTime && cell.text == "seconds") {
                _skipped = 1;
            } else if (cell.text.empty() && !cell.isQuoted) {
                _cells.places().fail(cell.position, "the name of the column is missing");
            } else {
                _table.names.emplace_back(cell.text);
            }
            ++_columns;
        } while (_cells.continueLine());
        if (_table.names.empty()) {
            _cells.places().fail(start,
                                 "a table has a column of times and at least one of values, with commas "
                                 "between them");
        }
    }

    void readRow() {
        std::size_t column = 0;
        std::size_t end = 0;
        do {
            Cell const cell = _cells.cell();
            end = _cells.position();
            if (column == 0) {
                readTime(cell);
            } else if (column >= _columns) {
                failForWidth(cell.position, "more stand here");
            } else if (column > _skipped) {
                readValue(cell);
            }
            ++column;
        } while (_cells.continueLine());
        if (column < _columns) {
            failForWidth(end, std::to_string(column) + (column == 1 ? " is there" : " are there"));
        }
    }

    [[noreturn]] void failForWidth(std::size_t position, std::string const& what) {
        _cells.places().fail(position, "a row has " + std::to_string(_columns) + " cells, but " + what);
    }

    /// Of a time that was rounded.
    static std::string_view withoutMark(std::string_view text) {
        return text.substr(0, text.size() - (text.ends_with('~') ? 1 : 0));
    }

    void readTime(Cell const& cell) {
        Tempus const time = timeOf(cell);
        if (!_table.times.empty() && time <= _table.times.back()) {
            _cells.places().fail(cell.position,
                                 quoted(cell.text) + " doesn't come after the time of the row before");
        }
        _table.times.push_back(time);
    }

    Tempus timeOf(Cell const& cell) const {
        Tempus time = kTempusInvalid;
        if (cell.text.find('/') != std::string_view::npos) {
            bool const wasRounded = cell.text.ends_with('~');
            time = timeFromFraction(withoutMark(cell.text));
            time.flags |= wasRounded && TempusIsNumeric(time) ? kTempusFlagHasBeenRounded : 0;
        } else if (std::optional<ExactDecimal> const number = ExactDecimal::parse(cell.text)) {
            time = number->toTempus();
            time = TempusIsNumeric(time) ? time : number->toNearestTempus();
            if (!TempusIsNumeric(time)) {
                _cells.places().fail(cell.position, quoted(cell.text) + " goes beyond exact time");
            }
        }
        if (!TempusIsNumeric(time)) {
            _cells.places().fail(cell.position, cell.text.empty()
                                                    ? "the time is missing"
                                                    : quoted(cell.text) + " is no time in seconds");
        }
        return time;
    }

    void readValue(Cell const& cell) {
        _table.values.push_back(cell.text.empty() ? std::numeric_limits<double>::quiet_NaN()
                                                  : _cells.places().numberFrom(cell.text, cell.position));
    }

    std::size_t _size;
    CellReader _cells;
    CsvFile& _table;
    ReadingProgress const& _progress;
    /// All of them, and how many stand unread behind that of the times.
    std::size_t _columns = 0;
    std::size_t _skipped = 0;
};

} // namespace

CsvFile readCsvText(std::string_view text, std::string const& file, ReadingProgress const& progress) {
    CsvFile table;
    table.file = file;
    text = checkedInputText(text, file);
    std::string withLineFeeds;
    if (text.find('\n') == std::string_view::npos && text.find('\r') != std::string_view::npos) {
        withLineFeeds = text;
        std::replace(withLineFeeds.begin(), withLineFeeds.end(), '\r', '\n');
        text = withLineFeeds;
    }
    TableReader(text, table, progress).read();
    return table;
}

CsvFile readCsvFile(std::string const& file, ReadingProgress const& progress) {
    return readCsvText(readInputText(file), file, progress);
}

} // namespace lumenkey::tools
