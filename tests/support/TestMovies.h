// Short movies for the tests, made once with the ffmpeg program and kept in the build directory.
#ifndef MOVIECONV_TESTS_SUPPORT_TESTMOVIES_H
#define MOVIECONV_TESTS_SUPPORT_TESTMOVIES_H

#include "tests/support/Folder.h"

#include <string>
#include <vector>

namespace test_movies {

using Args = std::vector<std::string>;

/// The path of the movie `name`, made with `ffmpeg ARGUMENTS PATH` unless it exists. Fails the test when it
/// cannot be.
std::string Make(const std::string& name, const Args& arguments);

/// ffmpeg arguments for pictures of 160 x 120 whose brightness counts them: picture n has luma LumaOf(n).
Args CountedPictures(double seconds, const std::string& rate = "25");
/// ffmpeg arguments for white flashes of 80 ms at every whole second.
Args FlashPictures(double seconds);
/// ffmpeg arguments for beeps of 80 ms at every whole second.
Args Beeps(double seconds);

constexpr int kCountedLumas = 50;
constexpr int LumaOf(int picture) {
    return 20 + picture % kCountedLumas * 4;
}

template <class... Lists>
Args Join(Lists... lists) {
    Args all;
    (all.insert(all.end(), lists.begin(), lists.end()), ...);
    return all;
}

} // namespace test_movies

#endif
