// Who gets the right to work on a plan or a list of clips.
#include "host/convert/Failure.h"
#include "host/pieces/FileLock.h"
#include "tests/support/Folder.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <optional>
#include <string>
#include <sys/stat.h>
#include <unistd.h>

namespace {

using movieconv::Category;
using movieconv::RunLock;

/// Why nobody gets it; empty when one does.
std::string Refusal(const std::string& list) {
    try {
        const RunLock lock(list);
        return {};
    } catch (const movieconv::Failure& failure) {
        EXPECT_EQ(failure.Kind(), Category::kOutput);
        return failure.Text();
    }
}

TEST(RunLock, IsNotGivenWhereSomethingElseStandsInItsPlace) {
    const Folder folder;
    std::filesystem::create_symlink(folder / "nowhere", folder / "link.lock");
    std::filesystem::create_directory(folder / "folder.lock");
    for (const char* name : {"link", "folder", "none/none"})
        EXPECT_EQ(Refusal(folder / name).find("cannot lock \"" + folder / name + ".lock\""), 0U) << name;
    EXPECT_FALSE(std::filesystem::exists(folder / "nowhere"));
}

// In a shared folder, where the lock may only be read.
TEST(RunLock, IsNotGivenWhileAnotherUserHasIt) {
    constexpr uid_t kNobody = 65534;
    const Folder folder;
    chmod(folder.Path().c_str(), 0777);
    std::optional<RunLock> held(folder / "list");
    chmod((folder / "list.lock").c_str(), 0644);
    if (seteuid(kNobody) != 0)
        GTEST_SKIP() << "only root can be somebody else";
    const std::string refusal = Refusal(folder / "list");
    ASSERT_EQ(seteuid(0), 0);
    EXPECT_NE(refusal.find("another run"), std::string::npos) << refusal;
    held.reset();
    EXPECT_EQ(Refusal(folder / "list"), "");
}

} // namespace
