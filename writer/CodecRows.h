// The codecs that can be written, one row each. Whoever looks for one asks the format table.
#ifndef MOVIECONV_WRITER_CODECROWS_H
#define MOVIECONV_WRITER_CODECROWS_H

#include "media/FourCC.h"
#include "writer/FormatTable.h"

#include <cstdint>
#include <span>

namespace writer {

constexpr uint32_t kXvid = FourCC("XVID");
constexpr uint32_t kH264 = FourCC("H264");
constexpr uint32_t kHevc = FourCC("HEVC");
constexpr uint32_t kMjpg = FourCC("MJPG");
constexpr uint32_t kVp8 = FourCC("VP80");
constexpr uint32_t kVp9 = FourCC("VP90");
constexpr uint32_t kAv1 = FourCC("AV01");
constexpr uint32_t kFfv1 = FourCC("FFV1");
constexpr uint32_t kMpeg2 = FourCC("MPG2");
constexpr uint32_t kFlv1 = FourCC("FLV1");
constexpr uint32_t kGif = FourCC("GIF ");
constexpr uint32_t kAac = FourCC("AAC ");
constexpr uint32_t kMp3 = FourCC("MP3 ");
constexpr uint32_t kAc3 = FourCC("AC3 ");
constexpr uint32_t kFlac = FourCC("FLAC");
constexpr uint32_t kAlac = FourCC("ALAC");
constexpr uint32_t kMp2 = FourCC("MP2 ");
constexpr uint32_t kOpus = FourCC("OPUS");
constexpr uint32_t kVorbis = FourCC("VORB");
constexpr uint32_t kPcm = FourCC("PCM ");
constexpr uint32_t kEac3 = FourCC("EAC3"); // copied only

/// Another name under which a codec is asked for, in capitals.
struct CodecAlias {
    uint32_t name = 0;
    uint32_t code = 0;
};

std::span<const PictureCodec> PictureCodecs();
std::span<const SoundCodec> SoundCodecs();
std::span<const CodecAlias> CodecAliases();

} // namespace writer

#endif
