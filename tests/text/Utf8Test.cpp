#include "text/Utf8.h"
#include "text/Printable.h"
#include "text/WriteAll.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <fcntl.h>
#include <iterator>
#include <random>
#include <string>
#include <sys/ioctl.h>
#include <thread>
#include <unistd.h>

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

TEST(Printable, IsOneLineThatNoTerminalObeys) {
    EXPECT_EQ(text::Printable("фильм\t映画 \xF0\x9F\x8E\xAC \\ it's"),
              "фильм\t映画 \xF0\x9F\x8E\xAC \\ it's");
    EXPECT_EQ(text::Printable("a\x1b[2J\r\nb\x7f"), "a\\x1b[2J\\x0d\\x0ab\\x7f");
    EXPECT_EQ(text::Printable("\xC2\x9b"
                              "1m"),
              "\\u009b1m");
    // NOLINTNEXTLINE(misc-misleading-bidirectional)
    EXPECT_EQ(text::Printable("gpj\xE2\x80\xAE.exe\xE2\x81\xA6"), "gpj\\u202e.exe\\u2066");
    EXPECT_EQ(text::Printable("\x9b"
                              "1m\xff"),
              "\\x9b1m\\xff");
    EXPECT_EQ(text::Printable(std::string(1, '\0')), "\\x00");
}

TEST(WriteAll, WaitsForASlowReaderAlsoWhereWritingDoesNot) {
    int ends[2] = {-1, -1};
    ASSERT_EQ(pipe2(ends, O_NONBLOCK), 0);
    const std::string text(std::size_t{1} << 20, 'x'); // more than a pipe holds
    bool written = false;
    std::thread writer([&] {
        written = text::WriteAll(ends[1], text);
        close(ends[1]);
    });
    const int capacity = fcntl(ends[0], F_GETPIPE_SZ);
    for (int waiting = 0; waiting < capacity; ioctl(ends[0], FIONREAD, &waiting))
        std::this_thread::yield();
    std::string taken;
    char part[4096];
    while (const ssize_t count = read(ends[0], part, sizeof part))
        taken.append(part, static_cast<std::size_t>(std::max<ssize_t>(count, 0)));
    writer.join();
    close(ends[0]);
    EXPECT_TRUE(written);
    EXPECT_TRUE(taken == text) << taken.size();
}

} // namespace
