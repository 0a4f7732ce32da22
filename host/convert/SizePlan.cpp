#include "host/convert/SizePlan.h"

#include "api/MovieConv.h"
#include "host/convert/Amounts.h"
#include "host/convert/CarryPlan.h"
#include "host/convert/CodecPlan.h"
#include "host/convert/EncodePlan.h"
#include "host/convert/Failure.h"
#include "host/convert/Formats.h"
#include "host/sentence/Say.h"
#include "media/FourCC.h"
#include "media/Limits.h"
#include "writer/WriterStatus.h"

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <numeric>
#include <vector>

namespace movieconv {
namespace {

// Encoders keep to a rate on the whole only: what they may exceed it by is left free.
constexpr double kSoundSpread = 1.15;
constexpr double kBufferSeconds = 2;    // of pictures, ahead of their rate
constexpr double kLeastSoundBits = 0.5; // a sample and channel, below which the encoders do not go
constexpr double kMostSoundShare = 0.25;
constexpr double kLeastPictureRate = 4000;

// What a container adds.
constexpr double kHeadBits = 16384 * 8;
constexpr double kPacketBits = 48 * 8;
constexpr double kShare = 0.96;
constexpr double kPacketStreamShare = 0.85; // of formats that cut all into small packets

bool IsAmong(uint32_t code, std::initializer_list<uint32_t> codes) {
    return std::find(codes.begin(), codes.end(), code) != codes.end();
}

/// Bits per pixel below which pictures had better be smaller.
double LeastBitsPerPixel(uint32_t codec) {
    constexpr double kModern = 0.04;
    constexpr double kOld = 0.15;
    return IsAmong(codec, {FourCC("H264"), FourCC("HEVC"), FourCC("VP90"), FourCC("AV01")}) ? kModern : kOld;
}

bool IsLossless(uint32_t soundCodec) {
    return IsAmong(soundCodec, {FourCC("PCM "), FourCC("FLAC"), FourCC("ALAC")});
}

double UncodedRate(const SoundCoding& plan, const SoundStreamInfo& source) {
    return static_cast<double>(plan.sampleRate.value_or(source.sampleRate)) *
           plan.channels.value_or(source.channels) * source.bitsPerSample;
}

/// Bits per second of a stream of sound in the output; 0 where what is heard decides them.
double SoundRate(const Request& request, const FileFormatInfo& format, const SoundStreamInfo& sound,
                 int64_t codedRate) {
    if (request.copySound)
        return static_cast<double>(codedRate);
    const SoundCoding plan = PlanSound(request, format, sound);
    if (plan.codec == FourCC("PCM "))
        return UncodedRate(plan, sound);
    return IsLossless(plan.codec) ? 0 : plan.rate.value_or(kUsualAudioBitrate);
}

/// Of all tracks.
std::optional<double> SoundRates(const Request& request, const FileFormatInfo& format,
                                 const SourceInfo& source) {
    const auto streamOf = [&](int index) -> const StreamInfo& {
        return source.streams.at(static_cast<std::size_t>(index));
    };
    std::vector<double> rates{
        SoundRate(request, format, *source.sound, streamOf(source.sound->index).bitRate)};
    for (const int index : CarryPlan(source, request, format).FurtherSound())
        rates.push_back(SoundRate(request, format, streamOf(index).sound.value(), streamOf(index).bitRate));
    if (std::find(rates.begin(), rates.end(), 0) != rates.end())
        return std::nullopt;
    return std::accumulate(rates.begin(), rates.end(), 0.0);
}

/// Sets the sound's rate, `share` at most where that is enough; what it can take at most, in bits per second.
double FitSound(Request& request, const FileFormatInfo& format, const SoundStreamInfo& source, double share) {
    SoundCoding plan = PlanSound(request, format, source);
    const double sampleRate = plan.sampleRate.value_or(source.sampleRate);
    if (IsLossless(plan.codec))
        return UncodedRate(plan, source);
    const double least = kLeastSoundBits * sampleRate;
    if (!request.channels && share < least * plan.channels.value_or(source.channels)) {
        request.channels = share < least * 2 ? 1 : std::min(2, source.channels);
        plan = PlanSound(request, format, source);
    }
    const double floor = least * plan.channels.value_or(source.channels);
    const double rate =
        std::max(floor, std::min(share, static_cast<double>(plan.rate.value_or(kUsualAudioBitrate))));
    request.audioRate = static_cast<int32_t>(rate);
    return rate * kSoundSpread;
}

void FitPictures(Request& request, const FileFormatInfo& format, const PictureStreamInfo& source,
                 double rate) {
    request.videoRate = static_cast<int32_t>(std::min<double>(rate, INT32_MAX));
    request.videoMaxRate = request.videoRate;
    const PictureCoding plan = PlanPictures(request, format, source);
    if (request.size)
        return;
    const Size size = plan.size.value_or(Size{source.width, source.height});
    const double pixels =
        static_cast<double>(size.width) * size.height * plan.frameRate.value_or(source.frameRate);
    const double factor = std::sqrt(rate / std::max(pixels, 1.0) / LeastBitsPerPixel(plan.codec));
    if (factor >= 1)
        return;
    static constexpr int32_t kLeastLength = 64; // what every encoder takes
    const auto shorter = [factor](int32_t length) {
        return std::min(length, std::max(kLeastLength, static_cast<int32_t>(length * factor / 2) * 2));
    };
    request.size = Size{shorter(size.width), shorter(size.height)};
}

/// Bytes of the covers and attached files that go into the output as they are.
int64_t StoredBytes(const Request& request, const FileFormatInfo& format, const SourceInfo& source) {
    const CarryPlan plan(source, request, format);
    int64_t bytes = 0;
    bool hasCover = false;
    for (const StreamInfo& stream : source.streams) {
        const bool isCover = stream.kind == StreamKind::kCover;
        const bool isOneTooMany = isCover && hasCover && !Has(format, kWriterFormatAttachments);
        if ((isCover || stream.kind == StreamKind::kAttachment) && !isOneTooMany &&
            plan.WhyItStays(stream).IsEmpty()) {
            bytes += stream.bytes;
            hasCover = hasCover || isCover;
        }
    }
    return bytes;
}

double SamplesPerPacket(const Request& request, const FileFormatInfo& format, const SourceInfo& source) {
    const auto isAc3 = [&] {
        if (!request.copySound)
            return PlanSound(request, format, *source.sound).codec == FourCC("AC3 ");
        const std::string& codec = source.streams.at(static_cast<std::size_t>(source.sound->index)).codec;
        return codec == "ac3" || codec == "eac3";
    };
    return isAc3() ? 1536 : 1024; // other codecs have about as many
}

/// The converted sound and what goes along with it.
double SoundTracks(const Request& request, const FileFormatInfo& format, const SourceInfo& source) {
    return static_cast<double>(1 + CarryPlan(source, request, format).FurtherSound().size());
}

/// Packets a second of pictures and sound.
double PacketRate(const Request& request, const FileFormatInfo& format, const SourceInfo& source,
                  double pictureRate) {
    const bool pictures = source.pictures && format.bHasVideo != 0;
    const bool sound = source.sound && format.bHasAudio != 0;
    const double perTrack = sound ? source.sound->sampleRate / SamplesPerPacket(request, format, source) : 0;
    return (pictures ? pictureRate : 0) + SoundTracks(request, format, source) * perTrack;
}

/// What becomes of so many bytes a second in a format that cuts all into small packets.
double InSmallPackets(const FileFormatInfo& format, double bytes, double packets) {
    constexpr double kPackBytes = 2048; // of a program stream
    constexpr double kPackContent = 2019;
    constexpr double kContent = 184;     // of a transport stream's packet
    constexpr double kHead = 14;         // of a picture or a piece of sound, whose last packet is half empty
    constexpr double kTables = 20 * 184; // ten times a second two tables, a packet each
    if (format.fccFormat == FourCC("MPG "))
        return bytes * kPackBytes / kPackContent;
    const double packet = format.fccFormat == FourCC("M2TS") ? 192 : 188;
    return (bytes + packets * (kHead + kContent / 2) + kTables) * packet / kContent;
}

} // namespace

Request FitIntoSize(Request request, const SourceInfo& source) {
    if (!request.maxSize)
        return request;
    const FileFormatInfo& format = ChooseFormat(request);
    if (source.certainty == Certainty::kGuessed && !request.length) {
        throw Failure(Category::kRequest, Say("\"{}\" does not tell how long it is", request.input),
                      Reason::kUnknownLength);
    }
    const double length = std::max(LengthToConvert(request, source), 0.001);
    const bool pictures = source.pictures && format.bHasVideo != 0;
    const bool sound = source.sound && format.bHasAudio != 0;
    if (pictures && !QualityRangeOf(PictureCodecFor(request, format)))
        throw Failure(Category::kRequest, Say("a codec without a bit rate cannot keep below a size"));
    const bool packets = Has(format, kWriterFormatSmallPackets);
    const double tracks = SoundTracks(request, format, source);
    const double packetRate = PacketRate(request, format, source, pictures ? source.pictures->peakRate : 0);
    const int64_t room = *request.maxSize - StoredBytes(request, format, source);
    const double free = static_cast<double>(room) * 8 * (packets ? kPacketStreamShare : kShare) - kHeadBits -
                        packetRate * length * kPacketBits;
    const double share = free / length * (pictures ? kMostSoundShare : 1 / kSoundSpread) / tracks;
    const double soundRate = sound ? tracks * FitSound(request, format, *source.sound, share) : 0;
    const double pictureRate = (free - soundRate * length) / (length + kBufferSeconds);
    if (pictureRate < (pictures ? kLeastPictureRate : -1)) { // sound alone takes all but what rounding leaves
        throw Failure(Category::kRequest,
                      Say("{} are too little for {}", SayAmount(FormatBytes(*request.maxSize)),
                          FormatTime(length, true)));
    }
    if (pictures)
        FitPictures(request, format, *source.pictures, pictureRate);
    return request;
}

std::optional<int64_t> NeededBytes(EncodeParam param, const Request& request, const SourceInfo& source,
                                   double length) {
    const FileFormatInfo& format = ChooseFormat(request);
    if (!HasRates(request, format, source))
        return std::nullopt;
    if (param.bNoAudio == 0) {
        const std::optional<double> rate = SoundRates(request, format, source);
        if (!rate)
            return std::nullopt;
        const double tracks = *rate / std::max(1, int32_t{param.nAudioBitrate});
        param.nAudioBitrate = static_cast<int32_t>(std::min<double>(*rate, INT32_MAX));
        param.nAudioMaxBitrate =
            static_cast<int32_t>(std::min<double>(param.nAudioMaxBitrate * tracks, INT32_MAX));
    }
    int64_t bytes = MCGetEstimateDiskSpaceEx(&param, length);
    if (Has(format, kWriterFormatSmallPackets) && length > 0) {
        const double pictureRate = source.pictures ? PlanPictures(request, format, *source.pictures)
                                                         .frameRate.value_or(source.pictures->frameRate)
                                                   : 0;
        const double rate = InSmallPackets(format, static_cast<double>(bytes) / length,
                                           PacketRate(request, format, source, pictureRate));
        bytes = std::llround(rate * length);
    }
    return bytes + StoredBytes(request, format, source);
}

Sentence TellSize(const Request& fitted) {
    const Sentence most = SayAmount(FormatBytes(fitted.maxSize.value_or(0)));
    Sentence pictures;
    if (fitted.videoRate)
        pictures = fitted.size ? Say("pictures at {} kbit/s in {}x{}", *fitted.videoRate / 1000,
                                     fitted.size->width, fitted.size->height)
                               : Say("pictures at {} kbit/s", *fitted.videoRate / 1000);
    const Sentence sound =
        fitted.audioRate ? Say("sound at {} kbit/s", *fitted.audioRate / 1000) : Sentence();
    if (fitted.videoRate && fitted.audioRate)
        return Say("to keep below {}: {}, {}", most, pictures, sound);
    return fitted.videoRate || fitted.audioRate
               ? Say("to keep below {}: {}", most, fitted.videoRate ? pictures : sound)
               : Say("to keep below {}:", most);
}

} // namespace movieconv
