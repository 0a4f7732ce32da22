#include "tests/support/Ffmpeg.h"
#include "tests/support/Program.h"

#include <gtest/gtest.h>

#include <sstream>

namespace test_movies {

Args Words(const std::string& text) {
    std::istringstream words(text);
    Args args;
    for (std::string word; words >> word;)
        args.push_back(word);
    return args;
}

void Ffmpeg(const Args& arguments) {
    const program::Result made = program::Run(Join(Words("ffmpeg -v error -nostdin -y"), arguments));
    EXPECT_EQ(made.code, 0) << made.err;
}

std::string FfmpegReads(const std::string& path, const Args& arguments) {
    const program::Result read =
        program::Run(Join(Words("ffmpeg -v error -nostdin -i"), Args{path}, arguments, Args{"-"}));
    EXPECT_EQ(read.err, "") << path;
    return read.out;
}

std::string Ffprobe(const std::string& path, const Args& arguments) {
    return program::Run(Join(Words("ffprobe -v error"), arguments, Args{path})).out;
}

} // namespace test_movies
