#include "host/convert/CarryOver.h"

#include "host/convert/CarryTexts.h"
#include "host/convert/CodecPlan.h"
#include "host/convert/Failure.h"
#include "host/convert/Formats.h"
#include "host/convert/Timecode.h"
#include "host/source/Languages.h"
#include "host/source/MediaTime.h"
#include "host/source/SourceError.h"
#include "host/source/StreamChoice.h"
#include "media/FourCC.h"
#include "media/MediaRecords.h"
#include "writer/WriterStatus.h"

#include <algorithm>
#include <array>
#include <cstddef>
#include <fmt/format.h>
#include <new>
#include <optional>
#include <string>
#include <utility>

namespace movieconv {
namespace {

constexpr int64_t kLargestCoverInFlac = 16'000'000; // with its description below 2^24

const StreamInfo& StreamAt(const SourceInfo& source, int index) {
    return source.streams[static_cast<std::size_t>(index)];
}

bool IsAmong(const std::vector<int>& list, int number) {
    return std::count(list.begin(), list.end(), number) > 0;
}

int TakeNext(void* context, int64_t until, int closing, WriterTrackItem* item) {
    BesideTrack::Item found;
    const bool any = static_cast<BesideTrack*>(context)->Next(until, closing != 0, found);
    *item = {found.sound, found.packet, found.time, found.duration};
    return any ? 1 : 0;
}

/// Why subtitles stay behind; empty when they do not.
std::string WhySubtitlesStay(const StreamInfo& stream, const FileFormatInfo& format) {
    constexpr uint32_t kMatroska = FourCC("MKV ");
    if (MWCarriesPackets(format.fccFormat, stream.codec.c_str()) != 0)
        return {};
    const bool matroskaCan = MWCarriesPackets(kMatroska, stream.codec.c_str()) != 0;
    return fmt::format("{} cannot hold them{}", ShortName(format), matroskaCan ? ", MKV can" : "");
}

/// Throws Failure for frames that MP4 and its like hold in another form: they join those of E-AC-3 that have
/// fewer than six blocks of 256 samples.
void RequireHoldable(const AVCodecParameters& sound, const FileFormatInfo& format) {
    constexpr int kWholeFrame = 6 * 256;
    constexpr std::array kJoining{FourCC("MP4 "), FourCC("MOV ")};
    const bool isPart =
        sound.codec_id == AV_CODEC_ID_EAC3 && sound.frame_size > 0 && sound.frame_size < kWholeFrame;
    if (isPart && std::find(kJoining.begin(), kJoining.end(), format.fccFormat) != kJoining.end())
        throw Failure(Category::kRequest,
                      fmt::format("{} cannot hold short frames of \"{}\" sound as it is; MKV can",
                                  ShortName(format), avcodec_get_name(sound.codec_id)));
}

/// What an output loses of a file of subtitles that holds this stream.
std::optional<NotCarried> LostOfFile(const StreamInfo& stream, const Request& request,
                                     const FileFormatInfo& format) {
    if (std::string reason = WhySubtitlesStay(stream, format); !reason.empty())
        return NotCarried{"subtitles", std::nullopt, stream.codec, stream.language, std::move(reason)};
    return LostLabel(stream, request, format);
}

/// What `read` gives, with its errors as failures.
template <class Function>
auto& OpenedBeside(Function read) {
    try {
        return read();
    } catch (const SourceError& error) {
        throw Failure(Category::kRequest, error.what());
    }
}

/// Adds the tracks that are read beside what the engine converts.
class FurtherTracks {
public:
    FurtherTracks(Movie& movie, const Request& request, const FileFormatInfo& format, uint32_t set)
        : movie_(movie), request_(request), format_(format), set_(set) {
        const double begin = request.firstClip ? ToSeconds(request.firstClip->begin) : request.begin;
        movie.SetBounds(begin, request.length.has_value(), request.split.has_value());
    }

