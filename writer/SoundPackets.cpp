#include "writer/SoundPackets.h"

#include "media/FourCC.h"
#include "writer/PacketTrack.h"
#include "writer/WriterFailure.h"

extern "C" {
#include <libavutil/intreadwrite.h>
}

#include <algorithm>
#include <cmath>
#include <cstdlib>
#include <optional>
#include <string>

namespace writer {
namespace {

/// The packets lie behind each other to the sample.
class SoundPackets final : public PacketTrack {
public:
    SoundPackets(const Track& track, const Container& container, bool isFirst)
        : PacketTrack(track, {1, std::max(track.parameters->sample_rate, 1)}),
          container_(container),
          carriage_(FindCarriage(container, track.parameters->codec_id)) {
        av::CheckMemory(avcodec_parameters_copy(parameters_.get(), track.parameters.get()));
        if (!isFirst)
            parameters_->initial_padding = 0;
        if (parameters_->codec_id == AV_CODEC_ID_OPUS)
            TellRunUp();
        const int* rates = carriage_.sampleRates;
        while (rates != nullptr && *rates != 0 && *rates != parameters_->sample_rate)
            ++rates;
        if (rates != nullptr && *rates == 0)
            throw WriterFailure(kWriterErrorCodec, std::string(container.name) + " cannot carry sound of " +
                                                       std::to_string(parameters_->sample_rate) +
                                                       " Hz of this codec.");
    }

    MuxedStream Stream() const override {
        return {.parameters = parameters_.get(),
                .unit = unit_,
                .runUp = parameters_->initial_padding,
                .carriage = &carriage_,
                .label = &track_.label};
    }

    bool Take(const WriterTrackItem& item, int64_t time) override {
        const av::Packet packet = av::CopyOf(*item.pPacket);
        const int64_t begin = av_rescale_q(time, kItemUnit, unit_);
        const bool follows = end_ && std::abs(begin - *end_) <= kRounding;
        if ((container_.ways & kCountsSamples) != 0)
            RequireNoGap(begin);
        if (container_.code == FourCC("MP3 "))
            KeepFromUnderflow(*packet);
        packet->pts = packet->dts =
            follows ? *end_ : std::max<int64_t>(begin, -int64_t{parameters_->initial_padding});
        packet->duration = av_rescale_q(item.llDuration, kItemUnit, unit_);
        first_ = first_.value_or(packet->pts);
        end_ = packet->pts + packet->duration;
        HandOn(*packet);
        return true;
    }

    double Seconds() const override {
        const int64_t samples = end_ ? *end_ - *first_ - parameters_->initial_padding : 0;
        return static_cast<double>(std::max<int64_t>(0, samples)) * av_q2d(unit_);
    }

private:
    static constexpr int64_t kRounding = 2; // samples

    /// Where only the number of samples tells the time, all behind a gap would be heard too early. Pictures
    /// begin at 0.
    void RequireNoGap(int64_t begin) const {
        constexpr double kAudible = 0.1; // seconds
        const bool hasPictures = container_.video.front() != 0;
        const int64_t before = end_ ? *end_ : hasPictures ? 0 : begin;
        const double gap = static_cast<double>(begin - before) * av_q2d(unit_);
        if (gap > kAudible)
            throw WriterFailure(kWriterErrorCodec, std::string(container_.name) +
                                                       " cannot hold sound as it is that pauses for " +
                                                       std::to_string(std::lround(gap * 1000)) +
                                                       " ms; convert it.");
    }

    /// The multiplexer takes the decoder's delay off the samples to leave out that a packet tells, and
    /// writes a great number into the header where they are fewer.
    static void KeepFromUnderflow(AVPacket& packet) {
        constexpr uint32_t kDecoderDelay = 528 + 1;
        uint8_t* skipped = av_packet_get_side_data(&packet, AV_PKT_DATA_SKIP_SAMPLES, nullptr);
        if (skipped != nullptr)
            AV_WL32(skipped, std::max(AV_RL32(skipped), kDecoderDelay));
    }

    /// Its header tells it as well.
    void TellRunUp() {
        constexpr int kField = 10;
        constexpr int kRate = 48000;
        if (parameters_->extradata_size >= kField + 2)
            AV_WL16(parameters_->extradata + kField,
                    static_cast<uint16_t>(
                        av_rescale(parameters_->initial_padding, kRate, parameters_->sample_rate)));
    }

    const Container& container_;
    const Carriage& carriage_;
    std::optional<int64_t> first_; // where the first packet begins
    std::optional<int64_t> end_;   // of the last one
};

} // namespace

std::unique_ptr<TrackStage> MakeSoundPackets(const Track& track, const Container& container, bool isFirst) {
    return std::make_unique<SoundPackets>(track, container, isFirst);
}

} // namespace writer
