#include "TestSource.h"

#include "text/Utf8.h"

#include <algorithm>
#include <cmath>
#include <cstring>

namespace {

constexpr int64_t kSecond = 10'000'000;
constexpr double kFrequency = 440.0;

} // namespace

TestPicture::TestPicture(int width, int height, int pitchExtra) {
    const int chromaWidth = (width + 1) / 2;
    const int chromaHeight = (height + 1) / 2;
    image_.nType = kMediaTypePicture;
    image_.nFormat = kPictureFormatPlanar420;
    image_.nWidth = width;
    image_.nHeight = height;
    image_.nPitchY = width + pitchExtra;
    image_.nPitchU = chromaWidth + pitchExtra;
    image_.nPitchV = chromaWidth + 2 * pitchExtra;
    planes_[0].assign(static_cast<size_t>(image_.nPitchY) * height, 255);
    planes_[1].assign(static_cast<size_t>(image_.nPitchU) * chromaHeight, 255);
    planes_[2].assign(static_cast<size_t>(image_.nPitchV) * chromaHeight, 255);
    for (int row = 0; row < chromaHeight; ++row) {
        std::memset(&planes_[1][static_cast<size_t>(row) * image_.nPitchU], 120, chromaWidth);
        std::memset(&planes_[2][static_cast<size_t>(row) * image_.nPitchV], 136, chromaWidth);
    }
    image_.pY = planes_[0].data();
    image_.pU = planes_[1].data();
    image_.pV = planes_[2].data();
}

const VideoImage& TestPicture::Paint(int number, int64_t time) {
    for (int y = 0; y < image_.nHeight; ++y) {
        unsigned char* row = image_.pY + static_cast<ptrdiff_t>(y) * image_.nPitchY;
        for (int x = 0; x < image_.nWidth; ++x)
            row[x] = static_cast<unsigned char>(40 + (x + y) / 4 % 60);
    }
    const int block = std::max(1, image_.nWidth / 10);
    for (int y = 0; y < image_.nHeight / 2; ++y)
        std::memset(image_.pY + static_cast<ptrdiff_t>(y) * image_.nPitchY + number % 10 * block, 220, block);
    image_.llTime = image_.llTime2 = time;
    return image_;
}

TestSound::TestSound(int rate, int channels, int bits, double quiet) : quiet_(quiet) {
    frame_.nType = 2;
    frame_.nSampleRate = rate;
    frame_.nChannels = channels;
    frame_.nBitsPerSample = bits;
}

const AudioFrame& TestSound::Next(int samples, int64_t time) {
    const int size = frame_.nBitsPerSample / 8;
    data_.clear();
    for (int i = 0; i < samples; ++i, ++position_) {
        const double time = static_cast<double>(position_) / frame_.nSampleRate;
        const double value = time < quiet_ ? 0.0 : 0.5 * std::sin(2 * M_PI * kFrequency * time);
        auto wide = static_cast<int32_t>(std::lround(value * 2147483647.0));
        if (size == 1)
            wide ^= INT32_MIN;
        for (int channel = 0; channel < frame_.nChannels; ++channel)
            for (int byte = 4 - size; byte < 4; ++byte)
                data_.push_back(static_cast<unsigned char>(static_cast<uint32_t>(wide) >> (8 * byte)));
    }
    frame_.pData = data_.data();
    frame_.nLength = frame_.nBufferSize = static_cast<int32_t>(data_.size());
    frame_.llTime = frame_.llTime2 = time;
    frame_.nDuration = static_cast<int32_t>(kSecond * samples / frame_.nSampleRate);
    return frame_;
}

EncodeParam TestMovie::Param() {
    EncodeParam param{};
    param.fccVideo = FourCC("XVID");
    param.fccColorFormat = FourCC("YV12");
    param.nBitCount = 12;
    param.nVideoBitrate = 512000;
    param.fccAudio = FourCC("AAC ");
    param.nBitsPerSample = 16;
    param.nAudioBitrate = 128000;
    param.fccFileFormat = FourCC("MP4 ");
    return param;
}

void* TestMovie::Create(const std::string& path) const {
    const VideoFormat video = Video();
    const AudioFormat audio = Audio();
    return MWCreateMediaFile(text::FromUtf8(path).c_str(), &param, hasVideo ? &video : nullptr,
                             hasAudio ? &audio : nullptr);
}

void TestMovie::WriteAll(void* file, const std::function<void(int)>& before) const {
    TestPicture picture(width, height, pitchExtra);
    TestSound sound(sampleRate, channels, bits, quietSeconds);
    const int64_t samples = std::llround(soundSeconds * sampleRate);
    int64_t written = 0;
    const auto writeSound = [&](int64_t until) {
        while (hasAudio && written < samples && written * kSecond / sampleRate <= until) {
            const int count = static_cast<int>(std::min<int64_t>(512, samples - written));
            MWWriteAudioData(file, &sound.Next(count, written * kSecond / sampleRate));
            written += count;
        }
    };
    for (int number = 0; hasVideo && number < pictures; ++number) {
        const auto time = static_cast<int64_t>(std::llround(number * kSecond / rate));
        writeSound(time);
        if (before)
            before(number);
        MWWriteVideoFrame(file, &picture.Paint(number, time));
    }
    writeSound(INT64_MAX);
}

bool TestMovie::Write(const std::string& path) const {
    void* file = Create(path);
    if (file == nullptr)
        return false;
    WriteAll(file);
    return MWCloseMediaFile(file, nullptr, nullptr) != 0;
}
