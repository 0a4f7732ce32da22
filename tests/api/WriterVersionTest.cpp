// An engine beside a media writer that tells its version: the program's own.
#include "api/MovieConv.h"
#include "tests/engine/IdleParts.h"
#include "writer/WriterStatus.h"

#include <gtest/gtest.h>

#include <string>

namespace {

unsigned g_version = MC_VERSION;

} // namespace

unsigned MWGetVersion() {
    return g_version;
}

namespace {

TEST(WriterVersionTest, AnotherMajorVersionIsRefused) {
    std::string log;
    const auto note = [](void* user, int level, const char* line) {
        if (level == MC_LOG_ERROR)
            *static_cast<std::string*>(user) += line;
    };
    ASSERT_EQ(MCSetLogCallback(note, &log), 1);
    const struct {
        unsigned version;
        bool fits;
    } cases[] = {{MC_VERSION, true},
                 {MC_MAKE_VERSION(MC_VERSION_MAJOR, 0, 0), true},
                 {MC_MAKE_VERSION(MC_VERSION_MAJOR, 99, 1), true},
                 {MC_MAKE_VERSION(MC_VERSION_MAJOR + 1, 7, 0), false},
                 {MC_MAKE_VERSION(0, 9, 0), false}};
    IdleVideo video(1);
    for (const auto& row : cases) {
        g_version = row.version;
        log.clear();
        const MCHandle handle = MCCreate(&video, nullptr);
        EXPECT_EQ(handle != nullptr, row.fits) << std::hex << row.version;
        EXPECT_EQ(log.find("media writer is of version") != std::string::npos, !row.fits) << log;
        MCDestroy(handle);
    }
    ASSERT_EQ(MCSetLogCallback(nullptr, nullptr), 1);
}

TEST(VersionTest, TheLibraryTellsThatOfItsHeaders) {
    EXPECT_EQ(MCGetVersion(), static_cast<unsigned>(MC_VERSION));
    EXPECT_EQ(MC_VERSION, MC_MAKE_VERSION(MC_VERSION_MAJOR, MC_VERSION_MINOR, MC_VERSION_PATCH));
    EXPECT_LT(MC_MAKE_VERSION(1, 9, 255), MC_MAKE_VERSION(1, 10, 0));
}

} // namespace
