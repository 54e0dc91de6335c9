#include "tests/tools/TestFolder.h"
#include "tools/output/JsonWriter.h"
#include "tools/output/SafeOutputFile.h"
#include "tools/output/Table.h"
#include "tools/output/TextForms.h"

#include <cerrno>
#include <charconv>
#include <cmath>
#include <cstdint>
#include <gtest/gtest.h>
#include <limits>
#include <nlohmann/json.hpp>
#include <random>
#include <sys/stat.h>
#include <sys/xattr.h>
#include <unistd.h>
#include <vector>

namespace lumenkey::tools {
namespace {

namespace fs = std::filesystem;

TEST(TextForms, ShortestTextReadsBackTheSameBits) {
    std::mt19937_64 random(20);
    for (int i = 0; i < 20'000; ++i) {
        double const value = std::bit_cast<double>(random());
        if (!std::isfinite(value)) {
            continue;
        }
        std::string const text = shortestText(value);
        double back = 0;
        std::from_chars(text.data(), text.data() + text.size(), back);
        ASSERT_EQ(std::bit_cast<std::uint64_t>(back), std::bit_cast<std::uint64_t>(value)) << text;
    }
    EXPECT_EQ(shortestText(0.1), "0.1");
    EXPECT_EQ(shortestText(-std::nan("")), "nan");
}

TEST(TextForms, WritesTimesInLowestTerms) {
    EXPECT_EQ(timeText(TempusMake(48, 96)), "1/2");
    EXPECT_EQ(timeText(TempusMake(0, 600)), "0/1");
    EXPECT_EQ(timeText(TempusMake(-10, 4)), "-5/2");
    EXPECT_EQ(timeText(TempusMake(std::numeric_limits<int64_t>::min(), 2)), "-4611686018427387904/1");
    EXPECT_EQ(timeText({3, 6, kTempusFlagValid | kTempusFlagHasBeenRounded, -7}), "1/2@-7~");
    EXPECT_EQ(timeText(kTempusNegativeInfinity), "-infinity");
    EXPECT_EQ(timeText(kTempusInvalid), "invalid");
}

TEST(TextForms, ShowsWhatTerminalsActOn) {
    EXPECT_EQ(printableText("\x1b\x7f\u0080\u009F|\u061C\u200E\u200F\u2028\u202E\u2066\u2069"),
              "\\x1b\\x7f\\xc2\\x80\\xc2\\x9f|\\xd8\\x9c\\xe2\\x80\\x8e\\xe2\\x80\\x8f\\xe2\\x80\\xa8"
              "\\xe2\\x80\\xae\\xe2\\x81\\xa6\\xe2\\x81\\xa9");
    std::string const neighbours =
        "\u00A0\u061B\u061D\u200D\u2010\u2027\u202F\u2065\u206A\uD7FF\uE000\uFDCF\uFFFD\U0010FFFD";
    EXPECT_EQ(printableText(neighbours), neighbours);
    // What is no character: cut, overlong, a half of a pair, beyond the last, never to be one.
    EXPECT_EQ(printableText("\xE2\x80|\x9B|\xC1\x81|\xE0\x9F\xBF|\xED\xA0\x80|\xF4\x90\x80\x80|\uFFFE"),
              "\\xe2\\x80|\\x9b|\\xc1\\x81|\\xe0\\x9f\\xbf|\\xed\\xa0\\x80|\\xf4\\x90\\x80\\x80|"
              "\\xef\\xbf\\xbe");
    EXPECT_EQ(tools::quoted(std::string(39, 'a') + "\u00E9b"), "'" + std::string(39, 'a') + "...'");
}

TEST(Table, AlignsColumnsByCharacters) {
    std::string const cells[2][2] = {{"H\u00FCfte", "1.5"}, {"a\tb", "-10.25"}};
    Table table;
    table.columns = {{"joint"}, {"value", Align::Right}};
    table.rowCount = 2;
    table.cell = [&](std::size_t row, std::size_t column) { return cells[row][column]; };
    StringSink out;
    table.write(out);
    EXPECT_EQ(out.text(), "joint    value\n"
                          "H\u00FCfte      1.5\n"
                          "a\\x09b  -10.25\n");
}

TEST(JsonWriter, WritesWhatAnIndependentReaderTakesBack) {
    double const infinity = std::numeric_limits<double>::infinity();
    StringSink out;
    JsonWriter json(out);
    json.beginObject();
    json.key("text \"\n");
    json.string("\x01\\ \xC3\xBC \xFF");
    json.key("numbers");
    json.beginArray();
    for (double const value : {-1.0 / 3, 5e-324, 1.7976931348623157e308, infinity}) {
        json.number(value);
    }
    json.integer(std::numeric_limits<std::uint64_t>::max());
    json.endArray();
    json.endObject();
    json.finish();
    EXPECT_EQ(nlohmann::json::parse(out.text()),
              (nlohmann::json{{"text \"\n", "\x01\\ \xC3\xBC \xEF\xBF\xBD"},
                              {"numbers",
                               {-1.0 / 3, 5e-324, 1.7976931348623157e308, nullptr,
                                std::numeric_limits<std::uint64_t>::max()}}}));
}

class SafeOutputFileTest : public ::testing::Test {
protected:
    TestFolder const _folder;
    std::string const _target = _folder.write("out.txt", "old");

