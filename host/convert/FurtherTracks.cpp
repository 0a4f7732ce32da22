#include "host/convert/FurtherTracks.h"

#include "host/convert/CarryPlan.h"
#include "host/convert/CarryTexts.h"
#include "host/convert/CodecPlan.h"
#include "host/convert/Failure.h"
#include "host/convert/Formats.h"
#include "host/sentence/Say.h"
#include "host/source/Languages.h"
#include "host/source/MediaTime.h"
#include "host/source/SourceError.h"
#include "media/MediaRecords.h"

#include <new>
#include <utility>

namespace movieconv {
namespace {

int TakeNext(void* context, int64_t until, int closing, WriterTrackItem* item) {
    BesideTrack::Item found;
    const bool any = static_cast<BesideTrack*>(context)->Next(until, closing != 0, found);
    *item = {found.sound, found.packet, found.time, found.duration};
    return any ? 1 : 0;
}

/// Throws Failure for frames of E-AC-3 with fewer than six blocks of 256 samples, which some formats join.
void RequireHoldable(const AVCodecParameters& sound, const FileFormatInfo& format) {
    constexpr int kWholeFrame = 6 * 256;
    const bool isPart =
        sound.codec_id == AV_CODEC_ID_EAC3 && sound.frame_size > 0 && sound.frame_size < kWholeFrame;
    if (isPart && Has(format, kWriterFormatJoinsFrames))
        throw Failure(Category::kRequest, Say("{} cannot hold short frames of \"{}\" sound as it is; MKV can",
                                              ShortName(format), SayCodec(avcodec_get_name(sound.codec_id))));
}

/// What `read` gives, with its errors as failures.
template <class Function>
auto& OpenedBeside(Function read) {
    try {
        return read();
    } catch (const SourceError& error) {
        throw Failure(Category::kRequest, error.Words());
    }
}

} // namespace

FurtherTracks::FurtherTracks(Movie& movie, const Request& request, const FileFormatInfo& format, uint32_t set)
    : movie_(movie), request_(request), format_(format), set_(set) {
    const double begin = request.firstClip ? ToSeconds(request.firstClip->begin) : request.begin;
    movie.Beside().SetBounds(begin, request.length.has_value(), request.split.has_value());
}

void FurtherTracks::Add(const StreamInfo& stream) {
    if (stream.kind == StreamKind::kSound)
        AddSound(stream);
    else
        AddPackets(stream);
}

void FurtherTracks::AddSound(const StreamInfo& stream) {
    if (request_.copySound) {
        CopiedSound& sound = movie_.Beside().CopySound(stream.index);
        tracks_.push_back({{}, &sound, stream, &sound});
        return;
    }
    const SoundCoding plan = PlanSound(request_, format_, *stream.sound);
    WriterTrack track{};
    track.nSampleRate = plan.sampleRate.value_or(stream.sound->sampleRate);
    track.nChannels = plan.channels.value_or(stream.sound->channels);
    track.nBitsPerSample = stream.sound->bitsPerSample;
    track.nBitrate = plan.rate.value_or(0);
    track.nChannelMask = stream.sound->speakers;
    BesideSound& source =
        OpenedBeside([&]() -> BesideSound& { return movie_.Beside().ReadSound(stream.index); });
    tracks_.push_back({track, &source, stream});
}

std::optional<NotCarried> FurtherTracks::AddFile(const SubtitleFileWish& wish, const std::string& charset) {
    const AVStream* described = nullptr;
    BesidePackets& source = OpenedBeside(
        [&]() -> BesidePackets& { return movie_.Beside().ReadFile(wish.path, charset, described); });
    StreamInfo stream;
    stream.kind = StreamKind::kSubtitles;
    stream.codec = avcodec_get_name(described->codecpar->codec_id);
    stream.language = ThreeLetters(wish.language);
    if (WhySubtitlesStay(stream, format_).IsEmpty()) {
        WriterTrack track{};
        track.pParameters = described->codecpar;
        tracks_.push_back({track, &source, stream});
    }
    return LostOfFile(stream, request_, format_);
}

void FurtherTracks::AddPackets(const StreamInfo& stream) {
    WriterTrack track{};
    av::CodecParameters parameters = movie_.ParametersOf(stream.index);
    track.pParameters = parameters.get();
    BesidePackets& source =
        OpenedBeside([&]() -> BesidePackets& { return movie_.Beside().ReadPackets(stream.index); });
    tracks_.push_back({track, &source, stream, nullptr, std::move(parameters)});
}

std::vector<SubtitleTrack> FurtherTracks::Finish() {
    std::vector<SubtitleTrack> subtitles;
    int number = kWriterTrackFurther;
    for (Track& each : tracks_) {
        if (each.copied != nullptr) {
            const AVCodecParameters& described = OpenedBeside(
                [&]() -> const AVCodecParameters& { return movie_.Beside().DescribeCopied(*each.copied); });
            RequireHoldable(described, format_);
            each.track.pParameters = &described;
        }
        if (each.stream.kind == StreamKind::kSubtitles)
            subtitles.push_back({number, each.stream});
        each.track.pfnNext = TakeNext;
        each.track.pContext = each.source;
        if (MWAddTrack(set_, &each.track) == 0)
            throw std::bad_alloc();
        LabelTrack(each.stream, request_, format_, set_, number++);
    }
    return subtitles;
}

} // namespace movieconv
