#include "tools/cli/EditVerb.h"

#include "tools/cli/UsageError.h"
#include "tools/curve/Keypoint.h"
#include "tools/edit/CurveChange.h"

#include <CLI/CLI.hpp>
#include <cmath>
#include <cstdint>

namespace lumenkey::tools {

namespace {

class Simplify : public EditVerb {
public:
    EditWords words() const override {
        EditWords words;
        words.name = "simplify";
        words.description = "Draw curves by few keypoints, within a tolerance";
        words.usage = "--tolerance X [--step T]";
        words.notes = "Looked at at ten times in each frame or step, no curve goes off more than the "
                      "tolerance in the stretch. One that\n"
                      "fewer keypoints can't draw so well stays as it is.\n";
        words.example = "lumenkey simplify walk.bvh --tolerance 0.01 -o few.csv --rows keypoints";
        words.keepsShape = true;
        return words;
    }

    void addOptions(CLI::App& verb) override {
        verb.add_option("--tolerance", _tolerance,
                        "How far a curve may go off, in the unit of its channel: radians, or units")
            ->option_text("X")
            ->required();
        _step.add(verb, "The curve is fitted to samples at every step of the stretch, or more");
    }

    void readOptions() override {
        if (!std::isfinite(_tolerance) || _tolerance < 0) {
            throw UsageError{"--tolerance must be 0 or above"};
        }
        _step.read();
    }

    void prepare(ChannelFile const& file, TimeSpan const& span) override {
        _step.prepare(file, span);
        _stretch = span;
        _comparedStep = comparedStep(file, span, _step.step());
    }
    std::optional<Tempus> sampleStep() const override { return _step.step(); }

    /// The fit keeps to the tolerance at its samples alone, and between two of them a curve may jump. So the
    /// curve is looked at more closely than it was sampled, and fitted anew, to more samples and more
    /// strictly, while it is off.
    void apply(KFChannel& channel, TimeSpan const& span) override {
        KFCurve& curve = *channel.getCurveInterface();
        std::unique_ptr<KFCurveInterface> const copy(curve.cloneCurve());
        auto& before = static_cast<KFCurve&>(*copy);
        std::vector<Tempus> const beside = timesBeside(curve, span);
        for (std::uint32_t attempt = 0; attempt < kAttempts; ++attempt) {
            fit(curve, span, _step.step() / (1U << attempt), _tolerance * (1 - 0.05 * attempt));
            if (curve.getNumberOfKeypoints() >= before.getNumberOfKeypoints()) {
                break;
            }
            CurveChange change = changeBetween(before, curve, _stretch, _comparedStep);
            compareAtKeypoints(before, curve, change);
            compareAtTimes(beside, before, curve, change);
            if (change.most <= _tolerance) {
                return;
            }
            curve = before;
        }
        curve = before;
    }

private:
    static constexpr std::uint32_t kAttempts = 6;

    /// Beside the curve where the stretch ends with it: of several keypoints at one time that alone shows the
    /// last.
    std::vector<Tempus> timesBeside(KFCurve& curve, TimeSpan const& edited) const {
        KeypointEnds const ends = *keypointEnds(curve.getSpline());
        std::vector<Tempus> times;
        if (!(ends.first < edited.from)) {
            times.push_back(ends.first - _comparedStep);
        }
        if (!(edited.to < ends.last)) {
            times.push_back(ends.last + _comparedStep);
        }
        return times;
    }

    static void fit(KFCurve& curve, TimeSpan const& span, Tempus const& step, double tolerance) {
        constexpr double hundredths = 100;
        SampledStretch const stretch(span, step);
        if (stretch.isEmpty()) {
            return;
        }
        TimeSpan const fitted{stretch.start, stretch.last};
        OutsideKept const kept(curve, fitted);
        makeLinesBezier(curve, fitted);
        curve.simplifyCurve(stretch.start, stretch.end, stretch.step, tolerance * hundredths, 1,
                            KFCurve::kSimplifyByFit, 0);
    }

    double _tolerance = 0;
    StepOption _step;
    TimeSpan _stretch;
    Tempus _comparedStep{};
};

} // namespace

Verb declareSimplify(CLI::App& program) { return declareEdit(program, std::make_shared<Simplify>()); }

} // namespace lumenkey::tools
