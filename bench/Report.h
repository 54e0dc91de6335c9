#pragma once

#include <iosfwd>
#include <string>
#include <vector>

/// What a ratio is held against.
struct Bound {
    enum class Kind { None, AtMost, AtLeast };

    Kind kind = Kind::None;
    double value = 0.0;

    static Bound none() noexcept { return {}; }
    static Bound atMost(double value) noexcept { return {Kind::AtMost, value}; }
    static Bound atLeast(double value) noexcept { return {Kind::AtLeast, value}; }
    bool isMetBy(double ratio) const noexcept;
};

struct ReportRow {
    std::string name;
    /// Ours and the one beside it, in `unit`.
    double figure = 0.0;
    double limit = 0.0;
    std::string unit;
    /// What the limit is.
    std::string against;
    double ratio = 0.0;
    Bound bound;
};

/// What the benchmarks found, in the order in which they ran.
class Report {
public:
    void add(ReportRow row) { _rows.push_back(std::move(row)); }
    /// A line below the table.
    void note(std::string line) { _notes.push_back(std::move(line)); }

    bool empty() const noexcept { return _rows.empty(); }
    void printTable(std::ostream& out) const;
    /// A JSON array of objects with name, ratio and bound (null for none). A ratio that must be at least its
    /// bound has " (at least)" behind its name. False when the file couldn't be written.
    bool writeJson(std::string const& path) const;

private:
    std::vector<ReportRow> _rows;
    std::vector<std::string> _notes;
};
