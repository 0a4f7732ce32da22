// Looks at movies through the decoders.
#ifndef MOVIECONV_TESTS_SUPPORT_INSPECT_H
#define MOVIECONV_TESTS_SUPPORT_INSPECT_H

#include "host/source/Movie.h"

#include <cstdint>
#include <string>
#include <vector>

namespace inspect {

struct SeenPicture {
    double time;
    double duration;
    int luma; // mean of the plane
    int width;
    int height;
};

struct Seen {
    std::vector<SeenPicture> pictures;
    std::vector<int16_t> sound; // first channel
    double soundBegin = 0;
    int64_t largestBlock = 0; // samples
    bool soundContinuous = true;
};

/// Everything from `begin` on, pictures first: the decoders must not depend on an even interleaving of the
/// calls.
Seen TakeAll(movieconv::Movie& movie, double begin = 0);
Seen LookAt(const std::string& path, double begin = 0);

/// Times at which the sound becomes loud after at least 0.3 s of quiet.
std::vector<double> Beginnings(const Seen& seen, int rate);

/// Times of the pictures that are bright after a dark one, or as the first.
std::vector<double> Flashes(const Seen& seen);

} // namespace inspect

#endif
