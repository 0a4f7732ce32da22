// The media writer over parameters, formats, pictures and sound of all kinds, real files in a temporary
// folder. The codecs are those that cost little.
#include "fuzz/Fuzz.h"
#include "media/FourCC.h"
#include "media/MediaWriter.h"
#include "tests/support/Folder.h"
#include "tests/writer/TestSource.h"
#include "text/Utf8.h"
#include "writer/WriterStatus.h"

#include <algorithm>
#include <filesystem>
#include <string>
#include <vector>

namespace {

constexpr int kMostWidth = 80;
constexpr int kMostHeight = 48;
constexpr int64_t kSecond = 10'000'000;
constexpr int64_t kYear = 365 * 24 * 3600 * kSecond;

/// A small size, or one that is none; what lies between would only take long.
int Size(FuzzedDataProvider& input, int most) {
    if (input.ConsumeIntegralInRange(0, 7) != 0)
        return input.ConsumeIntegralInRange(1, most);
    return input.PickValueInArray({0, -1, INT32_MIN, 32769, 70000, INT32_MAX});
}

/// The usual distance to the stamp before, up to two seconds, or years: hours of a standing picture would
/// only take long.
int64_t NextStamp(FuzzedDataProvider& input, int64_t before, int64_t usual) {
    int64_t step = usual;
    switch (input.ConsumeIntegralInRange(0, 9)) {
    case 0:
        step = input.ConsumeIntegralInRange(-2 * kSecond, 2 * kSecond);
        break;
    case 1:
        step = input.ConsumeBool() ? input.ConsumeIntegralInRange(kYear, INT64_MAX)
                                   : input.ConsumeIntegralInRange(INT64_MIN, -kYear);
        break;
    default:
        break;
    }
    return static_cast<int64_t>(static_cast<uint64_t>(before) + static_cast<uint64_t>(step));
}

/// No rate between a picture a second and what counts as none: standing pictures would only take long.
double Rate(FuzzedDataProvider& input, double usual) {
    const double rate = WildDouble(input, usual);
    return rate > 0.0001 && rate < 1.0 ? 1.0 : rate;
}

EncodeParam MakeParam(FuzzedDataProvider& input) {
    EncodeParam param{};
    param.fccFileFormat = input.PickValueInArray(
        {FourCC("MP4 "), FourCC("MOV "), FourCC("MKV "), FourCC("AVI "), FourCC("FLV "), FourCC("TS  "),
         FourCC("M4A "), FourCC("MP3 "), FourCC("WAV "), FourCC("FLAC"), FourCC("OGG "), FourCC("COPY")});
    param.fccVideo = input.PickValueInArray(
        {FourCC("XVID"), FourCC("MJPG"), FourCC("MPG2"), FourCC("FLV1"), FourCC("divx"), FourCC("????")});
    param.fccAudio = input.PickValueInArray({FourCC("AAC "), FourCC("MP3 "), FourCC("AC3 "), FourCC("FLAC"),
                                             FourCC("PCM "), FourCC("VORB"), FourCC("????")});
    param.nWidth = input.ConsumeBool() ? 0 : Size(input, kMostWidth);
    param.nHeight = input.ConsumeBool() ? 0 : Size(input, kMostHeight);
    param.dFrameRate = Rate(input, 0.0);
    param.nVideoRateMode = input.ConsumeBool() ? 1 : 0;
    param.nVideoBitrate = WildInteger(input, 0);
    param.nVideoMaxBitrate = WildInteger(input, 0);
    param.bResize = input.ConsumeBool() ? 1 : 0;
    param.nSampleRate = WildInteger(input, 0);
    param.nChannels = WildInteger(input, 0);
    param.nBitsPerSample = WildInteger(input, 16);
    param.nAudioRateMode = input.ConsumeBool() ? 1 : 0;
    param.nAudioBitrate = WildInteger(input, 0);
    param.nAudioMaxBitrate = WildInteger(input, 0);
    param.bNoVideo = input.ConsumeIntegralInRange(0, 7) == 0 ? 1 : 0;
    param.bNoAudio = input.ConsumeIntegralInRange(0, 7) == 0 ? 1 : 0;
    return param;
}

WriterOptions MakeOptions(FuzzedDataProvider& input) {
    WriterOptions options{};
    options.nSampleAspectNum = WildInteger(input, 1);
    options.nSampleAspectDen = WildInteger(input, 1);
    options.bFullRange = input.ConsumeBool() ? 1 : 0;
    options.nColorPrimaries = WildInteger(input, 0);
    options.nColorTransfer = WildInteger(input, 0);
    options.nColorMatrix = WildInteger(input, 0);
    options.bBitExact = input.ConsumeBool() ? 1 : 0;
    options.bRemovePartial = 1;
    options.nEncoderThreads = 1;
    return options;
}

/// Pictures in blocks of exactly the size that their record tells.
class Pictures {
public:
    explicit Pictures(FuzzedDataProvider& source) : input(source), stamp(NextStamp(source, 0, 0)) {}

