#include "tools/cli/Progress.h"

#include <gtest/gtest.h>

namespace lumenkey::tools {
namespace {

using std::chrono::milliseconds;

/// A screen whose clock stands still until it is told.
struct TestScreen {
    ProgressScreen::Clock::time_point time{};
    std::string shown;
    ProgressScreen screen{true, true, [this] { return time; },
                          [this](std::string_view text) { shown = text; }};

    /// What an update draws after so long; nothing where it doesn't.
    std::string after(milliseconds wait, Progress& bar, double share) {
        time += wait;
        shown.clear();
        bar.update(share);
        return shown;
    }
};

TEST(Progress, DrawsAfterASecondAndThenNowAndThen) {
    TestScreen test;
    {
        Progress bar("reading", ProgressOf::Work, test.screen);
        EXPECT_EQ(test.after(milliseconds(999), bar, 0.1), "");
        EXPECT_EQ(test.after(milliseconds(1), bar, 0.5),
                  "\rreading [####################....................] 50%\x1B[K");
        EXPECT_EQ(test.after(milliseconds(99), bar, 0.6), "");
        EXPECT_NE(test.after(milliseconds(1), bar, 7).find("#] 100%"), std::string::npos);
        Progress inner("more", ProgressOf::Work, test.screen);
        EXPECT_FALSE(inner.teller());
        EXPECT_EQ(test.after(milliseconds(5'000), inner, 0.5), "");
    }
    EXPECT_EQ(test.shown, "\r\x1B[K");
    EXPECT_FALSE(Progress("writing", ProgressOf::Output, test.screen).hasLine());
    EXPECT_TRUE(Progress("writing", ProgressOf::Work, test.screen).hasLine());
}

TEST(Progress, ThatIsPartOfOtherWorkTellsItsShare) {
    TestScreen test;
    double told = 0;
    {
        ProgressPart const part([&](double share) { told = share; });
        Progress("reading", ProgressOf::Work, test.screen).teller()(0.5);
        EXPECT_EQ(told, 0.25);
        Progress("writing", ProgressOf::Output, test.screen).update(1);
        EXPECT_EQ(told, 0.75);
    }
    EXPECT_TRUE(Progress("reading", ProgressOf::Work, test.screen).hasLine());
    EXPECT_EQ(test.shown, "");
}

} // namespace
} // namespace lumenkey::tools