    /// Writes the file anew; what is at fault, or nothing.
    static std::string faultOfWriting(std::string const& file) {
        try {
            SafeOutputFile out(file);
            out.write("new");
            out.close();
            return "";
        } catch (OutputError const& error) {
            EXPECT_EQ(error.target, file);
            return error.what;
        }
    }
};

TEST_F(SafeOutputFileTest, ReplacesTheTargetOnlyWhenClosed) {
    {
        SafeOutputFile out(_target);
        out.write("half");
        EXPECT_EQ(contentOf(_target), "old");
    }
    EXPECT_EQ(contentOf(_target), "old");
    EXPECT_EQ(_folder.entryCount(), 1U) << "a temporary was left behind";
    EXPECT_EQ(faultOfWriting(_target), "");
    EXPECT_EQ(contentOf(_target), "new");
    EXPECT_EQ(_folder.entryCount(), 1U) << "a temporary was left behind";
}

TEST_F(SafeOutputFileTest, KeepsPermissionsAndLinks) {
    fs::permissions(_target, fs::perms::owner_read | fs::perms::owner_write | fs::perms::group_read);
    fs::create_symlink("out.txt", _folder.file("link"));
    fs::create_symlink("link", _folder.file("linkToLink"));
    constexpr ::uid_t someone = 65'534;
    bool const maySetOwners = ::geteuid() == 0;
    if (maySetOwners) {
        ASSERT_EQ(::chown(_target.c_str(), someone, someone), 0);
    }
    EXPECT_EQ(faultOfWriting(_folder.file("linkToLink")), "");
    struct stat written {};
    ASSERT_EQ(::stat(_target.c_str(), &written), 0);
    EXPECT_EQ(written.st_uid, maySetOwners ? someone : ::geteuid());
    EXPECT_TRUE(fs::is_symlink(_folder.file("linkToLink")) && fs::is_symlink(_folder.file("link")));
    EXPECT_EQ(contentOf(_target), "new");
    EXPECT_EQ(fs::status(_target).permissions(),
              fs::perms::owner_read | fs::perms::owner_write | fs::perms::group_read);

    // The group may read, others of whom a list tells may write: as bits, both look like the group's.
    std::vector<std::uint32_t> list{2,          0x60001, 0xFFFFFFFF, 0x60002, 65'534,    0x40004,
                                    0xFFFFFFFF, 0x60010, 0xFFFFFFFF, 0x20,    0xFFFFFFFF};
    char const* const access = "system.posix_acl_access";
    std::size_t const size = list.size() * sizeof(list[0]);
    if (::setxattr(_target.c_str(), access, list.data(), size, 0) == 0) {
        EXPECT_EQ(faultOfWriting(_target), "");
        std::vector<std::uint32_t> kept(list.size());
        EXPECT_EQ(::getxattr(_target.c_str(), access, kept.data(), size), static_cast<ssize_t>(size));
        EXPECT_EQ(kept, list);
        // None, where the directory has one for new files.
        ASSERT_EQ(::removexattr(_target.c_str(), access), 0);
        ASSERT_EQ(::setxattr(_folder.path().c_str(), "system.posix_acl_default", list.data(), size, 0), 0);
        bool const takesMarks = ::setxattr(_target.c_str(), "user.mark", "1", 1, 0) == 0;
        EXPECT_EQ(faultOfWriting(_target), "");
        EXPECT_EQ(::getxattr(_target.c_str(), access, nullptr, 0), -1);
        EXPECT_EQ(faultOfWriting(_folder.file("listed.txt")), "");
        EXPECT_EQ(static_cast<unsigned>(fs::status(_folder.file("listed.txt")).permissions()), 0660U);
        ASSERT_EQ(::removexattr(_folder.path().c_str(), "system.posix_acl_default"), 0);
        EXPECT_EQ(::getxattr(_target.c_str(), "user.mark", nullptr, 0), takesMarks ? 1 : -1);
    } else {
        EXPECT_EQ(errno, EOPNOTSUPP);
    }

    fs::create_symlink("born.txt", _folder.file("dangling"));
    EXPECT_EQ(faultOfWriting(_folder.file("dangling")), "");
    EXPECT_EQ(contentOf(_folder.file("born.txt")), "new");

    mode_t const mask = ::umask(027);
    EXPECT_EQ(faultOfWriting(_folder.file("fresh.txt")), "");
    ::umask(mask);
    EXPECT_EQ(static_cast<unsigned>(fs::status(_folder.file("fresh.txt")).permissions()), 0640U);
}

TEST_F(SafeOutputFileTest, WritesTheLongestName) {
    std::string const longest = _folder.file(std::string(255, 'n'));
    EXPECT_EQ(faultOfWriting(longest), "");
    EXPECT_EQ(contentOf(longest), "new");
}

TEST_F(SafeOutputFileTest, RefusesTargetsThatCannotBeWritten) {
    EXPECT_EQ(faultOfWriting(_folder.file("missing/out.txt")), "No such file or directory");
    EXPECT_EQ(faultOfWriting(_folder.path().string()), "Is a directory");
    ASSERT_EQ(::mkfifo(_folder.file("pipe").c_str(), 0600), 0);
    EXPECT_EQ(faultOfWriting(_folder.file("pipe")),
              "it is no plain file, which could be replaced as a whole");
    fs::create_symlink("round", _folder.file("round"));
    EXPECT_EQ(faultOfWriting(_folder.file("round")), "Too many levels of symbolic links");
    // Nothing keeps the superuser from writing into a folder; a virtual file system does.
    EXPECT_NE(faultOfWriting("/proc/lumenkey-test.txt"), "");
    if (::geteuid() != 0) {
        fs::permissions(_folder.path(), fs::perms::owner_read | fs::perms::owner_exec);
        EXPECT_EQ(faultOfWriting(_target), "Permission denied");
        EXPECT_EQ(contentOf(_target), "old");
    }
}

} // namespace
} // namespace lumenkey::tools
