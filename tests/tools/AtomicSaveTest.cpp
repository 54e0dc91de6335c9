// A save that dies on its way leaves the file as it was, or as it was to become.

#include "tests/tools/MotionSamples.h"
#include "tests/tools/RunProgram.h"
#include "tests/tools/TestFolder.h"

#include <gtest/gtest.h>

#include <chrono>
#include <csignal>
#include <random>

namespace lumenkey::tools {
namespace {

using Microseconds = std::chrono::microseconds;

class AtomicSaveTest : public ::testing::Test {
protected:
    TestFolder const _folder;
    std::string const _file = _folder.file("f.lumen");

    void SetUp() override {
        std::string table = "time,A,B\n";
        for (int i = 0; i < 3000; ++i)
            table += std::to_string(i) + "/24," + std::to_string(i + 1) + ",7\n";
        ASSERT_EQ(runLumenkey({"convert", _folder.write("t.csv", table), _file}).exit, 0);
        // Once there and back: a time may be written in another timescale than the table's.
        ASSERT_EQ(runLumenkey(turn()).exit, 0);
        ASSERT_EQ(runLumenkey(turn()).exit, 0);
    }
    /// Turns the signs of all values round, and back when done again.
    std::vector<std::string> turn() const { return {"scale", _file, "--factor", "-1", "--in-place"}; }

    /// Runs that, to be ended by a signal after a while; true if it came to its end before.
    bool turnEndedAfter(Microseconds time, int signal) const {
        std::vector<std::string> words{"--foreground", "--preserve-status",
                                       "--signal=" + std::to_string(signal),
                                       std::to_string(time.count()) + "e-6", programPath()};
        std::vector<std::string> const turned = turn();
        words.insert(words.end(), turned.begin(), turned.end());
        int const exit = runProgramFile("/usr/bin/timeout", words).exit;
        EXPECT_TRUE(exit == 0 || exit == 128 + signal) << exit;
        return exit == 0;
    }
};

TEST_F(AtomicSaveTest, EndedAnywhereLeavesOneOfTheTwoFiles) {
    std::string const before = contentOf(_file);
    auto const start = std::chrono::steady_clock::now();
    ASSERT_EQ(runLumenkey(turn()).exit, 0);
    auto const whole = std::chrono::duration_cast<Microseconds>(std::chrono::steady_clock::now() - start);
    std::string const after = contentOf(_file);
    ASSERT_NE(after, before);

    std::mt19937 random(1);
    for (int const signal : {SIGTERM, SIGHUP, SIGINT, SIGKILL}) {
        int ended = 0;
        for (int i = 0; i < (signal == SIGKILL ? 60 : 20); ++i) {
            ended += turnEndedAfter(whole * (random() % 1000) / 1000, signal) ? 0 : 1;
            std::string const now = contentOf(_file);
            ASSERT_TRUE(now == before || now == after) << "a mixture of " << now.size() << " bytes";
            if (signal != SIGKILL) { // which nobody hears of
                ASSERT_EQ(_folder.entryCount(), 2U) << "signal " << signal << " leaves something behind";
            }
        }
        EXPECT_GT(ended, 0);
    }
    ASSERT_EQ(runLumenkey(turn()).exit, 0) << "what is left behind is in nobody's way";
}

TEST_F(AtomicSaveTest, AFullDiskLeavesTheOldFile) {
    std::string const before = contentOf(_file);
    for (char const* const blocks : {"0", "1", "40"}) {
        Outcome const outcome =
            runProgramFile("/bin/sh", {"-c", "ulimit -f " + std::string(blocks) + "; exec \"$0\" \"$@\"",
                                       programPath(), "scale", _file, "--factor", "-1", "--in-place"});
        EXPECT_EQ(outcome.exit, 1) << outcome.err;
        if (*blocks != '0') { // the complaint goes to a file too
            EXPECT_EQ(outcome.err, "lumenkey: " + _file + ": File too large\n");
        }
        EXPECT_EQ(contentOf(_file), before);
    }
    EXPECT_EQ(_folder.entryCount(), 2U) << "nothing is left behind";
}

} // namespace
} // namespace lumenkey::tools