    void AddSound(const StreamInfo& stream) {
        if (request_.copySound) {
            CopiedSound& sound = movie_.CopySoundBeside(stream.index);
            tracks_.push_back({{}, &sound, stream, &sound});
            return;
        }
        const SoundPlan plan = PlanSound(request_, format_, *stream.sound);
        WriterTrack track{};
        track.nSampleRate = plan.sampleRate.value_or(stream.sound->sampleRate);
        track.nChannels = plan.channels.value_or(stream.sound->channels);
        track.nBitsPerSample = stream.sound->bitsPerSample;
        track.nBitrate = plan.rate.value_or(0);
        track.nChannelMask = stream.sound->speakers;
        BesideSound& source =
            OpenedBeside([&]() -> BesideSound& { return movie_.ReadSoundBeside(stream.index); });
        tracks_.push_back({track, &source, stream});
    }

    /// Returns what of it is lost.
    std::optional<NotCarried> AddFile(const SubtitleFileWish& wish, const std::string& charset) {
        const AVStream* described = nullptr;
        BesidePackets& source = OpenedBeside(
            [&]() -> BesidePackets& { return movie_.ReadSubtitleFile(wish.path, charset, described); });
        StreamInfo stream;
        stream.kind = StreamKind::kSubtitles;
        stream.codec = avcodec_get_name(described->codecpar->codec_id);
        stream.language = ThreeLetters(wish.language);
        if (WhySubtitlesStay(stream, format_).empty()) {
            WriterTrack track{};
            track.pParameters = described->codecpar;
            tracks_.push_back({track, &source, stream});
        }
        return LostOfFile(stream, request_, format_);
    }

    void AddPackets(const StreamInfo& stream) {
        WriterTrack track{};
        track.pParameters = movie_.StreamOf(stream.index).codecpar;
        BesidePackets& source =
            OpenedBeside([&]() -> BesidePackets& { return movie_.ReadPacketsBeside(stream.index); });
        tracks_.push_back({track, &source, stream});
    }

    /// Hands them to the writer: only now, since what is copied is described by its first packets.
    void Finish(Carried& carried) {
        int number = kWriterTrackFurther;
        for (Track& each : tracks_) {
            if (each.copied != nullptr) {
                const AVCodecParameters& described = OpenedBeside(
                    [&]() -> const AVCodecParameters& { return movie_.DescribeCopied(*each.copied); });
                RequireHoldable(described, format_);
                each.track.pParameters = &described;
            }
            if (each.stream.kind == StreamKind::kSubtitles)
                carried.subtitles.push_back({number, each.stream});
            each.track.pfnNext = TakeNext;
            each.track.pContext = each.source;
            if (MWAddTrack(set_, &each.track) == 0)
                throw std::bad_alloc();
            LabelTrack(each.stream, request_, format_, set_, number++);
        }
    }

private:
    struct Track {
        WriterTrack track;
        BesideTrack* source;
        StreamInfo stream;
        CopiedSound* copied = nullptr;
    };

