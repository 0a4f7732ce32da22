#include "host/source/StreamDecoder.h"

#include "host/sentence/Say.h"
#include "host/source/LogSilence.h"
#include "host/source/SourceError.h"

namespace movieconv {

StreamDecoder::StreamDecoder(const AVCodecParameters& parameters, AVRational timeBase, int threads)
    : context_(av::NewCodecContext(avcodec_find_decoder(parameters.codec_id))), frame_(av::NewFrame()) {
    av::CheckMemory(avcodec_parameters_to_context(context_.get(), &parameters));
    context_->pkt_timebase = timeBase;
    context_->thread_count = threads;
    context_->thread_type = FF_THREAD_FRAME | FF_THREAD_SLICE;
    if (LogSilence::Holds()) // its threads are not ours
        context_->log_level_offset = AV_LOG_MAX_OFFSET;
    const int result = avcodec_open2(context_.get(), context_->codec, nullptr);
    av::CheckMemory(result);
    if (result < 0) {
        throw SourceError(Say("cannot start the decoder {}: {}", avcodec_get_name(parameters.codec_id),
                              Sentence(av::ErrorText(result))));
    }
}

bool StreamDecoder::Decode(const AVPacket* packet, const Sink& sink) {
    if (packet != nullptr && packet->size == 0 && packet->side_data_elems == 0)
        return true; // a picture that is shown for longer, which some containers tell so
    int result = avcodec_send_packet(context_.get(), packet);
    while (result == AVERROR(EAGAIN)) {
        if (!Receive(sink))
            return false;
        result = avcodec_send_packet(context_.get(), packet);
    }
    av::CheckMemory(result);
    if (result < 0 && result != AVERROR_EOF)
        ++damaged_;
    return packet == nullptr ? Drain(sink) : Receive(sink);
}

/// What comes out behind damage is still to be had.
bool StreamDecoder::Drain(const Sink& sink) {
    constexpr int kMostFailures = 1000; // more than any decoder keeps back
    for (int failures = 0; failures < kMostFailures; ++failures)
        if (!Receive(sink))
            return false;
    return false;
}

/// Hands out what is decoded. False at the end of the stream or when the sink wants no more.
bool StreamDecoder::Receive(const Sink& sink) {
    for (;;) {
        const int result = avcodec_receive_frame(context_.get(), frame_.get());
        if (result == AVERROR(EAGAIN))
            return true;
        if (result == AVERROR_EOF)
            return false;
        av::CheckMemory(result);
        if (result < 0) {
            ++damaged_;
            return true;
        }
        if (frame_->decode_error_flags != 0)
            ++damaged_;
        const bool goesOn = sink(*frame_);
        av_frame_unref(frame_.get());
        if (!goesOn)
            return false;
    }
}

} // namespace movieconv
