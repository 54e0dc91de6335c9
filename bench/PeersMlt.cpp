// MLT's animated properties, as a filter reads them: by name, at whole frames.

#include "bench/Benchmarks.h"
#include "bench/Subjects.h"

#ifdef LUMENKEY_BENCH_MLT

#include <framework/mlt.h>

namespace {

/// Its frames are our ticks, so that all keys and positions stand where ours do.
class MltCurve {
public:
    MltCurve(std::vector<Key> const& keys, mlt_keyframe_type type)
        : _properties(mlt_properties_new()), _length(static_cast<int>(keys.back().ticks) + 1) {
        for (Key const& key : keys) {
            mlt_properties_anim_set_double(_properties, kName, key.value, static_cast<int>(key.ticks),
                                           _length, type);
        }
    }
    ~MltCurve() { mlt_properties_close(_properties); }
    MltCurve(MltCurve const&) = delete;
    MltCurve& operator=(MltCurve const&) = delete;

    double operator()(int frame) const {
        return mlt_properties_anim_get_double(_properties, kName, frame, _length);
    }

private:
    static constexpr char const* kName = "level";
    mlt_properties _properties;
    int _length;
};

using MakeQueries = Queries (*)(std::vector<Key> const&);

Contest besideMlt(Bench const& bench, std::size_t size, std::uint32_t type, mlt_keyframe_type keyframeType,
                  MakeQueries queries) {
    auto const keys = makeKeys(size);
    PointReads ours(keys, type, queries(keys));
    std::vector<int> frames;
    for (Tempus const& time : ours.queries->times) {
        frames.push_back(static_cast<int>(time.value * (kTimescale / time.timescale)));
    }
    auto const curve = std::make_shared<MltCurve>(keys, keyframeType);
    requireAgreement("MLT, the last key", keys.back().value, (*curve)(static_cast<int>(keys.back().ticks)),
                     1e-9);
    auto const read = [curve, frames](std::size_t i) { return (*curve)(frames[i]); };
    return {timePerItem(bench, frames.size(), ours.pass()),
            timePerItem(bench, frames.size(), readAll(frames.size(), read))};
}

struct Pairing {
    char const* name;
    char const* against;
    std::uint32_t type;
    mlt_keyframe_type keyframeType;
    bool judged;
};

constexpr Pairing kPairings[] = {
    {"Bezier", "smooth", kKFInterpolationBezier, mlt_keyframe_smooth, true},
    {"Linear", "linear", kKFInterpolationLinear, mlt_keyframe_linear, false},
};

} // namespace

void registerMlt(Bench& bench) {
    for (Pairing const& pairing : kPairings) {
        for (auto const& [order, queries] :
             {std::pair{"ascending", &everyFrame}, std::pair{"random", &atRandom}}) {
            for (std::size_t const size : {std::size_t{10}, std::size_t{1000}}) {
                Bound const bound = pairing.judged && size == 1000 ? Bound::atMost(0.05) : Bound::none();
                registerContest(
                    bench, {withSize(std::string("beside MLT/") + pairing.name + "/" + order, size),
                            pairing.against, bound, [&bench, size, pairing, positions = queries] {
                                return besideMlt(bench, size, pairing.type, pairing.keyframeType, positions);
                            }});
            }
        }
    }
    bench.report.note("MLT walks its keys one by one at each read; it isn't asked for 100,000 of them.");
}

#else

void registerMlt(Bench& bench) { bench.report.note("MLT wasn't found when this was built (libmlt-dev)."); }

#endif
