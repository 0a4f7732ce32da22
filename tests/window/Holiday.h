// A movie to convert.
#ifndef MOVIECONV_TESTS_WINDOW_HOLIDAY_H
#define MOVIECONV_TESTS_WINDOW_HOLIDAY_H

#include "tests/support/TestMovies.h"

#include <string>

/// Pictures in motion, at most ten seconds of them, with sound; large ones are for people to look at.
inline std::string Holiday(int seconds = 4, const std::string& size = "640x360") {
    const std::string pictures =
        "mandelbrot=s=" + size + ":r=25:start_scale=0.6:end_scale=0.01:end_pts=250,format=yuv420p";
    return test_movies::Make("window-" + size + "-" + std::to_string(seconds) + "s.mkv",
                             {"-f", "lavfi", "-i", pictures, "-f", "lavfi", "-i", "sine=440:r=48000", "-t",
                              std::to_string(seconds), "-c:v", "libx264", "-preset", "veryfast", "-c:a",
                              "aac"});
}

#endif
