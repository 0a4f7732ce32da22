#include "host/source/CopiedSound.h"

#include "host/sentence/Say.h"
#include "host/source/CodedSound.h"
#include "host/source/SoundBlock.h"
#include "host/source/SourceError.h"

extern "C" {
#include <libavcodec/bsf.h>
#include <libavcodec/vorbis_parser.h>
#include <libavutil/intreadwrite.h>
}

#include <algorithm>
#include <cstring>
#include <new>
#include <utility>

namespace movieconv {

/// Takes the headers off AAC from broadcasts, which carry in each packet what others tell once.
class CopiedSound::Deframer {
public:
    /// Throws SourceError when `first` cannot be understood. `parameters` get what its header tells.
    Deframer(AVCodecParameters& parameters, AVRational timeBase, const AVPacket& first) {
        AVBSFContext* context = nullptr;
        const AVBitStreamFilter* filter = av_bsf_get_by_name("aac_adtstoasc");
        int result = filter == nullptr ? AVERROR_BSF_NOT_FOUND : av_bsf_alloc(filter, &context);
        context_.reset(context);
        form_ = AdtsForm(first);
        if (result >= 0)
            result = avcodec_parameters_copy(context_->par_in, &parameters);
        if (result >= 0) {
            context_->time_base_in = timeBase;
            result = av_bsf_init(context_.get());
        }
        av::CheckMemory(result);
        const av::Packet packet = av::CopyOf(first);
        size_t size = 0;
        const uint8_t* told = nullptr;
        if (result >= 0 && Filter(*packet))
            told = av_packet_get_side_data(packet.get(), AV_PKT_DATA_NEW_EXTRADATA, &size);
        if (told == nullptr)
            throw SourceError(Say("its sound has no form that could be copied; convert it instead"));
        parameters.extradata = static_cast<uint8_t*>(av_mallocz(size + AV_INPUT_BUFFER_PADDING_SIZE));
        if (parameters.extradata == nullptr)
            throw std::bad_alloc();
        std::memcpy(parameters.extradata, told, size);
        parameters.extradata_size = static_cast<int>(size);
    }

    bool HasOtherForm(const AVPacket& packet) const { return AdtsForm(packet) != form_; }

