#include "lumenkey/foundation/BXHashWriteStream.h"
#include "lumenkey/foundation/BXXMLReadStream.h"
#include "lumenkey/foundation/BXXMLWriteStream.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <array>
#include <bit>
#include <cstdio>
#include <fstream>
#include <functional>
#include <limits>
#include <random>

namespace {

constexpr BXScope kRootScope[] = {
    BXScope::element("kfml", 91),      BXScope::attribute("version", 91, 116),
    BXScope::element("group", 1),      BXScope::attribute("name", 1, 11),
    BXScope::attribute("id", 1, 12),   BXScope::element("leaf", 2),
    BXScope::attribute("name", 2, 11), BXScope::end(),
};
/// Gives `leaf` and an attribute of `group` other numbers.
constexpr BXScope kInnerScope[] = {
    BXScope::element("leaf", 3),
    BXScope::element("deep", 4),
    BXScope::attribute("id", 1, 13),
    BXScope::end(),
};

/// Writes down all that it is given: begins, ends, and elements with tag, text and name.
class Recorder : public BXSerializer {
public:
    using Hook = std::function<bool(BXSerializerReadStream&, BXStreamElement&)>;

    Recorder(std::string label, std::string& log, Hook onElement = {})
        : hook(std::move(onElement)), _label(std::move(label)), _log(log) {}

    void writeHeader(BXSerializerWriteStream&, bool) override {}
    void writeBody(BXSerializerWriteStream&, bool, bool, bool) override {}
    void markFactoriesForSerialization(BXSerializerWriteStream&, bool) override {}
    bool parseBegin(BXSerializerReadStream& stream) override {
        _log += _label + "( ";
        if (scope != nullptr) {
            stream.pushScope(scope);
        }
        return true;
    }
    bool parseEnd(BXSerializerReadStream&) override {
        _log += _label + ") ";
        return true;
    }
    bool parseElement(BXSerializerReadStream& stream, BXStreamElement& element) override {
        BXString text;
        _log += _label + std::to_string(element.tag());
        _log += element.getAsString(&text) ? "'" + text.str() + "' " : " ";
        return !hook || hook(stream, element);
    }

    Hook hook;
    BXScope const* scope = nullptr;

private:
    std::string _label;
    std::string& _log;
};

std::span<std::uint8_t const> bytesOf(std::string_view text) {
    return {reinterpret_cast<std::uint8_t const*>(text.data()), text.size()};
}

/// What a handler below all others writes down, then what failed.
std::string reading(std::string_view document, Recorder::Hook hook = {}) {
    std::string log;
    Recorder bottom("", log, std::move(hook));
    BXXMLReadStream stream(bytesOf(document));
    stream.pushScope(kRootScope);
    stream.pushHandler(&bottom);
    bool const isWhole = stream.parse();
    EXPECT_EQ(isWhole, stream.failure() == nullptr);
    if (BXReadFailure const* failure = stream.failure()) {
        log += std::to_string(failure->line) + ":" + std::to_string(failure->column) + ": " + failure->reason;
    }
    return log;
}

template <typename Write> std::string written(Write const& write, bool isWhole = true) {
    BXBufferWriteStream buffer(16, 16);
    BXXMLWriteStream stream(buffer, 5, 13);
    stream.pushScope(kRootScope);
    write(stream);
    EXPECT_EQ(stream.close(), isWhole);
    BXData const data = buffer.copyData();
    EXPECT_EQ(buffer.takeData(), data);
    EXPECT_EQ(buffer.size(), 0u);
    return {data.begin(), data.end()};
}

/// Refuses what goes beyond a number of bytes.
class FullSink final : public BXStream {
public:
    explicit FullSink(std::size_t room) : _room(room) {}
    bool write(void const*, std::size_t size) override {
        EXPECT_FALSE(_isFull) << "called after it refused";
        _isFull = size > _room;
        _room -= std::min(_room, size);
        return !_isFull;
    }

private:
    std::size_t _room;
    bool _isFull = false;
};

constexpr std::string_view kDeclaration = "<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n";

} // namespace

// Writing ---------------------------------------------------------------------------------------------------

