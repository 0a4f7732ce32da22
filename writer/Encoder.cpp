#include "writer/Encoder.h"

#include "media/CodeText.h"
#include "writer/UsualSchedule.h"
#include "writer/WriterFailure.h"
#include "writer/WriterStatus.h"

namespace writer {

av::CodecContext NewEncoder(const AVCodec* codec, uint32_t code, EncoderFlags flags) {
    if (codec == nullptr)
        throw WriterFailure(kWriterErrorCodec,
                            "This build of FFmpeg cannot encode \"" + CodeText(code) + "\".");
    av::CodecContext context = av::NewCodecContext(codec);
    if (flags.globalHeader)
        context->flags |= AV_CODEC_FLAG_GLOBAL_HEADER;
    if (flags.bitExact)
        context->flags |= AV_CODEC_FLAG_BITEXACT;
    return context;
}

void OpenEncoder(AVCodecContext& context, uint32_t code, const std::string& parameters) {
    const int error = [&] {
        const UsualSchedule usual;
        return avcodec_open2(&context, context.codec, nullptr);
    }();
    av::CheckMemory(error);
    if (error < 0)
        throw WriterFailure(kWriterErrorCodec, "The encoder for \"" + CodeText(code) + "\" does not accept " +
                                                   parameters + ": " + av::ErrorText(error) + ".");
}

void Encode(AVCodecContext& context, const AVFrame* frame, AVPacket& packet, const PacketTaker& take) {
    int error = avcodec_send_frame(&context, frame);
    while (error >= 0) {
        error = avcodec_receive_packet(&context, &packet);
        if (error < 0)
            break;
        take(packet);
        av_packet_unref(&packet);
    }
    if (error == AVERROR(EAGAIN) || error == AVERROR_EOF)
        return;
    av::CheckMemory(error);
    throw WriterFailure(kWriterErrorEncode, std::string("The encoder ") + context.codec->name +
                                                " failed: " + av::ErrorText(error) + ".");
}

} // namespace writer
