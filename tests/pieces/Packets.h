// What stands in a movie, packet by packet.
#ifndef MOVIECONV_TESTS_PIECES_PACKETS_H
#define MOVIECONV_TESTS_PIECES_PACKETS_H

#include "ffmpeg/AvHandles.h"

#include <fmt/format.h>

#include <algorithm>
#include <cstdint>
#include <string>
#include <vector>

namespace packets {

/// A line for each packet, by stream: its times, and what sound holds. Pictures are encoded anew in each
/// piece, so that their bytes may differ.
inline std::vector<std::string> Of(const std::string& path) {
    AVFormatContext* context = nullptr;
    if (avformat_open_input(&context, path.c_str(), nullptr, nullptr) < 0)
        return {"not a movie"};
    const av::Input movie(context);
    std::vector<std::string> lines;
    for (unsigned i = 0; i < context->nb_chapters; ++i)
        lines.push_back(fmt::format("chapter {} {}", context->chapters[i]->start, context->chapters[i]->end));
    const av::Packet packet = av::NewPacket();
    while (av_read_frame(context, packet.get()) >= 0) {
        const AVStream& stream = *context->streams[packet->stream_index];
        std::size_t content = 0;
        if (stream.codecpar->codec_type != AVMEDIA_TYPE_VIDEO)
            content = std::hash<std::string>()(std::string(reinterpret_cast<const char*>(packet->data),
                                                           static_cast<std::size_t>(packet->size)));
        lines.push_back(fmt::format("{} pts {:8} dts {:8} lasts {} holds {:x}", packet->stream_index,
                                    packet->pts, packet->dts, packet->duration, content));
        av_packet_unref(packet.get());
    }
    std::stable_sort(lines.begin(), lines.end(),
                     [](const std::string& one, const std::string& other) { return one[0] < other[0]; });
    return lines;
}

} // namespace packets

#endif
