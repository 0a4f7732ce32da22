// The exported functions with decoders that are nothing but tables of function pointers, called by slot
// number.
#include "api/MovieConv.h"
#include "tests/recorder/RecordingWriter.h"

#include <gtest/gtest.h>

#include <stdexcept>
#include <string>
#include <typeinfo>

namespace {

using Slot = void (*)();

/// A virtual table with the two words before it that the run-time type check of a sanitizer wants to see.
struct Table {
    const void* offsetToTop;
    const std::type_info* type;
    Slot slots[10];
};

template <class Function>
Slot ToSlot(Function* function) {
    return reinterpret_cast<Slot>(function);
}

void Unlisted() {
    FAIL() << "a slot that the engine has no business with";
}

/// A decoder: the address of its table's slots, and what the operations need.
template <class Info, class Record>
struct Fake {
    const Slot* table;
    Info info;
    Record record;
    int left;
};

using FakeVideo = Fake<VideoSourceInfo, VideoImage>;
using FakeAudio = Fake<AudioSourceInfo, AudioFrame>;

VideoSourceInfo* GetVideoInfo(FakeVideo* self) {
    return &self->info;
}
AudioSourceInfo* GetAudioInfo(FakeAudio* self) {
    return &self->info;
}

double SeekVideo(FakeVideo*, double seconds, int mode) {
    recorder::Note("seek video " + std::to_string(seconds) + " " + std::to_string(mode));
    return -1.0;
}

double SeekAudio(FakeAudio*, double seconds) {
    recorder::Note("seek audio " + std::to_string(seconds));
    return -1.0;
}

VideoImage* GetCurrentImage(FakeVideo* self) {
    return self->left > 0 ? &self->record : nullptr;
}

int DecodeNext(FakeVideo* self, int mode) {
    self->record.llTime += 1000000;
    return --self->left > 0 ? mode : 0;
}

AudioFrame* GetNextFrame(FakeAudio* self) {
    if (self->left-- <= 0)
        return nullptr;
    self->record.llTime += 1000000;
    return &self->record;
}

const Table kVideoTable = {nullptr,
                           &typeid(VideoDecoder),
                           {Unlisted, Unlisted, Unlisted, Unlisted, Unlisted, ToSlot(GetVideoInfo),
                            ToSlot(SeekVideo), Unlisted, ToSlot(GetCurrentImage), ToSlot(DecodeNext)}};
const Table kAudioTable = {nullptr,
                           &typeid(AudioDecoder),
                           {Unlisted, Unlisted, Unlisted, Unlisted, ToSlot(SeekAudio), ToSlot(GetNextFrame),
                            Unlisted, ToSlot(GetAudioInfo), Unlisted, Unlisted}};

class VirtualTableTest : public testing::Test {
protected:
    VirtualTableTest() {
        recorder::Reset();
        video.table = kVideoTable.slots;
        video.info.format = {320, 240, 10.0, 0.2};
        video.left = 2;
        audio.table = kAudioTable.slots;
        audio.info.format = {1000, 1, 8, 1000, 0.2};
        audio.record.nSampleRate = 1000;
        audio.record.nChannels = 1;
        audio.record.nBitsPerSample = 8;
        audio.record.nLength = 100;
        audio.record.llTime = -1000000;
        audio.left = 2;
    }

    VideoDecoder* Video() { return reinterpret_cast<VideoDecoder*>(&video); }
    AudioDecoder* Audio() { return reinterpret_cast<AudioDecoder*>(&audio); }

