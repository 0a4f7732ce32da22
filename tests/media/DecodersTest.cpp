// The virtual tables are part of the interface: a host may have been built by another compiler, or have made
// its tables by hand. So both sides are tested by slot number, never through the classes' own names for the
// slots.
#include "media/Decoders.h"
#include "media/EncodeParam.h"
#include "media/FourCC.h"

#include <gtest/gtest.h>

#include <cstddef>
#include <cstdint>
#include <iterator>
#include <string>
#include <vector>

extern "C" const std::size_t kRecordSizesInC[];

namespace {

std::vector<std::string> g_calls;
VideoSourceInfo g_videoInfo;
AudioSourceInfo g_audioInfo;
VideoImage g_image;
AudioFrame g_frame;

std::string Show(double value) {
    return std::to_string(value);
}

/// What a table made by hand belongs to: an object whose first word points to the table.
struct HandMade {
    const void* const* table;
};

void Unexpected(HandMade* /*self*/) {
    ADD_FAILURE() << "a slot that is not used was called";
}

template <class Function>
const void* Slot(Function* function) {
    return reinterpret_cast<const void*>(function);
}

const void* const kVideoTable[] = {
    Slot(Unexpected),
    Slot(Unexpected),
    Slot(Unexpected),
    Slot(Unexpected),
    Slot(Unexpected),
    Slot(+[](HandMade*) { return g_calls.emplace_back("info"), &g_videoInfo; }),
    Slot(+[](HandMade*, double seconds, int mode) -> double {
        g_calls.push_back("seek " + Show(seconds) + " " + std::to_string(mode));
        return seconds + 1;
    }),
    Slot(Unexpected),
    Slot(+[](HandMade*) { return g_calls.emplace_back("image"), &g_image; }),
    Slot(+[](HandMade*, int mode) { return g_calls.push_back("next " + std::to_string(mode)), mode + 41; }),
};

const void* const kAudioTable[] = {
    Slot(Unexpected),
    Slot(Unexpected),
    Slot(Unexpected),
    Slot(Unexpected),
    Slot(+[](HandMade*, double seconds) -> double {
        g_calls.push_back("seek " + Show(seconds));
        return seconds + 1;
    }),
    Slot(+[](HandMade*) { return g_calls.emplace_back("frame"), &g_frame; }),
    Slot(Unexpected),
    Slot(+[](HandMade*) { return g_calls.emplace_back("info"), &g_audioInfo; }),
};

// The check of an object's type would look for one beside the table.
[[gnu::noinline, gnu::no_sanitize("undefined")]] void CallEachVideoSlot(void* object) {
    auto& decoder = *static_cast<VideoDecoder*>(object);
    EXPECT_EQ(decoder.GetVideoInfo(), &g_videoInfo);
    EXPECT_EQ(decoder.Seek(2.5, 1), 3.5);
    EXPECT_EQ(decoder.GetCurrentImage(), &g_image);
    EXPECT_EQ(decoder.DecodeNext(1), 42);
}

[[gnu::noinline, gnu::no_sanitize("undefined")]] void CallEachAudioSlot(void* object) {
    auto& decoder = *static_cast<AudioDecoder*>(object);
    EXPECT_EQ(decoder.Seek(2.5), 3.5);
    EXPECT_EQ(decoder.GetNextFrame(), &g_frame);
    EXPECT_EQ(decoder.GetAudioInfo(), &g_audioInfo);
}

TEST(Decoders, AreCalledThroughTheirSlots) {
    g_calls.clear();
    HandMade video{kVideoTable};
    HandMade audio{kAudioTable};
    CallEachVideoSlot(&video);
    CallEachAudioSlot(&audio);
    EXPECT_EQ(g_calls, (std::vector<std::string>{"info", "seek 2.500000 1", "image", "next 1",
                                                 "seek 2.500000", "frame", "info"}));
}

class HostVideo : public VideoDecoder {
public:
    VideoSourceInfo* GetVideoInfo() override { return &g_videoInfo; }
    double Seek(double seconds, int mode) override { return seconds * mode; }
    VideoImage* GetCurrentImage() override { return &g_image; }
    int DecodeNext(int mode) override { return mode + 6; }
};

class HostAudio : public AudioDecoder {
public:
    double Seek(double seconds) override { return seconds * 2; }
    AudioFrame* GetNextFrame() override { return &g_frame; }
    AudioSourceInfo* GetAudioInfo() override { return &g_audioInfo; }
};

/// Calls the function in the object's slot `slot`.
template <class Result, class... Arguments>
[[gnu::no_sanitize("undefined")]] Result CallSlot(void* object, std::size_t slot, Arguments... arguments) {
    const void* const* table = static_cast<HandMade*>(object)->table;
    const auto function = reinterpret_cast<Result (*)(void*, Arguments...)>(const_cast<void*>(table[slot]));
    return function(object, arguments...);
}

TEST(Decoders, OfAHostHaveTheirSlots) {
    HostVideo video;
    EXPECT_EQ(CallSlot<VideoSourceInfo*>(&video, 5), &g_videoInfo);
    EXPECT_EQ((CallSlot<double, double, int>(&video, 6, 1.25, 3)), 3.75);
    EXPECT_EQ(CallSlot<VideoImage*>(&video, 8), &g_image);
    EXPECT_EQ((CallSlot<int, int>(&video, 9, 1)), 7);
    for (const std::size_t reserved : {0, 1, 2, 3, 4, 7})
        CallSlot<void>(&video, reserved);

    HostAudio audio;
    EXPECT_EQ((CallSlot<double, double>(&audio, 4, 1.25)), 2.5);
    EXPECT_EQ(CallSlot<AudioFrame*>(&audio, 5), &g_frame);
    EXPECT_EQ(CallSlot<AudioSourceInfo*>(&audio, 7), &g_audioInfo);
    for (const std::size_t reserved : {0, 1, 2, 3, 6})
        CallSlot<void>(&audio, reserved);
}

TEST(MediaRecords, HaveTheSameSizeInCAndCxx) {
    const std::size_t sizes[] = {sizeof(VideoFormat),     sizeof(AudioFormat),   sizeof(VideoSourceInfo),
                                 sizeof(AudioSourceInfo), sizeof(VideoImage),    sizeof(AudioFrame),
                                 sizeof(EncodeParam),     sizeof(FileFormatInfo)};
    for (std::size_t i = 0; i < std::size(sizes); ++i)
        EXPECT_EQ(kRecordSizesInC[i], sizes[i]) << i;
}

TEST(FourCC, StandsInMemoryAsItIsRead) {
    EXPECT_EQ(FourCC("MP4 "), 0x2034504DU);
    EXPECT_EQ(FourCC("XVID"), FourCC('X', 'V', 'I', 'D'));
    EXPECT_EQ(FourCC("\xFF\x80\x01\x7F"), 0x7F0180FFU);
}

} // namespace
