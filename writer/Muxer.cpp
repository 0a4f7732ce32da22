#include "writer/Muxer.h"

#include "thread/Stall.h"
#include "writer/MatroskaLanguages.h"
#include "writer/TextRows.h"
#include "writer/WriterFailure.h"
#include "writer/WriterStatus.h"

extern "C" {
#include <libavutil/opt.h>
}

#include <algorithm>
#include <iterator>
#include <new>
#include <string>
#include <string_view>
#include <utility>

namespace writer {
namespace {

/// Length of fragments in microseconds: what is lost at most when a file is cut off, unless key frames are
/// rarer.
constexpr int64_t kFragmentLength = 1'000'000;

/// By how many microseconds one stream may run ahead of another before it is written without it; longer until
/// each has begun, as long as what waits is not too large: an encoder may hold many pictures of a low rate.
constexpr int64_t kMostApart = 10'000'000;
constexpr int64_t kMostApartAtFirst = 600'000'000;
constexpr int64_t kMostBytesAtFirst = 32 << 20;

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

void SetFragments(AVFormatContext& output, bool describedByPacket, int64_t room) {
    // Times are written as they are, from the first fragment on.
    std::string flags = "empty_moov+default_base_moof+frag_discont";
    SetOption(output, "use_editlist", "0");
    SetOption(output, "write_tmcd", "0"); // comes with the index
    SetOption(output, "avoid_negative_ts", "disabled");
    if (HasPictures(output)) {
        flags += "+frag_keyframe";
        SetOption(output, "min_frag_duration", std::to_string(kFragmentLength));
    } else {
        SetOption(output, "frag_duration", std::to_string(kFragmentLength));
    }
    if (describedByPacket)
        flags += "+delay_moov";
    SetOption(output, "movflags", flags);
    SetOption(output, "moov_size", std::to_string(room));
}

} // namespace

Muxer::Muxer(const Container& container, AvioFile& file, Form form, const Extras& extras)
    : container_(container),
      file_(file),
      fragmented_(form.fragmented),
      extras_(container, form.fragmented, extras),
      packet_(av::NewPacket()) {
    AVFormatContext* output = nullptr;
    const int error = avformat_alloc_output_context2(&output, nullptr, container.muxer, nullptr);
    output_.reset(output);
    Check(error, "cannot be made");
    output_->pb = file.Io();
    output_->flags |= AVFMT_FLAG_CUSTOM_IO;
    if (form.bitExact)
        output_->flags |= AVFMT_FLAG_BITEXACT;
    extras_.SetMovieTags(*output_);
}

int Muxer::AddStream(const MuxedStream& stream) {
    AVStream* made = avformat_new_stream(output_.get(), nullptr);
    if (made == nullptr)
        throw std::bad_alloc();
    Check(avcodec_parameters_copy(made->codecpar, stream.parameters), "does not take a stream");
    extras_.SetLabel(*made, *stream.label);
    made->codecpar->codec_tag = stream.carriage->tag;
    made->time_base = stream.unit;
    made->avg_frame_rate = stream.rate;
    made->sample_aspect_ratio = stream.sampleAspect;
    if (stream.light != nullptr)
        AddLight(*made, *stream.light);
    const bool sparse = stream.parameters->codec_type == AVMEDIA_TYPE_SUBTITLE;
    streams_.push_back({stream.unit, stream.runUp, stream.carriage, stream.label, stream.light, sparse});
    return made->index;
}

void Muxer::WriteHeader(int64_t room) {
    SetOptions(room);
    extras_.AddStreams(*output_);
    extras_.SetEarlyChapters(*output_);
    Check(avformat_write_header(output_.get(), nullptr), "refuses its header");
    Check(extras_.WriteCover(*output_), "refuses its cover");
    SetLanguageTags();
    headerEnd_ = avio_tell(output_->pb);
    NoteWhole();
    if (fragmented_)
        SetDelays();
}

/// The multiplexer writes the tracks with the header, and once more at the end.
void Muxer::SetLanguageTags() {
    std::vector<const TrackLabel*> labels;
    for (const State& stream : streams_)
        if (!stream.label->Text("language_tag").empty())
            labels.push_back(stream.label);
    if (labels.empty() || !extras_.IsMatroska() || file_.Flush() != 0)
        return;
    if (const int error = PutLanguageTags(*file_.File(), labels); error != 0)
        throw SystemFailure(kWriterErrorWrite, error, "The languages could not be written");
}

/// One by one: avformat_write_header ignores it when it has no memory for one.
void Muxer::SetOptions(int64_t room) {
    if (container_.options != nullptr)
        av::CheckMemory(av_set_options_string(output_->priv_data, container_.options, "=", ","));
    if (fragmented_) {
        const bool describedByPacket = std::any_of(streams_.begin(), streams_.end(), [](const State& stream) {
            return stream.carriage->describedByPacket;
        });
        SetFragments(*output_, describedByPacket, room);
    } else if (container_.kind == ContainerKind::kSteadyRate) {
        SetOption(*output_, "avoid_negative_ts",
                  "disabled"); // Moving pictures by less than one would lose one.
    }
}

void Muxer::SetChapters(const std::vector<OutputChapter>& chapters) {
    extras_.SetChapters(*output_, chapters);
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
    packet_->stream_index = stream;
    SetTimes(*packet_, state, *out);
    const int64_t time = av_rescale_q(packet_->dts, out->time_base, av_get_time_base_q());
    const int counted = IsEmptyText(*packet_, out->codecpar->codec_id) ? 0 : 1;
    Interleave(*packet_);
    state.packets += counted;
    NoteWhole();
    FlushNowAndThen(time);
}

/// In the file's unit; those of decoding rise.
void Muxer::SetTimes(AVPacket& packet, State& state, const AVStream& out) const {
    av_packet_rescale_ts(&packet, state.unit, out.time_base);
    packet.pts += state.delay;
    packet.dts += state.delay;
    // A coarse unit can make two times equal. Many texts may be shown at one time, and packets of sound may
    // be shorter than the unit, as TrueHD's: a step for each would make it longer.
    const bool mayCoincide = extras_.IsMatroska() && out.codecpar->codec_type != AVMEDIA_TYPE_VIDEO;
    const int64_t step = mayCoincide ? 0 : 1;
    if (state.lastDts != AV_NOPTS_VALUE && packet.dts < state.lastDts + step) {
        packet.dts = state.lastDts + step;
        packet.pts = std::max(packet.pts, packet.dts);
    }
    state.lastDts = packet.dts;
}

/// Hands it to the multiplexer, which writes it when no other stream can have an earlier one.
void Muxer::Interleave(AVPacket& packet) {
    output_->max_interleave_delta = MostApart(packet.size);
    // A cover never gets a second packet, for which the multiplexer would wait.
    const bool alone = extras_.HasCoverStream() && streams_.size() == 1;
    Check(alone ? av_write_frame(output_.get(), &packet) : av_interleaved_write_frame(output_.get(), &packet),
          "refuses a packet");
    av_packet_unref(&packet);
}

void Muxer::WriteAt(AVPacket& packet, int64_t position) {
    output_->flags &= ~AVFMT_FLAG_AUTO_BSF; // it has been through that
    if (avio_tell(output_->pb) != position)
        avio_seek(output_->pb, position, SEEK_SET);
    Check(av_write_frame(output_.get(), &packet), "refuses a packet");
    ++streams_[static_cast<size_t>(packet.stream_index)].packets;
}

/// What begins before the first packet of the file is refused by some.
int64_t Muxer::MostApart(int packetSize) {
    const bool allBegun = std::all_of(streams_.begin(), streams_.end(),
                                      [](const State& each) { return each.begun || each.sparse; });
    if (allBegun)
        return LeastLag();
    bytesAtFirst_ += packetSize;
    return bytesAtFirst_ > kMostBytesAtFirst ? kMostApart : kMostApartAtFirst;
}

/// How far the one stream is ahead of the others that may still have to come before it: what is older can be
/// written, whatever the streams that are silent for long may bring.
int64_t Muxer::LeastLag() const {
    if (std::none_of(streams_.begin(), streams_.end(), [](const State& each) { return each.sparse; }))
        return kMostApart;
    std::vector<int64_t> times;
    for (size_t i = 0; i < streams_.size(); ++i)
        if (!streams_[i].sparse && streams_[i].lastDts != AV_NOPTS_VALUE)
            times.push_back(
                av_rescale_q(streams_[i].lastDts, output_->streams[i]->time_base, av_get_time_base_q()));
    int64_t lag = 1; // at 0 the multiplexer would wait for ever
    for (const int64_t time : times)
        if (const int64_t behind = *std::max_element(times.begin(), times.end()) - time; behind < kMostApart)
            lag = std::max(lag, behind);
    return lag;
}

/// Between two packets the multiplexers have written nothing by halves: what they hold back is not in the
/// file's buffer yet.
void Muxer::NoteWhole() {
    const int64_t position = avio_tell(output_->pb);
    if (wholes_.empty() || position > wholes_.back())
        wholes_.push_back(position);
    while (wholes_.size() > 1 && wholes_[1] <= file_.Size())
        wholes_.pop_front();
}

/// So that no more is lost when the program is killed than where fragments are written.
void Muxer::FlushNowAndThen(int64_t time) {
    if (flushed_ != INT64_MIN && time - flushed_ < kFragmentLength)
        return;
    flushed_ = time;
    avio_flush(output_->pb); // a failure is told by the next packet, or by the end
}

int64_t Muxer::WholeSize(int64_t size) const {
    const Turn turn(*this);
    if (finished_ && file_.Error() == 0)
        return size;
    const auto beyond = std::upper_bound(wholes_.begin(), wholes_.end(), size);
    const int64_t whole = beyond == wholes_.begin() ? 0 : *std::prev(beyond);
    return whole > headerEnd_ ? whole : 0;
}

bool Muxer::Describable() const {
    const Turn turn(*this);
    return std::all_of(streams_.begin(), streams_.end(), [](const State& stream) {
        return !stream.carriage->describedByPacket || stream.packets > 0;
    });
}

/// The multiplexer for GIF knows how long a picture stays from the next one.
void Muxer::TellLastStay() {
    constexpr int64_t kLongest = UINT16_MAX;
    if (std::string_view(container_.muxer) != "gif")
        return;
    const State& state = streams_.front();
    const int64_t stay =
        av_rescale_q(state.endPts - state.lastPts, state.unit, output_->streams[0]->time_base);
    SetOption(*output_, "final_delay", std::to_string(std::min(stay, kLongest)));
}

void Muxer::WriteTrailer() {
    const Turn turn(*this);
    if (std::exchange(ended_, true))
        return;
    TellLastStay();
    Check(av_write_trailer(output_.get()), "cannot be finished");
    SetLanguageTags();
    finished_ = true;
}

Muxer::Written Muxer::Stream(int stream) const {
    const Turn turn(*this);
    const State& state = streams_[static_cast<size_t>(stream)];
    const AVStream* out = output_->streams[stream];
    const int64_t length = state.endPts - state.firstPts - out->codecpar->initial_padding;
    const int64_t runUp = av_rescale_q(state.runUp, state.unit, out->time_base);
    return {.description = {.parameters = out->codecpar,
                            .unit = out->time_base,
                            .rate = out->avg_frame_rate,
                            .sampleAspect = out->sample_aspect_ratio,
                            .runUp = runUp,
                            .carriage = state.carriage,
                            .label = state.label,
                            .light = state.light},
            .delay = state.delay,
            .packets = state.packets,
            .end = av_rescale_q(state.endPts, state.unit, out->time_base),
            .last = av_rescale_q(state.lastPts, state.unit, out->time_base),
            .seconds = static_cast<double>(std::max<int64_t>(0, length)) * av_q2d(state.unit)};
}

bool Muxer::Empty() const {
    const Turn turn(*this);
    return std::all_of(streams_.begin(), streams_.end(),
                       [](const State& stream) { return stream.packets == 0; });
}

void Muxer::NoteTimes(State& state, const AVPacket& packet) {
    if (!std::exchange(state.begun, true))
        state.firstPts = state.endPts = state.lastPts = packet.pts;
    state.firstPts = std::min(state.firstPts, packet.pts);
    state.lastPts = std::max(state.lastPts, packet.pts);
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
