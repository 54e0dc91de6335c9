#include "lumenkey/foundation/BXString.h"
#include "lumenkey/foundation/BXUUID.h"

#include <gtest/gtest.h>

#include <cstdlib>
#include <memory>

TEST(BXString, FoldsCaseByUnicodeAndKeepsOtherBytesApart) {
    struct Row {
        char const* a;
        char const* b;
        bool equal;
    };
    static constexpr Row kRows[] = {
        {"", "", true},
        {"Opacity", "oPACITY", true},
        {"Opacity", "Opacit", false},
        {"STRASSE", "stra\u00DFe", true},                   // one letter folds into two
        {"\u03A3\u03C3\u03C2", "\u03C3\u03C3\u03C3", true}, // all three sigmas
        {"\u00C4", "\u00E4", true},
        {"\u00C4", "A\u0308", false}, // folding doesn't compose
        {"\xFF", "\xFF", true},
        {"\xFF", "\xFE", false},
        {"\xC3", "\u00C3", false}, // half a letter is no letter
        {"a\xC3", "A\xC3", true},
    };
    for (Row const& row : kRows) {
        int const forward = BXString(row.a).caseInsensitiveCompare(row.b);
        int const backward = BXString(row.b).caseInsensitiveCompare(row.a);
        EXPECT_EQ(forward == 0, row.equal) << row.a << " " << row.b;
        EXPECT_EQ((forward > 0) - (forward < 0), (backward < 0) - (backward > 0)) << row.a << " " << row.b;
    }
}

TEST(BXString, ToleratesPositionsBehindTheEnd) {
    BXString text("abc");
    EXPECT_EQ(text.find("c", 9), -1);
    EXPECT_EQ(text.find("", 3), 3);
    EXPECT_EQ(text.find("", 4), -1);
    EXPECT_EQ(text.substrTo(9), "abc");
    EXPECT_EQ(text.substrFrom(9), "");
    text.insert(9, "d");
    EXPECT_EQ(text, "abcd");
    EXPECT_TRUE(BXString(static_cast<char const*>(nullptr)).empty());
    std::unique_ptr<char, decltype(&std::free)> const copy(text.createCStr(), &std::free);
    EXPECT_STREQ(copy.get(), "abcd");
}

TEST(BXString, KeysNameTextsAndUnknownOnesThemselves) {
    EXPECT_EQ(BXString(BXStringKey("Channel X")), "X");
    EXPECT_EQ(BXString(BXStringKey("no such key")), "no such key");
    EXPECT_EQ(BXString::intern("UQSliderTransformer"),
              BXString::intern(std::string("UQSlider") + "Transformer"));
}

TEST(BXUUID, ReadsItsOwnTextAndNothingElse) {
    std::string const text = "0B00DE81-2292-11D7-AC3D-00039389B702";
    BXUUID uuid;
    ASSERT_TRUE(BXUUID::fromText(text, &uuid));
    EXPECT_EQ(uuid.words[0], 0x0B00DE81U);
    EXPECT_EQ(uuid.words[3], 0x9389B702U);
    EXPECT_EQ(uuid.text(), text);

    BXUUID const before = uuid;
    for (std::string const& wrong :
         {text.substr(1), text + "0", std::string("0B00DE81x2292-11D7-AC3D-00039389B702"),
          std::string("0B00DE81-2292-11D7-AC3D-00039389B7G2"), std::string()}) {
        EXPECT_FALSE(BXUUID::fromText(wrong, &uuid)) << wrong;
    }
    EXPECT_EQ(uuid, before);
}
