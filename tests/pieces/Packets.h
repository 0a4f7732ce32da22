// What stands in a movie, packet by packet.
#ifndef MOVIECONV_TESTS_PIECES_PACKETS_H
#define MOVIECONV_TESTS_PIECES_PACKETS_H

#include "ffmpeg/AvHandles.h"

extern "C" {
#include <libavutil/avstring.h>
}

#include <fmt/format.h>

#include <algorithm>
#include <cstdint>
#include <string>
#include <vector>

namespace packets {

constexpr int kEmptyText = 2; // bytes, which tell its length

inline std::size_t HashOf(const uint8_t* data, std::size_t size) {
    return std::hash<std::string>()(std::string(reinterpret_cast<const char*>(data), size));
}

/// A line for each text but the one that names the multiplexer's version.
inline void AddTags(std::vector<std::string>& lines, const std::string& whose, const AVDictionary* tags) {
    for (const AVDictionaryEntry* tag = nullptr;
         (tag = av_dict_get(tags, "", tag, AV_DICT_IGNORE_SUFFIX)) != nullptr;)
        if (av_match_name(tag->key, "encoder,software") == 0) // in AVI
            lines.push_back(fmt::format("{} {}={}", whose, tag->key, tag->value));
}

/// A line for each packet, by stream: its times, what is to be skipped of it, and what sound and cues hold;
/// before them one for each chapter, track and tag. Pictures are encoded anew in each piece, so that their
/// bytes may differ.
inline std::vector<std::string> Of(const std::string& path) {
    AVFormatContext* context = nullptr;
    if (avformat_open_input(&context, path.c_str(), nullptr, nullptr) < 0)
        return {"not a movie"};
    const av::Input movie(context);
    std::vector<std::string> lines;
    AddTags(lines, "tag", context->metadata);
    for (unsigned i = 0; i < context->nb_chapters; ++i) {
        const AVChapter& chapter = *context->chapters[i];
        lines.push_back(fmt::format("chapter {} {}", chapter.start, chapter.end));
        AddTags(lines, "chapter's tag", chapter.metadata);
    }
    for (unsigned i = 0; i < context->nb_streams; ++i) {
        const AVStream& stream = *context->streams[i];
        lines.push_back(fmt::format("{} track of {} disposition {:x}", i,
                                    avcodec_get_name(stream.codecpar->codec_id), stream.disposition));
        AddTags(lines, fmt::format("{} tag", i), stream.metadata);
    }
    const av::Packet packet = av::NewPacket();
    while (av_read_frame(context, packet.get()) >= 0) {
        const AVStream& stream = *context->streams[packet->stream_index];
        if (stream.codecpar->codec_id == AV_CODEC_ID_MOV_TEXT && packet->size <= kEmptyText) {
            av_packet_unref(packet.get()); // the time between two texts may be told in parts
            continue;
        }
        std::size_t content = 0;
        if (stream.codecpar->codec_type != AVMEDIA_TYPE_VIDEO)
            content = HashOf(packet->data, static_cast<std::size_t>(packet->size));
        std::size_t skipSize = 0;
        const uint8_t* skip = av_packet_get_side_data(packet.get(), AV_PKT_DATA_SKIP_SAMPLES, &skipSize);
        lines.push_back(fmt::format("{} pts {:8} dts {:8} lasts {} skips {:x} holds {:x}",
                                    packet->stream_index, packet->pts, packet->dts, packet->duration,
                                    skip != nullptr ? HashOf(skip, skipSize) : 0, content));
        av_packet_unref(packet.get());
    }
    std::stable_sort(lines.begin(), lines.end(),
                     [](const std::string& one, const std::string& other) { return one[0] < other[0]; });
    return lines;
}

/// The first lines in which two movies differ; empty when they are alike.
inline std::string Difference(const std::string& one, const std::string& other) {
    const std::vector<std::string> left = Of(one);
    const std::vector<std::string> right = Of(other);
    const auto [here, there] = std::mismatch(left.begin(), left.end(), right.begin(), right.end());
    if (here == left.end() && there == right.end())
        return {};
    const std::string end = "its end";
    return fmt::format("{} against {}", here != left.end() ? *here : end,
                       there != right.end() ? *there : end);
}

} // namespace packets

#endif
