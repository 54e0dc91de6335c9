#include "tools/cli/EditVerb.h"

#include "tools/cli/UsageError.h"

#include <CLI/CLI.hpp>
#include <cmath>

namespace lumenkey::tools {

namespace {

class Bake : public EditVerb {
public:
    EditWords words() const override {
        EditWords words;
        words.name = "bake";
        words.description = "Replace keypoints by those of a smooth curve through samples";
        words.usage = "[--step T] [--tolerance X]";
        words.notes = "The last sample is that of the last whole step; keypoints behind it stay. Beside the "
                      "stretch the\ncurve can change too, up to the next keypoint.\n";
        words.example = "lumenkey bake walk.bvh Hips --step 1/24 -o baked.bvh";
        words.keepsShape = true;
        return words;
    }

    void addOptions(CLI::App& verb) override {
        _step.add(verb, "The curve is sampled at every step of the stretch");
        verb.add_option(
                "--tolerance", _tolerance,
                "How far the curve may go off a sample, in the unit of its channel: radians, or units")
            ->option_text("X")
            ->capture_default_str();
    }

    void readOptions() override {
        if (!std::isfinite(_tolerance) || _tolerance < 0) {
            throw UsageError{"--tolerance must be 0 or above"};
        }
        _step.read();
    }

    void prepare(ChannelFile const& file, TimeSpan const& span) override { _step.prepare(file, span); }
    std::optional<Tempus> sampleStep() const override { return _step.step(); }

    void apply(KFChannel& channel, TimeSpan const& span) override {
        constexpr double hundredths = 100;
        SampledStretch const stretch(span, _step.step());
        if (stretch.isEmpty()) {
            return;
        }
        KFCurve& curve = *channel.getCurveInterface();
        OutsideKept const kept(curve, {stretch.start, stretch.last});
        double const scale = scaleOfFit(curve, stretch.step);
        deleteDisabledAt(curve, stretch.start); // in the way of the keypoint for the first sample
        curve.bakeCurve(nullptr, stretch.start, stretch.step, stretch.end, _tolerance * scale * hundredths,
                        scale);
    }

private:
    /// Makes values small beside a step. The fit measures along the curve, and so it measures time: where
    /// values weigh more, handles between two samples come out too short or too long, and the curve swings.
    static double scaleOfFit(KFCurve& curve, Tempus const& step) {
        constexpr double share = 0.01;
        double least = 0;
        double greatest = 0;
        curve.getCurrentMinValueV(&least, false);
        curve.getCurrentMaxValueV(&greatest, false);
        double const scale = share * TempusGetSeconds(step) / (greatest - least);
        return std::isnormal(scale) ? scale : 1;
    }

    double _tolerance = 0;
    StepOption _step;
};

} // namespace

Verb declareBake(CLI::App& program) { return declareEdit(program, std::make_shared<Bake>()); }

} // namespace lumenkey::tools
