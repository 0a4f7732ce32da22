#include "host/source/KeySeeker.h"

#include "host/source/MediaTime.h"
#include "host/source/PacketTime.h"

#include <cmath>
#include <string_view>

namespace movieconv {
namespace {

constexpr double kPreroll = 0.2;     // codecs need a little before the first good sample
constexpr int kProbedPackets = 2000; // read to find the picture where decoding can begin

bool IsKey(const AVPacket& packet) {
    return (packet.flags & AV_PKT_FLAG_KEY) != 0;
}

} // namespace

bool KeySeeker::Seek(double seconds) {
    return source_.Reader().IsSeekable() && (SeekBefore(seconds) || source_.Reader().Rewind());
}

bool KeySeeker::IsBeforeKey(const AVPacket& packet) {
    if (!awaitsKey_ || packet.stream_index != source_.Info().pictures->index)
        return false;
    awaitsKey_ = !IsKey(packet);
    return awaitsKey_;
}

/// Whether FFmpeg gives other stamps where it seeks than where it reads on.
bool KeySeeker::SeeksAstray() const {
    const std::string_view container = source_.Reader().Context()->iformat->name;
    if (container != "ogg" || source_.SoundStream() == nullptr)
        return container == "ogg";
    const AVCodecID sound = source_.SoundStream()->codecpar->codec_id;
    return source_.PictureStream() != nullptr || (sound != AV_CODEC_ID_VORBIS && sound != AV_CODEC_ID_OPUS);
}

/// Containers seek by decoding order or land beside a key picture, so it goes back until one lies before.
/// False when there is none after the source's start.
bool KeySeeker::SeekBefore(double seconds) {
    AVFormatContext* context = source_.Reader().Context();
    const int64_t start = context->start_time != AV_NOPTS_VALUE ? context->start_time : 0;
    double back = kPreroll;
    while (back < seconds && !SeeksAstray()) {
        const int64_t target = start + std::llround((seconds - back) * AV_TIME_BASE);
        const auto seek = [&] { return avformat_seek_file(context, -1, INT64_MIN, target, target, 0) >= 0; };
        if (!seek())
            return false;
        moved_ = true;
        if (KeyPictureAtOrBefore(ToMediaTime(seconds))) {
            awaitsKey_ = source_.PictureStream() != nullptr;
            return seek();
        }
        back = 2 * back + 1;
    }
    return false;
}

/// Whether the first key picture from here on is shown at `mediaTime` or earlier. True without a picture
/// stream.
bool KeySeeker::KeyPictureAtOrBefore(int64_t mediaTime) {
    const AVStream* pictures = source_.PictureStream();
    if (pictures == nullptr)
        return true;
    const av::Packet packet = av::NewPacket();
    for (int i = 0; i < kProbedPackets && av_read_frame(source_.Reader().Context(), packet.get()) >= 0; ++i) {
        const bool isKeyPicture = packet->stream_index == pictures->index && IsKey(*packet);
        const int64_t stamp = StampOf(*packet);
        av_packet_unref(packet.get());
        if (isKeyPicture)
            return stamp == AV_NOPTS_VALUE ||
                   source_.Reader().MediaTime(stamp, pictures->time_base) <= mediaTime;
    }
    return false;
}

} // namespace movieconv
