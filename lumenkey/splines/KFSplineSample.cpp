#include "lumenkey/splines/KFSpline.h"

#include "lumenkey/splines/KFSplineAccess.h"
#include "lumenkey/splines/KFSplineSampler.h"
#include "lumenkey/splines/KFSplineSamples.h"

void KFSampling::sampleUniform(KFSpline& spline, Tempus const& start, Tempus const& step, std::uint32_t first,
                               std::uint32_t count, Tempus const& t, KFSampleSink& sink) {
    KFSampleSink::Room const room = sink.next(count);
    if (room.values != nullptr) {
        KFSplineSampler(spline, start, step, count, t, first).values(room.values);
    }
    if (room.times != nullptr) {
        for (std::uint32_t i = 0; i < count; ++i) {
            room.times[i] = position(start, step, first + i);
        }
    }
}

void KFSampling::sampleOne(KFSpline& spline, Tempus const& u, Tempus const& t, KFSampleSink& sink) {
    KFSampleSink::Room const room = sink.next(1);
    if (room.values != nullptr) {
        *room.values = spline.getVertexValue(u, t, false);
    }
    if (room.times != nullptr) {
        *room.times = u;
    }
}

KFInterpolator* KFSampling::wholeCurveStrategy(KFSpline& spline) {
    if (!spline.getState()->parametric) {
        return nullptr;
    }
    std::uint32_t type = 0;
    spline.getInterpolation(&type, nullptr, nullptr);
    KFInterpolator* const strategy = spline.getInterpolator(type);
    return strategy->useKeypoints() ? nullptr : strategy;
}

namespace {

using KFSampling::position;

/// Samples of a curve that is one function. Those of an empty spline leave an array's values as they are, and are
/// the initial value in a vector.
void sampleAsOneCurve(KFSpline& spline, Tempus const& start, Tempus const& step, std::uint32_t count,
                      Tempus const& t, KFSampleSink& sink, bool intoVectors) {
    KFSampleSink::Room const room = sink.next(count);
    void* const first = spline.getFirstVertex();
    void* const last = spline.getLastVertex();
    for (std::uint32_t i = 0; i < count; ++i) {
        Tempus const u = position(start, step, i);
        if (room.values != nullptr && first != nullptr) {
            spline.interpolate(t, first, last, u, &room.values[i], false);
        } else if (room.values != nullptr && intoVectors) {
            room.values[i] = spline.getVertexValue(u, t, false);
        }
        if (room.times != nullptr) {
            room.times[i] = u;
        }
    }
}

/// `count` samples over the whole curve; `start` and the row's end only guide the strategy to its limits.
void sampleStretched(KFSpline& spline, KFInterpolator& strategy, Tempus const& start, Tempus const& step,
                     std::uint32_t count, Tempus const& t, KFSampleSink& sink, bool intoVectors) {
    Tempus const maxU = strategy.getAdjustedMaxU(spline, t, position(start, step, count));
    Tempus const minU = strategy.getAdjustedMinU(spline, t, start);
    // A single sample stands at the start of the curve.
    Tempus const stepU = count > 1 ? (maxU - minU) * (1.0 / (count - 1)) : kTempusZero;
    sampleAsOneCurve(spline, minU, stepU, count, t, sink, intoVectors);
}

/// With fewer than two valid vertices nothing bends: the samples at both ends of the row.
void sampleEnds(KFSpline& spline, Tempus const& start, Tempus const& step, std::uint32_t& count,
                Tempus const& t, KFSampleSink& sink) {
    KFSampling::sampleOne(spline, start, t, sink);
    if (count > 1) {
        KFSampling::sampleOne(spline, position(start, step, count - 1), t, sink);
        count = 2;
    }
}

void sampleInto(KFSpline& spline, Tempus const& start, Tempus const& step, std::uint32_t& count,
                Tempus const& t, bool adaptive, KFSampleSink& sink, bool intoVectors) {
    KFSplineAccess access(spline);
    if (KFInterpolator* const strategy = KFSampling::wholeCurveStrategy(spline)) {
        sampleStretched(spline, *strategy, start, step, count, t, sink, intoVectors);
    } else if (!adaptive) {
        KFSampling::sampleUniform(spline, start, step, 0, count, t, sink);
    } else if (spline.getNumberOfValidVertices(t) < 2) {
        sampleEnds(spline, start, step, count, t, sink);
    } else if (intoVectors) {
        count = KFSampling::walkIntoVectors(spline, start, step, count, t, sink);
    } else {
        count = KFSampling::walkIntoArrays(spline, start, step, count, t, sink);
    }
}

void sampleDerivativesInto(KFSpline& spline, Tempus const& start, Tempus const& step, std::uint32_t count,
                           Tempus const& t, KFSampleSink& sink) {
    KFSplineAccess access(spline);
    KFSampleSink::Room const room = sink.next(count);
    for (std::uint32_t i = 0; i < count; ++i) {
        Tempus const u = position(start, step, i);
        if (room.values != nullptr) {
            room.values[i] = spline.getDerivativeValue(u, t, false);
        }
        if (room.times != nullptr) {
            room.times[i] = u;
        }
    }
}

} // namespace

bool KFSpline::sampleSpline(Tempus const& start, Tempus const& step, std::uint32_t& count, Tempus* times,
                            double* values, Tempus const& t, bool adaptive) {
    KFSampleSink sink(times, values);
    sampleInto(*this, start, step, count, t, adaptive, sink, false);
    return true;
}

bool KFSpline::sampleSpline(Tempus const& start, Tempus const& step, std::uint32_t& count,
                            std::vector<Tempus>* times, std::vector<double>* values, Tempus const& t,
                            bool adaptive) {
    KFSampleSink sink(times, values);
    sampleInto(*this, start, step, count, t, adaptive, sink, true);
    return true;
}

bool KFSpline::sampleSplineSegment(Tempus const& start, Tempus const& step, std::uint32_t& count,
                                   Tempus* times, double* values, Tempus const& t, bool lock) {
    KFSplineAccess access(*this, lock);
    KFSampleSink sink(times, values);
    if (KFSampling::wholeCurveStrategy(*this) != nullptr) {
        sampleAsOneCurve(*this, start, step, count, t, sink, false);
    } else {
        KFSampling::sampleUniform(*this, start, step, 0, count, t, sink);
    }
    return true;
}

bool KFSpline::sampleSplineDerivatives(Tempus const& start, Tempus const& step, std::uint32_t& count,
                                       Tempus* times, double* values, Tempus const& t) {
    KFSampleSink sink(times, values);
    sampleDerivativesInto(*this, start, step, count, t, sink);
    return true;
}

bool KFSpline::sampleSplineDerivatives(Tempus const& start, Tempus const& step, std::uint32_t& count,
                                       std::vector<Tempus>* times, std::vector<double>* values,
                                       Tempus const& t) {
    KFSampleSink sink(times, values);
    sampleDerivativesInto(*this, start, step, count, t, sink);
    return true;
}
