#include "tools/cli/Progress.h"

#include <gtest/gtest.h>
#include <semaphore>

namespace lumenkey::tools {
namespace {

using std::chrono::milliseconds;

/// A screen whose time goes on only when it is told.
class TestScreen {
public:
    /// Work began before, if it did.
    explicit TestScreen(milliseconds begin = {})
        : screen{true,
                 true,
                 ProgressScreen::Clock::time_point(begin),
                 [this] { return ProgressScreen::Clock::time_point(_time); },
                 [this](std::stop_token const& stop, milliseconds time) { return waitFor(stop, time); },
                 [this](std::string_view text) { shown += text; }} {}

    ProgressScreen const screen;
    /// Only to be looked at while time stands still.
    std::string shown;

    /// What is drawn when the next wait is over, which must be for so long.
    std::string after(milliseconds wait) {
        _isWaiting.acquire();
        shown.clear();
        _isOver.release();
        _isWaiting.acquire();
        EXPECT_EQ(_waited, wait);
        _isWaiting.release(); // it still is
        return shown;
    }

private:
    bool waitFor(std::stop_token const& stop, milliseconds time) {
        std::stop_callback const end(stop, [this] { _isOver.release(); });
        _isWaiting.release();
        _isOver.acquire();
        _waited = time;
        _time += time;
        return !stop.stop_requested();
    }

    milliseconds _time{};
    milliseconds _waited{};
    std::counting_semaphore<> _isWaiting{0};
    std::counting_semaphore<> _isOver{0};
};

TEST(Progress, IsDrawnAfterASecondAndThenNowAndThen) {
    TestScreen test;
    {
        Progress bar("reading", ProgressOf::Work, test.screen);
        EXPECT_EQ(test.after(milliseconds(1'000)),
                  "\rreading [########................................] 1 s\x1B[K");
        EXPECT_EQ(test.after(milliseconds(100)),
                  "\rreading [.########...............................] 1 s\x1B[K");
        for (int i = 2; i < 63; ++i) { // 32 there, 31 back
            test.after(milliseconds(100));
        }
        EXPECT_EQ(test.after(milliseconds(100)),
                  "\rreading [.########...............................] 7 s\x1B[K");
        bar.teller()(0.5);
        EXPECT_EQ(test.after(milliseconds(100)),
                  "\rreading [####################....................] 50%, 7 s\x1B[K");
        bar.update(7);
        EXPECT_NE(test.after(milliseconds(100)).find("#] 100%"), std::string::npos);
        EXPECT_FALSE(Progress("more", ProgressOf::Work, test.screen).teller());
        test.shown.clear();
    }
    EXPECT_EQ(test.shown, "\r\x1B[K");
}

TEST(Progress, CountsTheWorkBeforeItsOwn) {
    TestScreen test(milliseconds(-950));
    Progress const bar("writing", ProgressOf::Work, test.screen);
    EXPECT_NE(test.after(milliseconds(100)), "");
}

TEST(Progress, LeavesResultsAndShortWorkAlone) {
    TestScreen test;
    EXPECT_FALSE(Progress("writing", ProgressOf::Output, test.screen).hasLine());
    EXPECT_TRUE(Progress("writing", ProgressOf::Work, test.screen).hasLine());
    EXPECT_EQ(test.shown, "");
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
