// A host as it was written for version 1.0.0, compiled with that version's headers: decoder classes, records,
// events, colour routines and the MC functions. Usage: first_version_host FOLDER WRITER
#include "Common/Image/ImageConvert.h"
#include "api/MovieConv.h"
#include "engine/AudioHelpers.h"
#include "platform/Platform.h"

#include <atomic>
#include <cstdio>
#include <cstring>
#include <filesystem>
#include <string>
#include <thread>
#include <vector>

#ifdef MC_VERSION
#error "these are not the headers of version 1.0.0"
#endif

static int failures = 0;

#define CHECK(condition)                                                                                     \
    ((condition) ? void() : (++failures, void(std::printf("line %d: %s\n", __LINE__, #condition))))

constexpr int kWidth = 64, kHeight = 48, kRate = 25, kSampleRate = 8000, kBlock = 400;

class Pictures : public VideoDecoder {
public:
    explicit Pictures(int count) : count(count) {
        info.format = {kWidth, kHeight, kRate, double(count) / kRate};
        image.nType = kMediaTypePicture;
        image.nFormat = kPictureFormatPlanar420;
        image.pY = image.pU = image.pV = plane.data();
        image.nWidth = image.nPitchY = kWidth;
        image.nHeight = kHeight;
        image.nPitchU = image.nPitchV = kWidth / 2;
        image.nDuration = kTicksPerSecond / kRate;
    }
    VideoSourceInfo* GetVideoInfo() override { return &info; }
    double Seek(double seconds, int) override { return number = int(seconds * kRate); }
    VideoImage* GetCurrentImage() override {
        image.llTime = image.llTime2 = number * kTicksPerSecond / kRate;
        return number < count ? &image : nullptr;
    }
    int DecodeNext(int) override { return ++number < count ? 1 : 0; }

    std::atomic<int> number{0};

private:
    const int count;
    VideoSourceInfo info{};
    VideoImage image{};
    std::vector<unsigned char> plane = std::vector<unsigned char>(kWidth * kHeight, 90);
};

class Sound : public AudioDecoder {
public:
    explicit Sound(double seconds) : seconds(seconds) {
        info.format = {kSampleRate, 1, 16, 2 * kSampleRate, seconds};
        block.nType = kMediaTypeSound;
        block.nSampleRate = kSampleRate;
        block.nChannels = 1;
        block.nBitsPerSample = 16;
        block.pData = reinterpret_cast<unsigned char*>(samples);
        block.nLength = block.nBufferSize = sizeof samples;
        block.nDuration = kBlock * kTicksPerSecond / kSampleRate;
    }
    AudioSourceInfo* GetAudioInfo() override { return &info; }
    double Seek(double to) override { return position = int(to * kSampleRate); }
    AudioFrame* GetNextFrame() override {
        block.llTime = block.llTime2 = position * kTicksPerSecond / kSampleRate;
        position += kBlock;
        return position <= seconds * kSampleRate ? &block : nullptr;
    }

private:
    const double seconds;
    int position = 0; // in samples
    short samples[kBlock]{};
    AudioSourceInfo info{};
    AudioFrame block{};
};

struct News {
    static unsigned Take(void* context, unsigned kind, unsigned value, uintptr_t info) {
        News& news = *static_cast<News*>(context);
        const auto* record = reinterpret_cast<const ProgressInfo*>(info);
        if (kind == 1) {
            news.outcome = value;
        } else if (record) {
            ++news.calls;
            news.last = *record;
            CHECK(value == static_cast<unsigned>(record->nProgress));
            CHECK(!record->pPreviewImage || record->pPreviewImage->nWidth == kWidth);
            news.shown += record->pPreviewImage ? 1 : 0;
        }
        return 1;
    }
    std::atomic<int> calls{0};
    int shown = 0;
    unsigned outcome = 99;
    ProgressInfo last{};
};

/// The numbers of progress and finished events that wait, and the outcome of the last one.
static void Drain(int& progress, int& finished, unsigned& outcome) {
    const EventTypeSpec type = {5000, 'kind'};
    EventRef event = nullptr;
    while (ReceiveNextEvent(1, &type, kEventDurationNoWait, 1, &event) == noErr) {
        UInt32 w = 99, l = 99;
        CHECK(GetEventParameter(event, 'WPAM', typeWildCard, nullptr, sizeof w, nullptr, &w) == noErr);
        CHECK(GetEventParameter(event, 'LPAM', typeWildCard, nullptr, sizeof l, nullptr, &l) == noErr);
        ++(w == 100 ? finished : progress);
        if (w == 100)
            outcome = l;
        ReleaseEvent(event);
    }
}

static void ConvertsInClips(const std::wstring& folder, bool files) {
    Pictures pictures(75);
    Sound sound(3.0);
    News news;
    const MCHandle converter = MCCreate(&pictures, &sound);
    EncodeParam param;
    CHECK(MCGetEncodeParam(converter, &param) == 1);
    CHECK(param.nWidth == kWidth && param.nHeight == kHeight && param.nSampleRate == kSampleRate);
    CHECK(param.nChannels == 1 && param.dFrameRate == kRate);
    CHECK(param.fccVideo == FourCC("XVID") && param.fccFileFormat == FourCC("MP4 "));
    param.nVideoBitrate = 0;
    CHECK(MCSetEncodeParam(converter, &param) == 1);
    MCGetEncodeParam(converter, &param);
    CHECK(param.nVideoBitrate == 512000);
    CHECK(MCSetOutputFile(converter, (folder + L"/first.mp4").c_str()) == 1);
    CHECK(MCSetSplitParam(converter, 1, 1000) == 1);
    CHECK(MCGetEstimateDiskSpace(converter) > 0);
    CHECK(MCGetEstimateDiskSpaceEx(&param, 10.0) > MCGetEstimateDiskSpaceEx(&param, 5.0));
    CHECK(MCStart(converter, 0.0, 0.0, nullptr, News::Take, &news) == 0);
    CHECK(MCWait(converter, MC_INFINITE) == 0);
    CHECK(news.outcome == kOutcomeCompleted);
    CHECK(news.calls > 1 && news.shown > 1 && news.last.dTotalLength == 3.0);
    CHECK(MCGetTargetCount(converter) >= 3);
    wchar_t name[MC_MAX_TARGET_NAME];
    CHECK(MCGetTargetFileName(converter, name, 0) == 1 && name == folder + L"/first_00.mp4");
    CHECK(MCGetTargetFileName(converter, name, 99) == 0);
    CHECK(!files || std::filesystem::file_size(folder + L"/first_00.mp4") > 1000);
    MCDestroy(converter);

    int progress = 0;
    int finished = 0;
    unsigned outcome = 99;
    Drain(progress, finished, outcome);
    CHECK(progress > 1 && finished == 1 && outcome == kOutcomeCompleted);
}

static void PausesAndStops(const std::wstring& folder) {
    Pictures pictures(1000000);
    News news;
    const MCHandle converter = MCCreate(&pictures, nullptr);
    MCSetOutputFile(converter, (folder + L"/second.mp4").c_str());
    CHECK(MCStart(converter, 0.0, 0.0, nullptr, News::Take, &news) == 0);
    CHECK(MCPause(converter) == 1);
    CHECK(MCPause(converter) == 2);
    CHECK(MCResume(converter) == 1);
    CHECK(MCWait(converter, 0) == MC_WAIT_TIMEOUT);
    CHECK(MCResume(converter) == 0);
    while (news.calls == 0)
        std::this_thread::yield();
    CHECK(MCStop(converter) == 0);
    CHECK(news.outcome == kOutcomeStopped);
    CHECK(MCAbort(converter) == 0 && MCWait(converter, MC_INFINITE) == 0);
    MCDestroy(converter);
}

static void HelpersAndColours() {
    unsigned char eight[2] = {1, 3};
    short sixteen[4] = {};
    CHECK(ConvertTo16BitsStero(sixteen, 8, 1, eight, 2) == 4 && sixteen[0] == 128 && sixteen[3] == 384);
    Sound sound(1.0);
    CHECK(get_small_frame(&sound) != nullptr && get_small_frame(nullptr) == nullptr);
    CHECK(PlayAudio(&sound)->format.nSampleRate == kSampleRate);
    int y = 0, u = 0, v = 0;
    PixelRGB_2_YUV(255, 255, 255, y, u, v);
    CHECK(y > 230 && u == 128 && v == 128);
}

int main(int, char** argv) {
    const std::string folder = argv[1];
    for (const auto& entry : std::filesystem::directory_iterator(folder))
        if (entry.path().extension() == ".mp4")
            std::filesystem::remove(entry.path());
    const std::wstring wide(folder.begin(), folder.end());
    ConvertsInClips(wide, std::strcmp(argv[2], "orvex") == 0);
    PausesAndStops(wide);
    HelpersAndColours();
    return failures == 0 ? 0 : 1;
}
