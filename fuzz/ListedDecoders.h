// Decoders whose pictures, blocks of sound and formats come from the input.
#ifndef MOVIECONV_FUZZ_LISTEDDECODERS_H
#define MOVIECONV_FUZZ_LISTEDDECODERS_H

#include "fuzz/Fuzz.h"
#include "tests/engine/ScriptedHost.h"

#include <cstddef>
#include <cstdint>
#include <optional>
#include <vector>

constexpr size_t kMostRecords = 24;
constexpr size_t kSampleBytes = 4096;

/// Sums and differences that wrap, as the engine's stamps do.
inline int64_t Add(int64_t a, int64_t b) {
    return static_cast<int64_t>(static_cast<uint64_t>(a) + static_cast<uint64_t>(b));
}
inline int64_t Subtract(int64_t a, int64_t b) {
    return static_cast<int64_t>(static_cast<uint64_t>(a) - static_cast<uint64_t>(b));
}

/// Mostly the usual one.
inline int64_t WildTime(FuzzedDataProvider& input, int64_t usual) {
    switch (input.ConsumeIntegralInRange(0, 9)) {
    case 0:
        return WildInteger<int64_t>(input, usual);
    case 1:
        return -1;
    case 2:
        return Add(usual, input.ConsumeIntegral<int32_t>());
    default:
        return usual;
    }
}

/// Which calls to a decoder's description fail: never, always, or from one call on.
class Availability {
public:
    explicit Availability(FuzzedDataProvider& input)
        : calls(input.ConsumeIntegralInRange(0, 7) == 0 ? input.ConsumeIntegralInRange(0, 8) : INT32_MAX) {}

    bool Next() { return calls > 0 && (calls == INT32_MAX || calls-- > 0); }

private:
    int32_t calls;
};

class ListedVideo : public VideoDecoder {
public:
    explicit ListedVideo(FuzzedDataProvider& input)
        : available(input), overwrites(input.ConsumeBool()), stepMs(input.ConsumeIntegralInRange(0U, 1500U)) {
        info.format.nWidth = WildInteger(input, 320);
        info.format.nHeight = WildInteger(input, 240);
        info.format.dFrameRate = WildDouble(input, 25.0);
        info.format.dDuration = WildDouble(input, 1.0);
        int64_t time = WildTime(input, 0);
        for (auto i = input.ConsumeIntegralInRange<size_t>(0, kMostRecords); i > 0; --i) {
            pictures.push_back(MakePicture(input, time));
            results.push_back(WildInteger(input, 1));
            time = Add(time, kSecond / 25);
        }
    }

    VideoSourceInfo* GetVideoInfo() override { return available.Next() ? &info : nullptr; }
    double Seek(double, int) override { return 0.0; }
    VideoImage* GetCurrentImage() override {
        if (position >= pictures.size() || !pictures[position])
            return nullptr;
        if (!overwrites)
            return &*pictures[position];
        record = *pictures[position];
        return &record;
    }
    int DecodeNext(int) override {
        AdvanceClock(stepMs);
        const int result = position < results.size() ? results[position] : 0;
        if (++position < pictures.size() && pictures[position])
            record = *pictures[position];
        return result;
    }

    void Rewind() { position = 0; }

    /// The record that the engine reads as that of picture `index`, which it has written, once it has moved
    /// on.
    const VideoImage& AfterNext(size_t index) const {
        const bool overwritten = overwrites && index + 1 < pictures.size() && pictures[index + 1];
        return *pictures.at(overwritten ? index + 1 : index);
    }
    const VideoImage& Picture(size_t index) const { return pictures.at(index).value(); }

    /// True for what a preview may point to.
    bool IsCurrent(const VideoImage* image) const {
        return overwrites ? image == &record : position < pictures.size() && image == &*pictures[position];
    }

private:
    static std::optional<VideoImage> MakePicture(FuzzedDataProvider& input, int64_t time) {
        if (input.ConsumeIntegralInRange(0, 31) == 0)
            return std::nullopt;
        VideoImage image{};
        image.nType = WildInteger<int32_t>(input, kMediaTypePicture);
        image.nFormat = WildInteger<int32_t>(input, kPictureFormatPlanar420);
        image.nReserved = input.ConsumeIntegral<int16_t>();
        image.nWidth = WildInteger(input, 320);
        image.reserved[11] = input.ConsumeIntegral<uint8_t>();
        image.llTime = WildTime(input, time);
        image.llTime2 = WildTime(input, image.llTime);
        image.nDuration = input.ConsumeIntegral<int16_t>();
        return image;
    }

    VideoSourceInfo info{};
    Availability available;
    std::vector<std::optional<VideoImage>> pictures;
    std::vector<int> results;
    VideoImage record{};
    bool overwrites;
    uint32_t stepMs;
    size_t position = 0;
};

class ListedAudio : public AudioDecoder {
public:
    explicit ListedAudio(FuzzedDataProvider& input)
        : available(input), stepMs(input.ConsumeIntegralInRange(0U, 1500U)) {
        info.format.nSampleRate = WildInteger(input, 8000);
        info.format.nChannels = WildInteger(input, 2);
        info.format.nBitsPerSample = WildInteger(input, 16);
        info.format.nBytesPerSecond = WildInteger(input, 32000);
        info.format.dDuration = WildDouble(input, 1.0);
        int64_t time = WildTime(input, 0);
        for (auto i = input.ConsumeIntegralInRange<size_t>(0, kMostRecords); i > 0; --i) {
            blocks.push_back(MakeBlock(input, time));
            time = Add(time, kSecond / 20);
        }
    }

    AudioSourceInfo* GetAudioInfo() override { return available.Next() ? &info : nullptr; }
    double Seek(double) override { return 0.0; }
    AudioFrame* GetNextFrame() override {
        AdvanceClock(stepMs);
        if (position >= blocks.size() || !blocks[position++])
            return nullptr;
        return &*blocks[position - 1];
    }

    void Rewind() { position = 0; }

    const AudioFrame& Block(size_t index) const { return blocks.at(index).value(); }
    const AudioFormat& Format() const { return info.format; }

private:
    std::optional<AudioFrame> MakeBlock(FuzzedDataProvider& input, int64_t time) {
        if (input.ConsumeIntegralInRange(0, 31) == 0)
            return std::nullopt;
        AudioFrame frame{};
        frame.nType =
            input.ConsumeBool() ? kMediaTypeSound : 0; // never that of silence, which the engine makes
        frame.nSampleRate = WildInteger(input, 8000);
        frame.nChannels = WildInteger(input, 2);
        frame.nBitsPerSample = WildInteger(input, 16);
        frame.nLength = WildInteger(input, 1600);
        frame.pData = frame.nLength <= static_cast<int32_t>(kSampleBytes) ? samples : nullptr;
        frame.nBufferSize = input.ConsumeIntegral<int16_t>();
        frame.llTime = WildTime(input, time);
        frame.llTime2 = WildTime(input, frame.llTime);
        return frame;
    }
    AudioSourceInfo info{};
    Availability available;
    std::vector<std::optional<AudioFrame>> blocks;
    unsigned char samples[kSampleBytes] = {};
    uint32_t stepMs;
    size_t position = 0;
};

#endif
