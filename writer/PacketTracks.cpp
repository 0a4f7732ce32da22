#include "writer/PacketTracks.h"

#include "media/FourCC.h"
#include "media/MediaRecords.h"
#include "platform/LogRoute.h"
#include "writer/CueRow.h"
#include "writer/FileRecord.h"
#include "writer/TextRows.h"
#include "writer/WriterFailure.h"

extern "C" {
#include <libavutil/intreadwrite.h>
}

#include <algorithm>
#include <array>
#include <cerrno>
#include <cmath>
#include <cstdlib>
#include <cstring>
#include <limits>
#include <optional>
#include <string>
#include <utility>

namespace writer {
namespace {

/// Of the times of cues. MP4's multiplexer compares them with those of other tracks without regard to units:
/// no other may be finer.
constexpr AVRational kCueUnit{1, 192000};
constexpr AVRational kTick{1, kTicksPerSecond};
constexpr int64_t kFarthest = 1000 * 3600 * kTicksPerSecond; // of a text's begin, in a movie that is none
constexpr int64_t kLongest = 3600 * kTicksPerSecond;         // of a packet in MP4, whose lengths have 31 bits
constexpr int kMostOfText = 65535; // bytes: MP4 has no more, and who reads more takes for ever
constexpr int64_t kUnknownLength = 5 * kTicksPerSecond; // of a text that does not say how long it is shown

const Carriage kAsUsual{};

/// What both kinds have in common: they do their work on the stage's thread.
class PacketTrack : public BesideTrack {
public:
    PacketTrack(const Track& track, AVRational unit)
        : track_(track), unit_(unit), parameters_(av::NewParameters()) {}

    MuxedStream Stream() const override {
        return {
            .parameters = parameters_.get(), .unit = unit_, .carriage = &kAsUsual, .label = &track_.label};
    }
    void Start(PacketTaker take, StageFailure /*failed*/) override { take_ = std::move(take); }
    void Finish() override {}
    void Cancel() override {}
    void Join() override {}

protected:
    /// `packet` at its time in the file, in 100 ns units.
    void HandOn(AVPacket& packet, int64_t begin, int64_t duration) {
        if (begin > kFarthest) {
            Drop("written", AVERROR(ERANGE));
            return;
        }
        const int64_t end = begin + std::min(duration, kFarthest);
        // The multiplexer ends a text only when other streams come in between, which they do not at the
        // close.
        const bool fillsTime = parameters_->codec_id == AV_CODEC_ID_MOV_TEXT;
        if (fillsTime && end_ && *end_ < begin)
            HandOnEmpty(*end_, begin);
        end_ = end;
        for (; fillsTime && end - begin > kLongest; begin += kLongest) {
            const av::Packet part = av::CopyOf(packet);
            Send(*part, begin, kLongest);
        }
        Send(packet, begin, end - begin);
    }
    void HandOn(AVPacket& packet) { take_(packet); }

    void Drop(const char* what, int error) {
        ++*track_.lostCues;
        WriteLog(kLogWarning, "A subtitle could not be %s: %s.", what, av::ErrorText(error).c_str());
    }

    const Track& track_;
    const AVRational unit_;
    av::CodecParameters parameters_;

private:
    void HandOnEmpty(int64_t begin, int64_t end) {
        constexpr int kNoLetters = 2; // the length of a text
        for (; begin < end; begin += kLongest) {
            const av::Packet packet = av::NewPacket();
            av::CheckMemory(av_new_packet(packet.get(), kNoLetters));
            std::fill_n(packet->data, kNoLetters, uint8_t{0});
            Send(*packet, begin, std::min(end - begin, kLongest));
        }
    }

    void Send(AVPacket& packet, int64_t begin, int64_t duration) {
        packet.pts = packet.dts = av_rescale_q(begin, kTick, unit_);
        packet.duration = av_rescale_q(begin + duration, kTick, unit_) - packet.pts;
        packet.flags |= AV_PKT_FLAG_KEY;
        HandOn(packet);
    }