    FakeVideo video{};
    FakeAudio audio{};
};

unsigned NoteCall(void*, unsigned kind, unsigned value, uintptr_t info) {
    recorder::Note("call " + std::to_string(kind) + " " + std::to_string(value) + (info ? "" : " null"));
    return 1;
}

TEST_F(VirtualTableTest, ConvertsThroughTheListedSlots) {
    const MCHandle handle = MCCreate(Video(), Audio());
    EncodeParam param;
    EXPECT_EQ(MCGetEncodeParam(handle, &param), 1);
    EXPECT_EQ(param.nSampleRate, 1000);
    EXPECT_EQ(MCSetOutputFile(handle, L"x.mp4"), 1);
    EXPECT_EQ(MCStart(handle, 0.5, 0.0, nullptr, NoteCall, nullptr), 0);
    EXPECT_EQ(MCWait(handle, MC_INFINITE), 0);
    MCDestroy(handle);

    const std::vector<std::string> expected = {"create x.mp4 320x240@10 1000/1 -> #1",
                                               "seek video 0.500000 1",
                                               "seek audio 0.500000",
                                               "sound #1 0 +100",
                                               "picture #1 0",
                                               "sound #1 1000000 +100",
                                               "picture #1 1000000",
                                               "close #1 with callback",
                                               "call 1 0"};
    std::vector<std::string> trace;
    for (const std::string& line : recorder::Trace())
        if (line.rfind("log ", 0) != 0 && line.rfind("call 0", 0) != 0)
            trace.push_back(line);
    EXPECT_EQ(trace, expected);
}

TEST(FourCCTest, StandsInMemoryAsItIsRead) {
    EXPECT_EQ(FourCC("MP4 "), 0x2034504DU);
    EXPECT_EQ(FourCC("\xFF\x80\x01\x7F"), 0x7F0180FFU);
}

TEST(NullTest, NullHandlesDoNothing) {
    EncodeParam param = {};
    wchar_t name[MC_MAX_TARGET_NAME];
    EXPECT_EQ(MCCreate(nullptr, nullptr), nullptr);
    MCDestroy(nullptr);
    EXPECT_EQ(MCSetEncodeParam(nullptr, &param), 0);
    EXPECT_EQ(MCGetEncodeParam(nullptr, &param), 0);
    EXPECT_EQ(MCSetOutputFile(nullptr, L"x"), 0);
    EXPECT_EQ(MCSetSplitParam(nullptr, 1, 1), 0);
    EXPECT_EQ(MCEnablePreview(nullptr, 1), 0U);
    EXPECT_EQ(MCStart(nullptr, 0.0, 0.0, nullptr, NoteCall, nullptr), -1);
    EXPECT_EQ(MCPause(nullptr), 0);
    EXPECT_EQ(MCResume(nullptr), 0);
    EXPECT_EQ(MCStop(nullptr), 0);
    EXPECT_EQ(MCAbort(nullptr), 0);
    EXPECT_EQ(MCWait(nullptr, 0), -1);
    EXPECT_EQ(MCGetTargetCount(nullptr), 0);
    EXPECT_EQ(MCGetTargetFileName(nullptr, name, 0), 0);
    EXPECT_EQ(MCGetEstimateDiskSpace(nullptr), 0);
    EXPECT_EQ(MCSetThreadPriority(nullptr, 7), 0);
}

class ThrowingVideo : public VideoDecoder {
public:
    VideoSourceInfo* GetVideoInfo() override {
        if (throws)
            throw std::runtime_error("no description");
        return &info;
    }
    double Seek(double, int) override { return 0.0; }
    VideoImage* GetCurrentImage() override { return nullptr; }
    int DecodeNext(int) override { return 0; }
    bool throws = true;
    VideoSourceInfo info{};
};

TEST(ExceptionTest, NoneComesOut) {
    ThrowingVideo video;
    EXPECT_EQ(MCCreate(&video, nullptr), nullptr);
    video.throws = false;
    const MCHandle handle = MCCreate(&video, nullptr);
    ASSERT_NE(handle, nullptr);
    video.throws = true;
    EXPECT_EQ(MCSetEncodeParam(handle, nullptr), 0);
    EXPECT_EQ(MCStart(handle, 0.0, 0.0, nullptr, nullptr, nullptr), -1);
    EXPECT_EQ(MCGetEstimateDiskSpace(handle), 0);
    EXPECT_EQ(MCWait(handle, MC_INFINITE), 0);
    MCDestroy(handle);
}

} // namespace
