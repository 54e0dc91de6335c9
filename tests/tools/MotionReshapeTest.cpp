// Simplifying and smoothing a whole motion, made by the project's own generator: how far its channels are
// moved, and how many keypoints are left.

#include "lumenkey/curves/KFCurve.h"
#include "tests/tools/RunProgram.h"
#include "tests/tools/TestFolder.h"
#include "tools/import/ChannelFile.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>

namespace lumenkey::tools {
namespace {

/// A walk of 480 frames at 120 a second.
struct MotionReshape : testing::Test {
    TestFolder folder;
    ChannelFile walk;
    ChannelFile original;
    Tempus frame;

    MotionReshape() {
        std::string const file = folder.file("walk.bvh");
        runProgramFile(LUMENKEY_MAKE_MOTION, {file});
        walk = openChannelFile(file);
        original = openChannelFile(file);
        frame = walk.frameDuration;
    }
    template <class Visit> void forEachChannel(Visit visit) {
        for (ChannelTree::Node node = 0; node < walk.tree->count(); ++node) {
            if (walk.tree->isChannel(node)) {
                auto& channel = static_cast<KFChannel&>(walk.tree->base(node));
                auto& before = static_cast<KFChannel&>(original.tree->base(node));
                visit(channel, before);
            }
        }
    }
    /// The largest distance of two channels at `perFrame` places a frame, up to the last frame but one; so
    /// many frames `inside` of both ends.
    double distance(KFChannel const& a, KFChannel const& b, int perFrame, int inside = 0) const {
        double worst = 0.0;
        for (int i = inside * perFrame; i <= (static_cast<int>(walk.rows) - 2 - inside) * perFrame; ++i) {
            Tempus const t = walk.firstTime + frame * TempusMake(i, perFrame);
            worst = std::max(worst, std::fabs(a.getCurveValue(t, true) - b.getCurveValue(t, true)));
        }
        return worst;
    }
};

TEST_F(MotionReshape, SimplifyingKeepsTheToleranceWithFewKeypoints) {
    unsigned left = 0, all = 0;
    forEachChannel([&](KFChannel& channel, KFChannel& before) {
        SCOPED_TRACE(channel.getFullDisplayName().str());
        double const span = before.getKeyframeMaxValue(false) - before.getKeyframeMinValue(false);
        channel.setInterpolation(kKFInterpolationBezier);
        before.setInterpolation(kKFInterpolationBezier);
        // So that the curve keeps a hundredth of the span.
        channel.simplify(walk.firstTime, walk.lastTime, frame, 100.0 * channel.getScale(),
                         KFCurve::kSimplifyByFit, 0, false);
        EXPECT_LE(distance(channel, before, 1), span * 0.01 + 1e-9);
        EXPECT_LE(distance(channel, before, 10), span * 0.0102 + 1e-9);
        all += before.getNumberOfKeyframes();
        left += channel.getNumberOfKeyframes();
    });
    EXPECT_GT(all, 20000U);
    EXPECT_LT(left, all / 15);
}

TEST_F(MotionReshape, SmoothingHardlyMovesWhatIsSmooth) {
    forEachChannel([&](KFChannel& channel, KFChannel& before) {
        SCOPED_TRACE(channel.getFullDisplayName().str());
        double const span = before.getKeyframeMaxValue(false) - before.getKeyframeMinValue(false);
        channel.smoothKeyframes(walk.firstTime, walk.lastTime, frame);
        EXPECT_EQ(channel.getNumberOfKeyframes(), walk.rows - 1);
        // Beyond the ends stand repeats of the outermost frame, which draw three towards it.
        EXPECT_LE(distance(channel, before, 1), span * 0.05 + 1e-9);
        EXPECT_LE(distance(channel, before, 10, 3), span * 0.001 + 1e-9);
    });
}

} // namespace
} // namespace lumenkey::tools