    Movie& movie_;
    const Request& request_;
    const FileFormatInfo& format_;
    const uint32_t set_;
    std::vector<Track> tracks_;
};

bool CanBeHeard(const StreamInfo& stream) {
    return stream.decodable && stream.sound && stream.sound->sampleRate > 0 && stream.sound->channels > 0;
}

/// Why a stream of sound beside the engine's stays behind; empty when it does not.
std::string WhySoundStays(const SourceInfo& source, const StreamInfo& stream, const FileFormatInfo& format,
                          bool copies) {
    if (format.bHasAudio == 0)
        return fmt::format("{} cannot hold it", ShortName(format));
    if (!HoldsSeveralTracks(format))
        return fmt::format("{} holds one track of sound, MKV and MP4 hold several", ShortName(format));
    if (!CanBeHeard(stream))
        return "it cannot be decoded";
    if (copies && MWCarriesPackets(format.fccFormat, stream.codec.c_str()) == 0)
        return fmt::format("{} cannot hold it as it is", ShortName(format));
    if (source.pictures && !BelongsTo(StreamAt(source, source.pictures->index).programs, stream))
        return "it belongs to another programme";
    return {};
}

/// Hands a cover or an attachment that the format can hold to the writer; a cover after the first one, or of
/// another kind, is a file among others. Empty when it was taken.
std::string CarryStored(const Movie& movie, const StreamInfo& stream, const Request& request,
                        const FileFormatInfo& format, uint32_t set, bool& hasCover) {
    if (stream.kind != StreamKind::kCover && stream.kind != StreamKind::kAttachment)
        return {};
    const bool holdsFiles = (MWGetFormatTraits(format.fccFormat) & kWriterFormatAttachments) != 0;
    if (stream.kind == StreamKind::kCover && hasCover && !holdsFiles)
        return "only one cover is carried";
    const std::vector<uint8_t> data = movie.StoredFile(stream.index);
    const auto size = static_cast<int64_t>(data.size());
    const char* title = request.noMetadata ? "" : stream.title.c_str();
    if (stream.kind == StreamKind::kCover && !hasCover) {
        hasCover = MWSetCover(set, data.data(), size) != 0;
        if (hasCover)
            MWDescribeCover(set, stream.fileName.c_str(), title);
        if (hasCover || !holdsFiles)
            return hasCover ? "" : "it is neither JPEG nor PNG";
    }
    const bool unnamed = stream.kind == StreamKind::kCover && stream.fileName.empty();
    const std::string type = stream.codec == "mjpeg" ? "jpeg" : stream.codec;
    const std::string name = unnamed ? fmt::format("cover-{}.{}", stream.index, type) : stream.fileName;
    const std::string mimeType = unnamed ? fmt::format("image/{}", type) : stream.mimeType;
    const bool taken = MWAddAttachment(set, name.c_str(), mimeType.c_str(), data.data(), size) != 0 &&
                       MWDescribeAttachment(set, title) != 0;
    return taken ? "" : "it has no name or no content";
}

/// What is converted and what was chosen, of a source.
struct Chosen {
    int pictures = -1; ///< Stream numbers, -1 for none.
    int sound = -1;
    std::vector<int> sounds; ///< Wanted ones.
    std::vector<int> subtitles;

    bool noPictures = false; ///< The user wants none.
    bool noSound = false;