    /// False when the packet is damaged; its content is gone then.
    bool Filter(AVPacket& packet) {
        int result = av_bsf_send_packet(context_.get(), &packet);
        if (result >= 0)
            result = av_bsf_receive_packet(context_.get(), &packet);
        av::CheckMemory(result);
        return result >= 0;
    }

private:
    struct Free {
        void operator()(AVBSFContext* context) const { av_bsf_free(&context); }
    };
    std::unique_ptr<AVBSFContext, Free> context_;
    int form_ = 0;
};

void CopiedSound::VorbisParserFree::operator()(AVVorbisParseContext* parser) const {
    av_vorbis_parse_free(&parser);
}

CopiedSound::CopiedSound(const PacketReader& reader, const AVStream& stream, Demuxer& demuxer,
                         const BesideBounds& bounds, Failures& failures)
    : BesideTrack(bounds, failures),
      reader_(reader),
      demuxer_(demuxer),
      stream_(stream.index),
      timeBase_(stream.time_base),
      parameters_(av::CopyOf(*stream.codecpar)),
      sampleBytes_(SampleBytes(*stream.codecpar)) {}

CopiedSound::~CopiedSound() = default;

const AVCodecParameters& CopiedSound::Describe() {
    const av::Packet first = demuxer_.FirstBeside(stream_);
    const bool isPart = bounds_.begin > 0 || bounds_.ends || bounds_.isCut;
    if (isPart)
        ForgetWhole(*parameters_);
    if (first && parameters_->codec_id == AV_CODEC_ID_AAC && parameters_->extradata_size == 0 &&
        HasAdtsHeader(*first))
        deframer_ = std::make_unique<Deframer>(*parameters_, timeBase_, *first);
    if (first && parameters_->codec_id == AV_CODEC_ID_EAC3)
        if (const int samples = Eac3Samples(*first); samples > 0)
            parameters_->frame_size = samples;
    if (parameters_->codec_id == AV_CODEC_ID_VORBIS)
        vorbis_.reset(av_vorbis_parse_init(parameters_->extradata, parameters_->extradata_size));
    parameters_->initial_padding = first && bounds_.begin == 0 ? static_cast<int>(RunUp(*first)) : 0;
    return *parameters_;
}

/// The samples of the first packets that a decoder leaves out: what the codec needs, not what an edit list
/// cuts off, of which a packet before the cut is enough.
int64_t CopiedSound::RunUp(const AVPacket& first) const {
    constexpr int64_t kMostFrames = 4;
    const int64_t frame = parameters_->frame_size;
    const int64_t most = frame > 0 ? kMostFrames * frame : int64_t{parameters_->sample_rate} / 10;
    size_t size = 0;
    const uint8_t* skipped = av_packet_get_side_data(&first, AV_PKT_DATA_SKIP_SAMPLES, &size);
    int64_t samples = skipped != nullptr && size >= 4 ? int64_t{AV_RL32(skipped)} : 0;
    const int64_t early =
        first.pts != AV_NOPTS_VALUE ? -SamplesAt(reader_.MediaTime(first.pts, timeBase_)) : 0;
    if (samples == 0)
        samples = parameters_->initial_padding > 0 ? parameters_->initial_padding : early;
    if (samples > most)
        return frame > 0 ? samples % frame + frame : 0;
    return std::max<int64_t>(samples, 0);
}

bool CopiedSound::Find(int64_t until, bool closing, Item& item) {
    const auto isBehind = [&](const Held& held) { return TimeOf(held.begin) >= until; };
    while (pending_.empty() || !isBehind(pending_.back())) {
        Demuxer::Beside taken = demuxer_.TakeBeside(stream_, until, closing);
        if (taken.packet)
            Hold(std::move(taken.packet));
        else if (taken.ended && doubted_)
            SettleDoubted(std::nullopt);
        else
            break;
    }
    if (pending_.empty() || isBehind(pending_.front()) || !Cut(pending_.front(), until, closing)) {
        item.time = pending_.empty() ? until : std::min(until, TimeOf(pending_.front().begin));
        return false;
    }
    const int64_t begin = TimeOf(current_.begin);
    item = {nullptr, current_.packet.get(), begin, TimeOf(current_.begin + current_.samples) - begin};
    return true;
}

/// Makes the first of the pending packets the current one, or what of it lies before the file's end. False
/// when that is not known yet.
bool CopiedSound::Cut(Held& first, int64_t until, bool closing) {
    const bool mayBeCut = sampleBytes_ > 0 && until != BesideBounds::kOpen && (bounds_.isCut || bounds_.ends);
    const int64_t most = mayBeCut ? SamplesAt(until) - first.begin : first.samples;
    if (most >= first.samples) {
        current_ = std::move(first);
        pending_.pop_front();
        return true;
    }
    if (!closing || most <= 0)
        return false;
    current_ = {av::CopyOf(*first.packet), first.begin, most};
    const auto bytes = static_cast<int>(most * sampleBytes_);
    current_.packet->size = bytes;
    first.packet->data += bytes;
    first.packet->size -= bytes;
    first.begin += most;
    first.samples -= most;
    return true;
}

void CopiedSound::Hold(av::Packet packet) {
    if (packet->size <= 0 || (!timeline_ && IsTail(*packet, parameters_->codec_id)))
        return;
    const bool hasHeader = deframer_ && HasAdtsHeader(*packet);
    if ((hasHeader ? deframer_->HasOtherForm(*packet) : DescribesAnew(*packet, *parameters_)) ||
        HasOtherRate(*packet))
        throw SourceError(
            Say("its sound changes its form there and cannot be copied on; convert it instead"));
    if (hasHeader && !deframer_->Filter(*packet))
        return;
    av_packet_shrink_side_data(packet.get(), AV_PKT_DATA_NEW_EXTRADATA, 0); // it has been told
    Held held{std::move(packet), 0, 0};
    held.samples = Samples(*held.packet);
    const std::optional<int64_t> stamp = StampOf(held);
    SettleDoubted(stamp);
    if (timeline_ && held.samples > 0 && timeline_->NeedsWitness(stamp))
        doubted_ = std::move(held);
    else
        Settle(std::move(held), std::nullopt);
}

/// Than the packets before. What else may change in frames that tell their form themselves, such as the
/// number of channels, a copy keeps.
bool CopiedSound::HasOtherRate(const AVPacket& packet) {
    const std::optional<int> told = RateTold(packet, parameters_->codec_id);
    rate_ = rate_ ? rate_ : told;
    return told && told != rate_;
}

void CopiedSound::SettleDoubted(std::optional<int64_t> witness) {
    if (std::optional<Held> doubted = std::exchange(doubted_, std::nullopt))
        Settle(std::move(*doubted), witness);
}

/// Puts it behind the pending ones, as far as it belongs into the output.
void CopiedSound::Settle(Held held, std::optional<int64_t> witness) {
    if (!Place(held, witness))
        return;
    // What is not to be heard is wanted as the run-up only.
    const bool isHeard = (held.packet->flags & AV_PKT_FLAG_DISCARD) == 0;
    if (!isHeard && (held.begin < -int64_t{parameters_->initial_padding} || held.begin >= 0))
        return;
    held.packet->flags &= ~AV_PKT_FLAG_DISCARD;
    const int64_t begin = SamplesAt(bounds_.begin);
    if (bounds_.begin > 0 && held.begin < begin) {
        const int64_t early = begin - held.begin;
        if (sampleBytes_ == 0 || early >= held.samples)
            return;
        held.packet->data += early * sampleBytes_;
        held.packet->size -= static_cast<int>(early * sampleBytes_);
        held.begin = begin;
        held.samples -= early;
    }
    pending_.push_back(std::move(held));
}

/// On the timeline, once that has begun.
std::optional<int64_t> CopiedSound::StampOf(const Held& held) const {
    if (held.packet->pts == AV_NOPTS_VALUE)
        return std::nullopt;
    return reader_.MediaTime(held.packet->pts, timeBase_) - (timeline_ ? TimeOf(origin_) : 0);
}

/// False when the source has gone back to what it had given before.
bool CopiedSound::Place(Held& held, std::optional<int64_t> witness) {
    const std::optional<int64_t> stamp = StampOf(held);
    if (!timeline_) {
        origin_ = SamplesAt(stamp.value_or(0));
        const int64_t unit = av_rescale_q_rnd(1, timeBase_, {1, parameters_->sample_rate}, AV_ROUND_UP);
        if (std::abs(origin_ + parameters_->initial_padding) <= unit) // the container has rounded it
            origin_ = -parameters_->initial_padding;
        timeline_.emplace(parameters_->sample_rate, 0);
        timeline_->Place(std::nullopt, held.samples);
        held.begin = origin_;
        return true;
    }
    const int64_t before = timeline_->Position();
    if (held.samples == 0) { // of unknown length: the stamp alone tells
        held.begin = std::max(origin_ + before, stamp ? SamplesAt(*stamp + TimeOf(origin_)) : 0);
        timeline_->FillTo(TimeOf(held.begin - origin_));
        return true;
    }
    const SoundTimeline::Placement placement = timeline_->Place(stamp, held.samples, witness);
    held.begin = origin_ + before + placement.silence;
    return placement.cut < held.samples;
}

/// How many a packet holds of all channels; 0 when that is not known exactly.
int64_t CopiedSound::Samples(const AVPacket& packet) {
    const AVRational unit{1, parameters_->sample_rate};
    if (sampleBytes_ > 0)
        return packet.size / sampleBytes_;
    if (parameters_->codec_id == AV_CODEC_ID_OPUS)
        return av_rescale_q(OpusSamples(packet), {1, 48000}, unit);
    if (vorbis_)
        return std::max(av_vorbis_parse_frame(vorbis_.get(), packet.data, packet.size), 0);
    const bool isExact = av_cmp_q(timeBase_, unit) <= 0;
    if (isExact && packet.duration > 0)
        return av_rescale_q(packet.duration, timeBase_, unit);
    return std::max(av_get_audio_frame_duration2(parameters_.get(), packet.size), 0);
}

int64_t CopiedSound::SamplesAt(int64_t time) const {
    return SamplesIn(time, parameters_->sample_rate);
}

int64_t CopiedSound::TimeOf(int64_t samples) const {
    return TimeOfSamples(samples, parameters_->sample_rate);
}

} // namespace movieconv