TEST(BXXMLWriteStream, IndentsHoweverDeep) {
    std::string const deep = written([](BXXMLWriteStream& stream) {
        for (int i = 0; i < 200; ++i) {
            stream.startElement(2);
        }
    });
    EXPECT_NE(deep.find("\n" + std::string(400, ' ') + "<leaf/>\n" + std::string(398, ' ') + "</leaf>\n"),
              std::string::npos);
    EXPECT_EQ(written([](BXXMLWriteStream&) {}), std::string(kDeclaration) + "<kfml version=\"5.13\"/>\n");
}

TEST(BXXMLWriteStream, LeavesOutWhatHasNoPlace) {
    auto const misuse = [](BXXMLWriteStream& stream) {
        stream.writeValue(1.0);         // no element
        stream.writeAttribute(12, 1.0); // nor here
        stream.endElement();
        stream.startElement(1);
        stream.writeAttribute(12, true);
        stream.writeAttribute(12, false); // twice
        stream.writeAttribute(99, true);  // no name
        stream.startElement(99);
        stream.writeAttribute(12, true);
        stream.startElement(2);
        stream.endElement();
        stream.endElement();
        stream.startElement(2);
        stream.endElement();
        stream.writeAttribute(11, true); // behind content
        stream.writeValue(5.0);          // behind a child
        stream.popScope();
        stream.popScope();
    };
    EXPECT_EQ(written(misuse, false), std::string(kDeclaration) + "<kfml version=\"5.13\">\n"
                                                                  "  <group id=\"1\">\n"
                                                                  "    <leaf/>\n"
                                                                  "  </group>\n"
                                                                  "</kfml>\n");
}

TEST(BXXMLWriteStream, LeavesOutWhatLiesTooDeepToBeRead) {
    for (int const depth : {989, 990, 999, 1000}) { // below the root
        BXBufferWriteStream buffer(1024, 1024);
        BXXMLWriteStream stream(buffer, 5, 13);
        stream.pushScope(kRootScope);
        for (int i = 1; i < depth; ++i) {
            stream.startElement(1);
        }
        bool const allowsNode = depth > 990 || stream.allowsNode();
        EXPECT_EQ(allowsNode, depth != 990);
        stream.writeElement(2, 5.0);
        EXPECT_EQ(stream.failure(), depth == 990    ? "nodes lie more than 990 elements deep in each other"
                                    : depth == 1000 ? "elements lie more than 1000 deep in each other"
                                                    : "");
        EXPECT_EQ(stream.close(), allowsNode && depth < 1000);
        BXData const data = buffer.copyData();
        EXPECT_TRUE(BXXMLReadStream(data).parse());
    }
}

TEST(BXXMLWriteStream, LeavesOutWhatIsTooLongToBeRead) {
    constexpr std::size_t limit = std::size_t{64} << 20;
    constexpr std::size_t beside = std::size_t{64} << 10; // in a tag
    struct {
        std::string attribute;
        std::string content;
        bool isWhole;
    } const cases[] = {{std::string(limit - beside, 'x'), std::string(limit, 'x'), true},
                       {std::string(limit - beside + 1, 'x'), "short", false},
                       {"short", std::string(limit + 1, 'x'), false},
                       {"short", std::string(limit / 4 + 1, '\1'), false},
                       {"short", std::string(limit / 4 + 1, '<'), true}};
    for (auto const& each : cases) {
        BXBufferWriteStream buffer(1024, 1024);
        BXXMLWriteStream stream(buffer, 5, 13);
        stream.pushScope(kRootScope);
        stream.startElement(2);
        stream.writeAttribute(11, BXString(each.attribute));
        stream.writeValue(BXString(each.content));
        EXPECT_EQ(stream.close(), each.isWhole);
        BXData const data = buffer.takeData();
        EXPECT_TRUE(BXXMLReadStream(data).parse());
    }
}

TEST(BXXMLWriteStream, RemembersThatTheSinkRefused) {
    for (std::size_t const room : {0u, 100u, 40000u, 150000u}) {
        FullSink sink(room);
        BXXMLWriteStream stream(sink, 5, 13);
        stream.pushScope(kRootScope);
        for (int i = 0; i < 5000; ++i) {
            stream.writeElement(2, i * 0.1);
        }
        stream.startElement(2);
        stream.writeValue(BXString(std::string(50000, 'x')));
        stream.endElement();
        EXPECT_FALSE(stream.close());
        EXPECT_FALSE(stream.close());
    }
}

