#include "writer/CueTracks.h"

#include "platform/LogRoute.h"
#include "writer/CueRow.h"
#include "writer/FileRecord.h"
#include "writer/PacketTrack.h"
#include "writer/TextRows.h"
#include "writer/WriterFailure.h"

#include <algorithm>
#include <cerrno>
#include <new>
#include <optional>
#include <string>
#include <utility>
#include <vector>

namespace writer {
namespace {

/// Of the times of cues. MP4's multiplexer compares them with those of other tracks without regard to units:
/// no other may be finer.
constexpr AVRational kCueUnit{1, 192000};
constexpr int64_t kFarthest = 1000 * 3600 * kTicksPerSecond; // of a text's begin, in a movie that is none
constexpr int64_t kLongest = 3600 * kTicksPerSecond;         // of a packet in MP4, whose lengths have 31 bits
constexpr int kMostOfText = 65535; // bytes: MP4 has no more, and who reads more takes for ever
constexpr int64_t kUnknownLength = 5 * kTicksPerSecond; // of a text that does not say how long it is shown

const Carriage kAsUsual{};

/// What both kinds have in common.
class CueTrack : public PacketTrack {
public:
    explicit CueTrack(const Track& track) : PacketTrack(track, kCueUnit) {}

    MuxedStream Stream() const override {
        return {
            .parameters = parameters_.get(), .unit = unit_, .carriage = &kAsUsual, .label = &track_.label};
    }

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

    void Drop(const char* what, int error) {
        ++*track_.lostCues;
        WriteLog(kLogWarning, "A subtitle could not be %s: %s.", what, av::ErrorText(error).c_str());
    }

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
        packet.pts = packet.dts = av_rescale_q(begin, kItemUnit, unit_);
        packet.duration = av_rescale_q(begin + duration, kItemUnit, unit_) - packet.pts;
        packet.flags |= AV_PKT_FLAG_KEY;
        PacketTrack::HandOn(packet);
    }

    std::optional<int64_t> end_; // of the packet before
};

/// As they are.
class CopiedCues final : public CueTrack {
public:
    explicit CopiedCues(const Track& track) : CueTrack(track) {
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

/// Of text, in another form than they have.
class ConvertedCues final : public CueTrack {
public:
    ConvertedCues(const Track& track, AVCodecID target)
        : CueTrack(track),
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

std::unique_ptr<TrackStage> MakeCueTrack(const Track& track, const Container& container) {
    const AVCodecID target = PacketForm(container, track.parameters->codec_id);
    if (target == track.parameters->codec_id)
        return std::make_unique<CopiedCues>(track);
    return std::make_unique<ConvertedCues>(track, target);
}

} // namespace writer
