#include "tools/cli/EditVerb.h"

namespace lumenkey::tools {

namespace {

class Reverse : public EditVerb {
public:
    EditWords words() const override {
        return {"reverse",
                "Turn curves round in time",
                "",
                "Of the keypoints in the stretch the first changes places with the last, the second with the "
                "last "
                "but one.\n",
                "lumenkey reverse walk.bvh -o back.bvh",
                "largest change"};
    }

    void apply(KFChannel& channel, TimeSpan const& span) override {
        KFCurve& curve = *channel.getCurveInterface();
        std::vector<void*> const keypoints = keypointsWithin(curve, span);
        if (!keypoints.empty()) {
            curve.reverseKeypoints(keypoints.front(), keypoints.back(), true);
        }
    }

    bool movesInTime() const override { return true; }
};

} // namespace

Verb declareReverse(CLI::App& program) { return declareEdit(program, std::make_shared<Reverse>()); }

} // namespace lumenkey::tools
