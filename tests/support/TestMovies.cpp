#include "tests/support/TestMovies.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <fmt/format.h>
#include <functional>
#include <system_error>
#include <unistd.h>

namespace test_movies {
namespace {

namespace fs = std::filesystem;

/// The path of a file NAME that depends on all of `origin`, made by `write` unless it exists: things of
/// different tests may have one name. Tests run in parallel: each makes its own and the first one stays,
/// since a test may be using it.
template <class Write>
std::string Kept(const std::string& name, const std::string& origin, Write write) {
    const fs::path folder =
        fs::path(MOVIECONV_TEST_MOVIES) / fmt::format("{:x}", std::hash<std::string>()(origin));
    const fs::path path = folder / name;
    if (!fs::exists(path)) {
        fs::create_directories(folder);
        const fs::path mine = folder / fmt::format("{}-{}", getpid(), name);
        write(mine.string());
        std::error_code isThere;
        fs::create_hard_link(mine, path, isThere);
        fs::remove(mine);
        EXPECT_TRUE(fs::exists(path)) << isThere.message();
    }
    return path.string();
}

} // namespace

std::string Make(const std::string& name, const Args& arguments) {
    std::string all;
    for (const std::string& argument : arguments)
        all += argument + '\n';
    return Kept(name, all, [&](const std::string& path) { Ffmpeg(Join(arguments, Args{path})); });
}

std::string Part(const std::string& name, const std::string& content) {
    return Kept(name, content, [&](const std::string& path) { WriteFile(path, content); });
}

Args CountedPictures(double seconds, const std::string& rate) {
    return Lavfi(
        fmt::format("color=gray:s=160x120:r={}:d={},format=yuv420p,geq=lum='20+mod(N,{})*4':cb=128:cr=128",
                    rate, seconds, kCountedLumas));
}

Args FlashPictures(double seconds) {
    return Lavfi(fmt::format("color=black:s=160x120:r=25:d={},format=yuv420p,"
                             "drawbox=c=white:t=fill:enable='lt(mod(t,1),0.079)'",
                             seconds));
}

Args Beeps(double seconds) {
    return Lavfi(
        fmt::format("aevalsrc='if(lt(mod(t,1),0.08),0.8*sin(2*PI*1000*t),0)':s=44100:d={}", seconds));
}

Args NearLossless() {
    return Words("-c:v mpeg4 -q:v 2 -c:a pcm_s16le");
}

std::string CountedMovie(double seconds) {
    return Make("counted.mkv", Join(CountedPictures(seconds), Beeps(seconds), NearLossless()));
}

} // namespace test_movies
