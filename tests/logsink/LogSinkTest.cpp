#include "logsink/LogSink.h"
#include "tests/support/Folder.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <clocale>
#include <fstream>
#include <set>
#include <string>
#include <thread>
#include <vector>

namespace {

class LogSink : public testing::Test {
protected:
    ~LogSink() override { LogSinkSetFile(nullptr); }

    const Folder folder;
};

TEST_F(LogSink, EveryCallIsOneLineOfUtf8) {
    struct {
        std::wstring text;
        std::string line;
    } const cases[] = {
        {L"many ends\n\r\r\n\n", "many ends\n"},
        {L"", "\n"},
        {L"\r\n", "\n"},
        {L"two\r\nlines", "two  lines\n"},
        {L"100%s %d", "100%s %d\n"},
        {L"\u00e9 \u20ac \U0001F600", "\xC3\xA9 \xE2\x82\xAC \xF0\x9F\x98\x80\n"},
        {{static_cast<wchar_t>(0xD800), static_cast<wchar_t>(0xDCE9)}, "\xEF\xBF\xBD\xEF\xBF\xBD\n"},
        {{static_cast<wchar_t>(0x110000), static_cast<wchar_t>(-1)}, "\xEF\xBF\xBD\xEF\xBF\xBD\n"},
        {std::wstring(5000, L'x'), std::string(5000, 'x') + "\n"},
    };
    std::setlocale(LC_ALL, "C");
    const std::string path = folder / "lines";
    ASSERT_EQ(LogSinkSetFile(path.c_str()), 1);
    std::string expected;
    for (const auto& [text, line] : cases) {
        EXPECT_EQ(Log(text.c_str()), 1);
        expected += line;
        EXPECT_EQ(ReadFile(path), expected);
    }
    EXPECT_EQ(Log(nullptr), 0);
    EXPECT_EQ(ReadFile(path), expected);
}

TEST_F(LogSink, GoesWhereItWasToldLast) {
    const std::string path = folder / "old \xC3\xA9";
    WriteFile(path, "old\n"); // which is appended to
    testing::internal::CaptureStderr();
    EXPECT_EQ(Log(L"first"), 1);
    EXPECT_EQ(LogSinkSetFile(path.c_str()), 1);
    EXPECT_EQ(LogSinkSetFile((folder / "missing/file").c_str()), 0); // changes nothing
    EXPECT_EQ(Log(L"second"), 1);
    EXPECT_EQ(LogSinkSetFile(nullptr), 1);
    EXPECT_EQ(Log(L"third"), 1);
    EXPECT_EQ(LogSinkSetFile(path.c_str()), 1);
    EXPECT_EQ(LogSinkSetFile(""), 1);
    EXPECT_EQ(Log(L"gone"), 1);
    EXPECT_EQ(testing::internal::GetCapturedStderr(), "first\nthird\n");
    EXPECT_EQ(ReadFile(path), "old\nsecond\n");
}

TEST_F(LogSink, ReportsALineThatCannotBeWritten) {
    ASSERT_EQ(LogSinkSetFile("/dev/full"), 1);
    EXPECT_EQ(Log(L"lost"), 0);
}

TEST_F(LogSink, KeepsLinesWholeWhileThreadsWriteAndTheTargetChanges) {
    constexpr int kThreads = 4;
    constexpr int kLines = 300;
    ASSERT_EQ(LogSinkSetFile((folder / "a").c_str()), 1);
    std::vector<std::thread> threads;
    for (int thread = 0; thread < kThreads; ++thread)
        threads.emplace_back([thread] {
            for (int line = 0; line < kLines; ++line)
                Log((std::to_wstring(thread) + L":" + std::to_wstring(line) + L":" + std::wstring(200, L'x'))
                        .c_str());
        });
    for (int change = 0; change < 50; ++change)
        EXPECT_EQ(LogSinkSetFile((folder / (change % 2 == 0 ? "b" : "a")).c_str()), 1);
    for (std::thread& thread : threads)
        thread.join();

    std::set<std::string> seen;
    for (const char* name : {"a", "b"}) {
        std::ifstream file(folder / name);
        for (std::string line; std::getline(file, line);) {
            EXPECT_EQ(std::count(line.begin(), line.end(), 'x'), 200);
            EXPECT_TRUE(seen.insert(line).second);
        }
    }
    EXPECT_EQ(seen.size(), static_cast<std::size_t>(kThreads) * kLines);
}

} // namespace