    bool Wants(const StreamInfo& stream) const {
        return stream.kind == StreamKind::kPictures    ? !noPictures
               : stream.kind == StreamKind::kSound     ? !noSound && IsAmong(sounds, stream.index)
               : stream.kind == StreamKind::kSubtitles ? IsAmong(subtitles, stream.index)
                                                       : true;
    }
};

/// Empty when the format can hold the stream, or it is of a kind of which the source itself tells.
std::string WhyItStays(const SourceInfo& source, const Chosen& chosen, const StreamInfo& stream,
                       const FileFormatInfo& format, bool copies) {
    const uint32_t traits = MWGetFormatTraits(format.fccFormat);
    switch (stream.kind) {
    case StreamKind::kPictures:
        if (chosen.pictures == stream.index || format.bHasVideo == 0)
            return {};
        return chosen.pictures < 0 ? "it cannot be decoded" : "one stream of pictures is converted";
    case StreamKind::kSound:
        if (format.bHasAudio != 0 && (chosen.sound < 0 ? CanBeHeard(stream) : chosen.sound == stream.index))
            return {};
        return WhySoundStays(source, stream, format, copies);
    case StreamKind::kSubtitles:
        return WhySubtitlesStay(stream, format);
    case StreamKind::kData:
        return stream.holdsChapters || HoldsTheTimecode(source, stream) ? ""
                                                                        : "data streams are not converted";
    case StreamKind::kCover:
        if ((traits & kWriterFormatCover) == 0)
            return fmt::format("{} cannot hold it", ShortName(format));
        return format.fccFormat == FourCC("FLAC") && stream.bytes > kLargestCoverInFlac
                   ? fmt::format("{} cannot hold one of {} bytes", ShortName(format), stream.bytes)
                   : "";
    case StreamKind::kAttachment:
        return (traits & kWriterFormatAttachments) != 0 ? ""
                                                        : fmt::format("{} cannot hold it", ShortName(format));
    }
    return {};
}

/// What the name of a file of subtitles says of its codec.
std::string UsualTextCodec(const std::string& path) {
    const std::size_t dot = path.rfind('.');
    const std::string extension = dot == std::string::npos ? "" : path.substr(dot + 1);
    return SameIgnoringCase(extension, "ass") || SameIgnoringCase(extension, "ssa") ? "ass"
           : SameIgnoringCase(extension, "vtt")                                     ? "webvtt"
                                                                                    : "subrip";
}

/// Nothing for subtitles of a file of their own.
std::optional<int> NumberOf(const StreamInfo& stream) {
    return stream.index >= 0 ? std::optional(stream.index) : std::nullopt;
}

NotCarried LeftOf(const StreamInfo& stream, std::string reason) {
    const std::string& what = stream.codec == "none" ? stream.fileName : stream.codec;
    return {std::string(KindName(stream.kind)), NumberOf(stream), what, stream.language, std::move(reason)};
}

/// Without what is drawn into the pictures, unless it is asked for by name.
std::vector<int> SubtitlesToCarry(const SourceInfo& source, const Request& request) {
    std::vector<int> wanted = WantedTracks(source.streams, StreamKind::kSubtitles, request.subtitles);
    if (!request.subtitles)
        wanted.erase(
            std::remove_if(wanted.begin(), wanted.end(),
                           [&](int stream) { return std::to_string(stream) == request.burnSubtitles; }),
            wanted.end());
    return wanted;
}

Chosen ChosenOf(const SourceInfo& source, const Request& request) {
    return {source.pictures ? source.pictures->index : -1,
            source.sound ? source.sound->index : -1,
            WantedTracks(source.streams, StreamKind::kSound, request.audioTracks),
            SubtitlesToCarry(source, request),
            request.noVideo,
            request.noAudio};
}

/// What goes into the output beside what the engine converts.
std::vector<int> StreamsBeside(const SourceInfo& source, const Chosen& chosen, const Request& request,
                               const FileFormatInfo& format) {
    std::vector<int> beside;
    if (request.copySound && source.sound && format.bHasAudio != 0)
        beside.push_back(source.sound->index);
    for (const int stream : FurtherSound(source, request, format))
        beside.push_back(stream);
    for (const int stream : chosen.subtitles)
        if (WhySubtitlesStay(StreamAt(source, stream), format).empty())
            beside.push_back(stream);
    return beside;
}

/// What no output holds of chapters: what FFmpeg does not read, and what has no place in the movie.
void AddLostChapters(const SourceInfo& source, const Request& request, std::vector<NotCarried>& left) {
    if (request.noChapters)
        return;
    const auto tell = [&](std::string reason) {
        left.push_back({"chapters", std::nullopt, {}, {}, std::move(reason)});
    };
    const auto add = [&](int count, const char* what) {
        if (count > 0)
            tell(fmt::format("{} of them {}", count, what));
    };
    add(source.unreadChapters, "are in other editions or within others");
    add(source.disorderedChapters, "are out of their order in time");
    add(ChaptersOutside(source), "lie outside the movie");
    add(source.furtherTitles, "have titles in further languages");
    if (std::string names = FurtherChapterTexts(source); !names.empty() && !request.noMetadata)
        tell(fmt::format("of their texts only the titles are carried, not {}", names));
}

/// Of the one cover that is carried.
std::optional<NotCarried> LostCoverTitle(const SourceInfo& source, const Request& request,
                                         const FileFormatInfo& format) {
    const uint32_t traits = MWGetFormatTraits(format.fccFormat);
    const auto cover =
        std::find_if(source.streams.begin(), source.streams.end(),
                     [](const StreamInfo& stream) { return stream.kind == StreamKind::kCover; });
    if (cover == source.streams.end() || cover->title.empty() || request.noMetadata ||
        (traits & kWriterFormatCover) == 0 || (traits & kWriterFormatCoverText) != 0)
        return std::nullopt;
    return NotCarried{"label",
                      cover->index,
                      cover->codec,
                      {},
                      fmt::format("{} cannot hold its {}", ShortName(format), "title")};
}

/// Texts, labels and chapters that the format has no room for.
std::vector<NotCarried> LostByFormat(const SourceInfo& source, const std::vector<int>& beside,
                                     const Request& request, const FileFormatInfo& format) {
    std::vector<NotCarried> left = LostTexts(source, request, format);
    if (std::optional<NotCarried> chapters = WhyChaptersStay(source, request, format))
        left.push_back(*std::move(chapters));
    else
        AddLostChapters(source, request, left);
    if (std::optional<NotCarried> timecode = WhyTimecodeStays(source, request, format))
        left.push_back(*std::move(timecode));
    for (const int stream : beside)
        if (std::optional<NotCarried> lost = LostLabel(StreamAt(source, stream), request, format))
            left.push_back(std::move(*lost));
    if (std::optional<NotCarried> title = LostCoverTitle(source, request, format))
        left.push_back(*std::move(title));
    return left;
}

} // namespace

std::vector<int> FurtherSound(const SourceInfo& source, const Request& request,
                              const FileFormatInfo& format) {
    std::vector<int> further;
    const std::vector<int> wanted = WantedTracks(source.streams, StreamKind::kSound, request.audioTracks);
    for (const StreamInfo& stream : source.streams)
        if (source.sound && IsAmong(wanted, stream.index) && stream.kind == StreamKind::kSound &&
            stream.index != source.sound->index &&
            WhySoundStays(source, stream, format, request.copySound).empty())
            further.push_back(stream.index);
    return further;
}

Carried CarryOver(Movie& movie, const Request& request, const FileFormatInfo& format, uint32_t writerSet) {
    const SourceInfo& source = movie.Info();
    const Chosen chosen = ChosenOf(source, request);
    const std::vector<int> beside = StreamsBeside(source, chosen, request, format);
    CarryTexts(source, request, format, writerSet);
    Carried carried{{}, LostByFormat(source, beside, request, format)};
    std::vector<NotCarried>& left = carried.left;
    if (!request.noChapters && !WhyChaptersStay(source, request, format))
        if (const int wrong = CarryChapters(source, request, format, writerSet); wrong != 0)
            left.push_back(
                {"chapters", std::nullopt, {}, {}, fmt::format("{} of them have no length", wrong)});
    FurtherTracks tracks(movie, request, format, writerSet);
    for (const int number : beside) {
        const StreamInfo& stream = StreamAt(source, number);
        if (stream.kind == StreamKind::kSound)
            tracks.AddSound(stream);
        else
            tracks.AddPackets(stream);
    }
    for (const SubtitleFileWish& wish : request.subtitleFiles)
        if (std::optional<NotCarried> lost = tracks.AddFile(wish, request.subtitleCharset))
            left.push_back(std::move(*lost));
    tracks.Finish(carried);
    bool hasCover = false;
    for (const StreamInfo& stream : source.streams) {
        if (!chosen.Wants(stream))
            continue;
        std::string reason = WhyItStays(source, chosen, stream, format, request.copySound);
        if (reason.empty())
            reason = CarryStored(movie, stream, request, format, writerSet, hasCover);
        if (!reason.empty())
            left.push_back(LeftOf(stream, std::move(reason)));
    }
    return carried;
}

std::vector<NotCarried> LostCues(const std::vector<Carried::Subtitles>& subtitles, uint32_t writerSet) {
    std::vector<NotCarried> lost;
    for (const auto& [track, stream] : subtitles)
        if (const int64_t count = MWGetLostCues(writerSet, track); count > 0)
            lost.push_back(
                LeftOf(stream, count == 1 ? "one of their texts could not be converted"
                                          : fmt::format("{} of their texts could not be converted", count)));
    return lost;
}

std::vector<NotCarried> ForetellLeftBehind(const SourceInfo& source, const Request& request,
                                           const FileFormatInfo& format) {
    const Chosen chosen = ChosenOf(source, request);
    std::vector<NotCarried> left =
        LostByFormat(source, StreamsBeside(source, chosen, request, format), request, format);
    for (const SubtitleFileWish& wish : request.subtitleFiles) {
        StreamInfo stream;
        stream.kind = StreamKind::kSubtitles;
        stream.codec = UsualTextCodec(wish.path);
        stream.language = ThreeLetters(wish.language);
        if (std::optional<NotCarried> lost = LostOfFile(stream, request, format))
            left.push_back(std::move(*lost));
    }
    for (const StreamInfo& stream : source.streams)
        if (chosen.Wants(stream))
            if (std::string reason = WhyItStays(source, chosen, stream, format, request.copySound);
                !reason.empty())
                left.push_back(LeftOf(stream, std::move(reason)));
    return left;
}

} // namespace movieconv
