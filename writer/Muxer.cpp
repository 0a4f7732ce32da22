#include "writer/Muxer.h"

#include "thread/Stall.h"
#include "writer/WriterFailure.h"
#include "writer/WriterStatus.h"

extern "C" {
#include <libavutil/opt.h>
}

#include <algorithm>
#include <new>
#include <string>
#include <utility>

namespace writer {
namespace {

/// Length of fragments in microseconds: what is lost at most when a file is cut off, unless key frames are
/// rarer.
constexpr int64_t kFragmentLength = 1'000'000;

/// By how many microseconds one stream may run ahead of another before it is written without it; longer until
/// each has begun.
constexpr int64_t kMostApart = 10'000'000;
constexpr int64_t kMostApartAtFirst = 600'000'000;

bool Has(const AVFormatContext& output, AVCodecID id) {
    return std::any_of(output.streams, output.streams + output.nb_streams,
                       [id](const AVStream* stream) { return stream->codecpar->codec_id == id; });
}

bool HasPictures(const AVFormatContext& output) {
    return std::any_of(output.streams, output.streams + output.nb_streams, [](const AVStream* stream) {
        return stream->codecpar->codec_type == AVMEDIA_TYPE_VIDEO;
    });
}

/// Whether a packet of sound holds little but its codec's run-up. Where time is a count from 0 on, such a
/// packet would be heard and move all sound away from the pictures.
bool IsRunUp(const AVPacket& packet, const AVStream& stream) {
    return stream.codecpar->codec_type == AVMEDIA_TYPE_AUDIO && packet.pts + packet.duration / 2 < 0;
}

void SetOption(AVFormatContext& output, const char* name, const std::string& value) {
    av::CheckMemory(av_opt_set(&output, name, value.c_str(), AV_OPT_SEARCH_CHILDREN));
}

void SetFragments(AVFormatContext& output) {
    // Times are written as they are, from the first fragment on.
    std::string flags = "empty_moov+default_base_moof+frag_discont";
    SetOption(output, "use_editlist", "0");
    SetOption(output, "avoid_negative_ts", "disabled");
    if (HasPictures(output)) {
        flags += "+frag_keyframe";
        SetOption(output, "min_frag_duration", std::to_string(kFragmentLength));
    } else {
        SetOption(output, "frag_duration", std::to_string(kFragmentLength));
    }
    // The description of this codec is only known from its first packet.
    if (Has(output, AV_CODEC_ID_AC3))
        flags += "+delay_moov";
    SetOption(output, "movflags", flags);
}

} // namespace

Muxer::Muxer(const Container& container, AvioFile& file, bool fragmented, bool bitExact)
    : container_(container), fragmented_(fragmented), packet_(av::NewPacket()) {
    AVFormatContext* output = nullptr;
    const int error = avformat_alloc_output_context2(&output, nullptr, container.muxer, nullptr);
    output_.reset(output);
    Check(error, "cannot be made");
    output_->pb = file.Io();
    output_->flags |= AVFMT_FLAG_CUSTOM_IO;
    if (bitExact)
        output_->flags |= AVFMT_FLAG_BITEXACT;
}

int Muxer::AddStream(const MuxedStream& stream) {
    AVStream* made = avformat_new_stream(output_.get(), nullptr);
    if (made == nullptr)
        throw std::bad_alloc();
    Check(avcodec_parameters_copy(made->codecpar, stream.parameters), "does not take a stream");
    made->codecpar->codec_tag = StreamTag(container_, made->codecpar->codec_id);
    made->time_base = stream.unit;
    made->avg_frame_rate = stream.rate;
    made->sample_aspect_ratio = stream.sampleAspect;
    streams_.push_back({stream.unit, stream.runUp});
    return made->index;
}

void Muxer::WriteHeader() {
    // Not handed over with the header: of options that there is no memory for, that tells nothing.
    if (fragmented_)
        SetFragments(*output_);
    else if (container_.kind == ContainerKind::kSteadyRate)
        SetOption(*output_, "avoid_negative_ts",
                  "disabled"); // Moving pictures by less than one would lose one.
    Check(avformat_write_header(output_.get(), nullptr), "refuses its header");
    if (fragmented_)
        SetDelays();
}

/// The right to use the multiplexer, which may write to the file for long.
class Muxer::Turn {
public:
    explicit Turn(const Muxer& muxer) : muxer_(muxer) {
        std::unique_lock lock(muxer.mutex_);
        WaitAndTell(
            muxer.changed_, lock, [&] { return !muxer.busy_; },
            L"MediaWriter::A stream waits while another one is written to the file");
        muxer.busy_ = true;
    }
    ~Turn() {
        {
            const std::lock_guard lock(muxer_.mutex_);
            muxer_.busy_ = false;
        }
        muxer_.changed_.notify_one();
    }
    Turn(const Turn&) = delete;
    Turn& operator=(const Turn&) = delete;

private:
    const Muxer& muxer_;
};

void Muxer::Write(AVPacket& packet, int stream) {
    const Turn turn(*this);
    State& state = streams_[static_cast<size_t>(stream)];
    const AVStream* out = output_->streams[stream];
    NoteTimes(state, packet);
    if (container_.kind == ContainerKind::kSteadyRate && HasPictures(*output_) && IsRunUp(packet, *out))
        return;
    av_packet_move_ref(packet_.get(), &packet);
    av_packet_rescale_ts(packet_.get(), state.unit, out->time_base);
    packet_->pts += state.delay;
    packet_->dts += state.delay;
    // A coarse unit can make two times equal.
    if (state.lastDts != AV_NOPTS_VALUE && packet_->dts <= state.lastDts) {
        packet_->dts = state.lastDts + 1;
        packet_->pts = std::max(packet_->pts, packet_->dts);
    }
    state.lastDts = packet_->dts;
    packet_->stream_index = stream;
    // What begins before the first packet of the file is refused by some: an encoder may hold many pictures.
    const bool allBegun =
        std::all_of(streams_.begin(), streams_.end(), [](const State& each) { return each.begun; });
    output_->max_interleave_delta = allBegun ? kMostApart : kMostApartAtFirst;
    Check(av_interleaved_write_frame(output_.get(), packet_.get()), "refuses a packet");
    ++state.packets;
}

void Muxer::WriteTrailer() {
    const Turn turn(*this);
    if (std::exchange(ended_, true))
        return;
    Check(av_write_trailer(output_.get()), "cannot be finished");
}

Muxer::Written Muxer::Stream(int stream) const {
    const Turn turn(*this);
    const State& state = streams_[static_cast<size_t>(stream)];
    const AVStream* out = output_->streams[stream];
    const int64_t length = state.endPts - state.firstPts - out->codecpar->initial_padding;
    const int64_t runUp = av_rescale_q(state.runUp, state.unit, out->time_base);
    return {{out->codecpar, out->time_base, out->avg_frame_rate, out->sample_aspect_ratio, runUp},
            state.delay,
            state.packets,
            static_cast<double>(std::max<int64_t>(0, length)) * av_q2d(state.unit)};
}

bool Muxer::Empty() const {
    const Turn turn(*this);
    return std::all_of(streams_.begin(), streams_.end(),
                       [](const State& stream) { return stream.packets == 0; });
}

void Muxer::NoteTimes(State& state, const AVPacket& packet) {
    if (!std::exchange(state.begun, true))
        state.firstPts = state.endPts = packet.pts;
    state.firstPts = std::min(state.firstPts, packet.pts);
    state.endPts = std::max(state.endPts, packet.pts + packet.duration);
}

void Muxer::Check(int result, const char* what) const {
    av::CheckMemory(result);
    if (result < 0)
        throw WriterFailure(kWriterErrorEncode,
                            std::string("The container ") + what + ": " + av::ErrorText(result) + ".");
}

void Muxer::SetDelays() {
    AVRational longest{0, 1};
    for (const State& state : streams_) {
        const AVRational seconds = av_mul_q(av_make_q(static_cast<int>(state.runUp), 1), state.unit);
        if (av_cmp_q(seconds, longest) > 0)
            longest = seconds;
    }
    for (size_t stream = 0; stream < streams_.size(); ++stream) {
        const AVRational unit = output_->streams[stream]->time_base;
        streams_[stream].delay = av_rescale_q_rnd(1, longest, unit, AV_ROUND_UP);
    }
}

} // namespace writer
