#include "host/source/Movie.h"

#include "host/source/EarlierCues.h"
#include "host/source/MediaTime.h"
#include "host/source/PictureLosses.h"
#include "host/source/SourceError.h"

#include <fmt/format.h>
#include <utility>

namespace movieconv {
namespace {

std::unique_ptr<SubtitleBurner> MakeBurner(const Source& source, const SourceChoice& choice) {
    if (!choice.burn || choice.stampsOnly)
        return nullptr;
    if (source.PictureStream() == nullptr)
        throw TrackError("there are no pictures to draw subtitles into");
    return std::make_unique<SubtitleBurner>(source, choice);
}

} // namespace

Movie::Movie(const std::string& path, const SourceChoice& choice, std::shared_ptr<Interruption> interruption)
    : choice_(choice),
      source_(path, choice, std::move(interruption)),
      burner_(MakeBurner(source_, choice)),
      failures_([this] { demuxer_.Stop(); }),
      demuxer_(source_, failures_) {
    if (choice.fromStart)
        demuxer_.StayAtStart();
    if (source_.PictureStream() != nullptr && choice.stampsOnly)
        stamps_ = std::make_unique<PictureStamps>(source_, demuxer_);
    else if (source_.PictureStream() != nullptr)
        pictures_ = std::make_unique<PictureDecoder>(source_, demuxer_, failures_, choice, burner_.get());
    if (source_.SoundStream() != nullptr)
        sound_ = std::make_unique<SoundDecoder>(source_, demuxer_, failures_);
}

void Movie::EndPicturesAt(double seconds) {
    if (pictures_)
        pictures_->EndAt(seconds);
    if (stamps_)
        stamps_->EndAt(seconds);
}

void Movie::SetBounds(double begin, bool ends, bool isCut) {
    begin_ = begin;
    bounds_.begin = ToMediaTime(begin);
    bounds_.ends = ends;
    bounds_.isCut = isCut;
}

BesideSound& Movie::ReadSoundBeside(int stream) {
    const SoundStreamInfo& sound = *Info().streams[static_cast<std::size_t>(stream)].sound;
    auto track = std::make_unique<BesideSound>(source_.Reader(), StreamOf(stream), sound, demuxer_, bounds_,
                                               failures_);
    BesideSound& made = *track;
    AddBeside(stream, std::move(track));
    besideSound_.push_back(&made);
    return made;
}

BesidePackets& Movie::ReadPacketsBeside(int stream) {
    const bool isPlain = IsPlainText(StreamOf(stream).codecpar->codec_id);
    auto track = std::make_unique<BesidePackets>(
        [this, stream, isPlain](int64_t until, bool wait) {
            Demuxer::Beside taken = demuxer_.TakeBeside(stream, until, wait);
            if (taken.packet && isPlain && MakeUtf8(*taken.packet))
                ++cuesInOtherCharset_;
            return taken;
        },
        [this](int64_t stamp, AVRational timeBase) { return source_.Reader().MediaTime(stamp, timeBase); },
        StreamOf(stream).time_base, bounds_, failures_);
    BesidePackets& made = *track;
    AddBeside(stream, std::move(track));
    if (bounds_.begin > 0) {
        std::vector<av::Packet>& earlier = EarlierCues()[stream];
        for (const av::Packet& packet : earlier)
            if (isPlain && MakeUtf8(*packet))
                ++cuesInOtherCharset_;
        made.Precede(std::move(earlier));
    }
    return made;
}

CopiedSound& Movie::CopySoundBeside(int stream) {
    auto track =
        std::make_unique<CopiedSound>(source_.Reader(), StreamOf(stream), demuxer_, bounds_, failures_);
    CopiedSound& made = *track;
    soundIsCopied_ = soundIsCopied_ || (Info().sound && Info().sound->index == stream);
    AddBeside(stream, std::move(track));
    return made;
}

const AVCodecParameters& Movie::DescribeCopied(CopiedSound& sound) {
    if (Pictures() != nullptr || begin_ > 0) // as the decoders are going to
        demuxer_.Seek(begin_);
    return sound.Describe();
}

BesidePackets& Movie::ReadSubtitleFile(const std::string& path, const std::string& charset,
                                       const AVStream*& stream) {
    subtitleFiles_.push_back(std::make_unique<SubtitleFile>(path, charset, source_.Reader().Interruptible()));
    SubtitleFile& file = *subtitleFiles_.back();
    stream = &file.Stream();
    auto track =
        std::make_unique<BesidePackets>([&file](int64_t, bool) { return file.Take(); },
                                        [](int64_t stamp, AVRational timeBase) {
                                            return av_rescale_q(stamp, timeBase, {1, kTicksPerSecond});
                                        },
                                        stream->time_base, bounds_, failures_);
    BesidePackets& made = *track;
    beside_.push_back(std::move(track));
    return made;
}

/// Of all subtitles, read once.
std::map<int, std::vector<av::Packet>>& Movie::EarlierCues() {
    if (std::exchange(earlierCuesRead_, true) || !source_.Reader().IsSeekable())
        return earlierCues_;
    std::vector<int> subtitles;
    for (const StreamInfo& stream : Info().streams)
        if (stream.kind == StreamKind::kSubtitles)
            subtitles.push_back(stream.index);
    const int main = Info().pictures ? Info().pictures->index : Info().sound->index;
    MovieReader again(Info().path, choice_.playlists, Growth::kRead, source_.Reader().Interruptible());
    earlierCues_ = ReadEarlierCues(again, main, std::move(subtitles), bounds_.begin);
    return earlierCues_;
}

void Movie::AddBeside(int stream, std::unique_ptr<BesideTrack> track) {
    besideStreams_.push_back(stream);
    demuxer_.ReadBeside(besideStreams_);
    beside_.push_back(std::move(track));
}

void Movie::Stop() {
    bounds_.stopped = true;
    // Before the demuxer, lest a decoder take the stop for the source's end and hand on what belongs there;
    // the sound first, which goes on where pictures end.
    if (sound_)
        sound_->Stop();
    if (pictures_)
        pictures_->Stop();
    demuxer_.Stop();
}

std::optional<Shortfall> Movie::Missing() const {
    const auto reached = [&](int stream) { return ToSeconds(demuxer_.EndOf(stream).value_or(0)); };
    Reached ends;
    if ((pictures_ && pictures_->RanDry()) || (stamps_ && stamps_->RanDry()))
        ends.pictures = reached(Info().pictures->index);
    if (sound_ && sound_->RanDry())
        ends.sound = reached(Info().sound->index);
    const std::optional<Shortfall> found = FindShortfall(Info().promise, ends);
    return found ? found : LateShortfall(ends);
}

/// What goes on only in streams that are not converted, since they came up late.
std::optional<Shortfall> Movie::LateShortfall(const Reached& ends) const {
    std::optional<Shortfall> found;
    for (const LateStreams::Left& left : demuxer_.LeftOut()) {
        Promise promise;
        (left.kind == StreamKind::kPictures ? promise.pictures : promise.sound) = ToSeconds(left.end);
        found = found ? found : FindShortfall(promise, ends);
    }
    return found;
}

std::vector<std::string> Movie::Complaints() const {
    std::vector<std::string> texts;
    if (const int64_t cues = cuesInOtherCharset_; cues > 0)
        texts.push_back(fmt::format("{} of its subtitles {} not in UTF-8 and taken for Windows-1252", cues,
                                    cues == 1 ? "was" : "were"));
    if (pictures_)
        for (std::string& loss : PictureLosses(*Info().pictures, choice_, *pictures_))
            texts.push_back(std::move(loss));
    for (const LateStreams::Left& left : demuxer_.LeftOut())
        texts.push_back(fmt::format(
            "{} of {:.0f} s, which the source announces only at {:.0f} s, {} left out",
            left.kind == StreamKind::kPictures ? "pictures" : "sound", ToSeconds(left.end - left.begin),
            ToSeconds(left.begin), left.kind == StreamKind::kPictures ? "were" : "was"));
    if (const int jumps = demuxer_.ClockJumps(); jumps > 0) {
        texts.push_back(fmt::format("the source's clock jumped {}; the parts were joined",
                                    jumps == 1 ? "once" : fmt::format("{} times", jumps)));
    }
    if (pictures_ && pictures_->Damaged() > 0)
        texts.push_back(fmt::format("{} damaged pieces of picture data were skipped", pictures_->Damaged()));
    if (pictures_ && pictures_->Repaired() > 0) {
        texts.push_back(
            fmt::format("{} pictures had a missing or falling time stamp", pictures_->Repaired()));
    }
    if (sound_ && sound_->Damaged() > 0)
        texts.push_back(fmt::format("{} damaged pieces of sound data were skipped", sound_->Damaged()));
    if (sound_ && sound_->Corrections() > 0) {
        texts.push_back(
            fmt::format("the sound had {} gaps or overlaps, which were closed", sound_->Corrections()));
    }
    if (sound_ && !soundIsCopied_ && sound_->Channels() > Info().sound->channels)
        texts.push_back(fmt::format("some of its sound has {} channels and got {}", sound_->Channels(),
                                    Info().sound->channels));
    for (const BesideSound* sound : besideSound_) {
        if (sound->Damaged() > 0)
            texts.push_back(fmt::format("{} damaged pieces of sound data were skipped in stream {}",
                                        sound->Damaged(), sound->Stream()));
        if (sound->Corrections() > 0)
            texts.push_back(fmt::format("the sound of stream {} had {} gaps or overlaps, which were closed",
                                        sound->Stream(), sound->Corrections()));
    }
    return texts;
}

} // namespace movieconv
