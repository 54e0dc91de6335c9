// Every input that fuzzing has started from, or found something with, once more.

#include "tests/fuzz/FuzzTargets.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>
#include <iterator>
#include <vector>

TEST(FuzzCorpus, IsBorne) {
    for (FuzzTarget const& target : kFuzzTargets) {
        std::size_t inputs = 0;
        for (auto const& entry : std::filesystem::directory_iterator(
                 std::filesystem::path(LUMENKEY_TEST_SOURCE_DIR) / "tests/fuzz/corpus" / target.name)) {
            SCOPED_TRACE(entry.path().string());
            std::ifstream file(entry.path(), std::ios::binary);
            std::vector<std::uint8_t> const bytes{std::istreambuf_iterator<char>(file), {}};
            target.run(bytes);
            ++inputs;
        }
        EXPECT_GT(inputs, 0U) << target.name;
    }
}
