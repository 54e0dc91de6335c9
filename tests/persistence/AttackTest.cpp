// Documents by someone who means ill: each is refused at a line, a column and for a reason, or read as its
// text says, and the tree that was being read into goes on working.

#include "tests/persistence/Victim.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <chrono>

#include <sys/mman.h>
#include <unistd.h>

namespace {

/// The thread sanitizer keeps a shadow of every byte that is touched.
#ifdef __SANITIZE_THREAD__
constexpr std::size_t kBytesForOne = 5;
#else
constexpr std::size_t kBytesForOne = 1;
#endif

using namespace std::string_literals;

constexpr std::size_t kMiB = std::size_t{1} << 20;

std::string repeated(std::string const& text, std::size_t count) {
    std::string all;
    all.reserve(text.size() * count);
    for (std::size_t i = 0; i < count; ++i)
        all += text;
    return all;
}

/// A gibibyte of letters behind a start, for the price of one mebibyte: the same pages again and again.
class Gibibyte {
public:
    static constexpr std::size_t kSize = 1024 * kMiB;

    explicit Gibibyte(std::string const& start) {
        int const letters = memfd_create("letters", 0);
        EXPECT_EQ(write(letters, std::string(kMiB, 'x').data(), kMiB), static_cast<ssize_t>(kMiB));
        void* const room =
            mmap(nullptr, kSize, PROT_NONE, MAP_PRIVATE | MAP_ANONYMOUS | MAP_NORESERVE, -1, 0);
        EXPECT_NE(room, MAP_FAILED);
        _bytes = static_cast<std::uint8_t*>(room);
        for (std::size_t at = 0; at < kSize; at += kMiB) {
            int const access = at == 0 ? PROT_READ | PROT_WRITE : PROT_READ;
            EXPECT_NE(mmap(_bytes + at, kMiB, access, MAP_PRIVATE | MAP_FIXED, letters, 0), MAP_FAILED);
        }
        close(letters);
        std::copy(start.begin(), start.end(), _bytes);
    }
    ~Gibibyte() { munmap(_bytes, kSize); }
    Gibibyte(Gibibyte const&) = delete;
    Gibibyte& operator=(Gibibyte const&) = delete;

    Bytes bytes() const { return {_bytes, kSize}; }

private:
    std::uint8_t* _bytes = nullptr;
};

std::string utf16(std::string const& ascii, bool isLittleEndian, bool hasMark) {
    std::string text = !hasMark ? "" : isLittleEndian ? "\xFF\xFE" : "\xFE\xFF";
    for (char const c : ascii) {
        text += isLittleEndian ? c : '\0';
        text += isLittleEndian ? '\0' : c;
    }
    return text;
}

} // namespace

