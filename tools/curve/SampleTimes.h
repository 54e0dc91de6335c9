#pragma once

#include "lumenkey/curves/KFCurve.h"
#include "lumenkey/splines/KFSpline.h"

#include <cstddef>
#include <vector>

namespace lumenkey::tools {

/// The times at which curves are read: a row with a constant step, or a list.
class SampleTimes {
public:
    /// Time i is `start + step * i`.
    static SampleTimes row(Tempus const& start, Tempus const& step, std::size_t count);
    /// `count` times spread evenly, the first at `start` and the last at `end`, every one as exact as time
    /// is. A single one stands at `start`.
    static SampleTimes spread(Tempus const& start, Tempus const& end, std::size_t count);
    static SampleTimes list(std::vector<Tempus> times);

    std::size_t count() const { return _isRow ? _count : _list.size(); }
    Tempus at(std::size_t i) const;

    /// The values of a curve at `number` of these times from time `first` on, into room for as many. A row is
    /// read in one walk.
    void readValues(KFCurve& curve, std::size_t first, std::size_t number, double* values) const;
    /// Likewise the slopes of its spline; all 0 where it has none.
    void readSlopes(KFSpline* spline, std::size_t first, std::size_t number, double* slopes) const;

    /// At all these times.
    std::vector<double> values(KFCurve& curve) const;
    std::vector<double> slopes(KFSpline* spline) const;

private:
    bool _isRow = false;
    Tempus _start{};
    Tempus _step{};
    std::size_t _count = 0;
    std::vector<Tempus> _list;
};

} // namespace lumenkey::tools
