// A host in C++ that brings decoder objects: it draws pictures, hums a tone and has the engine make a movie
// of both. Usage: minimal_host OUTPUT.mp4
#include <movieconv/MovieConv.h>

#include <array>
#include <cmath>
#include <cstdio>
#include <string>

constexpr int kWidth = 320, kHeight = 240, kPictures = 75, kPicturesPerSecond = 25;
constexpr int kSampleRate = 44100, kBlockSamples = 441;
constexpr double kSeconds = 1.0 * kPictures / kPicturesPerSecond;

/// A grey gradient that wanders to the left.
class Pictures final : public VideoDecoder {
public:
    Pictures() {
        info.format = {kWidth, kHeight, kPicturesPerSecond, kSeconds};
        image.nType = kMediaTypePicture;
        image.nFormat = kPictureFormatPlanar420;
        image.pY = luma.data();
        image.pU = image.pV = grey.data();
        grey.fill(128);
        image.nWidth = image.nPitchY = kWidth;
        image.nHeight = kHeight;
        image.nPitchU = image.nPitchV = kWidth / 2;
        image.nDuration = kTicksPerSecond / kPicturesPerSecond;
    }
    VideoSourceInfo* GetVideoInfo() override { return &info; }
    double Seek(double seconds, int) override { return number = int(seconds * kPicturesPerSecond); }
    VideoImage* GetCurrentImage() override {
        for (int i = 0; i < kWidth * kHeight; ++i)
            luma[i] = (unsigned char)(16 + (i % kWidth + i / kWidth + 2 * number) % 220);
        image.llTime = image.llTime2 = number * kTicksPerSecond / kPicturesPerSecond;
        return number < kPictures ? &image : nullptr;
    }
    int DecodeNext(int) override { return ++number < kPictures ? 1 : 0; }

private:
    int number = 0;
    VideoSourceInfo info{};
    VideoImage image{};
    std::array<unsigned char, kWidth * kHeight> luma{}, grey{};
};

/// A tone of 441 Hz in blocks of one hundredth of a second.
class Sound final : public AudioDecoder {
public:
    Sound() {
        info.format = {kSampleRate, 1, 16, 2 * kSampleRate, kSeconds};
        block.nType = kMediaTypeSound;
        block.nSampleRate = kSampleRate;
        block.nChannels = 1;
        block.nBitsPerSample = 16;
        block.pData = (unsigned char*)samples.data();
        block.nLength = block.nBufferSize = sizeof samples;
        block.nDuration = kBlockSamples * kTicksPerSecond / kSampleRate;
    }
    AudioSourceInfo* GetAudioInfo() override { return &info; }
    double Seek(double seconds) override { return position = int(seconds * kSampleRate); }
    AudioFrame* GetNextFrame() override {
        for (int i = 0; i < kBlockSamples; ++i)
            samples[i] = short(8000 * std::sin(6.283185307 * 441 * (position + i) / kSampleRate));
        block.llTime = block.llTime2 = position * kTicksPerSecond / kSampleRate;
        position += kBlockSamples;
        return position <= kSeconds * kSampleRate ? &block : nullptr;
    }

private:
    int position = 0; // in samples
    AudioSourceInfo info{};
    AudioFrame block{};
    std::array<short, kBlockSamples> samples{};
};

/// Comes on the engine's thread; 0 would cancel.
unsigned Report(void*, unsigned kind, unsigned value, uintptr_t) {
    if (kind == 0)
        std::fprintf(stderr, "%5.1f %%\n", value / 100.0);
    return 1;
}

int main(int argc, char** argv) {
    const std::string name = argc == 2 ? argv[1] : "out.mp4"; // ASCII; wide names are UTF-32
    const std::wstring wide(name.begin(), name.end());
    Pictures pictures;
    Sound sound;
    EncodeParam param;
    MCResult result{};
    result.nSize = sizeof result;
    MCSetLogCallback([](void*, int, const char*) {}, nullptr); // or a log of one's own
    MCHandle converter = MCCreate(&pictures, &sound);
    if (!converter || !MCEncodeParamForFile(wide.c_str(), &param))
        return std::fprintf(stderr, "no converter, or an extension that tells no format\n"), 1;
    MCSetEncodeParam(converter, &param);
    MCSetOutputFile(converter, wide.c_str());
    MCEnableEvents(converter, 0);        // nobody here receives them
    MCEnableStopOnFailure(converter, 1); // a full disk ends it at once
    if (MCStart(converter, 0.0, 0.0, nullptr, Report, nullptr) == 0)
        MCWait(converter, MC_INFINITE);
    MCGetResult(converter, &result);
    MCDestroy(converter);
    if (!result.bDone)
        std::fprintf(stderr, "%s: %s\n", result.szPath, result.szWhat);
    return result.bDone ? 0 : 1;
}
