// Internal: not installed.
#pragma once

#include "lumenkey/splines/KFSpline.h"

#include <vector>

/// Where rows of samples go: a caller's arrays, which are filled from their start, or vectors, which grow at their
/// end. Either target may be null.
class KFSampleSink {
public:
    /// Places for a row of samples, null where there is no target.
    struct Room {
        Tempus* times;
        double* values;
    };

    KFSampleSink(Tempus* times, double* values) noexcept : _times(times), _values(values) {}
    KFSampleSink(std::vector<Tempus>* times, std::vector<double>* values) noexcept
        : _timeVector(times), _valueVector(values) {}

    /// Room for the next `count` samples. The caller fills it before it asks again.
    Room next(std::uint32_t count) {
        Room const room{roomIn(_timeVector, _times, count), roomIn(_valueVector, _values, count)};
        _written += count;
        return room;
    }

    /// How many samples went in so far.
    std::uint32_t written() const noexcept { return _written; }

private:
    template <class Element>
    Element* roomIn(std::vector<Element>* vector, Element* array, std::uint32_t count) const {
        if (vector != nullptr) {
            std::size_t const size = vector->size();
            vector->resize(size + count);
            return vector->data() + size;
        }
        return array != nullptr ? array + _written : nullptr;
    }

    Tempus* _times = nullptr;
    double* _values = nullptr;
    std::vector<Tempus>* _timeVector = nullptr;
    std::vector<double>* _valueVector = nullptr;
    std::uint32_t _written = 0;
};

/// Sampling under the spline's lock, which the caller holds.
namespace KFSampling {

/// Sample i of a row: `start + step * i`.
inline Tempus position(Tempus const& start, Tempus const& step, std::uint32_t i) noexcept {
    return BX_TempusSaferAdd(start, step * i);
}

/// The samples `first` to `first + count - 1` of a row.
void sampleUniform(KFSpline& spline, Tempus const& start, Tempus const& step, std::uint32_t first,
                   std::uint32_t count, Tempus const& t, KFSampleSink& sink);

/// The sample at one position.
void sampleOne(KFSpline& spline, Tempus const& u, Tempus const& t, KFSampleSink& sink);

/// The strategy that draws the whole of a parametric spline as one function; null where segments are drawn.
KFInterpolator* wholeCurveStrategy(KFSpline& spline);

/// Walks from vertex to vertex and spends samples only where the curve bends. Returns the new number of samples.
///
/// The two walks differ, since callers rely on each: the one into arrays ends at position `count`, counts a Bezier
/// segment between flat handles as straight, and writes no sample at a vertex between two curved segments; the one
/// into vectors ends at position `count - 1` (with a `count` of 0 at `start`) and writes both ends of each straight
/// segment.
std::uint32_t walkIntoArrays(KFSpline& spline, Tempus const& start, Tempus const& step, std::uint32_t count,
                             Tempus const& t, KFSampleSink& sink);
std::uint32_t walkIntoVectors(KFSpline& spline, Tempus const& start, Tempus const& step, std::uint32_t count,
                              Tempus const& t, KFSampleSink& sink);

} // namespace KFSampling
