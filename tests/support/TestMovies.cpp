#include "tests/support/TestMovies.h"
#include "tests/support/Program.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <fmt/format.h>
#include <functional>
#include <system_error>
#include <unistd.h>

namespace test_movies {

std::string Make(const std::string& name, const Args& arguments) {
    namespace fs = std::filesystem;
    std::string all;
    for (const std::string& argument : arguments)
        all += argument + '\n';
    // A folder for each way of making: tests of different files may give theirs one name.
    const fs::path folder =
        fs::path(MOVIECONV_TEST_MOVIES) / fmt::format("{:x}", std::hash<std::string>()(all));
    const fs::path path = folder / name;
    if (!fs::exists(path)) {
        fs::create_directories(folder);
        // Tests run in parallel: each makes its own and the first one stays, since a test may be using it.
        const fs::path mine = folder / fmt::format("{}-{}", getpid(), name);
        const program::Result result = program::Run(
            Join(Args{"ffmpeg", "-v", "error", "-nostdin", "-y"}, arguments, Args{mine.string()}));
        EXPECT_EQ(result.code, 0) << "ffmpeg could not make " << name << ": " << result.err;
        std::error_code isThere;
        fs::create_hard_link(mine, path, isThere);
        fs::remove(mine);
        EXPECT_TRUE(fs::exists(path)) << isThere.message();
    }
    return path.string();
}

Args CountedPictures(double seconds, const std::string& rate) {
    return {
        "-f", "lavfi", "-i",
        fmt::format("color=gray:s=160x120:r={}:d={},format=yuv420p,geq=lum='20+mod(N,{})*4':cb=128:cr=128",
                    rate, seconds, kCountedLumas)};
}

Args FlashPictures(double seconds) {
    return {"-f", "lavfi", "-i",
            fmt::format("color=black:s=160x120:r=25:d={},format=yuv420p,"
                        "drawbox=c=white:t=fill:enable='lt(mod(t,1),0.079)'",
                        seconds)};
}

Args Beeps(double seconds) {
    return {"-f", "lavfi", "-i",
            fmt::format("aevalsrc='if(lt(mod(t,1),0.08),0.8*sin(2*PI*1000*t),0)':s=44100:d={}", seconds)};
}

} // namespace test_movies
