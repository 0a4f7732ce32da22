#include "host/source/BesideTracks.h"

#include "host/sentence/Say.h"
#include "host/source/Charset.h"
#include "host/source/CueSettings.h"
#include "host/source/MediaTime.h"

#include <algorithm>
#include <fmt/format.h>
#include <utility>

namespace movieconv {

BesideTracks::BesideTracks(Source& source, const SourceChoice& choice, Demuxer& demuxer, Failures& failures)
    : source_(source), choice_(choice), demuxer_(demuxer), failures_(failures) {}

void BesideTracks::SetBounds(double begin, bool ends, bool isCut) {
    begin_ = begin;
    bounds_.begin = ToMediaTime(begin);
    bounds_.ends = ends;
    bounds_.isCut = isCut;
}

BesideSound& BesideTracks::ReadSound(int stream) {
    const SoundStreamInfo& sound = *source_.Info().streams[static_cast<std::size_t>(stream)].sound;
    BesideSound& track = Add(stream, std::make_unique<BesideSound>(source_.Reader(), StreamOf(stream), sound,
                                                                   demuxer_, bounds_, failures_));
    sounds_.push_back(&track);
    return track;
}

BesidePackets& BesideTracks::ReadPackets(int stream) {
    const AVCodecID codec = source_.ParametersOf(stream)->codec_id;
    const auto toUsualForm = [this, codec](AVPacket& packet) {
        if (IsPlainText(codec) && MakeUtf8(packet))
            ++cuesInOtherCharset_;
        if (codec == AV_CODEC_ID_WEBVTT)
            TakeCueSettings(packet);
    };
    const auto take = [this, stream, toUsualForm](int64_t until, bool wait) {
        Demuxer::Beside taken = demuxer_.TakeBeside(stream, until, wait);
        if (taken.packet)
            toUsualForm(*taken.packet);
        return taken;
    };
    const auto clock = [this](int64_t stamp, AVRational timeBase) {
        return source_.Reader().MediaTime(stamp, timeBase);
    };
    BesidePackets& track = Add(
        stream, std::make_unique<BesidePackets>(take, clock, StreamOf(stream).time_base, bounds_, failures_));
    if (bounds_.begin > 0) {
        std::vector<av::Packet> earlier = CuesBefore(stream);
        for (const av::Packet& packet : earlier)
            toUsualForm(*packet);
        track.Precede(std::move(earlier));
    }
    return track;
}

CopiedSound& BesideTracks::CopySound(int stream) {
    copied_.push_back(stream);
    return Add(stream, std::make_unique<CopiedSound>(source_.Reader(), StreamOf(stream), demuxer_, bounds_,
                                                     failures_));
}

const AVCodecParameters& BesideTracks::DescribeCopied(CopiedSound& sound) {
    if (source_.PictureStream() != nullptr || begin_ > 0) // as the decoders are going to
        demuxer_.Seek(begin_);
    return sound.Describe();
}

BesidePackets& BesideTracks::ReadFile(const std::string& path, const std::string& charset,
                                      const AVStream*& stream) {
    files_.push_back(std::make_unique<SubtitleFile>(path, charset, source_.Reader().Interruptible()));
    SubtitleFile& file = *files_.back();
    stream = &file.Stream();
    const auto clock = [](int64_t stamp, AVRational timeBase) {
        return av_rescale_q(stamp, timeBase, {1, kTicksPerSecond});
    };
    const auto take = [&file](int64_t, bool) -> Demuxer::Beside {
        av::Packet packet = file.Take();
        const bool ended = packet == nullptr;
        return {std::move(packet), ended};
    };
    auto track = std::make_unique<BesidePackets>(take, clock, stream->time_base, bounds_, failures_);
    BesidePackets& made = *track;
    tracks_.push_back(std::move(track));
    return made;
}

template <class Track>
Track& BesideTracks::Add(int stream, std::unique_ptr<Track> track) {
    streams_.push_back(stream);
    demuxer_.ReadBeside(streams_);
    tracks_.push_back(std::move(track));
    return static_cast<Track&>(*tracks_.back());
}

const AVStream& BesideTracks::StreamOf(int stream) const {
    return *source_.Reader().Context()->streams[stream];
}

/// Those of all subtitles are read at once. A source that cannot be sought is read from its start, with them.
std::vector<av::Packet> BesideTracks::CuesBefore(int stream) {
    const SourceInfo& info = source_.Info();
    if (!std::exchange(earlierCuesRead_, true) && source_.Reader().IsSeekable() && !info.clockRestarts) {
        std::vector<int> subtitles;
        for (const StreamInfo& each : info.streams)
            if (each.kind == StreamKind::kSubtitles)
                subtitles.push_back(each.index);
        const int main = info.pictures ? info.pictures->index : info.sound->index;
        PacketReader again(info.path, choice_.playlists, Growth::kRead, source_.Reader().Interruptible());
        earlierCues_ = ReadEarlierCues(again, main, std::move(subtitles), bounds_.begin);
    }
    return std::move(earlierCues_.packets[stream]);
}

bool BesideTracks::Copies(int stream) const {
    return std::find(copied_.begin(), copied_.end(), stream) != copied_.end();
}

std::vector<Sentence> BesideTracks::Complaints() const {
    std::vector<Sentence> texts;
    AddTold(texts, TellEarliestCue(earlierCues_.earliest, bounds_.begin));
    const int64_t cues = cuesInOtherCharset_;
    AddTold(texts, SayCounted(cues, Say("1 of its subtitles was not in UTF-8 and taken for Windows-1252"),
                              Say("{} of its subtitles were not in UTF-8 and taken for Windows-1252", cues)));
    for (const BesideSound* sound : sounds_) {
        const int stream = sound->Stream();
        const int64_t damaged = sound->Damaged();
        AddTold(
            texts,
            SayCounted(damaged, Say("1 damaged piece of sound data was skipped in stream {}", stream),
                       Say("{} damaged pieces of sound data were skipped in stream {}", damaged, stream)));
        const int closed = sound->Corrections();
        AddTold(texts,
                SayCounted(closed,
                           Say("the sound of stream {} had 1 gap or overlap, which was closed", stream),
                           Say("the sound of stream {} had {} gaps or overlaps, which were closed", stream,
                               closed)));
    }
    return texts;
}

} // namespace movieconv
