#include "lumenkey/foundation/BXAsciiStream.h"

#include <gtest/gtest.h>

#include <random>

namespace {

/// The text of bytes that come in pieces of a size.
std::string textOf(std::string const& bytes, std::size_t piece) {
    BXAsciiStream stream;
    for (std::size_t at = 0; at < bytes.size(); at += piece)
        EXPECT_TRUE(stream.write(bytes.data() + at, std::min(piece, bytes.size() - at)));
    stream.close();
    stream.close();
    EXPECT_FALSE(stream.write("x", 1)) << "closed";
    return stream.getString().str();
}

std::string bytesOf(std::string const& text) {
    BXAsciiStream stream;
    if (!stream.open(BXString(text)))
        return "refused";
    std::string bytes(text.size(), '?');
    std::size_t const first = stream.read(bytes.data(), 1);
    bytes.resize(first + stream.read(bytes.data() + first, bytes.size() - first));
    EXPECT_EQ(stream.read(nullptr, 0), 0U);
    stream.close();
    return bytes;
}

} // namespace

TEST(BXAsciiStream, GivesTheSameBytesBack) {
    // The examples of RFC 4648.
    for (auto const& [bytes, text] : {std::pair{"", ""},
                                      {"f", "Zg=="},
                                      {"fo", "Zm8="},
                                      {"foo", "Zm9v"},
                                      {"foob", "Zm9vYg=="},
                                      {"fooba", "Zm9vYmE="},
                                      {"foobar", "Zm9vYmFy"}})
        EXPECT_EQ(textOf(bytes, 100), text);
    std::mt19937 random(1);
    for (std::size_t size = 0; size < 300; ++size) {
        std::string bytes;
        while (bytes.size() < size)
            bytes += static_cast<char>(random());
        std::string const text = textOf(bytes, size % 7 + 1);
        EXPECT_EQ(text, textOf(bytes, 1000));
        EXPECT_EQ(bytesOf(text), bytes);
    }
}

TEST(BXAsciiStream, TakesOnlyWholeTexts) {
    EXPECT_EQ(bytesOf(" Zm9v\n\tYg = =\r\n"), "foob");
    for (char const* const text : {"Z", "Zg", "Zg=", "Zg===", "=", "Z===", "Zg==Zg==", "Zm8=Zg==", "Zg=g",
                                   "Zm9v!", "Zm-v", "Zm9v===="})
        EXPECT_EQ(bytesOf(text), "refused") << text;
    BXAsciiStream stream;
    EXPECT_FALSE(stream.open("?"));
    char byte = 0;
    EXPECT_EQ(stream.read(&byte, 1), 0U);
    EXPECT_FALSE(stream.write("x", 1)) << "a text is open";
    EXPECT_TRUE(stream.open("Zg==")) << "the next one";
    EXPECT_EQ(stream.read(&byte, 1), 1U);
    EXPECT_EQ(byte, 'f');
}
