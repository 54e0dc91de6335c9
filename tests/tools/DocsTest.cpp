// What the pages about the program and the document show is so.

#include "tests/tools/RunProgram.h"
#include "tests/tools/TestFolder.h"

#include <gtest/gtest.h>

namespace lumenkey::tools {
namespace {

std::string pageNamed(std::string const& name) { return contentOf(LUMENKEY_TEST_SOURCE_DIR "/" + name); }

/// The blocks of a page that begin with such a line, such as three backquotes and `xml`.
std::vector<std::string> blocksOf(std::string const& page, std::string const& opening) {
    std::vector<std::string> blocks;
    std::string const closing = "\n```\n";
    for (std::size_t at = 0; (at = page.find("\n" + opening + "\n", at)) != std::string::npos;) {
        std::size_t const begin = at + opening.size() + 2;
        at = page.find(closing, begin);
        blocks.push_back(page.substr(begin, at + 1 - begin));
        at += closing.size();
    }
    return blocks;
}

class DocsTest : public ::testing::Test {
protected:
    TestFolder const _folder;

    Outcome run(std::string const& command) const {
        return runProgramFile("/bin/sh",
                              {"-c", "lumenkey() { \"$0\" \"$@\"; }; cd \"$1\" || exit; " + command,
                               programPath(), _folder.path().string()});
    }
    /// A transcript as it is shown: each command behind a `$ `, then what it says.
    std::string transcriptAgain(std::string const& shown) const {
        std::string again;
        std::istringstream lines(shown);
        for (std::string line; std::getline(lines, line);) {
            if (line.starts_with("$ ")) {
                Outcome const outcome = run(line.substr(2));
                again += line + "\n" + outcome.out + outcome.err;
            }
        }
        return again;
    }
};

TEST_F(DocsTest, TheProgramSaysWhatItsPageShows) {
    std::vector<std::string> const transcripts = blocksOf(pageNamed("docs/program.md"), "```");
    EXPECT_EQ(transcripts.size(), 3U);
    for (std::string const& transcript : transcripts) {
        EXPECT_EQ(transcriptAgain(transcript), transcript);
    }
}

TEST_F(DocsTest, TheProgramSaysWhatTheFirstPageShows) {
    runProgramFile(LUMENKEY_MAKE_MOTION, {_folder.file("walk.bvh")});
    std::vector<std::string> const transcripts = blocksOf(pageNamed("README.md"), "```console");
    ASSERT_EQ(transcripts.size(), 1U);
    EXPECT_EQ(transcriptAgain(transcripts[0]), transcripts[0]);
    EXPECT_TRUE(std::filesystem::exists(_folder.file("plot.svg")));
}

TEST_F(DocsTest, TheCommandsOfTheGuideDrawItsPictures) {
    _folder.write("hand.csv", pageNamed("docs/editing/hand.csv"));
    std::istringstream lines(pageNamed("docs/editing.md"));
    int commands = 0;
    for (std::string line; std::getline(lines, line);) {
        if (!line.starts_with("    lumenkey ")) {
            continue;
        }
        ++commands;
        Outcome const outcome = run(line);
        EXPECT_EQ(outcome.exit, 0) << line << "\n" << outcome.err;
        std::string const picture = line.substr(line.rfind(' ') + 1);
        EXPECT_GT(contentOf(_folder.file(picture)).size(), 20'000U) << picture;
        EXPECT_FALSE(pageNamed("docs/editing/" + picture).empty()) << picture;
    }
    EXPECT_EQ(commands, 7);
}

TEST_F(DocsTest, TheExampleOfADocumentIsOne) {
    std::vector<std::string> const examples = blocksOf(pageNamed("docs/format.md"), "```xml");
    ASSERT_EQ(examples.size(), 1U);
    std::string const file = _folder.write("example.lumen", examples[0]);
    EXPECT_EQ(outputOf({"check", file}), "");
    Json const info = jsonOf({"info", file});
    EXPECT_EQ(info["channelNames"], Json({"Size", "Blur"}));
    EXPECT_EQ(info["keypoints"], 2);
    // Each form of a time, as it is written.
    std::string const written = _folder.file("written.lumen");
    std::string const schema = LUMENKEY_TEST_SOURCE_DIR "/docs/document.rng";
    for (std::string const time : {"0/600", "-1/2@3", "1/3~", "5/0#7", "1/2@-1#9", "+infinity~", "-infinity~",
                                   "invalid~", "indefinite~", "-infinity"}) {
        std::string text = examples[0];
        text.replace(text.find("0/600"), 5, time);
        outputOf({"convert", _folder.write("example.lumen", text), written});
        EXPECT_NE(contentOf(written).find("<time>" + time + "</time>"), std::string::npos) << time;
        Outcome const valid =
            runProgramFile("/usr/bin/xmllint", {"--huge", "--noout", "--relaxng", schema, file, written});
        EXPECT_EQ(valid.exit, 0) << valid.err;
    }
}

} // namespace
} // namespace lumenkey::tools