    PacketTaker take_;
    std::optional<int64_t> end_; // of the packet before
};

/// Subtitles as they are.
class CopiedPackets final : public PacketTrack {
public:
    explicit CopiedPackets(const Track& track) : PacketTrack(track, kCueUnit) {
        av::CheckMemory(avcodec_parameters_copy(parameters_.get(), track.parameters.get()));
    }

    bool Take(const WriterTrackItem& item, int64_t time) override {
        const bool ends = item.llDuration > 0;
        const bool isBefore = ends && time + item.llDuration <= 0;
        if (isBefore || IsEmptyText(*item.pPacket, parameters_->codec_id))
            return true;
        const av::Packet packet = av::CopyOf(*item.pPacket);
        const int64_t begin = std::max<int64_t>(time, 0);
        HandOn(*packet, begin, ends ? time + item.llDuration - begin : 0);
        return true;
    }
};

/// Sound as it is, behind each other to the sample.
class CopiedSound final : public PacketTrack {
public:
    CopiedSound(const Track& track, const Container& container, bool isFirst)
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
        const int64_t begin = av_rescale_q(time, kTick, unit_);
        const bool follows = end_ && std::abs(begin - *end_) <= kRounding;
        if ((container_.ways & kCountsSamples) != 0)
            RequireNoGap(begin);
        if (container_.code == FourCC("MP3 "))
            KeepFromUnderflow(*packet);
        packet->pts = packet->dts =
            follows ? *end_ : std::max<int64_t>(begin, -int64_t{parameters_->initial_padding});
        packet->duration = av_rescale_q(item.llDuration, kTick, unit_);
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

struct SubtitleFree {
    void operator()(AVSubtitle* subtitle) const { avsubtitle_free(subtitle); }
};

av::CodecContext OpenCues(const AVCodec* codec, const AVCodecParameters* parameters,
                          const AVCodecContext* header) {
    av::CodecContext context = av::NewCodecContext(codec);
    if (parameters != nullptr)
        av::CheckMemory(avcodec_parameters_to_context(context.get(), parameters));
    context->time_base = {1, 1000};
    context->pkt_timebase = {1, 1000};
    if (header != nullptr && header->subtitle_header != nullptr) {
        context->subtitle_header = static_cast<uint8_t*>(
            av_memdup(header->subtitle_header, static_cast<size_t>(header->subtitle_header_size) + 1));
        if (context->subtitle_header == nullptr)
            throw std::bad_alloc();
        context->subtitle_header_size = header->subtitle_header_size;
    }
    const int result =
        codec == nullptr ? AVERROR_ENCODER_NOT_FOUND : avcodec_open2(context.get(), codec, nullptr);
    av::CheckMemory(result);
    if (result < 0)
        throw WriterFailure(kWriterErrorCodec,
                            "The subtitles cannot be converted: " + av::ErrorText(result) + ".");
    return context;
}

/// Subtitles of text in another form than they have.
class ConvertedText final : public PacketTrack {
public:
    ConvertedText(const Track& track, AVCodecID target)
        : PacketTrack(track, kCueUnit),
          decoder_(
              OpenCues(avcodec_find_decoder(track.parameters->codec_id), track.parameters.get(), nullptr)),
          encoder_(OpenCues(avcodec_find_encoder(target), nullptr, decoder_.get())),
          oneAtATime_(target == AV_CODEC_ID_MOV_TEXT),
          packet_(av::NewPacket()),
          row_([this](int64_t begin, int64_t end, const std::vector<std::string>& texts) {
              Encode(begin, end, texts);
          }) {
        av::CheckMemory(avcodec_parameters_from_context(parameters_.get(), encoder_.get()));
    }

    bool Take(const WriterTrackItem& item, int64_t time) override {
        const int64_t end = time + (item.llDuration > 0 ? item.llDuration : kUnknownLength);
        const int64_t begin = std::max<int64_t>(time, 0);
        if (end <= begin)
            return true;
        for (std::string& text : Decode(*item.pPacket)) {
            if (oneAtATime_)
                row_.Add(begin, end, std::move(text));
            else
                Encode(begin, end, {text});
        }
        return true;
    }

