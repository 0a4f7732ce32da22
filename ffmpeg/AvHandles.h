// Owners for the objects of FFmpeg's libraries, and the text of their errors. Nothing else is wrapped.
#ifndef MOVIECONV_FFMPEG_AVHANDLES_H
#define MOVIECONV_FFMPEG_AVHANDLES_H

extern "C" {
#include <libavcodec/avcodec.h>
#include <libavformat/avformat.h>
#include <libavutil/audio_fifo.h>
#include <libavutil/error.h>
#include <libavutil/mem.h>
#include <libswresample/swresample.h>
#include <libswscale/swscale.h>
}

#include <array>
#include <cerrno>
#include <memory>
#include <new>
#include <string>
#include <utility>

namespace av {

struct FrameFree {
    void operator()(AVFrame* frame) const { av_frame_free(&frame); }
};
struct PacketFree {
    void operator()(AVPacket* packet) const { av_packet_free(&packet); }
};
struct CodecContextFree {
    void operator()(AVCodecContext* context) const { avcodec_free_context(&context); }
};
struct CodecParametersFree {
    void operator()(AVCodecParameters* parameters) const { avcodec_parameters_free(&parameters); }
};
struct InputFree {
    void operator()(AVFormatContext* context) const { avformat_close_input(&context); }
};
struct OutputFree {
    void operator()(AVFormatContext* context) const { avformat_free_context(context); }
};
struct IoFree {
    void operator()(AVIOContext* io) const {
        av_freep(static_cast<void*>(&io->buffer));
        avio_context_free(&io);
    }
};
struct ScalerFree {
    void operator()(SwsContext* scaler) const { sws_freeContext(scaler); }
};
struct ResamplerFree {
    void operator()(SwrContext* resampler) const { swr_free(&resampler); }
};
struct SampleFifoFree {
    void operator()(AVAudioFifo* fifo) const { av_audio_fifo_free(fifo); }
};

using Frame = std::unique_ptr<AVFrame, FrameFree>;
using Packet = std::unique_ptr<AVPacket, PacketFree>;
using CodecContext = std::unique_ptr<AVCodecContext, CodecContextFree>;
using CodecParameters = std::unique_ptr<AVCodecParameters, CodecParametersFree>;
/// An AVFormatContext opened with avformat_open_input.
using Input = std::unique_ptr<AVFormatContext, InputFree>;
/// An AVFormatContext allocated for writing; its AVIOContext is owned apart.
using Output = std::unique_ptr<AVFormatContext, OutputFree>;
/// An AVIOContext made with avio_alloc_context; what lies behind its `opaque` is owned apart.
using Io = std::unique_ptr<AVIOContext, IoFree>;
using Scaler = std::unique_ptr<SwsContext, ScalerFree>;
using Resampler = std::unique_ptr<SwrContext, ResamplerFree>;
using SampleFifo = std::unique_ptr<AVAudioFifo, SampleFifoFree>;

/// Throws std::bad_alloc when the libraries' `result` says that there was no memory: that is no fault of the
/// data or the parameters.
inline void CheckMemory(int result) {
    if (result == AVERROR(ENOMEM))
        throw std::bad_alloc();
}

/// Empty ones. Throw std::bad_alloc.
inline Packet NewPacket() {
    Packet packet(av_packet_alloc());
    return packet ? std::move(packet) : throw std::bad_alloc();
}
inline Frame NewFrame() {
    Frame frame(av_frame_alloc());
    return frame ? std::move(frame) : throw std::bad_alloc();
}
/// With the defaults of `codec`, which may be null.
inline CodecContext NewCodecContext(const AVCodec* codec) {
    CodecContext context(avcodec_alloc_context3(codec));
    return context ? std::move(context) : throw std::bad_alloc();
}
inline CodecParameters NewParameters() {
    CodecParameters parameters(avcodec_parameters_alloc());
    return parameters ? std::move(parameters) : throw std::bad_alloc();
}

/// One more reference to the same data. Throw std::bad_alloc.
inline Frame CopyOf(const AVFrame& frame) {
    Frame copy(av_frame_clone(&frame));
    return copy ? std::move(copy) : throw std::bad_alloc();
}
inline Packet CopyOf(const AVPacket& packet) {
    Packet copy(av_packet_clone(&packet));
    return copy ? std::move(copy) : throw std::bad_alloc();
}

/// Parameters that outlive their stream. Throws std::bad_alloc.
inline CodecParameters CopyOf(const AVCodecParameters& parameters) {
    CodecParameters copy = NewParameters();
    CheckMemory(avcodec_parameters_copy(copy.get(), &parameters));
    return copy;
}

/// An AVIOContext with a buffer of its own. Throws std::bad_alloc.
inline Io NewIo(int bufferSize, bool forWriting, void* opaque, int (*read)(void*, uint8_t*, int),
                int (*write)(void*, uint8_t*, int), int64_t (*seek)(void*, int64_t, int)) {
    auto* buffer = static_cast<unsigned char*>(av_malloc(static_cast<size_t>(bufferSize)));
    if (buffer == nullptr)
        throw std::bad_alloc();
    Io io(avio_alloc_context(buffer, bufferSize, forWriting ? 1 : 0, opaque, read, write, seek));
    if (!io) {
        av_free(buffer);
        throw std::bad_alloc();
    }
    return io;
}

/// Options for an open call; what is left in it afterwards was not recognised.
class Options {
public:
    Options() = default;
    Options(const Options&) = delete;
    Options& operator=(const Options&) = delete;
    ~Options() { av_dict_free(&entries_); }

    /// Throws std::bad_alloc.
    void Set(const char* key, const char* value) { CheckMemory(av_dict_set(&entries_, key, value, 0)); }
    /// What is opened with these opens nothing else by itself. An empty list would allow all. Throws
    /// std::bad_alloc.
    void AllowNoProtocol() { Set("protocol_whitelist", "none"); }
    AVDictionary** Get() { return &entries_; }

private:
    AVDictionary* entries_ = nullptr;
};

/// A channel layout that releases what it owns.
class ChannelLayout {
public:
    ChannelLayout() = default;
    /// The usual layout for that many channels.
    explicit ChannelLayout(int channels) { av_channel_layout_default(&layout_, channels); }
    ChannelLayout(const ChannelLayout&) = delete;
    ChannelLayout& operator=(const ChannelLayout&) = delete;
    ~ChannelLayout() { av_channel_layout_uninit(&layout_); }

    AVChannelLayout* Get() { return &layout_; }
    const AVChannelLayout* Get() const { return &layout_; }
    int Channels() const { return layout_.nb_channels; }

private:
    AVChannelLayout layout_{};
};

/// What an error code of the libraries means, in English.
inline std::string ErrorText(int code) {
    std::array<char, AV_ERROR_MAX_STRING_SIZE> text{};
    av_strerror(code, text.data(), text.size());
    return text.data();
}

} // namespace av

#endif
