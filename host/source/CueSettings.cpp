#include "host/source/CueSettings.h"

#include "ffmpeg/AvHandles.h"

#include <algorithm>
#include <new>
#include <string>
#include <string_view>

extern "C" {
#include <libavutil/intreadwrite.h>
}

namespace movieconv {
namespace {

void AddSideData(AVPacket& packet, AVPacketSideDataType type, const std::string& text) {
    if (text.empty())
        return;
    uint8_t* data = av_packet_new_side_data(&packet, type, text.size());
    if (data == nullptr)
        throw std::bad_alloc();
    std::copy(text.begin(), text.end(), data);
}

/// The first line of `text`, which is taken off it.
std::string TakeLine(std::string_view& text) {
    const std::size_t length = std::min(text.find('\n'), text.size());
    std::string line(text.substr(0, length));
    if (!line.empty() && line.back() == '\r')
        line.pop_back();
    text.remove_prefix(std::min(length + 1, text.size()));
    return line;
}

} // namespace

void TakeCueSettings(AVPacket& packet) {
    constexpr std::size_t kNumber = 8; // bytes in front, which tell the addition among others
    constexpr uint64_t kOfCues = 1;
    std::size_t size = 0;
    const uint8_t* data = av_packet_get_side_data(&packet, AV_PKT_DATA_MATROSKA_BLOCKADDITIONAL, &size);
    if (data == nullptr || size < kNumber || AV_RB64(data) != kOfCues)
        return;
    std::string_view text(reinterpret_cast<const char*>(data) + kNumber, size - kNumber);
    const std::string settings = TakeLine(text);
    const std::string name = TakeLine(text); // comments follow
    AddSideData(packet, AV_PKT_DATA_WEBVTT_SETTINGS, settings);
    AddSideData(packet, AV_PKT_DATA_WEBVTT_IDENTIFIER, name);
}

} // namespace movieconv
