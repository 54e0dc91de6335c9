#include "lumenkey/curves/KFRecordedPoints.h"

#include <algorithm>

namespace {

constexpr std::size_t kStillOpen = 2;

} // namespace

void KFRecordedPoints::clear() noexcept {
    _points.clear();
    _highestBefore = -std::numeric_limits<double>::max();
    _lowestBefore = std::numeric_limits<double>::max();
}

void KFRecordedPoints::append(Point const& point) {
    _points.push_back(point);
    settle();
}

void KFRecordedPoints::append(Point const& head, Point const& point, Point const& tail) {
    _points.insert(_points.end(), {head, point, tail});
    settle();
}

void KFRecordedPoints::replaceLast(Point const& point, Point const& tail) {
    _points.push_back(tail);
    _points[_points.size() - 2] = point;
    settle();
}

void KFRecordedPoints::settle() noexcept {
    if (_points.size() <= kStillOpen)
        return;
    double const settled = _points[_points.size() - kStillOpen - 1].value;
    _highestBefore = std::max(_highestBefore, settled);
    _lowestBefore = std::min(_lowestBefore, settled);
}

double KFRecordedPoints::between(Point const& from, Point const& to, Tempus const& t) noexcept {
    return from.value + (to.value - from.value) * TempusFraction(t, from.time, to.time);
}

double KFRecordedPoints::valueAt(Tempus const& t) const {
    auto const next = std::lower_bound(_points.begin(), _points.end(), t,
                                       [](Point const& point, Tempus const& u) { return point.time < u; });
    return next->time == t ? next->value : between(*(next - 1), *next, t);
}

double KFRecordedPoints::highest() const noexcept {
    double result = std::max(_highestBefore, _points.back().value);
    return _points.size() < kStillOpen ? result
                                       : std::max(result, _points[_points.size() - kStillOpen].value);
}

double KFRecordedPoints::lowest() const noexcept {
    double result = std::min(_lowestBefore, _points.back().value);
    return _points.size() < kStillOpen ? result
                                       : std::min(result, _points[_points.size() - kStillOpen].value);
}
