// The multiplexers by themselves: what a program that is killed, or a file beyond 4 GB, leaves on the disk.
#include "writer/Muxer.h"
#include "ffmpeg/AvHandles.h"
#include "media/FourCC.h"
#include "writer/AvioFile.h"
#include "writer/FormatTable.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cstdint>
#include <cstring>
#include <memory>
#include <string>

namespace {

/// Keeps the beginning of what is written to it and counts the rest.
class Beginning final : public writer::ByteFile {
public:
    int64_t Write(const uint8_t* data, int64_t size) override {
        const int64_t room = static_cast<int64_t>(head_.size()) - position_;
        if (room > 0)
            std::memcpy(&head_[static_cast<size_t>(position_)], data,
                        static_cast<size_t>(std::min(room, size)));
        position_ += size;
        size_ = std::max(size_, position_);
        return size;
    }
    int64_t Read(uint8_t* /*data*/, int64_t /*size*/) override { return 0; }
    int64_t Seek(int64_t offset, int whence) override {
        position_ = offset + (whence == SEEK_SET ? 0 : whence == SEEK_CUR ? position_ : size_);
        return position_;
    }
    int64_t Truncate(int64_t /*size*/) override { return 0; }
    int64_t Sync() override { return 0; }

    int64_t Size() const { return size_; }
    const std::string& Head() const { return head_; }
    uint64_t Number(size_t at, int bytes) const {
        uint64_t value = 0;
        for (int i = bytes; i-- > 0;)
            value = value << 8 | static_cast<unsigned char>(head_[at + static_cast<size_t>(i)]);
        return value;
    }

private:
    std::string head_ = std::string(512, '\0');
    int64_t position_ = 0;
    int64_t size_ = 0;
};

/// A stream of sound of 48 kHz, mono, 16 bits or what the codec makes of them.
class SoundFile {
public:
    SoundFile(const char (&format)[5], AVCodecID codec)
        : muxer_(*writer::FindContainer(FourCC(format)), io_, {.fragmented = false, .bitExact = true},
                 extras_) {
        const av::CodecParameters parameters = av::NewParameters();
        parameters->codec_type = AVMEDIA_TYPE_AUDIO;
        parameters->codec_id = codec;
        parameters->format = AV_SAMPLE_FMT_S16;
        parameters->sample_rate = 48000;
        parameters->bits_per_coded_sample = 16;
        parameters->block_align = 2;
        const av::ChannelLayout mono(1);
        av_channel_layout_copy(&parameters->ch_layout, mono.Get());
        static constexpr writer::Carriage kUsual;
        static const writer::TrackLabel kUnnamed;
        muxer_.AddStream(
            {.parameters = parameters.get(), .unit = {1, 48000}, .carriage = &kUsual, .label = &kUnnamed});
        muxer_.WriteHeader(0);
    }

    void Write(int64_t bytes, int64_t samples) {
        const av::Packet packet(av_packet_alloc());
        ASSERT_EQ(av_new_packet(packet.get(), static_cast<int>(bytes)), 0);
        std::memset(packet->data, 0, static_cast<size_t>(bytes));
        packet->pts = packet->dts = samples_;
        packet->duration = samples;
        samples_ += samples;
        muxer_.Write(*packet, 0);
    }

    const Beginning& OnDisk() const { return *file_; }
    void End() {
        muxer_.WriteTrailer();
        EXPECT_EQ(io_.Flush(), 0);
    }

private:
    const writer::Extras extras_;
    std::shared_ptr<Beginning> file_ = std::make_shared<Beginning>();
    writer::AvioFile io_{file_, writer::AvioFile::Mode::kWrite};
    writer::Muxer muxer_;
    int64_t samples_ = 0;
};

TEST(Muxer, AWavFileOfMoreThanFourGigabytesSaysHowLongItIs) {
    constexpr int64_t kPacket = 64 << 20;
    constexpr int kPackets = 65;
    SoundFile wav("WAV ", AV_CODEC_ID_PCM_S16LE);
    for (int i = 0; i < kPackets; ++i)
        wav.Write(kPacket, kPacket / 2);
    wav.End();
    const Beginning& file = wav.OnDisk();
    ASSERT_GT(file.Size(), int64_t{4} << 30);
    EXPECT_EQ(file.Head().substr(0, 4), "RF64");
    ASSERT_EQ(file.Head().substr(12, 4), "ds64");
    EXPECT_EQ(file.Number(20, 8), static_cast<uint64_t>(file.Size()) - 8);
    EXPECT_EQ(file.Number(28, 8), static_cast<uint64_t>(kPacket) * kPackets);
    EXPECT_EQ(file.Number(36, 8), static_cast<uint64_t>(kPacket) * kPackets / 2);
}

TEST(Muxer, LeavesNoMoreThanASecondInMemory) {
    constexpr struct {
        const char (&format)[5];
        AVCodecID codec;
    } kFiles[] = {{"WAV ", AV_CODEC_ID_PCM_S16LE},
                  {"MKV ", AV_CODEC_ID_PCM_S16LE},
                  {"TS  ", AV_CODEC_ID_MP3},
                  {"FLV ", AV_CODEC_ID_MP3}};
    for (const auto& [format, codec] : kFiles) {
        SCOPED_TRACE(format);
        SoundFile file(format, codec);
        int64_t before = file.OnDisk().Size();
        constexpr int64_t kBytesPerSecond = 50 * 40;
        for (int second = 0; second < 10; ++second) { // too little to fill a buffer
            for (int i = 0; i < 50; ++i)
                file.Write(40, 960);
            if (second < 2)
                before = file.OnDisk().Size();
        }
        EXPECT_GE(file.OnDisk().Size() - before, 7 * kBytesPerSecond);
    }
}

} // namespace
