#include "host/source/CropDetection.h"

#include "ffmpeg/FilterGraph.h"
#include "ffmpeg/FilterLibrary.h"
#include "host/sentence/Say.h"
#include "host/source/StreamDecoder.h"

#include <algorithm>
#include <cmath>
#include <cstdlib>
#include <filesystem>
#include <system_error>
#include <utility>

extern "C" {
#include <libavutil/dict.h>
}

namespace movieconv {
namespace {

constexpr int kLooks = 20;
constexpr int kMostPackets = 200; // from a key picture to what comes out of the decoder

// Joins what is not black from one picture to the next.
constexpr char kDetector[] = "cropdetect=limit=0.094:round=2:skip=0:reset=0";

/// The first picture from the key picture at or before `seconds`; null when there is none.
av::Frame LookAt(PacketReader& reader, int stream, double seconds) {
    AVFormatContext* context = reader.Context();
    const int64_t start = context->start_time != AV_NOPTS_VALUE ? context->start_time : 0;
    const int64_t target = start + std::llround(seconds * AV_TIME_BASE);
    if (avformat_seek_file(context, -1, INT64_MIN, target, INT64_MAX, 0) < 0)
        return nullptr;
    const AVStream* pictures = context->streams[stream];
    StreamDecoder decoder(*pictures->codecpar, pictures->time_base, 1);
    av::Frame found;
    const auto take = [&](AVFrame& frame) {
        found = av::NewFrame();
        av_frame_move_ref(found.get(), &frame);
        return false;
    };
    const av::Packet packet = av::NewPacket();
    for (int count = 0; !found && count < kMostPackets && av_read_frame(context, packet.get()) >= 0;
         ++count) {
        if (packet->stream_index == stream)
            decoder.Decode(packet.get(), take);
        av_packet_unref(packet.get());
    }
    if (!found)
        decoder.Decode(nullptr, take);
    return found;
}

int Figure(const AVFrame& picture, const char* key) {
    const AVDictionaryEntry* entry = av_dict_get(picture.metadata, key, nullptr, 0);
    return entry != nullptr ? std::atoi(entry->value) : 0;
}

/// What the detector has found so far; nothing while all is black.
std::optional<Crop> Found(const AVFrame& picture) {
    const int width = Figure(picture, "lavfi.cropdetect.w");
    const int height = Figure(picture, "lavfi.cropdetect.h");
    const int left = Figure(picture, "lavfi.cropdetect.x");
    const int top = Figure(picture, "lavfi.cropdetect.y");
    if (width <= 0 || height <= 0)
        return std::nullopt;
    return Crop{top, picture.height - top - height, left, picture.width - left - width};
}

/// The same of the picture as it is shown.
Crop Upright(Crop crop, const PictureStreamInfo& pictures) {
    if (pictures.mirrored)
        std::swap(crop.left, crop.right);
    for (int turn = 0; turn < pictures.quarterTurns; ++turn)
        crop = {crop.left, crop.right, crop.bottom, crop.top};
    return crop;
}

} // namespace

bool CanBeLookedAtBefore(const std::string& path) {
    std::error_code unknown;
    return std::filesystem::is_regular_file(path, unknown);
}

std::optional<Crop> FindBorders(Source& source) {
    if (!source.Info().pictures || !source.Reader().IsSeekable())
        return std::nullopt;
    const PictureStreamInfo& pictures = *source.Info().pictures;
    std::optional<av::FilterGraph> graph;
    std::optional<Crop> borders;
    try {
        for (int look = 0; look < kLooks; ++look) {
            const double part = (look + 0.5) / kLooks;
            const av::Frame picture = LookAt(source.Reader(), pictures.index, source.Info().duration * part);
            if (picture && !graph)
                graph.emplace(*picture, kDetector);
            if (!picture || !graph->Fits(*picture))
                continue;
            picture->pts = look;
            graph->Push(*picture);
            while (const av::Frame seen = graph->Take())
                borders = Found(*seen);
        }
    } catch (const av::FilterError& error) {
        throw SourceError(Say("its borders cannot be looked for: {}", WordsOf(error)));
    }
    return borders ? std::optional(Upright(*borders, pictures)) : std::nullopt;
}

} // namespace movieconv
