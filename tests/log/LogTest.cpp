#include "log/dyLog.h"

#include "tests/log/ScriptedBundle.h"
#include "tests/support/Folder.h"
#include "tests/support/Process.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <cstdlib>
#include <filesystem>
#include <functional>
#include <string>
#include <thread>
#include <vector>

// What a search of the whole process would find; the log module must never call it.
extern "C" [[gnu::visibility("default")]] int GlobalLog(const wchar_t*) __asm__("Log");
extern "C" int GlobalLog(const wchar_t* /*text*/) {
    std::abort();
}

namespace {

namespace fs = std::filesystem;

/// What `body` prints in a process of its own, where nothing has been logged yet. Failed expectations in it
/// count here.
std::string PrintedBy(const std::function<void()>& body) {
    const ProcessResult child = InChild([&] {
        body();
        return testing::Test::HasFailure();
    });
    EXPECT_EQ(child.code, 0) << child.out << child.err;
    return child.out;
}

class Logging : public testing::Test {
protected:
    Logging() {
        fs::create_directory(folder / "a b");
        g_bundle = {"file://localhost" + (folder / "a%20b/")};
    }
    ~Logging() override { EXPECT_EQ(g_bundle.urlsOut, 0); }

    void PutSink(const char* library) const { fs::copy_file(library, SinkPath()); }
    std::string SinkPath() const { return folder / "a b/quennet.dylib"; }

    static std::wstring LastLine() {
        const auto lastLine = reinterpret_cast<const wchar_t* (*)()>(LogGetAddress("LastLine"));
        return lastLine ? lastLine() : L"no sink";
    }

