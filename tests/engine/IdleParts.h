// Decoders that play endless or counted streams and do nothing else, for measurements.
#ifndef MOVIECONV_TESTS_ENGINE_IDLEPARTS_H
#define MOVIECONV_TESTS_ENGINE_IDLEPARTS_H

#include "media/Decoders.h"

#include <cstdint>

/// A count for what has to be stopped.
constexpr int64_t kEndless = 1'000'000'000;

/// `count` black pictures, 25 a second.
class IdleVideo : public VideoDecoder {
public:
    explicit IdleVideo(int64_t count) : left(count) {
        static unsigned char planes[160 * 120]{};
        info.format = {160, 120, 25.0, static_cast<double>(count) / 25};
        image.nType = kMediaTypePicture;
        image.nFormat = kPictureFormatPlanar420;
        image.pY = image.pU = image.pV = planes;
        image.nWidth = image.nPitchY = 160;
        image.nPitchU = image.nPitchV = 80;
        image.nHeight = 120;
    }
    VideoSourceInfo* GetVideoInfo() override { return &info; }
    double Seek(double, int) override { return 0.0; }
    VideoImage* GetCurrentImage() override { return &image; }
    int DecodeNext(int) override {
        image.llTime += 400000;
        return --left > 0;
    }

private:
    VideoSourceInfo info{};
    VideoImage image{};
    int64_t left;
};

/// `count` blocks of 20 ms of sound.
class IdleAudio : public AudioDecoder {
public:
    explicit IdleAudio(int64_t count) : left(count) {
        info.format = {8000, 1, 8, 8000, static_cast<double>(count) / 50};
        static unsigned char samples[160]{};
        block = {0, 8000, 1, 8, samples, sizeof samples, sizeof samples, {}, 0, 0, 200000};
    }
    AudioSourceInfo* GetAudioInfo() override { return &info; }
    double Seek(double) override { return 0.0; }
    AudioFrame* GetNextFrame() override {
        if (left-- <= 0)
            return nullptr;
        block.llTime += 200000;
        return &block;
    }

private:
    AudioSourceInfo info{};
    AudioFrame block{};
    int64_t left;
};

#endif
