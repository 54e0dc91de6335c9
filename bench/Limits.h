#pragma once

#include "bench/Curves.h"
#include "lumenkey/splines/KFCubic.h"

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <vector>

/// What can be had at best: the keys of a cubic curve in arrays of doubles, times in seconds. It keeps the
/// current segment's polynomial, solves U by the same root finder as the library, and has neither lock, nor
/// exact time, nor edits. Positions lie between the first and the last key.
class CubicArrays {
public:
    explicit CubicArrays(std::vector<Key> const& keys) {
        for (Key const& key : keys) {
            _times.push_back(key.seconds());
            _values.push_back(key.value);
            _outU.push_back(key.out.u);
            _outV.push_back(key.out.v);
            _inU.push_back(key.in.u);
            _inV.push_back(key.in.v);
        }
        prepare(0);
    }

    /// For positions that mostly ascend: the next segment is tried first.
    double ascending(double seconds) noexcept {
        if (!holds(seconds)) {
            if (seconds >= _high && _segment + 2 < _times.size() && seconds < _times[_segment + 2]) {
                prepare(_segment + 1);
            } else {
                search(seconds);
            }
        }
        return value(seconds);
    }

    double anywhere(double seconds) noexcept {
        if (!holds(seconds))
            search(seconds);
        return value(seconds);
    }

private:
    bool holds(double seconds) const noexcept { return _low <= seconds && seconds < _high; }
    double value(double seconds) const noexcept { return _polynomial(_parameter((seconds - _low) / _width)); }

    void search(double seconds) noexcept {
        auto const after = std::upper_bound(_times.begin() + 1, _times.end() - 1, seconds);
        prepare(static_cast<std::size_t>(after - _times.begin()) - 1);
    }

    void prepare(std::size_t segment) noexcept {
        std::size_t const end = segment + 1;
        _segment = segment;
        _low = _times[segment];
        _high = _times[end];
        _width = _high - _low;
        double const polygonU[4] = {0.0, _outU[segment] / _width, 1.0 + _inU[end] / _width, 1.0};
        double const polygonV[4] = {_values[segment], _values[segment] + _outV[segment],
                                    _values[end] + _inV[end], _values[end]};
        _parameter.prepare(polygonU);
        _polynomial = KFCubic::fromBezier(polygonV);
    }

    std::vector<double> _times, _values, _outU, _outV, _inU, _inV;
    std::size_t _segment = 0;
    double _low = 0.0, _high = 0.0, _width = 1.0;
    KFCubicInverse _parameter;
    KFCubic _polynomial;
};

/// One read for each position, of an array with the value of each segment; which segment is known beforehand.
class SegmentLookup {
public:
    SegmentLookup(std::vector<Key> const& keys, Queries const& queries) {
        for (Key const& key : keys)
            _values.push_back(key.value);
        std::size_t segment = 0;
        for (double const seconds : queries.seconds) {
            while (segment + 2 < keys.size() && keys[segment + 1].seconds() <= seconds)
                ++segment;
            _segments.push_back(static_cast<std::uint32_t>(segment));
        }
    }

    std::size_t size() const noexcept { return _segments.size(); }
    double operator()(std::size_t query) const noexcept { return _values[_segments[query]]; }

private:
    std::vector<double> _values;
    std::vector<std::uint32_t> _segments;
};