// Reading ---------------------------------------------------------------------------------------------------

TEST(BXXMLReadStream, HandsOverContainersFirstAndLeavesAtTheirEnd) {
    EXPECT_EQ(reading("<kfml version='5.13'>\n"
                      "  <group name='g'>text <leaf> a&amp;b<![CDATA[<c>]]>\n </leaf> more <leaf/></group>\n"
                      "  <unknown><leaf>inside</leaf><kfml/></unknown>\n"
                      "  <!-- comment --><?target x?>\n"
                      "</kfml>\n"),
              "( 91 1 2' a&b<c>\n ' 2'' ) ");
    EXPECT_EQ(reading("<other><leaf/></other>"), "( ) ");
}

TEST(BXXMLReadStream, EndsHandlersAndScopesWithTheirElement) {
    std::string log;
    Recorder inner("i", log, [](BXSerializerReadStream&, BXStreamElement& element) {
        return element.tag() != 4; // refused: known only by the scope that this handler pushes
    });
    inner.scope = kInnerScope;
    Recorder second("s", log);
    auto const push = [&](BXSerializerReadStream& stream, BXStreamElement& element) {
        if (element.tag() == 1) {
            stream.pushHandler(nullptr);
            stream.pushHandler(&inner);
            stream.pushHandler(&second);
        }
        return true;
    };
    auto const run = [&](std::string_view document) {
        log.clear();
        Recorder bottom("b", log, push);
        BXXMLReadStream stream(bytesOf(document));
        stream.pushScope(kRootScope);
        stream.pushHandler(&bottom);
        EXPECT_TRUE(stream.parse());
        EXPECT_TRUE(stream.parse()) << "again";
        return log;
    };
    // `leaf` is 3 inside, by the scope of the inner handler, and 2 again behind it.
    EXPECT_EQ(run("<kfml><leaf/><group><leaf>x</leaf><group/></group><leaf/><deep/></kfml>"),
              "b( b91 b2'' b1 i( s( s3'x' s1'' s) i) b2'' b) ");
    EXPECT_EQ(run("<kfml><group/><leaf/></kfml>"), "b( b91 b1'' i( s( s) i) b2'' b) ");
    EXPECT_EQ(reading("<group><leaf/></group>",
                      [](BXSerializerReadStream&, BXStreamElement& element) { return element.tag() == 1; }),
              "( 1 2'' ) 1:15: a handler refused an element");
}

TEST(BXXMLReadStream, HasNothingLeftToSkipAtAnEnd) {
    EXPECT_EQ(reading("<kfml><group><leaf/></group><leaf>a</leaf><leaf>b</leaf></kfml>",
                      [](BXSerializerReadStream& stream, BXStreamElement& element) {
                          if (element.tag() != 91) {
                              stream.skipElement();
                          }
                          return true;
                      }),
              "( 91 1 2'a' 2'b' ) ");
}

TEST(BXXMLReadStream, FindsAttributesByTheScopesOfTheMoment) {
    std::string found;
    auto const ask = [&](BXSerializerReadStream& stream, BXStreamElement& element) {
        std::uint32_t id = 0;
        BXString name("untouched");
        auto const note = [&](std::uint32_t tag) {
            found += element.getAttributeAsUInt32(tag, &id) ? std::to_string(id) + " " : "- ";
        };
        note(12);
        note(13);
        stream.pushScope(kInnerScope); // makes `id` of `group` 13
        note(12);
        note(13);
        EXPECT_FALSE(element.getAttributeAsUInt32(11, &id)); // no number
        EXPECT_TRUE(element.getAttributeAsString(11, &name));
        EXPECT_EQ(name, std::string_view("a\\\x01"));
        EXPECT_EQ(element.getAttributeAsUUID(11), nullptr);
        return true;
    };
    EXPECT_EQ(reading("<group other='1' id=' 5 ' name='a\\\\x01'/>", ask), "( 1'' ) ");
    EXPECT_EQ(found, "5 - - 5 ");
}

