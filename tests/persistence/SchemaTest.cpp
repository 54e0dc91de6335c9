// What is written is valid against the schema that other people's tools may go by.

#include "tests/persistence/RandomTree.h"

#include <gtest/gtest.h>

#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <unistd.h>

TEST(Schema, HoldsForAllThatIsWritten) {
    namespace fs = std::filesystem;
    fs::path const folder = fs::temp_directory_path() / ("lumenkey-schema-" + std::to_string(getpid()));
    fs::create_directories(folder);
    std::string const check = "xmllint --noout --relaxng '" LUMENKEY_TEST_SOURCE_DIR "/docs/document.rng'";
    std::string const log = " >" + (folder / "log").string() + " 2>&1";
    std::string files;
    for (std::uint64_t seed = 1; seed <= 60; ++seed) {
        fs::path const file = folder / (std::to_string(seed) + ".lumen");
        OwnedTree const tree = randomTree(seed);
        std::ofstream(file, std::ios::binary) << documentOf(*tree, true, seed % 2 == 0);
        files += " " + file.string();
    }
    EXPECT_EQ(std::system((check + files + log).c_str()), 0) << std::ifstream(folder / "log").rdbuf();

    // The schema isn't so wide that anything goes.
    fs::path const wrong = folder / "wrong.lumen";
    std::ofstream(wrong) << "<kfml version=\"5.13\"><parameter name=\"\" id=\"-1\"/></kfml>";
    EXPECT_NE(std::system((check + " " + wrong.string() + log).c_str()), 0);
    fs::remove_all(folder);
}