    const Folder folder;
};

TEST(Replace, Table) {
    struct {
        const char *text, *pattern;
        char replacement;
        const char* expected;
        int count;
    } const cases[] = {
        {"a%20b%20", "%20", ' ', "a b ", 2},
        {"aaa", "aa", 'X', "Xa", 1},
        {"aaaa", "aa", 'a', "aa", 2},
        {"", "%20", ' ', "", 0},
        {"%220%20%2", "%20", ' ', "%220 %2", 1},
    };
    for (const auto& row : cases) {
        std::string text = row.text;
        EXPECT_EQ(replace_str_2_char(text.data(), row.pattern, row.replacement), row.count) << row.text;
        EXPECT_STREQ(text.c_str(), row.expected);
    }
}

TEST_F(Logging, DirectoryTable) {
    const std::string localhost = "file://localhost";
    struct {
        std::string url, path;
        Missing missing = Missing::Nothing;
    } const cases[] = {
        {"file://localhost/Applications/My%20App.app/", "/Applications/My App.app/Contents/MacOS"},
        {"file://localhost/usr/local/bin/", "/usr/local/bin"},
        {"file:///Applications/X.app/", "file:///Applications/X.app/Contents/MacOS"},
        {"file://localhost/", ""},
        {"file://localhost/%20%41%c3/", "/ %41%c3"},
        {"xyzfile://localhost/bin/", "ost/bin"}, // 16 characters are left out wherever the text was found
        {".app/", ".app/Contents/MacOS"},
        {"app/", "app"},
        {"a", ""},
        {"", ""},
        {localhost + "/" + std::string(492, 'd') + "/", "/" + std::string(492, 'd')},
        {localhost + "/" + std::string(493, 'd') + "/", ""}, // 511 bytes: too long for the URL's buffer
        {std::string(491, 'd') + ".app/", std::string(491, 'd') + ".app/Contents/MacOS"},
        {std::string(492, 'd') + ".app/", ""},
        {"file:///Applications/X.app/", "", Missing::Bundle},
        {"file:///Applications/X.app/", "", Missing::Url},
        {"file:///Applications/X.app/", "", Missing::String},
    };
    for (const auto& [url, path, missing] : cases) {
        g_bundle.url = url;
        g_bundle.missing = missing;
        std::string buffer(512, '#');
        GetAppPathA(buffer.data(), 511);
        EXPECT_EQ(buffer.c_str(), path) << url;
        EXPECT_EQ(buffer[511], '#');
        for (const int none : {0, -1})
            GetAppPathA(buffer.data() + 511, none);
        EXPECT_EQ(buffer[511], '#');
    }
}

TEST_F(Logging, LinesReachTheSink) {
    PutSink(recording_sink);
    const std::string printed = PrintedBy([] {
        EXPECT_EQ(LogEx(L"MovieConv::%d %ls %f %s\r\n", 5, L"wide \u20ac", 1.5, "narrow"), 1);
        EXPECT_EQ(LastLine(), L"MovieConv::5 wide \u20ac 1.500000 narrow\r\n");
        EXPECT_EQ(Log(L"100%s %d"), 2);
        EXPECT_EQ(LastLine(), L"100%s %d");
        EXPECT_EQ(LogEx(L"%ls", L""), 0);
        EXPECT_EQ(LastLine(), L"100%s %d");
        EXPECT_EQ(Log(L""), 3);
        EXPECT_EQ(LastLine(), L"");
        const std::wstring fits(1023, L'x');
        EXPECT_EQ(LogEx(L"%ls", fits.c_str()), 4);
        EXPECT_EQ(LastLine(), fits);
        EXPECT_EQ(LogEx(L"%lsy", fits.c_str()), 5);
        EXPECT_EQ(LastLine().substr(0, 1022), fits.substr(0, 1022));
        EXPECT_LE(LastLine().size(), 1023U);
    });
    EXPECT_EQ(printed, "");
}

TEST_F(Logging, WithoutASinkThePathIsToldOnceAndWhatIsLookedUpEachTime) {
    const std::string printed = PrintedBy([this] {
        EXPECT_EQ(LogEx(L"%d", 1), 0);
        PutSink(recording_sink); // too late: it is not looked for again
        EXPECT_EQ(dyLogInit(), nullptr);
        for (const std::intptr_t ordinal : {1, 65535}) // shown as numbers
            EXPECT_EQ(LogGetAddress(reinterpret_cast<const char*>(ordinal)), nullptr);
    });
    std::string expected = "dyLog.h: dlopen [" + SinkPath() + "] error.\r\n";
    for (const char* name : {"Log", "1", "65535"})
        expected.append("dyLog.h: LogGetAddress [").append(name).append("] [0x0] error.\r\n");
    EXPECT_EQ(printed, expected);
}

TEST_F(Logging, ALibraryWithoutTheEntryIsToldByItsHandle) {
    PutSink(entryless_sink);
    const std::string printed = PrintedBy([] {
        EXPECT_NE(dyLogInit(), nullptr);
        EXPECT_NE(LogGetAddress("NotALog"), nullptr);
        EXPECT_EQ(LogEx(L"line"), 0);
        std::printf("%x", static_cast<unsigned>(reinterpret_cast<std::uintptr_t>(dyLogInit())));
    });
    const std::string start = "dyLog.h: LogGetAddress [Log] [0x";
    ASSERT_EQ(printed.rfind(start, 0), 0U) << printed;
    const std::string shown = printed.substr(printed.rfind('\n') + 1);
    EXPECT_EQ(printed, start + shown + "] error.\r\n" + shown);
}

TEST_F(Logging, APathThatDoesNotFitGivesUp) {
    for (const std::string& url :
         {"file://localhost/" + std::string(600, 'd') + "/", std::string(484, 'd') + "/tail.app/",
          std::string(498, 'd') + "/", std::string(509, 'd') + "/"}) {
        g_bundle.url = url;
        const std::string printed = PrintedBy([] { EXPECT_EQ(dyLogInit(), nullptr); });
        EXPECT_EQ(printed.rfind("dyLog.h: dlopen [", 0), 0U) << printed;
        EXPECT_LE(printed.size(), std::string("dyLog.h: dlopen [] error.\r\n").size() + 511);
    }
}

TEST_F(Logging, TwoThreadsMayLogFirst) {
    PutSink(recording_sink);
    for (int round = 0; round < 10; ++round) {
        const std::string printed = PrintedBy([] {
            std::vector<std::thread> threads;
            for (int i = 0; i < 2; ++i)
                threads.emplace_back([] { EXPECT_NE(LogGetAddress("Log"), nullptr); });
            for (std::thread& thread : threads)
                thread.join();
            EXPECT_EQ(Log(L"whole"), 1);
        });
        EXPECT_EQ(printed, "");
    }
}

} // namespace
