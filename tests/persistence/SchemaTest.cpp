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
    std::string command = "xmllint --noout --relaxng '" LUMENKEY_TEST_SOURCE_DIR "/docs/document.rng'";
    for (std::uint64_t seed = 1; seed <= 60; ++seed) {
        fs::path const file = folder / (std::to_string(seed) + ".lumen");
        OwnedTree const tree = randomTree(seed);
        std::ofstream(file, std::ios::binary) << documentOf(*tree, true, seed % 2 == 0);
        command += " " + file.string();
    }
    EXPECT_EQ(std::system((command + " >" + (folder / "log").string() + " 2>&1").c_str()), 0)
        << std::ifstream(folder / "log").rdbuf();

    // The schema isn't so wide that anything goes.
    std::ofstream(folder / "wrong.lumen") << "<kfml version=\"5.13\"><parameter name=\"\" id=\"-1\"/></kfml>";
    EXPECT_NE(std::system(("xmllint --noout --relaxng '" LUMENKEY_TEST_SOURCE_DIR "/docs/document.rng' " +
                           (folder / "wrong.lumen").string() + " 2>/dev/null")
                              .c_str()),
              0);
    fs::remove_all(folder);
}
