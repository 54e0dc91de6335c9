#include "tools/import/CsvFile.h"
#include "tools/import/CsvTree.h"
#include "tools/import/InputError.h"
#include "tools/output/TextForms.h"

#include <gtest/gtest.h>

namespace lumenkey::tools {
namespace {

/// `name: time=value ...` for each channel; the message where the text is refused.
std::string readBack(std::string_view text) {
    try {
        CsvFile const table = readCsvText(text, "f.csv");
        std::unique_ptr<ChannelTree> const tree = treeOfCsv(table);
        std::string result;
        for (ChannelTree::Node const channel : tree->channelsBelow(ChannelTree::kTop)) {
            result += std::to_string(tree->base(channel).getID()) + " " + tree->dottedName(channel) + ":";
            KFSpline& spline = *tree->spline(channel);
            std::vector<void*> handles;
            spline.getAllVerticesHandles(handles);
            for (void* const handle : handles) {
                Tempus time{};
                double value = 0;
                spline.getVertex(handle, &time, &value, kTempusZero);
                result += " " + timeText(time) + "=" + shortestText(value);
            }
            result += "\n";
        }
        return result;
    } catch (InputError const& error) {
        return error.text();
    }
}

TEST(CsvFile, ReadsTablesOfValuesOverTime) {
    struct {
        std::string_view text;
        char const* expected;
    } const cases[] = {
        {"t,X,Y\n0,1,2\n0.1,-3e2,.5\n", "1 X: 0/1=1 1/10=-300\n2 Y: 0/1=2 1/10=0.5\n"},
        {"\xEF\xBB\xBFt, X ,Y\r\n\r\n-0.5 ,\t+1,\r\n 1e1,,7", "1 X: -1/2=1\n2 Y: 10/1=7\n"},
        {"\n \nt,\"a,\"\"b\"\"\n.c\"\r\n\"0\",\"1\"\r\n\n", "1 a,\"b\"\n.c: 0/1=1\n"},
        {"t,X,X\n", "1 X:\n2 X:\n"},
        {"time,seconds,A.B\n1001/24000,not read,1\n2/24,,2\n", "1 A.B: 1001/24000=1 1/12=2\n"},
        {"time,s\n1/3,1\n0.5,2\n", "1 s: 1/3=1 1/2=2\n"},
        {"Time,seconds\n0,1\n", "1 seconds: 0/1=1\n"},
        {"time,X\n1/3~,1\n0.66666666666666667,2\n", "1 X: 1/3~=1 1431655765/2147483647~=2\n"},
        {"t,X\r0,1\r\r1,2", "1 X: 0/1=1 1/1=2\n"},
        {"t,\"\"\n0,1\n", "1 : 0/1=1\n"},
        // The place of every fault.
        {"t,X\r0,high\r", "f.csv:2:3: 'high' is not a number"},
        {"t,X\rY\n0,1\n", "f.csv:1:4: a carriage return inside a line; lines end in another way here"},
        {"", "f.csv:1:1: the file is empty"},
        {"t;X\n0;1\n",
         "f.csv:1:1: a table has a column of times and at least one of values, with commas between them"},
        {"time,seconds\n0,0\n",
         "f.csv:1:1: a table has a column of times and at least one of values, with commas between them"},
        {"0,1\n1,2\n", "f.csv:1:1: '0' is a time, where the first line names the columns"},
        {"1/2~,1\n", "f.csv:1:1: '1/2~' is a time, where the first line names the columns"},
        {"\"0\",X\n0,1\n", "1 X: 0/1=1\n"},
        {"t,X,\n", "f.csv:1:5: the name of the column is missing"},
        {"t,X\n0,1\n0,2\n", "f.csv:3:1: '0' doesn't come after the time of the row before"},
        {"t,X\n1/2,1\n0.5,2\n", "f.csv:3:1: '0.5' doesn't come after the time of the row before"},
        {"t,X\n,1\n", "f.csv:2:1: the time is missing"},
        {"t,X\n 1s,1\n", "f.csv:2:2: '1s' is no time in seconds"},
        {"t,X\n1/0,1\n", "f.csv:2:1: '1/0' is no time in seconds"},
        {"t,X\n1e30,1\n", "f.csv:2:1: '1e30' goes beyond exact time"},
        {"t,X\n0,1,2\n", "f.csv:2:5: a row has 2 cells, but more stand here"},
        {"t,X,Y\n0,1\r\n", "f.csv:2:5: a row has 3 cells, but 2 are there"},
        {"t,X\n0", "f.csv:2:2: a row has 2 cells, but 1 is there"},
        {"t,X\n0,nan\n", "f.csv:2:3: 'nan' is not a number"},
        {"t,X\n0,1e999\n", "f.csv:2:3: '1e999' is out of the range of numbers"},
        {"t,X\n0,1.5.2\n", "f.csv:2:3: '1.5.2' is not a number"},
        {"t,\"X\n\nY\"\n0,1\n1,\"x\"\n", "f.csv:5:3: 'x' is not a number"},
        {"t,X\n0,1\"2\"\n", "f.csv:2:4: a quotation mark inside a cell that doesn't start with one"},
        {"t,X\n0,\"1\" \n", "f.csv:2:6: more stands here, behind the closing quotation mark"},
        {"t,X\n0,\"1\n2\n", "f.csv:2:3: this quotation mark is never closed"},
    };
    for (auto const& each : cases) {
        EXPECT_EQ(readBack(each.text), each.expected) << each.text;
    }
    EXPECT_EQ(readBack(std::string_view("t,X\n0,1\0\n", 9)), "f.csv:2:4: a zero byte: this is no text");
}

TEST(CsvFile, TellsWhetherRowsAreEvenlySpaced) {
    auto const durationOf = [](std::string_view text) {
        return timeText(rowDuration(readCsvText(text, "f.csv")));
    };
    EXPECT_EQ(durationOf("t,X\n1/24,1\n2/24,1\n0.125,\n"), "1/24");
    EXPECT_EQ(durationOf("t,X\n0,1\n0.1,1\n0.3,\n"), "invalid");
    EXPECT_EQ(durationOf("t,X\n0,1\n"), "invalid");
    EXPECT_EQ(durationOf("t,X\n0,1\n0.33333333333,1\n"), "invalid");
}

} // namespace
} // namespace lumenkey::tools