    const VideoImage& Next(bool usual) {
        image = {};
        image.nType = usual ? kMediaTypePicture : WildInteger<int32_t>(input, kMediaTypePicture);
        image.nFormat =
            usual ? kPictureFormatPlanar420 : WildInteger<int32_t>(input, kPictureFormatPlanar420);
        const bool changes = input.ConsumeIntegralInRange(0, 7) == 0;
        image.nWidth = width = changes ? Size(input, kMostWidth) : width;
        image.nHeight = height = changes ? Size(input, kMostHeight) : height;
        const int chromaWidth = width / 2 + width % 2;
        const int chromaHeight = height / 2 + height % 2;
        sampleBytes = image.nFormat == kPictureFormatPlanar420Deep ? 2 : 1;
        MakePlane(image.pY, image.nPitchY, width, height, planes[0]);
        MakePlane(image.pU, image.nPitchU, chromaWidth, chromaHeight, planes[1]);
        MakePlane(image.pV, image.nPitchV, chromaWidth, chromaHeight, planes[2]);
        stamp = NextStamp(input, stamp, kSecond / 25);
        image.llTime = image.llTime2 = stamp;
        return image;
    }

private:
    void MakePlane(unsigned char*& plane, int32_t& pitch, int columns, int rows,
                   std::vector<unsigned char>& bytes) {
        const bool exists = columns > 0 && rows > 0 && columns <= kMostWidth && rows <= kMostHeight;
        const int rowBytes = exists ? columns * sampleBytes : columns;
        pitch = exists ? rowBytes + input.ConsumeIntegralInRange(0, 3) : rowBytes;
        bytes.assign(exists ? static_cast<size_t>(pitch) * static_cast<size_t>(rows - 1) +
                                  static_cast<size_t>(rowBytes)
                            : 1,
                     input.ConsumeIntegral<uint8_t>());
        plane = bytes.data();
        switch (input.ConsumeIntegralInRange(0, 31)) {
        case 0:
            plane = nullptr;
            break;
        case 1: // the last row first
            if (exists) {
                plane += static_cast<ptrdiff_t>(rows - 1) * pitch;
                pitch = -pitch;
            }
            break;
        case 2: // too small for a row
            pitch = rowBytes > 0 ? input.ConsumeIntegralInRange(1 - rowBytes, rowBytes - 1) : 0;
            break;
        case 3:
            pitch = exists && rows > 1 ? 0 : INT32_MIN;
            break;
        default:
            break;
        }
    }

    FuzzedDataProvider& input;
    int64_t stamp;
    int width = 32;
    int height = 16;
    int sampleBytes = 1;
    std::vector<unsigned char> planes[3];
    VideoImage image{};
};

/// Sound in blocks of exactly the size that their record tells.
class Sound {
public:
    explicit Sound(FuzzedDataProvider& source) : input(source), stamp(NextStamp(source, 0, 0)) {}

