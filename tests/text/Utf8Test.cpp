#include "text/Utf8.h"

#include <gtest/gtest.h>

#include <iterator>
#include <random>
#include <string>

namespace {

TEST(Utf8, KnownCharacters) {
    EXPECT_EQ(text::ToUtf8(L"a\u00e9\u20ac\U0001F600"), "a\xC3\xA9\xE2\x82\xAC\xF0\x9F\x98\x80");
    EXPECT_EQ(text::FromUtf8("a\xC3\xA9\xE2\x82\xAC\xF0\x9F\x98\x80"), L"a\u00e9\u20ac\U0001F600");
}

TEST(Utf8, InvalidBytesBecomeEscapes) {
    // Latin-1, overlong, surrogate, above U+10FFFF, cut short: every byte by itself.
    for (const std::string bytes : {"\xE9", "\xC0\xAF", "\xED\xA0\x80", "\xF4\x90\x80\x80", "\xE2\x82"}) {
        const std::wstring wide = text::FromUtf8(bytes);
        ASSERT_EQ(wide.size(), bytes.size());
        for (std::size_t i = 0; i < bytes.size(); ++i)
            EXPECT_EQ(static_cast<unsigned>(wide[i]), 0xDC00U + static_cast<unsigned char>(bytes[i]));
    }
    EXPECT_EQ(text::FromUtf8("\xE2\x82z").back(), L'z');
}

TEST(Utf8, AnyBytesSurviveTheRoundTrip) {
    std::mt19937 random(7);
    std::uniform_int_distribution<int> length(0, 40);
    std::uniform_int_distribution<int> byte(0, 255);
    std::uniform_int_distribution<int> high(0x80, 0xFF);
    for (int round = 0; round < 5000; ++round) {
        std::string bytes(static_cast<std::size_t>(length(random)), '\0');
        for (char& value : bytes)
            value = static_cast<char>(round % 2 == 0 ? byte(random) : high(random));
        EXPECT_EQ(text::ToUtf8(text::FromUtf8(bytes)), bytes);
    }
}

TEST(Utf8, IsCutBetweenCharacters) {
    const std::string letters = "a\xC3\xA9\xE2\x82\xAC"; // of one, two and three bytes
    const std::size_t sizes[] = {0, 1, 1, 3, 3, 3, 6, 6};
    for (std::size_t most = 0; most < std::size(sizes); ++most)
        EXPECT_EQ(text::CutTo(most, letters), letters.substr(0, sizes[most])) << most;
    char copy[6];
    text::CopyText(copy, letters);
    EXPECT_STREQ(copy, "a\xC3\xA9");
    text::CopyText(copy, "five!");
    EXPECT_STREQ(copy, "five!");
}

} // namespace
