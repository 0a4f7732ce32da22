#include "tests/support/Inspect.h"

#include <algorithm>
#include <cmath>
#include <cstring>

namespace inspect {
namespace {

int MeanLuma(const VideoImage& image) {
    int64_t sum = 0;
    for (int y = 0; y < image.nHeight; ++y)
        for (int x = 0; x < image.nWidth; ++x)
            sum += image.pY[static_cast<ptrdiff_t>(y) * image.nPitchY + x];
    return static_cast<int>(std::lround(static_cast<double>(sum) / image.nWidth / image.nHeight));
}

void TakeSound(AudioDecoder& decoder, Seen& seen) {
    int64_t samples = 0;
    while (const AudioFrame* block = decoder.GetNextFrame()) {
        if (block->nLength == 0)
            break;
        const int sampleBytes = block->nBitsPerSample / 8;
        const int count = block->nLength / sampleBytes / block->nChannels;
        if (samples == 0)
            seen.soundBegin = static_cast<double>(block->llTime) / 1e7;
        const double due = seen.soundBegin + static_cast<double>(samples) / block->nSampleRate;
        seen.soundContinuous =
            seen.soundContinuous && std::abs(static_cast<double>(block->llTime) / 1e7 - due) < 1e-6;
        seen.largestBlock = std::max<int64_t>(seen.largestBlock, count);
        for (int i = 0; i < count; ++i) {
            int16_t value = 0;
            const int top = sampleBytes - 2; // the upper 16 bits of a wider sample
            std::memcpy(&value,
                        block->pData + static_cast<ptrdiff_t>(i) * block->nChannels * sampleBytes + top, 2);
            seen.sound.push_back(value);
        }
        samples += count;
    }
}

} // namespace

Seen TakeAll(movieconv::Movie& movie, double begin) {
    Seen seen;
    VideoDecoder* pictures = movie.Pictures();
    AudioDecoder* sound = movie.Sound();
    if (begin > 0 && pictures != nullptr)
        pictures->Seek(begin, 1);
    if (begin > 0 && sound != nullptr)
        sound->Seek(begin);
    if (pictures != nullptr) {
        for (const VideoImage* image = pictures->GetCurrentImage(); image != nullptr;
             image = pictures->GetCurrentImage()) {
            seen.pictures.push_back({static_cast<double>(image->llTime) / 1e7, image->nDuration / 1e7,
                                     MeanLuma(*image), image->nWidth, image->nHeight});
            if (pictures->DecodeNext(1) < 1)
                break;
        }
    }
    if (sound != nullptr)
        TakeSound(*sound, seen);
    return seen;
}

Seen LookAt(const std::string& path, double begin) {
    movieconv::Movie movie(path, {});
    return TakeAll(movie, begin);
}

std::vector<double> Beginnings(const Seen& seen, int rate) {
    std::vector<double> times;
    int64_t lastLoud = -rate;
    for (size_t i = 0; i < seen.sound.size(); ++i) {
        if (std::abs(seen.sound[i]) > 3000) {
            if (static_cast<int64_t>(i) - lastLoud > rate * 3 / 10)
                times.push_back(seen.soundBegin + static_cast<double>(i) / rate);
            lastLoud = static_cast<int64_t>(i);
        }
    }
    return times;
}

std::vector<double> Flashes(const Seen& seen) {
    constexpr int kBright = 130;
    std::vector<double> times;
    bool wasBright = false;
    for (const SeenPicture& picture : seen.pictures) {
        const bool bright = picture.luma > kBright;
        if (bright && !wasBright)
            times.push_back(picture.time);
        wasBright = bright;
    }
    return times;
}

} // namespace inspect
