#include "tools/cli/EditVerb.h"

#include "tools/curve/Keypoint.h"

namespace lumenkey::tools {

namespace {

class Reverse : public EditVerb {
public:
    EditWords words() const override {
        EditWords words;
        words.name = "reverse";
        words.description = "Turn curves round in time";
        words.notes = "The keypoints of the stretch are mirrored about its middle.\n";
        words.example = "lumenkey reverse walk.bvh -o back.bvh";
        return words;
    }

    void prepare(ChannelFile const&, TimeSpan const& span) override { _bothEnds = span.from + span.to; }

    void apply(KFChannel& channel, TimeSpan const& span) override {
        editKeypointsWithin(channel, span, [this](KFCurve& curve) {
            std::vector<void*> const keypoints = everyKeypointHandle(*curve.getSpline());
            Tempus first{};
            Tempus last{};
            curve.getKeypoint(keypoints.front(), &first, nullptr);
            curve.getKeypoint(keypoints.back(), &last, nullptr);
            curve.reverseKeypoints(keypoints.front(), keypoints.back(), true); // about the middle of the two
            curve.forceRetimeCurve(TempusMake(1, 1), _bothEnds - (first + last));
        });
    }

private:
    /// Twice the middle of the stretch.
    Tempus _bothEnds{};
};

} // namespace

Verb declareReverse(CLI::App& program) { return declareEdit(program, std::make_shared<Reverse>()); }

} // namespace lumenkey::tools