TEST(Attack, IsRefusedWithPlaceAndReason) {
    std::string const leaf = "<parameter id='2' value='7'/>";
    std::string const whole = kDocumentHead + leaf + kDocumentTail;
    std::size_t const headSize = kDocumentHead.size();
    auto const at = [&](std::size_t column) { return "1:" + std::to_string(column) + ": "; };
    struct Row {
        char const* name;
        std::string document;
        std::string expected;
    };
    Row const rows[] = {
        {"folders in one another, 10^6 deep",
         kDocumentHead + repeated("<parameter id='9' factoryID='1'>", 1'000'000),
         at(headSize + 1 + 989 * 32) + "nodes lie more than 990 elements deep in each other"},
        {"as deep as it may be",
         kDocumentHead + leaf + repeated("<parameter id='9' factoryID='1'>", 987) +
             "<parameter id='9' factoryID='2'><curve type='1'><numberOfKeypoints>1</numberOfKeypoints>" +
             keypointElement("0/1", "1") + "</curve></parameter>" + repeated("</parameter>", 987) +
             kDocumentTail,
         ""},
        {"the same of nobody's elements", kDocumentHead + repeated("<x>", 1'000'000),
         at(headSize + 1 + 998 * 3) + "elements lie more than 1000 deep in each other"},
        {"an entity bomb",
         "<!DOCTYPE kfml [<!ENTITY a 'lol'><!ENTITY b '&a;&a;&a;&a;&a;&a;&a;&a;&a;&a;'>"
         "<!ENTITY c '&b;&b;&b;&b;&b;&b;&b;&b;&b;&b;'>]>" +
             kDocumentHead + "<parameter id='2' name='&c;'/>" + kDocumentTail,
         "1:16: a document type declaration is not allowed"},
        {"an external entity",
         "<!DOCTYPE kfml [<!ENTITY a SYSTEM 'file:///etc/passwd'>]>" + kDocumentHead + "&a;" + kDocumentTail,
         "1:16: a document type declaration is not allowed"},
        {"a parameter entity", "<!DOCTYPE kfml [<!ENTITY % a SYSTEM 'http://localhost/'> %a;]>" + whole,
         "1:16: a document type declaration is not allowed"},
        {"an external type", "<!DOCTYPE kfml PUBLIC 'a' 'http://localhost/kfml.dtd'>\n" + whole,
         "1:54: a document type declaration is not allowed"},
        {"an entity that nobody declared", kDocumentHead + "&a;" + kDocumentTail,
         at(headSize + 1) + "undefined entity"},
        {"a character that XML hasn't", kDocumentHead + "&#0;" + kDocumentTail,
         at(headSize + 1) + "reference to invalid character number"},
        {"a zero byte", kDocumentHead + "\0"s + kDocumentTail,
         at(headSize + 1) + "not well-formed (invalid token)"},
        {"a zero byte in an attribute", kDocumentHead + "<parameter id='2' name='a\0b'/>"s + kDocumentTail,
         at(headSize + 26) + "not well-formed (invalid token)"},
        {"zero bytes behind the end", whole + "\0\0"s,
         at(whole.size() + 1) + "not well-formed (invalid token)"},
        {"bytes that are no UTF-8", kDocumentHead + "\xC0\xAF" + kDocumentTail,
         at(headSize + 1) + "not well-formed (invalid token)"},
        {"half a UTF-16 character", utf16(whole, true, true) + "\n", at(whole.size() + 1) + "unclosed token"},
        {"two byte order marks", "\xEF\xBB\xBF\xEF\xBB\xBF" + whole, "1:1: not well-formed (invalid token)"},
        {"an encoding that isn't", "<?xml version='1.0' encoding='UTF-16'?>" + whole,
         "1:31: encoding specified in XML declaration is incorrect"},
        {"a second root", whole + whole, at(whole.size() + 1) + "junk after document element"},
        {"UTF-8 with a mark", "\xEF\xBB\xBF" + whole, ""},
        {"UTF-16 without a mark", utf16(whole, true, false), ""},
        {"UTF-16, low byte first", utf16(whole, true, true), ""},
        {"UTF-16, high byte first", utf16(whole, false, true), ""},
        {"another number of the same attribute", kDocumentHead + "<parameter id='2' id='3'/>" + kDocumentTail,
         at(headSize + 19) + "duplicate attribute"},
    };
    for (Row const& row : rows) {
        SCOPED_TRACE(row.name);
        Victim victim;
        std::size_t const before = forgetPeak();
        EXPECT_EQ(victim.read(row.document), row.expected);
        EXPECT_LT(peakMiB() - before, 2 * (row.document.size() >> 20) + 16);
        if (row.expected.empty()) {
            EXPECT_EQ(victim.value->getInitialValue(), 7.0);
        }
        victim.expectUsable();
    }
}

TEST(Attack, IsNoticedAtEveryCut) {
    std::string const document =
        documentOfCurve("<numberOfKeypoints>1</numberOfKeypoints>" + keypointElement("1/1", "5"));
    for (std::size_t size = 0; size < document.size(); ++size) {
        SCOPED_TRACE(size);
        Victim victim;
        EXPECT_EQ(victim.read(document.substr(0, size)).find("1:"), 0U);
        victim.expectUsable();
    }
}

TEST(Attack, OfAGibibyteEndsEarly) {
    for (std::string const& start :
         {kDocumentHead + "<parameter id='2' name='", kDocumentHead + "<parameter id='2' ",
          kDocumentHead + "<", kDocumentHead + "<!-- ", kDocumentHead + "<parameter id='2'><flags>",
          "<kfml version='5.13'><?"s}) {
        SCOPED_TRACE(start.substr(start.size() - 8));
        Gibibyte const document(start);
        Victim victim;
        std::size_t const before = forgetPeak();
        auto const begin = std::chrono::steady_clock::now();
        std::string const refusal = victim.read(document.bytes());
        EXPECT_NE(refusal.find("longer than 67108864 bytes"), std::string::npos) << refusal;
        EXPECT_LT(peakMiB() - before, 512U * kBytesForOne);
        EXPECT_LT(std::chrono::steady_clock::now() - begin, std::chrono::seconds(30));
        victim.expectUsable();
    }
}
