// GSL's cubic spline with accelerator. It interpolates the keys' values smoothly and knows no handles: a
// curve without anything to solve, so our unsolved types are held against it.

#include "bench/Benchmarks.h"
#include "bench/Subjects.h"

#ifdef LUMENKEY_BENCH_GSL

#include <gsl/gsl_spline.h>

namespace {

class GslCurve {
public:
    explicit GslCurve(std::vector<Key> const& keys) {
        std::vector<double> times;
        std::vector<double> values;
        for (Key const& key : keys) {
            times.push_back(key.seconds());
            values.push_back(key.value);
        }
        _spline = gsl_spline_alloc(gsl_interp_cspline, keys.size());
        _accelerator = gsl_interp_accel_alloc();
        gsl_spline_init(_spline, times.data(), values.data(), keys.size());
    }
    ~GslCurve() {
        gsl_interp_accel_free(_accelerator);
        gsl_spline_free(_spline);
    }
    GslCurve(GslCurve const&) = delete;
    GslCurve& operator=(GslCurve const&) = delete;

    double operator()(double seconds) const { return gsl_spline_eval(_spline, seconds, _accelerator); }

private:
    gsl_spline* _spline;
    gsl_interp_accel* _accelerator;
};

Contest besideGsl(Bench const& bench, std::size_t size, std::uint32_t type,
                  Queries (*queries)(std::vector<Key> const&)) {
    auto const keys = makeKeys(size);
    PointReads ours(keys, type, queries(keys));
    auto const curve = std::make_shared<GslCurve>(keys);
    requireAgreement("GSL, the first key", keys.front().value, (*curve)(0.0), 1e-9);
    auto const read = [curve, positions = ours.queries](std::size_t i) {
        return (*curve)(positions->seconds[i]);
    };
    return {timePerItem(bench, ours.queries->size(), ours.pass()),
            timePerItem(bench, ours.queries->size(), readAll(ours.queries->size(), read))};
}

struct Subject {
    char const* name;
    std::uint32_t type;
    bool judged;
};

} // namespace

void registerGsl(Bench& bench) {
    for (Subject const& subject :
         {Subject{"Linear", kKFInterpolationLinear, true}, Subject{"Ease", kKFInterpolationEase, true},
          Subject{"Bezier", kKFInterpolationBezier, false}}) {
        for (auto const& [order, queries] :
             {std::pair{"ascending", &everyFrame}, std::pair{"random", &atRandom}}) {
            for (std::size_t const size : kSizes) {
                Bound const bound = subject.judged && size == 1000 ? Bound::atMost(1.0) : Bound::none();
                registerContest(bench,
                                {withSize(std::string("beside GSL/") + subject.name + "/" + order, size),
                                 "gsl_spline_eval, cubic", bound,
                                 [&bench, size, type = subject.type, positions = queries] {
                                     return besideGsl(bench, size, type, positions);
                                 }});
            }
        }
    }
}

#else

void registerGsl(Bench& bench) { bench.report.note("GSL wasn't found when this was built (libgsl-dev)."); }

#endif
