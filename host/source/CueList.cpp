#include "host/source/CueList.h"

#include "host/sentence/Say.h"
#include "host/source/Charset.h"
#include "host/source/EarlierCues.h"
#include "host/source/MediaTime.h"
#include "host/source/PacketClock.h"
#include "host/source/PacketTime.h"
#include "host/source/SourceError.h"
#include "host/source/StreamChoice.h"
#include "host/source/SubtitleFile.h"

#include <algorithm>
#include <limits>
#include <memory>
#include <utility>

namespace movieconv {
namespace {

constexpr int64_t kLongestCue = 24LL * 60 * 60 * kTicksPerSecond;

void CheckDecodable(const AVCodecParameters& parameters, const BurnWish& wish) {
    if (avcodec_find_decoder(parameters.codec_id) == nullptr)
        throw TrackError(Say("the subtitles \"{}\" cannot be decoded", wish.what));
}

void Add(CueList& list, av::Packet packet, int64_t begin, int64_t duration) {
    const bool isKnown = duration > 0 && duration < kLongestCue;
    list.cues.push_back({begin, isKnown ? begin + duration : begin, std::move(packet)});
}

/// False for one that begins at `end` or later.
bool AddUntil(int64_t end, CueList& list, const PacketReader& reader, av::Packet packet) {
    const AVRational unit = reader.Context()->streams[packet->stream_index]->time_base;
    const int64_t stamp = StampOf(*packet);
    if (stamp == AV_NOPTS_VALUE)
        return true;
    if (IsPlainText(list.parameters->codec_id))
        MakeUtf8(*packet);
    const int64_t begin = reader.MediaTime(stamp, unit);
    if (begin >= end)
        return false;
    const int64_t duration = av_rescale_q(packet->duration, unit, {1, kTicksPerSecond});
    Add(list, std::move(packet), begin, duration);
    return true;
}

void ReadStream(CueList& list, const Source& source, const BurnWish& wish, bool playlists) {
    const int stream = WantedTracks(source.Info().streams, StreamKind::kSubtitles, {{wish.what}}).front();
    PacketReader reader(source.Info().path, playlists, Growth::kRead, source.Reader().Interruptible());
    if (!reader.IsSeekable())
        throw TrackError(Say("the subtitles of a pipe cannot be drawn into its pictures"));
    AVFormatContext* context = reader.Context();
    if (stream >= static_cast<int>(context->nb_streams))
        throw TrackError(Say("the subtitles {} are not there any more", stream));
    list.parameters = source.ParametersOf(stream);
    CheckDecodable(*list.parameters, wish);
    reader.Select({stream});
    PacketClock clock(source.Info(), reader);
    reader.SelectBeside(clock.Witnesses());
    constexpr int64_t kMargin = 60 * kTicksPerSecond; // texts stand in front of pictures of the same time
    const int64_t earliest = wish.earliest ? *wish.earliest - kMargin : EarliestCueFor(reader, wish.begin);
    if (earliest > 0 && !source.Info().clockRestarts) {
        if (!wish.earliest)
            list.unread = TellEarliestCue(earliest, wish.begin);
        if (!SeekToCues(reader, earliest) && !reader.Rewind())
            throw TrackError(Say("the subtitles cannot be read ahead of the pictures"));
    }
    for (bool ended = false; !ended;) {
        av::Packet read = av::NewPacket();
        const int result = av_read_frame(context, read.get());
        av::CheckMemory(result);
        ended = result < 0;
        if (!ended)
            clock.Push(std::move(read));
        while (av::Packet packet = clock.Pop(ended))
            if (packet->stream_index == stream && !AddUntil(wish.end, list, reader, std::move(packet)))
                return;
    }
}

void ReadFile(CueList& list, const Source& source, const BurnWish& wish) {
    try {
        SubtitleFile file(wish.what, wish.charset, source.Reader().Interruptible());
        const AVStream& stream = file.Stream();
        CheckDecodable(*stream.codecpar, wish);
        list.parameters = av::CopyOf(*stream.codecpar);
        while (av::Packet packet = file.Take()) {
            const auto ticks = [&](int64_t stamp) {
                return av_rescale_q(stamp, stream.time_base, {1, kTicksPerSecond});
            };
            const int64_t begin = packet->pts;
            const int64_t duration = packet->duration;
            if (begin != AV_NOPTS_VALUE)
                Add(list, std::move(packet), ticks(begin), ticks(duration));
        }
    } catch (const TrackError&) {
        throw;
    } catch (const SourceError& error) {
        throw TrackError(error.Words());
    }
}

} // namespace

bool NamesStream(const BurnWish& wish) {
    return !wish.what.empty() && std::all_of(wish.what.begin(), wish.what.end(),
                                             [](char letter) { return letter >= '0' && letter <= '9'; });
}

av::CodecContext CueList::OpenDecoder(AVRational timeBase) const {
    av::CodecContext decoder = av::NewCodecContext(avcodec_find_decoder(parameters->codec_id));
    av::CheckMemory(avcodec_parameters_to_context(decoder.get(), parameters.get()));
    decoder->pkt_timebase = timeBase;
    const int result = avcodec_open2(decoder.get(), decoder->codec, nullptr);
    av::CheckMemory(result);
    if (result < 0)
        throw TrackError(Say("the subtitles cannot be decoded: {}", Sentence(av::ErrorText(result))));
    return decoder;
}

std::vector<CueList::Span> CueList::Spans() const {
    std::vector<Span> spans;
    spans.reserve(cues.size());
    int64_t next = std::numeric_limits<int64_t>::max(); // where the one behind those that begin together does
    for (std::size_t i = cues.size(); i-- > 0;) {
        const Cue& cue = cues[i];
        if (!spans.empty() && spans.back().begin > cue.begin)
            next = spans.back().begin;
        spans.push_back({cue.begin, cue.end > cue.begin ? cue.end : next});
    }
    std::reverse(spans.begin(), spans.end());
    return spans;
}

bool CueList::IsText() const {
    const AVCodecDescriptor* descriptor = avcodec_descriptor_get(parameters->codec_id);
    return descriptor != nullptr && (descriptor->props & AV_CODEC_PROP_TEXT_SUB) != 0;
}

CueList ReadCues(const Source& source, const BurnWish& wish, bool playlists) {
    CueList list;
    if (NamesStream(wish))
        ReadStream(list, source, wish, playlists);
    else
        ReadFile(list, source, wish);
    std::stable_sort(
        list.cues.begin(), list.cues.end(),
        [](const CueList::Cue& one, const CueList::Cue& other) { return one.begin < other.begin; });
    return list;
}

} // namespace movieconv
