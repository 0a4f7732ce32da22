// The time stamps that reach the media writer, as the engine's audio-and-video loop makes them.
#ifndef MOVIECONV_TESTS_WRITER_ENGINEMODEL_H
#define MOVIECONV_TESTS_WRITER_ENGINEMODEL_H

#include <cmath>
#include <cstdint>
#include <vector>

/// One source; times in 100 ns units unless they say otherwise.
struct ModelSource {
    double fps = 25.0;
    int pictures = 250;
    std::vector<int64_t> pictureTimes; ///< Instead of a steady rate, when not empty.
    int sampleRate = 44100;
    int blockSamples = 512;
    int64_t soundOffset = 0; ///< Stamp of the first sample.
    double soundSeconds = 10.0;
    int64_t stampRounding = 1; ///< Stamps of the source are rounded to this.
    int splitMilliseconds = 0; ///< 0: one file.

    int64_t PictureLength() const { return std::llround(1e7 / fps); }
};

/// One call to the writer.
struct ModelEvent {
    bool picture;
    bool silence;
    int64_t stamp;  ///< As the writer gets it.
    int64_t source; ///< True time in the source; for silence without meaning.
    int64_t bytes;  ///< Of sound: 16 bits, two channels.
};

using ModelClip = std::vector<ModelEvent>;

/// What the writer is called with, clip by clip.
std::vector<ModelClip> RunEngineModel(const ModelSource& source);

#endif
