// What the encoders for pictures and for sound have in common: opening, feeding, and the failures.
#ifndef MOVIECONV_WRITER_ENCODER_H
#define MOVIECONV_WRITER_ENCODER_H

#include "ffmpeg/AvHandles.h"

#include <cstdint>
#include <functional>
#include <string>

namespace writer {

/// Takes one encoded packet; its time stamps are in the unit that the encoder documents.
using PacketTaker = std::function<void(AVPacket&)>;

/// What the container asks of an encoder.
struct EncoderFlags {
    bool globalHeader; ///< Parameters belong into the file's header, not into the stream.
    bool bitExact;
};

/// A context for `codec`, which is null when this build of FFmpeg has no encoder for "code". Throws
/// WriterFailure (kWriterErrorCodec).
av::CodecContext NewEncoder(const AVCodec* codec, uint32_t code, EncoderFlags flags);

/// Opens it. `parameters` says in the message of a failure what was asked of it. Throws WriterFailure
/// (kWriterErrorCodec).
void OpenEncoder(AVCodecContext& context, uint32_t code, const std::string& parameters);

/// Sends one frame, or null to end, and hands out the packets that are ready by way of `packet`. Throws
/// WriterFailure (kWriterErrorEncode).
void Encode(AVCodecContext& context, const AVFrame* frame, AVPacket& packet, const PacketTaker& take);

} // namespace writer

#endif
