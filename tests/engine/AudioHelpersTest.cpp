// The helpers for a host that plays the sound itself.
#include "engine/AudioHelpers.h"
#include "tests/engine/IdleParts.h"
#include "tests/recorder/RecordingWriter.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <vector>

namespace {

/// Hands out one block after the other.
class Blocks : public IdleAudio {
public:
    Blocks() : IdleAudio(0) {}
    AudioFrame* GetNextFrame() override { return next < blocks.size() ? &blocks[next++] : nullptr; }

    void Add(int32_t rate, int32_t channels, int32_t bits, int32_t length, int64_t time) {
        blocks.push_back({5, rate, channels, bits, data, length, length + 100, {77}, time + 1, time, 99});
    }

    std::vector<AudioFrame> blocks;
    unsigned char data[100000] = {};

private:
    size_t next = 0;
};

TEST(SmallFrameTest, CutsPiecesOf30MillisecondsFrom50OnUntilItIsReset) {
    Blocks decoder;
    decoder.Add(44100, 2, 16, 14112, 1000); // 80 ms
    decoder.Add(8000, 1, 8, 400, 0);        // 50 ms
    decoder.Add(8000, 1, 8, 399, 900000);
    decoder.Add(8000, 1, 8, 0, 5);
    decoder.Add(8000, 1, 8, 1, -20);
    decoder.Add(8000, 1, 8, 800, 0);
    constexpr struct {
        size_t block;
        int32_t offset, length;
        int64_t time;
        int32_t duration;
    } kPieces[] = {{0, 0, 5292, 1000, 300000},
                   {0, 5292, 5292, 301000, 300000},
                   {0, 10584, 3528, 601000, 200000},
                   {1, 0, 240, 0, 300000},
                   {1, 240, 160, 300000, 200000},
                   {2, 0, 399, 900000, 498750},
                   {3, 0, 0, 5, 0},
                   {4, 0, 1, -20, 1250},
                   {5, 0, 240, 0, 300000}};
    get_small_frame(nullptr);
    for (const auto& [block, offset, length, time, duration] : kPieces) {
        SCOPED_TRACE(testing::Message() << "block " << block << " from " << offset);
        const AudioFrame* frame = get_small_frame(&decoder);
        ASSERT_NE(frame, nullptr);
        AudioFrame expected = decoder.blocks[block];
        expected.pData += offset;
        expected.nLength = expected.nBufferSize = length;
        expected.llTime2 = expected.llTime = time;
        expected.nDuration = duration;
        EXPECT_TRUE(SameBytes(*frame, expected));
    }
    EXPECT_EQ(get_small_frame(nullptr), nullptr); // forgets the rest
    EXPECT_EQ(get_small_frame(&decoder), nullptr);
    EXPECT_EQ(get_small_frame(&decoder), nullptr);
}

TEST(StereoTest, WidensAndDoubles) {
    const struct {
        int bits, channels, count, result;
        std::vector<short> written;
    } cases[] = {
        {8, 1, 3, 6, {0, 0, 16384, 16384, 32640, 32640}},
        {8, 2, 4, 4, {0, 16384, 32640, 128}},
        {8, 3, 2, 0, {0, 0, 16384, 16384}},
        {16, 2, 2, 2, {-32768, 511}},
        {16, 1, 2, 4, {-32768, -32768, 511, 511}},
        {16, 6, 1, 0, {-32768, -32768}},
        {24, 2, 2, 2, {}},
        {24, 1, 1, 2, {-32768, -32768}},
        {16, 0, 2, 0, {}},
        {8, 0, 2, 0, {}},
        {16, 2, 0, 0, {}},
        {16, 1, -1, -2, {}},
    };
    unsigned char bytes8[] = {0, 128, 255, 1};
    unsigned char bytes16[] = {99, 0, 128, 255, 1}; // -32768 and 511 from an odd address on
    for (const auto& test : cases) {
        SCOPED_TRACE(testing::Message() << test.bits << " bits, " << test.channels << " channels");
        std::vector<short> destination(8, 0x5555);
        unsigned char* source = test.bits == 8 ? bytes8 : bytes16 + 1;
        EXPECT_EQ(ConvertTo16BitsStero(destination.data(), test.bits, test.channels, source, test.count),
                  test.result);
        std::vector<short> expected = test.written;
        expected.resize(8, 0x5555);
        EXPECT_EQ(destination, expected);
    }
}

} // namespace
