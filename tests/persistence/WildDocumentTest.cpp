// Documents that are well-formed and full of what nothing should hold: times and numbers that are none,
// curves that run backwards.

#include "lumenkey/curves/KFCurve.h"
#include "tests/persistence/Victim.h"

#include <gtest/gtest.h>

using namespace std::string_literals;

TEST(WildDocument, HoldsTimesThatAreNone) {
    struct Row {
        char const* text;
        Tempus expected;
    };
    Row const rows[] = {
        {"1/0", kTempusZero},
        {"9223372036854775807/1", TempusMake(INT64_MAX, 1)},
        {"-9223372036854775808/2147483647", TempusMake(INT64_MIN, INT32_MAX)},
        {"3/1@-9223372036854775808", {3, 1, kTempusFlagValid, INT64_MIN}},
        {"+infinity~", {0, 0, kTempusPositiveInfinity.flags | kTempusFlagHasBeenRounded, 0}},
        {"indefinite", kTempusIndefinite},
        {"invalid", kTempusInvalid},
        // Bits of no kind come back as they are, and count as invalid.
        {"1/0#1", {1, 0, kTempusFlagValid, 0}},
        {"7/-5#1", {7, -5, kTempusFlagValid, 0}},
        {"1/1#4294967295", {1, 1, 4294967295U, 0}},
        {"-5/2147483647@9#13", {-5, INT32_MAX, 13, 9}},
    };
    for (Row const& row : rows) {
        SCOPED_TRACE(row.text);
        Victim victim;
        std::string const time = row.text;
        std::string const timing = "<timing in='" + time + "' out='" + time + "' offset='" + time + "'/>";
        EXPECT_EQ(victim.read(kDocumentHead + timing + "<parameter id='2'><fadeInOffset>" + time +
                              "</fadeInOffset><fadeOutOffset>" + time +
                              "</fadeOutOffset><curve type='1'>"
                              "<numberOfKeypoints>1</numberOfKeypoints>" +
                              keypointElement(time, "5") + keypointElement("2/1", "6") +
                              "</curve></parameter>" + kDocumentTail),
                  "");
        std::vector<void*> handles;
        KFCurve& curve = *victim.value->getCurveInterface();
        curve.getKeypointHandleList(handles);
        ASSERT_EQ(handles.size(), 2U);
        Tempus read = TempusMake(8, 1);
        curve.getKeypoint(handles[0], &read, nullptr);
        EXPECT_TRUE(read.value == row.expected.value && read.timescale == row.expected.timescale &&
                    read.flags == row.expected.flags && read.epoch == row.expected.epoch);
        victim.expectUsable();
    }
}

TEST(WildDocument, HoldsNumbersThatAreNone) {
    for (std::string const number : {"nan", "inf", "-inf", "1e308", "-1e308", "5e-324", "1e999", "x", ""}) {
        for (std::string const count : {"0", "1", "4294967295", "4294967296", "-1"}) {
            SCOPED_TRACE(number + " " + count);
            std::string const handles =
                "<bias>" + number + "</bias><normal>" + number + "</normal><inputTangentTime>" + number +
                "</inputTangentTime><inputTangentValue>" + number +
                "</inputTangentValue><outputTangentTime>" + number +
                "</outputTangentTime><outputTangentValue>" + number + "</outputTangentValue>";
            std::string const one = keypointElement("1/1", number, handles);
            std::string const document = documentOfCurve(
                "<numberOfKeypoints>" + count + "</numberOfKeypoints><max>" + number + "</max><min>" +
                    number + "</min>" + one + keypointElement("2/1", "5", handles),
                "type='1' value='" + number + "' default='" + number + "'");
            Victim victim;
            std::size_t const before = forgetPeak();
            EXPECT_EQ(victim.read(document), "");
            EXPECT_LT(peakMiB() - before, 16U) << "what a document only promises takes no memory";
            victim.expectUsable();
        }
    }
}

TEST(WildDocument, PromisesKeypointsInEveryChannel) {
    std::size_t most[2] = {};
    for (bool const promises : {false, true}) {
        std::string document = kDocumentHead;
        for (int id = 10; id < 10'010; ++id) {
            document += "<parameter id='" + std::to_string(id) +
                        "' factoryID='2'><curve type='1'><numberOfKeypoints>" +
                        (promises ? "4294967295" : "0000000001") + "</numberOfKeypoints></curve></parameter>";
        }
        Victim victim;
        std::size_t const before = forgetPeak();
        EXPECT_EQ(victim.read(document + kDocumentTail), "");
        most[promises] = peakMiB() - before;
    }
    EXPECT_LT(most[true], most[false] + 12);
}

TEST(WildDocument, HoldsCurvesThatAreNone) {
    constexpr char const* kTimes[][4] = {
        {"3/1", "1/1", "2/1", "0/1"},
        {"1/1", "1/1", "1/1", "1/1"},
        {"0/1", "1/1", "1/1", "2/1"},
        {"0/1", "1/2147483647", "2/2147483647", "9223372036854775807/1"},
        {"-infinity", "0/1", "+infinity", "+infinity"},
        {"invalid", "0/1", "indefinite", "1/1"},
        {"0/1@1", "1/1", "2/1@-1", "3/1@1"},
        {"1/1", "-9223372036854775808/1", "9223372036854775807/1", "0/1"},
    };
    constexpr char const* kValues[][4] = {
        {"0", "1", "-1", "5"}, {"nan", "nan", "0", "1"}, {"inf", "-inf", "1e308", "-1e308"}};
    constexpr char const* kTypes[] = {"0",  "1",  "4",  "6",  "7",  "8",  "10", "12",        "13",
                                      "14", "15", "16", "17", "18", "19", "99", "4294967295"};
    for (auto const& times : kTimes) {
        for (auto const& values : kValues) {
            for (std::string const type : kTypes) {
                for (std::string const mode : {"0", "1", "2", "3", "4", "5", "4294967295"}) {
                    SCOPED_TRACE(times[0] + " "s + times[1] + " " + values[0] + " " + type + " " + mode);
                    std::string curve = "<numberOfKeypoints>4</numberOfKeypoints><preExtrapolation>" + mode +
                                        "</preExtrapolation><postExtrapolation>" + mode +
                                        "</postExtrapolation>";
                    for (std::size_t i = 0; i < 4; ++i)
                        curve += keypointElement(times[i], values[i],
                                                 "<outputTangentTime>-7</outputTangentTime>"
                                                 "<outputTangentValue>3</outputTangentValue>",
                                                 "interpolation='" + type + "' flags='4294967295'");
                    bool const isClosed = mode == "1";
                    Victim victim;
                    EXPECT_EQ(victim.read(documentOfCurve(
                                  curve + (isClosed ? "<closed>1</closed>" : ""),
                                  isClosed ? "type='1' parametric='1' retimingExtrapolation='1'"
                                           : "type='1' round='0'")),
                              "");
                    EXPECT_EQ(victim.value->getNumberOfKeyframes(), 4U);
                    victim.expectUsable();
                    if (testing::Test::HasFailure())
                        return;
                }
            }
        }
    }
}
