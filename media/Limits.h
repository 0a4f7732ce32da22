// Limits and defaults that more than one part of the product keeps to.
#ifndef MOVIECONV_MEDIA_LIMITS_H
#define MOVIECONV_MEDIA_LIMITS_H

#include "media/FourCC.h"

#include <cstdint>

constexpr double kLowestFrameRate = 0.1;  // that may be asked for; pictures per second
constexpr double kHighestFrameRate = 200; // pictures per second; of a source with more the engine makes 30
constexpr int32_t kLargestSide = 32768;   // of a picture, in pixels

// Bits per second where nobody says anything.
constexpr int32_t kUsualVideoBitrate = 512'000;
constexpr int32_t kUsualAudioBitrate = 128'000;

// What the engine codes with where nobody says anything.
constexpr uint32_t kEngineVideoCodec = FourCC("XVID");
constexpr uint32_t kEngineAudioCodec = FourCC("AAC ");

#endif
