// The places of the decoders' operations in their virtual tables, and the exported functions where there is
// nothing to work on or a decoder throws.
#include "api/MovieConv.h"
#include "media/FourCC.h"
#include "tests/engine/IdleParts.h"

#include <gtest/gtest.h>

#include <cstddef>
#include <cstring>
#include <stdexcept>

namespace {

/// A virtual function's place in the table: a pointer to it begins with its offset in bytes, on some
/// processors plus 1.
template <class Function>
size_t Slot(Function function) {
    size_t offset = 0;
    std::memcpy(&offset, &function, sizeof offset);
    return offset / sizeof(void*);
}

TEST(VirtualTableTest, OperationsKeepTheirPlaces) {
    static_assert(sizeof(VideoDecoder) == sizeof(void*) && sizeof(AudioDecoder) == sizeof(void*));
    EXPECT_EQ(Slot(&VideoDecoder::GetVideoInfo), 5U);
    EXPECT_EQ(Slot(&VideoDecoder::Seek), 6U);
    EXPECT_EQ(Slot(&VideoDecoder::GetCurrentImage), 8U);
    EXPECT_EQ(Slot(&VideoDecoder::DecodeNext), 9U);
    EXPECT_EQ(Slot(&AudioDecoder::Seek), 4U);
    EXPECT_EQ(Slot(&AudioDecoder::GetNextFrame), 5U);
    EXPECT_EQ(Slot(&AudioDecoder::GetAudioInfo), 7U);
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
    EXPECT_EQ(MCStart(nullptr, 0.0, 0.0, nullptr, nullptr, nullptr), -1);
    EXPECT_EQ(MCPause(nullptr), 0);
    EXPECT_EQ(MCResume(nullptr), 0);
    EXPECT_EQ(MCStop(nullptr), 0);
    EXPECT_EQ(MCAbort(nullptr), 0);
    EXPECT_EQ(MCWait(nullptr, 0), -1);
    EXPECT_EQ(MCGetTargetCount(nullptr), 0);
    EXPECT_EQ(MCGetTargetFileName(nullptr, name, 0), 0);
    EXPECT_EQ(MCGetEstimateDiskSpace(nullptr), 0);
    EXPECT_EQ(MCGetEstimateDiskSpaceEx(nullptr, 10.0), 0);
    EXPECT_EQ(MCGetDiskFreeSpace(nullptr), 0);
    EXPECT_EQ(MCSetThreadPriority(nullptr, 7), 0);
}

class ThrowingVideo : public IdleVideo {
public:
    ThrowingVideo() : IdleVideo(1) {}
    VideoSourceInfo* GetVideoInfo() override {
        return throws ? throw std::runtime_error("no description") : IdleVideo::GetVideoInfo();
    }
    bool throws = true;
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
