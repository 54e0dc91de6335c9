// GStreamer's interpolation control source: linear, and a natural cubic spline through the keys.

#include "bench/Benchmarks.h"
#include "bench/Subjects.h"

#ifdef LUMENKEY_BENCH_GSTREAMER

#include <cstdlib>

#include <gst/controller/gstinterpolationcontrolsource.h>
#include <gst/gst.h>

namespace {

GstClockTime toClockTime(Tempus const& time) {
    return static_cast<GstClockTime>(time.value) * GST_SECOND / static_cast<GstClockTime>(time.timescale);
}

class GstCurve {
public:
    GstCurve(std::vector<Key> const& keys, GstInterpolationMode mode) {
        start();
        _source = gst_interpolation_control_source_new();
        g_object_set(_source, "mode", mode, nullptr);
        auto* const timed = GST_TIMED_VALUE_CONTROL_SOURCE(_source);
        for (Key const& key : keys)
            gst_timed_value_control_source_set(timed, toClockTime(key.time()), key.value);
    }
    ~GstCurve() { gst_object_unref(_source); }
    GstCurve(GstCurve const&) = delete;
    GstCurve& operator=(GstCurve const&) = delete;

    double operator()(GstClockTime time) const {
        double value = 0.0;
        gst_control_source_get_value(_source, time, &value);
        return value;
    }
    void fill(GstClockTime start, GstClockTime step, std::vector<double>& values) const {
        gst_control_source_get_value_array(_source, start, step, static_cast<guint>(values.size()),
                                           values.data());
    }

private:
    /// Nothing here needs a plug-in, so none is looked for.
    static void start() {
        setenv("GST_REGISTRY_DISABLE", "yes", 0);
        gst_init(nullptr, nullptr);
    }

    GstControlSource* _source;
};

using MakeQueries = Queries (*)(std::vector<Key> const&);

Contest singleReads(Bench const& bench, std::size_t size, std::uint32_t type, GstInterpolationMode mode,
                    MakeQueries queries) {
    auto const keys = makeKeys(size);
    PointReads ours(keys, type, queries(keys));
    std::vector<GstClockTime> times;
    for (Tempus const& time : ours.queries->times)
        times.push_back(toClockTime(time));
    auto const curve = std::make_shared<GstCurve>(keys, mode);
    requireAgreement("GStreamer, the first key", keys.front().value, (*curve)(0), 1e-9);
    auto const read = [curve, times](std::size_t i) { return (*curve)(times[i]); };
    return {timePerItem(bench, times.size(), ours.pass()),
            timePerItem(bench, times.size(), readAll(times.size(), read))};
}

Contest rows(Bench const& bench, std::size_t size, std::int32_t perSecond, std::uint32_t type,
             GstInterpolationMode mode) {
    auto const keys = makeKeys(size);
    RowReads const ours(keys, type, perSecond);
    auto const values = std::make_shared<std::vector<double>>(ours.values->size());
    auto const curve = std::make_shared<GstCurve>(keys, mode);
    GstClockTime const step = GST_SECOND / static_cast<GstClockTime>(perSecond);
    auto const fill = [curve, step, values] {
        curve->fill(step, step, *values);
        benchmark::ClobberMemory();
    };
    return {timePerItem(bench, values->size(), ours), timePerItem(bench, values->size(), fill)};
}

struct Pairing {
    char const* name;
    char const* against;
    std::uint32_t type;
    GstInterpolationMode mode;
    bool judged;
};

constexpr Pairing kPairings[] = {
    {"Bezier", "cubic", kKFInterpolationBezier, GST_INTERPOLATION_MODE_CUBIC, true},
    {"Bezier beside monotonic", "monotonic cubic", kKFInterpolationBezier,
     GST_INTERPOLATION_MODE_CUBIC_MONOTONIC, false},
    {"Linear", "linear", kKFInterpolationLinear, GST_INTERPOLATION_MODE_LINEAR, false},
};

} // namespace

void registerGStreamer(Bench& bench) {
    for (Pairing const& pairing : kPairings) {
        std::string const name = std::string("beside GStreamer/") + pairing.name;
        for (auto const& [order, queries] :
             {std::pair{"ascending", &everyFrame}, std::pair{"random", &atRandom}}) {
            for (std::size_t const size : kSizes) {
                Bound const bound = pairing.judged && size == 1000 ? Bound::atMost(0.2) : Bound::none();
                registerContest(
                    bench, {withSize(name + "/" + order, size), std::string(pairing.against) + ", single",
                            bound, [&bench, size, pairing, positions = queries] {
                                return singleReads(bench, size, pairing.type, pairing.mode, positions);
                            }});
            }
        }
        for (std::size_t const size : kSizes) {
            Bound const bound = pairing.judged && size == 1000 ? Bound::atMost(1.0) : Bound::none();
            registerContest(bench, {withSize(name + "/row", size), std::string(pairing.against) + ", array",
                                    bound, [&bench, size, pairing] {
                                        return rows(bench, size, kFrames, pairing.type, pairing.mode);
                                    }});
        }
        registerContest(bench, {name + "/dense row/1000", std::string(pairing.against) + ", array",
                                pairing.judged ? Bound::atMost(1.0) : Bound::none(), [&bench, pairing] {
                                    return rows(bench, 1000, kDense, pairing.type, pairing.mode);
                                }});
    }
}

#else

void registerGStreamer(Bench& bench) {
    bench.report.note("GStreamer wasn't found when this was built (libgstreamer1.0-dev).");
}

#endif
