#include "tests/host/TestMovies.h"

#include <gtest/gtest.h>

#include <cstdlib>
#include <fcntl.h>
#include <filesystem>
#include <fmt/format.h>
#include <spawn.h>
#include <sys/wait.h>
#include <unistd.h>

namespace test_movies {

int RunProgram(const std::vector<std::string>& arguments) {
    std::vector<char*> argv;
    for (const std::string& argument : arguments) {
        argv.push_back(const_cast<char*>(argument.c_str()));
    }
    argv.push_back(nullptr);
    posix_spawn_file_actions_t actions;
    posix_spawn_file_actions_init(&actions);
    posix_spawn_file_actions_addopen(&actions, 0, "/dev/null", O_RDONLY, 0);
    posix_spawn_file_actions_addopen(&actions, 1, "/dev/null", O_WRONLY, 0);
    pid_t child = 0;
    const int spawned = posix_spawnp(&child, argv[0], &actions, nullptr, argv.data(), environ);
    posix_spawn_file_actions_destroy(&actions);
    int status = 0;
    if (spawned != 0 || waitpid(child, &status, 0) != child) {
        return 127;
    }
    return WIFEXITED(status) ? WEXITSTATUS(status) : 128 + WTERMSIG(status);
}

std::string Make(const std::string& name, const std::vector<std::string>& arguments) {
    namespace fs = std::filesystem;
    const fs::path folder = MOVIECONV_TEST_MOVIES;
    const fs::path path = folder / name;
    if (!fs::exists(path)) {
        fs::create_directories(folder);
        // Tests run in parallel: each makes its own and the last one stays.
        const fs::path mine = folder / fmt::format("{}-{}", getpid(), name);
        const int result =
            RunProgram(Join(std::vector<std::string>{"ffmpeg", "-v", "error", "-nostdin", "-y"}, arguments,
                            std::vector<std::string>{mine.string()}));
        EXPECT_EQ(result, 0) << "ffmpeg could not make " << name;
        fs::rename(mine, path);
    }
    return path.string();
}

std::vector<std::string> CountedPictures(double seconds, const std::string& rate) {
    return {
        "-f", "lavfi", "-i",
        fmt::format("color=gray:s=160x120:r={}:d={},format=yuv420p,geq=lum='20+mod(N,{})*4':cb=128:cr=128",
                    rate, seconds, kCountedLumas)};
}

std::vector<std::string> FlashPictures(double seconds) {
    return {"-f", "lavfi", "-i",
            fmt::format("color=black:s=160x120:r=25:d={},format=yuv420p,"
                        "drawbox=c=white:t=fill:enable='lt(mod(t,1),0.079)'",
                        seconds)};
}

std::vector<std::string> Beeps(double seconds) {
    return {"-f", "lavfi", "-i",
            fmt::format("aevalsrc='if(lt(mod(t,1),0.08),0.8*sin(2*PI*1000*t),0)':s=44100:d={}", seconds)};
}

Folder::Folder() {
    std::string pattern = (std::filesystem::temp_directory_path() / "movieconv-XXXXXX").string();
    path_ = mkdtemp(pattern.data());
}

Folder::~Folder() {
    std::error_code ignored;
    std::filesystem::remove_all(path_, ignored);
}

} // namespace test_movies
