#include "tools/cli/EditVerb.h"

namespace lumenkey::tools {

namespace {

class Smooth : public EditVerb {
public:
    EditWords words() const override {
        EditWords words;
        words.name = "smooth";
        words.description = "Take the jitter out of curves";
        words.usage = "[--step T]";
        words.notes = "Each step gets a keypoint, as high as a parabola through seven samples is there "
                      "(Savitzky and Golay 1964): the longer\n"
                      "the step, the smoother. The last one is that of the last whole step; keypoints behind "
                      "it stay.\nBeside the stretch the curve can change too, up to the next keypoint.\n";
        words.example =
            "lumenkey smooth walk.bvh Spine.Xrotation --from 1 --to 2 -o smooth.bvh --plot smooth.svg";
        return words;
    }

    void addOptions(CLI::App& verb) override {
        _step.add(verb, "The curve is sampled at every step of the stretch");
    }
    void readOptions() override { _step.read(); }
    void prepare(ChannelFile const& file, TimeSpan const& span) override { _step.prepare(file, span); }
    std::optional<Tempus> sampleStep() const override { return _step.step(); }

    void apply(KFChannel& channel, TimeSpan const& span) override {
        SampledStretch const stretch(span, _step.step());
        if (stretch.isEmpty()) {
            return;
        }
        KFCurve& curve = *channel.getCurveInterface();
        OutsideKept const kept(curve, {stretch.start, stretch.last});
        curve.smoothCurve(stretch.start, stretch.end, stretch.step);
    }

private:
    StepOption _step;
};

} // namespace

Verb declareSmooth(CLI::App& program) { return declareEdit(program, std::make_shared<Smooth>()); }

} // namespace lumenkey::tools
