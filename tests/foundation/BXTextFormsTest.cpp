#include "lumenkey/foundation/BXTextForms.h"

#include <gtest/gtest.h>

#include <bit>
#include <cmath>
#include <limits>
#include <random>

namespace {

template <typename Value> std::string textOf(Value const& value) {
    char room[BXText::kLongest];
    return {room, BXText::write(room, value)};
}

std::string escapedText(std::string_view text, BXText::Place place) {
    std::string made;
    for (std::size_t at = 0; at < text.size();) {
        std::size_t const end = BXText::plainEnd(text, at, place);
        made += text.substr(at, end - at);
        at = end;
        if (at < text.size()) {
            char room[8];
            made.append(room, BXText::escaped(room, text, at++));
        }
    }
    return made;
}

bool sameBits(Tempus const& a, Tempus const& b) {
    return a.value == b.value && a.timescale == b.timescale && a.flags == b.flags && a.epoch == b.epoch;
}

/// Whether the text gives a value at all; where it doesn't, the target may not have changed.
template <typename Value> bool reads(std::string_view text, Value const& expected) {
    Value value{};
    bool const isRead = BXText::read(text, &value);
    if constexpr (std::is_same_v<Value, Tempus>) {
        return sameBits(value, expected) && (isRead || sameBits(expected, Value{}));
    } else {
        return value == expected && (isRead || expected == Value{});
    }
}

} // namespace

TEST(BXTextForms, ReadDoublesBackBitForBit) {
    std::mt19937_64 random(1);
    for (int i = 0; i < 200000; ++i) {
        auto const value = std::bit_cast<double>(random());
        std::string const text = textOf(value);
        double back = 5;
        ASSERT_TRUE(BXText::read(text, &back)) << text;
        ASSERT_TRUE(std::bit_cast<std::uint64_t>(back) == std::bit_cast<std::uint64_t>(value) ||
                    (std::isnan(value) && std::isnan(back)))
            << text;
    }
    EXPECT_EQ(textOf(0.1), "0.1");
    EXPECT_EQ(textOf(-0.0), "-0");
    EXPECT_EQ(textOf(10.0), "10");
    EXPECT_EQ(textOf(-std::numeric_limits<double>::infinity()), "-inf");
    EXPECT_EQ(textOf(-std::numeric_limits<double>::quiet_NaN()), "nan");
}

TEST(BXTextForms, WriteTimesAsFractionsAndWords) {
    struct Row {
        Tempus time;
        char const* text;
    };
    constexpr std::uint32_t kRounded = kTempusFlagValid | kTempusFlagHasBeenRounded;
    static constexpr Row kRows[] = {
        {TempusMake(48, 24), "48/24"},
        {{-7, 30, kTempusFlagValid, 2}, "-7/30@2"},
        {{1, 3, kRounded, 0}, "1/3~"},
        {{1, 3, kRounded, -4}, "1/3@-4~"},
        {kTempusInvalid, "invalid"},
        {kTempusIndefinite, "indefinite"},
        {kTempusPositiveInfinity, "+infinity"},
        {kTempusNegativeInfinity, "-infinity"},
        {{0, 0, kRounded | kTempusFlagIndefinite, 0}, "indefinite~"},
        {{5, 0, kTempusFlagValid, 0}, "5/0#1"},
        {{0, 1, kTempusFlagValid | kTempusFlagPositiveInfinity, 9}, "0/1@9#5"},
    };
    for (Row const& row : kRows) {
        EXPECT_EQ(textOf(row.time), row.text);
    }
}

TEST(BXTextForms, ReadTimesBackBitForBit) {
    std::mt19937_64 random(2);
    for (int i = 0; i < 100000; ++i) {
        // Small fields often, so that numbers, constants and odd bits all come up.
        auto const field = [&] { return static_cast<std::int64_t>(random()) >> (random() % 64); };
        auto const small = [&] { return random() % 3 == 0 ? field() : 0; };
        Tempus const time{small(), static_cast<std::int32_t>(small()),
                          static_cast<std::uint32_t>(random() % 4 == 0 ? random() : random() % 32), small()};
        Tempus back{1, 2, 3, 4};
        ASSERT_TRUE(BXText::read(textOf(time), &back)) << textOf(time);
        ASSERT_TRUE(sameBits(back, time)) << textOf(time);
    }
}

TEST(BXTextForms, EscapeOnlyWhatXmlCannotHold) {
    using enum BXText::Place;
    EXPECT_EQ(escapedText("C:\\temp\\x\\x4", Content), "C:\\temp\\x\\x4");
    EXPECT_EQ(escapedText("\\x4f", Content), "\\x5Cx4f");
    EXPECT_EQ(escapedText(std::string_view("a\0b\x1F\xFF", 5), Content), "a\\x00b\\x1F\\xFF");
    EXPECT_EQ(escapedText("\xEF\xBF\xBE \xED\xA0\x80", Content), "\\xEF\\xBF\\xBE \\xED\\xA0\\x80");
    EXPECT_EQ(escapedText("\xC0\xAF\xF4\x90\x80\x80", Content), "\\xC0\\xAF\\xF4\\x90\\x80\\x80");
    EXPECT_EQ(escapedText("\u00C4\U0001F3A8\uFFFD", Content), "\u00C4\U0001F3A8\uFFFD");
    EXPECT_EQ(escapedText("<&>\"\t\n\r", Content), "&lt;&amp;&gt;&quot;\t\n&#13;");
    EXPECT_EQ(escapedText("\t\n\r", Attribute), "&#9;&#10;&#13;");
}

TEST(BXTextForms, TakeOnlyWholeValues) {
    EXPECT_TRUE(reads<bool>("\n true ", true));
    EXPECT_TRUE(reads<double>(" 1.5e3\t", 1500));
    EXPECT_TRUE(reads<std::uint32_t>("8589934593", 1)); // the low half
    EXPECT_TRUE(reads<std::int32_t>("-2", -2));
    EXPECT_TRUE(reads<std::int32_t>("18446744073709551615", -1));
    EXPECT_TRUE(reads<std::uint64_t>("18446744073709551615", ~std::uint64_t{0}));
    for (char const* text :
         {"", " ", "1 2", "1,5", "1x", "x", "yes", "18446744073709551616", "--1", "1e999", "0x10"}) {
        EXPECT_TRUE(reads<bool>(text, false)) << text;
        EXPECT_TRUE(reads<std::uint32_t>(text, 0)) << text;
        EXPECT_TRUE(reads<std::int32_t>(text, 0)) << text;
        EXPECT_TRUE(reads<std::uint64_t>(text, 0)) << text;
        EXPECT_TRUE(reads<Tempus>(text, Tempus{})) << text;
    }
    for (char const* text : {"", "1,5", "1x", "1e999", "0x10", "1 2"}) {
        EXPECT_TRUE(reads<double>(text, 0)) << text;
    }
    for (char const* text :
         {"1", "1/", "1/0", "1/-2", "-1/-1", "1/2/3", "1/2@", "1/2~~", "1/2@3#", "1/1#-1", "1/2 ~", "nan",
          "inf", "infinity", "invalid~~", "1/2147483648", "9223372036854775808/1", "1/2#3~", "~"}) {
        EXPECT_TRUE(reads<Tempus>(text, Tempus{})) << text;
    }
}