TEST(BXXMLReadStream, ReadsWhatWasWritten) {
    std::mt19937_64 random(4);
    std::vector<std::string> texts;
    // What makes up escapes and characters, so that there are whole and broken ones.
    static constexpr std::string_view kBytes = "\\\\\\xx4Ff&<>\"']\r\n\t \x7F\xC3\xA4\xEF\xBF\xBE"
                                               "\xED\xA0\x80\xF0\x9F\x8E\xE2\x82\xAC\xC0";
    for (int i = 0; i < 20000; ++i) {
        std::string& text = texts.emplace_back();
        for (auto n = random() % 40; n != 0; --n) {
            text += static_cast<char>(random() % 4 == 0 ? random() : kBytes[random() % kBytes.size()]);
        }
    }
    BXUUID const uuid{{0x4B723EA5, 0x244311D7, 0x9C750003, 0x9366FB58}};
    std::string const document = written([&](BXXMLWriteStream& stream) {
        for (std::string const& text : texts) {
            stream.startElement(1);
            stream.writeAttribute(11, BXString(text));
            stream.writeAttribute(12, uuid);
            stream.writeValue(BXString(text));
            stream.endElement();
        }
    });
    std::size_t next = 0;
    reading(document, [&](BXSerializerReadStream& stream, BXStreamElement& element) {
        BXString value;
        BXString name;
        if (element.tag() == 1) {
            EXPECT_TRUE(stream.getAsString(element, &value) &&
                        stream.getAttributeAsString(element, 11, &name));
            EXPECT_EQ(value.str(), texts[next]);
            EXPECT_EQ(name.str(), texts[next++]);
            std::unique_ptr<BXUUID> const read(stream.getAttributeAsUUID(element, 12));
            EXPECT_TRUE(read && *read == uuid);
        }
        return true;
    });
    EXPECT_EQ(next, texts.size());
}

TEST(BXXMLReadStream, TakesTheEncodingsOfXmlAndTellsWhereItFailed) {
    struct Row {
        std::string document;
        char const* log;
    };
    using namespace std::string_literals;
    Row const rows[] = {
        {"", "( ) 1:1: no element found"},
        {"<kfml>\n <leaf></group>\n</kfml>", "( 91 ) 2:10: mismatched tag"},
        {"<kfml>\u00C4\xFF</kfml>", "( ) 1:8: not well-formed (invalid token)"},
        {"<?xml version='1.0' encoding='EBCDIC'?><kfml/>", "( ) 1:31: unknown encoding"},
        {"<?xml version='1.0' encoding='ISO-8859-1'?><leaf>\xC4</leaf>", "( 2'\u00C4' ) "},
        {"\xEF\xBB\xBF<leaf>\u00C4</leaf>", "( 2'\u00C4' ) "},
        {"\xFF\xFE<\0l\0e\0a\0f\0>\0a\0\xC4\0<\0/\0l\0e\0a\0f\0>\0"s, "( 2'a\u00C4' ) "},
    };
    for (Row const& row : rows) {
        EXPECT_EQ(reading(row.document), row.log) << row.document;
    }

    BXXMLReadStream missing(BXURL("/no/such/file"));
    EXPECT_FALSE(missing.parse());
    EXPECT_EQ(missing.failure()->line, 0u);
    EXPECT_EQ(missing.failure()->reason.find("the file can't be opened: "), 0u);
    BXXMLReadStream folder(BXURL("/"));
    EXPECT_FALSE(folder.parse());
    EXPECT_EQ(folder.failure()->reason.find("the file can't be read: "), 0u);
}

TEST(BXXMLReadStream, KeepsTheLimitOfSize) {
    std::string_view const document = "<leaf></leaf>";
    for (std::uint64_t const limit : {document.size(), document.size() - 1}) {
        BXXMLReadStream stream(bytesOf(document));
        stream.setSizeLimit(limit);
        EXPECT_EQ(stream.parse(), limit == document.size());
    }
}

TEST(BXXMLReadStream, ReadsTextsAndTagsUpToTheirLimit) {
    std::size_t const limit = std::size_t{64} << 20;
    std::size_t size = 0;
    auto const measure = [&](BXSerializerReadStream&, BXStreamElement& element) {
        BXString text;
        size = element.getAttributeAsString(11, &text) || element.getAsString(&text) ? text.size() : 0;
        return true;
    };
    // A tag counts as a whole.
    for (auto const& [before, after, room] :
         {std::tuple{"<leaf>", "</leaf>", limit}, {"<leaf name='", "'/>", limit - 15}}) {
        for (std::size_t const length : {room, room + 1}) {
            std::string const log = reading(before + std::string(length, 'x') + after, measure);
            EXPECT_EQ(log.find(" is longer than 67108864 bytes") != std::string::npos, length > room)
                << before;
        }
        EXPECT_EQ(size, room);
    }
}