    void Reach(int64_t time) override { row_.Reach(time); }
    void Finish() override { row_.Finish(); }

private:
    std::vector<std::string> Decode(const AVPacket& source) {
        const av::Packet packet = av::CopyOf(source);
        packet->pts = packet->dts = 0;
        packet->duration = 1;
        if (packet->size > kMostOfText) {
            Drop("read", AVERROR(EMSGSIZE));
            return {};
        }
        AVSubtitle decoded{};
        int got = 0;
        const int result = avcodec_decode_subtitle2(decoder_.get(), &decoded, &got, packet.get());
        const std::unique_ptr<AVSubtitle, SubtitleFree> owner(&decoded);
        av::CheckMemory(result);
        std::vector<std::string> texts;
        for (unsigned i = 0; result >= 0 && got != 0 && i < decoded.num_rects; ++i)
            if (decoded.rects[i]->ass != nullptr)
                texts.emplace_back(decoded.rects[i]->ass);
        if (result < 0)
            Drop("read", result);
        return texts;
    }

    /// Several texts come below each other in the place and style of the first.
    void Encode(int64_t begin, int64_t end, const std::vector<std::string>& texts) {
        std::string line = texts.front();
        for (size_t i = 1; i < texts.size(); ++i)
            line += "\\N" + WordsOf(texts[i]);
        if (WordsOf(line).empty())
            return;
        if (encoder_->codec_id == AV_CODEC_ID_WEBVTT)
            line = Escaped(line);
        AVSubtitleRect rect{};
        rect.type = SUBTITLE_ASS;
        rect.ass = line.data();
        AVSubtitleRect* rects = &rect;
        AVSubtitle subtitle{};
        subtitle.num_rects = 1;
        subtitle.rects = &rects;
        subtitle.end_display_time = static_cast<uint32_t>((end - begin) / (kTicksPerSecond / 1000));
        std::vector<uint8_t> coded(kLeastRoom + line.size() * 4);
        const int size =
            avcodec_encode_subtitle(encoder_.get(), coded.data(), static_cast<int>(coded.size()), &subtitle);
        av::CheckMemory(size);
        if (size <= 0) {
            Drop("written", size);
            return;
        }
        av::CheckMemory(av_new_packet(packet_.get(), size));
        std::copy_n(coded.begin(), size, packet_->data);
        HandOn(*packet_, begin, end - begin);
        av_packet_unref(packet_.get());
    }

    /// An event whose words mean themselves to readers of WebVTT, which FFmpeg's encoder does not see to.
    static std::string Escaped(const std::string& event) {
        std::string escaped = event.substr(0, event.size() - WordsOf(event).size());
        for (size_t at = escaped.size(); at < event.size(); ++at) {
            if (event.compare(at, 2, "{\\") == 0) { // an order, which is no text
                const size_t end = std::min(event.find('}', at), event.size() - 1);
                escaped.append(event, at, end - at + 1);
                at = end;
                continue;
            }
            const char letter = event[at];
            escaped += letter == '&'   ? "&amp;"
                       : letter == '<' ? "&lt;"
                       : letter == '>' ? "&gt;"
                                       : std::string(1, letter);
        }
        return escaped;
    }

    /// What is behind the commas that part the fields of an event.
    static std::string WordsOf(const std::string& event) {
        constexpr int kFieldsBefore = 8;
        size_t at = 0;
        for (int i = 0; i < kFieldsBefore && at != std::string::npos; ++i)
            at = event.find(',', at == 0 && i == 0 ? 0 : at + 1);
        return at == std::string::npos ? std::string() : event.substr(at + 1);
    }

    static constexpr size_t kLeastRoom = 65536;

    av::CodecContext decoder_;
    av::CodecContext encoder_;
    const bool oneAtATime_;
    av::Packet packet_;
    CueRow row_;
};

} // namespace

std::unique_ptr<BesideTrack> MakePacketTrack(const Track& track, const Container& container, bool isFirst) {
    if (IsSound(track))
        return std::make_unique<CopiedSound>(track, container, isFirst);
    const AVCodecID target = PacketForm(container, track.parameters->codec_id);
    if (target == track.parameters->codec_id)
        return std::make_unique<CopiedPackets>(track);
    return std::make_unique<ConvertedText>(track, target);
}

} // namespace writer