    const AudioFrame& Next() {
        frame = {};
        frame.nType = input.ConsumeIntegralInRange(0, 7) == 0 ? kMediaTypeSilence : kMediaTypeSound;
        frame.nSampleRate = WildInteger(input, 8000);
        if (frame.nSampleRate > 0 && frame.nSampleRate < 1000)
            frame.nSampleRate = 1000; // hours of sound in a few bytes would only take long
        frame.nChannels = WildInteger(input, 2);
        frame.nBitsPerSample = input.PickValueInArray({16, 16, 16, 8, 24, 32, 0, 12, INT32_MIN});
        const int length = WildInteger(input, 1600);
        bytes.assign(length > 0 && length <= 4096 ? static_cast<size_t>(length) : 1,
                     input.ConsumeIntegral<uint8_t>());
        frame.nLength = length > 4096 ? 1 : length;
        frame.pData = input.ConsumeIntegralInRange(0, 31) == 0 ? nullptr : bytes.data();
        stamp = NextStamp(input, stamp, kSecond / 20);
        frame.llTime = frame.llTime2 = stamp;
        return frame;
    }

private:
    FuzzedDataProvider& input;
    int64_t stamp;
    std::vector<unsigned char> bytes;
    AudioFrame frame{};
};

void WriteRecords(FuzzedDataProvider& input, void* file) {
    Pictures pictures(input);
    Sound sound(input);
    for (int record = input.ConsumeIntegralInRange(0, 24); record > 0; --record) {
        if (input.ConsumeBool()) {
            const bool usual = input.ConsumeBool();
            MWWriteVideoFrame(file, &pictures.Next(usual));
        } else {
            MWWriteAudioData(file, &sound.Next());
        }
    }
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    static const Folder folder;
    FuzzedDataProvider input(data, size);
    const WriterOptions options = MakeOptions(input);
    const uint32_t set = MWRegisterOptions(&options);
    FUZZ_CHECK(set != 0);
    EncodeParam param = MakeParam(input);
    param.nReserved[kWriterSetWord] = set;
    const VideoFormat video{Size(input, kMostWidth), Size(input, kMostHeight), Rate(input, 25.0), 1.0};
    const AudioFormat audio{WildInteger(input, 8000), WildInteger(input, 2), WildInteger(input, 16),
                            WildInteger(input, 32000), 1.0};
    const bool hasVideo = input.ConsumeIntegralInRange(0, 7) != 0;
    const bool hasAudio = input.ConsumeIntegralInRange(0, 7) != 0;
    const std::string target = folder / "movie";

    void* file = MWCreateMediaFile(text::FromUtf8(target).c_str(), &param, hasVideo ? &video : nullptr,
                                   hasAudio ? &audio : nullptr);
    WriteRecords(input, file);
    const bool complete = MWCloseMediaFile(file, nullptr, nullptr) != 0;

    WriterStatus status{};
    FUZZ_CHECK(MWGetFileStatus(set, MWGetFileCount(set), &status) == 1);
    FUZZ_CHECK(MWUnregisterOptions(set) == 1);
    FUZZ_CHECK(complete == (status.nState == kWriterFileComplete));
    const bool well = complete || status.nState == kWriterFileEmpty;
    FUZZ_CHECK(well == (status.nError == kWriterErrorNone) && well == (status.szWhat[0] == '\0'));
    // A complete file under its name, or nothing at all.
    const std::vector<std::string> names = folder.Names();
    FUZZ_CHECK(names == (complete ? std::vector<std::string>{"movie"} : std::vector<std::string>{}));
    if (complete) {
        FUZZ_CHECK(status.llBytesWritten == static_cast<int64_t>(std::filesystem::file_size(target)));
        std::filesystem::remove(target);
    }
    return 0;
}