TEST(BXXMLReadStream, ReadsFilesBlockByBlockAndTellsHowFarItIs) {
    std::string const path = ::testing::TempDir() + "lumenkey_streams_test.kfml";
    std::string document = "<kfml>";
    std::string expected = "( 91 ";
    for (int i = 0; i < 50000; ++i) {
        document += "\n  <leaf name='n'>" + std::to_string(i) + "</leaf>";
        expected += "2'" + std::to_string(i) + "' ";
    }
    document += "</kfml>";
    std::ofstream(path, std::ios::binary) << document;
    std::string log;
    Recorder bottom("", log);
    BXXMLReadStream stream{BXURL(path)};
    stream.pushScope(kRootScope);
    stream.pushHandler(&bottom);
    std::vector<std::uint64_t> told;
    stream.setProgress([&told](std::uint64_t bytes) { told.push_back(bytes); });
    EXPECT_TRUE(stream.parse());
    EXPECT_TRUE(log == expected + ") ");
    EXPECT_GE(told.size(), 3U);
    EXPECT_TRUE(std::is_sorted(told.begin(), told.end()));
    EXPECT_EQ(told.back(), document.size());
    std::remove(path.c_str());
}

// Digests ---------------------------------------------------------------------------------------------------

template <typename... Value> std::array<std::uint8_t, 16> hashOf(Value const&... values) {
    BXHashWriteStream stream;
    (stream.writeValue(values), ...);
    return stream.getHash();
}

TEST(BXHashWriteStream, TellsNeighboursApart) {
    constexpr double kNan = std::numeric_limits<double>::quiet_NaN();
    std::vector<std::array<std::uint8_t, 16>> hashes = {
        hashOf(),
        hashOf(BXString("ab"), BXString("c")),
        hashOf(BXString("a"), BXString("bc")),
        hashOf(BXString("abc")),
        hashOf(BXString("abc"), BXString()),
        hashOf(true),
        hashOf(std::uint32_t{1}),
        hashOf(std::uint64_t{1}),
        hashOf(0.0),
        hashOf(-0.0),
        hashOf(kNan),
        hashOf(TempusMake(1, 2)),
        hashOf(TempusMake(2, 4)),
        hashOf(BXUUID{{1, 0, 0, 0}}),
        hashOf(BXUUID{{0, 0, 0, 1}}),
    };
    // Elements with attributes inside each other and beside each other; a scope around it tells what lies
    // inside.
    for (bool const isInside : {false, true}) {
        BXHashWriteStream stream;
        EXPECT_TRUE(stream.isHashStream());
        stream.startElement(1);
        if (isInside) {
            stream.pushScope(kRootScope);
        }
        for (std::uint32_t const tag : {1u, 2u}) {
            stream.startElement(tag);
            stream.writeAttribute(tag, 1.0);
            hashes.push_back(stream.getHash());
        }
    }
    for (std::size_t i = 0; i < hashes.size(); ++i) {
        EXPECT_EQ(std::count(hashes.begin(), hashes.end(), hashes[i]), 1) << i;
    }
    for (std::uint64_t const bits : {0xFFF8000000000000U, 0x7FF8000000000123U})
        EXPECT_EQ(hashOf(kNan), hashOf(std::bit_cast<double>(bits))) << "as in a text";
}

TEST(BXHashWriteStream, DoesNotDependOnHowBytesAreCut) {
    // Asking in between cuts the input elsewhere; strings around the size of its block are what could go
    // wrong.
    BXHashWriteStream whole;
    BXHashWriteStream cut;
    for (std::size_t size = 0; size < 3000; size += 7) {
        for (BXHashWriteStream* stream : {&whole, &cut}) {
            stream->startElement(static_cast<std::uint32_t>(size));
            stream->writeAttribute(3, TempusMake(static_cast<std::int64_t>(size), 24));
            stream->writeValue(BXString(std::string(size, 'x')));
            stream->endElement();
        }
        cut.getHash();
    }
    EXPECT_EQ(whole.getHash(), cut.getHash());
}
