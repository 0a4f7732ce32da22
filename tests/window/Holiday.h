// A movie to convert.
#ifndef MOVIECONV_TESTS_WINDOW_HOLIDAY_H
#define MOVIECONV_TESTS_WINDOW_HOLIDAY_H

#include "tests/support/TestMovies.h"

#include <string>

/// Four seconds of pictures in motion, with sound.
inline std::string Holiday() {
    const std::string pictures =
        "mandelbrot=s=1280x720:r=25:start_scale=0.6:end_scale=0.01:end_pts=250,format=yuv420p";
    return test_movies::Make("window-4s.mkv",
                             {"-f", "lavfi", "-i", pictures, "-f", "lavfi", "-i", "sine=440:r=48000", "-t",
                              "4", "-c:v", "libx264", "-preset", "veryfast", "-c:a", "aac"});
}

#endif
