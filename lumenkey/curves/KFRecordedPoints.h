// Internal: not installed.
#pragma once

#include "lumenkey/foundation/Tempus.h"

#include <cstddef>
#include <deque>
#include <limits>

/// The values of a take, ascending by time. Only the last two may still be changed or taken away, so the extremes of
/// those before them are kept as they come.
class KFRecordedPoints {
public:
    struct Point {
        Tempus time;
        double value;
        bool operator==(Point const& other) const noexcept {
            return time == other.time && value == other.value;
        }
    };

    bool empty() const noexcept { return _points.empty(); }
    std::size_t size() const noexcept { return _points.size(); }
    Point const& operator[](std::size_t index) const noexcept { return _points[index]; }
    Point const& first() const noexcept { return _points.front(); }
    Point const& last() const noexcept { return _points.back(); }
    bool operator==(KFRecordedPoints const& other) const { return _points == other._points; }

    void clear() noexcept;
    // Each adds all of its points or, for want of memory, none.
    void append(Point const& point);
    void append(Point const& head, Point const& point, Point const& tail);
    /// In the place of the last one.
    void replaceLast(Point const& point, Point const& tail);
    /// Of one of the last two.
    void setValue(std::size_t index, double value) noexcept { _points[index].value = value; }
    /// The extremes stay those of all that was there.
    void removeLast() noexcept { _points.pop_back(); }
    void removeFirst() noexcept { _points.pop_front(); }

    /// The value at a time from the first to the last point: a point's own, or on the line between two. O(log n).
    double valueAt(Tempus const& t) const;
    /// The extremes of a list that isn't empty. O(1).
    double highest() const noexcept;
    double lowest() const noexcept;

    static double between(Point const& from, Point const& to, Tempus const& t) noexcept;

private:
    /// The point that is none of the last two any more enters the extremes.
    void settle() noexcept;

    std::deque<Point> _points;
    double _highestBefore = -std::numeric_limits<double>::max();
    double _lowestBefore = std::numeric_limits<double>::max();
};
