// Short movies for the tests, made once with the ffmpeg program and kept in the build directory.
#ifndef MOVIECONV_TESTS_SUPPORT_TESTMOVIES_H
#define MOVIECONV_TESTS_SUPPORT_TESTMOVIES_H

#include "tests/support/Ffmpeg.h"
#include "tests/support/Folder.h"

#include <string>

namespace test_movies {

/// The path of the movie `name`, made with `ffmpeg ARGUMENTS PATH` unless it exists. Fails the test when it
/// cannot be.
std::string Make(const std::string& name, const Args& arguments);

/// The path of a file with that content, of which movies are made: the same one each time.
std::string Part(const std::string& name, const std::string& content);

/// ffmpeg arguments for pictures of 160 x 120 whose brightness counts them: picture n has luma LumaOf(n).
Args CountedPictures(double seconds, const std::string& rate = "25");
/// ffmpeg arguments for white flashes of 80 ms at every whole second.
Args FlashPictures(double seconds);
/// ffmpeg arguments for beeps of 80 ms at every whole second.
Args Beeps(double seconds);

/// ffmpeg arguments for encoders that lose next to nothing.
Args NearLossless();

/// A movie of counted pictures and beeps, hardly compressed.
std::string CountedMovie(double seconds = 4);

constexpr int kCountedLumas = 50;
constexpr int LumaOf(int picture) {
    return 20 + picture % kCountedLumas * 4;
}

} // namespace test_movies

#endif
