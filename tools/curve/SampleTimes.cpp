#include "tools/curve/SampleTimes.h"

#include <cstdint>
#include <utility>

namespace lumenkey::tools {

SampleTimes SampleTimes::row(Tempus const& start, Tempus const& step, std::size_t count) {
    SampleTimes times;
    times._isRow = true;
    times._start = start;
    times._step = step;
    times._count = count;
    return times;
}

SampleTimes SampleTimes::spread(Tempus const& start, Tempus const& end, std::size_t count) {
    if (count < 2) {
        return row(start, kTempusZero, count);
    }
    Tempus const span = end - start;
    auto const steps = static_cast<std::uint32_t>(count - 1);
    Tempus const step = span / steps;
    if (!TempusHasBeenRounded(step)) {
        return row(start, step, count);
    }
    std::vector<Tempus> times;
    times.reserve(count);
    for (std::uint32_t i = 0; i < steps; ++i) {
        times.push_back(start + span * TempusMake(i, 1) / steps);
    }
    times.push_back(end);
    return list(std::move(times));
}

SampleTimes SampleTimes::list(std::vector<Tempus> times) {
    SampleTimes made;
    made._list = std::move(times);
    return made;
}

Tempus SampleTimes::at(std::size_t i) const {
    return _isRow ? BX_TempusSaferAdd(_start, _step * static_cast<std::uint32_t>(i)) : _list[i];
}

void SampleTimes::readValues(KFCurve& curve, std::size_t first, std::size_t number, double* values) const {
    if (_isRow) {
        auto sampled = static_cast<std::uint32_t>(number);
        curve.getCurveSamples(at(first), _step, sampled, static_cast<Tempus**>(nullptr), &values);
        return;
    }
    for (std::size_t i = 0; i < number; ++i) {
        values[i] = curve.getValue(_list[first + i], 0.0);
    }
}

void SampleTimes::readSlopes(KFSpline* spline, std::size_t first, std::size_t number, double* slopes) const {
    for (std::size_t i = 0; i < number; ++i) {
        slopes[i] = spline == nullptr ? 0 : spline->getDerivativeValue(at(first + i), kTempusZero, true);
    }
}

std::vector<double> SampleTimes::values(KFCurve& curve) const {
    std::vector<double> values(count());
    readValues(curve, 0, count(), values.data());
    return values;
}

std::vector<double> SampleTimes::slopes(KFSpline* spline) const {
    std::vector<double> slopes(count());
    readSlopes(spline, 0, count(), slopes.data());
    return slopes;
}

} // namespace lumenkey::tools
