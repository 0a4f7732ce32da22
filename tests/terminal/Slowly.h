// A conversion that tests can interfere with.
#ifndef MOVIECONV_TESTS_TERMINAL_SLOWLY_H
#define MOVIECONV_TESTS_TERMINAL_SLOWLY_H

#include "tests/support/TestMovies.h"

#include <string>

/// Arguments of one that takes its time: many large pictures, but none that a codec keeps for later.
inline test_movies::Args Slowly(const std::string& output) {
    return {test_movies::CountedMovie(60), output, "--size", "1280x960", "--frame-rate", "100"};
}

#endif
