#include "MovieReader.h"
#include "tests/support/Folder.h"

#include <gtest/gtest.h>

extern "C" {
#include <libavutil/imgutils.h>
}

#include <algorithm>
#include <cmath>
#include <map>

namespace {

void TakePicture(const AVFrame& frame, AVRational unit, ReadMovie& movie) {
    ReadPicture picture;
    // Containers without stamps leave the last picture of some codecs without one.
    picture.time = frame.best_effort_timestamp == AV_NOPTS_VALUE && movie.pictures.size() > 1
                       ? 2 * movie.pictures.back().time - movie.pictures[movie.pictures.size() - 2].time
                       : static_cast<double>(frame.best_effort_timestamp) * av_q2d(unit);
    picture.isKeyFrame = frame.key_frame != 0;
    picture.width = frame.width;
    picture.height = frame.height;
    picture.luma.resize(static_cast<size_t>(frame.width) * frame.height);
    av_image_copy_plane(picture.luma.data(), frame.width, frame.data[0], frame.linesize[0], frame.width,
                        frame.height);
    movie.pictures.push_back(std::move(picture));
}

void TakeSound(const AVFrame& frame, AVRational unit, ReadMovie& movie) {
    if (movie.samples == 0)
        movie.audioStart = static_cast<double>(frame.best_effort_timestamp) * av_q2d(unit);
    movie.samples += frame.nb_samples;
    const av::Resampler toFloat(swr_alloc());
    const av::Frame floats(av_frame_alloc());
    floats->format = AV_SAMPLE_FMT_FLTP;
    floats->sample_rate = frame.sample_rate;
    av_channel_layout_copy(&floats->ch_layout, &frame.ch_layout);
    ASSERT_EQ(swr_convert_frame(toFloat.get(), floats.get(), &frame), 0);
    const auto* first = reinterpret_cast<const float*>(floats->data[0]);
    movie.firstChannel.insert(movie.firstChannel.end(), first, first + floats->nb_samples);
    const av::ChannelLayout usual(frame.ch_layout.nb_channels);
    const bool told = frame.ch_layout.order != AV_CHANNEL_ORDER_UNSPEC;
    for (int channel = 0; channel < frame.ch_layout.nb_channels; ++channel) {
        const AVChannel place = av_channel_layout_channel_from_index(told ? &frame.ch_layout : usual.Get(),
                                                                     static_cast<unsigned>(channel));
        const auto* samples = reinterpret_cast<const float*>(floats->extended_data[channel]);
        float& loudest = movie.loudest[place < 0 ? 0 : uint64_t{1} << place];
        loudest = std::max(loudest, *std::max_element(samples, samples + floats->nb_samples));
    }
}

av::CodecContext OpenDecoder(const AVStream& stream) {
    const AVCodec* codec = avcodec_find_decoder(stream.codecpar->codec_id);
    av::CodecContext context(avcodec_alloc_context3(codec));
    avcodec_parameters_to_context(context.get(), stream.codecpar);
    context->pkt_timebase = stream.time_base;
    context->thread_count = 1;
    return avcodec_open2(context.get(), codec, nullptr) < 0 ? nullptr : std::move(context);
}

void Describe(AVFormatContext& input, AVStream& stream, ReadMovie& movie) {
    const AVCodecParameters& parameters = *stream.codecpar;
    if (parameters.codec_type == AVMEDIA_TYPE_VIDEO) {
        ++movie.videoStreams;
        movie.videoCodec = parameters.codec_id;
        movie.sampleAspect = av_guess_sample_aspect_ratio(&input, &stream, nullptr);
    } else if (parameters.codec_type == AVMEDIA_TYPE_AUDIO) {
        ++movie.audioStreams;
        movie.audioCodec = parameters.codec_id;
        movie.sampleRate = parameters.sample_rate;
        movie.channels = parameters.ch_layout.nb_channels;
    }
}

bool Decode(AVCodecContext& decoder, AVPacket* packet, const std::function<void(const AVFrame&)>& take) {
    if (avcodec_send_packet(&decoder, packet) < 0)
        return false;
    const av::Frame frame(av_frame_alloc());
    int result = 0;
    while ((result = avcodec_receive_frame(&decoder, frame.get())) >= 0)
        take(*frame);
    return result == AVERROR(EAGAIN) || result == AVERROR_EOF;
}

} // namespace

ReadMovie ReadMovieFile(const std::string& path) {
    av_log_set_level(AV_LOG_FATAL);
    ReadMovie movie;
    AVFormatContext* context = nullptr;
    if (avformat_open_input(&context, ("file:" + path).c_str(), nullptr, nullptr) < 0)
        return movie;
    const av::Input input(context);
    if (avformat_find_stream_info(context, nullptr) < 0)
        return movie;
    movie.duration = static_cast<double>(context->duration) / AV_TIME_BASE;
    std::map<int, av::CodecContext> decoders;
    for (unsigned i = 0; i < context->nb_streams; ++i) {
        AVStream& stream = *context->streams[i];
        if (stream.codecpar->codec_type == AVMEDIA_TYPE_DATA) // a timecode
            continue;
        Describe(*context, stream, movie);
        decoders[static_cast<int>(i)] = OpenDecoder(stream);
    }
    movie.readable = true;
    const auto decode = [&](int index, AVPacket* packet) {
        const AVRational unit = context->streams[index]->time_base;
        const bool video = context->streams[index]->codecpar->codec_type == AVMEDIA_TYPE_VIDEO;
        const auto take = [&](const AVFrame& frame) {
            video ? TakePicture(frame, unit, movie) : TakeSound(frame, unit, movie);
        };
        movie.readable = movie.readable && decoders[index] && Decode(*decoders[index], packet, take);
    };
    const av::Packet packet(av_packet_alloc());
    while (av_read_frame(context, packet.get()) >= 0) {
        if (decoders.count(packet->stream_index) != 0)
            decode(packet->stream_index, packet.get());
        av_packet_unref(packet.get());
    }
    for (const auto& entry : decoders)
        decode(entry.first, nullptr);
    return movie;
}

void ExpectSame(const ReadMovie& movie, const ReadMovie& whole) {
    EXPECT_TRUE(movie.readable);
    ASSERT_EQ(movie.pictures.size(), whole.pictures.size());
    for (size_t i = 0; i < movie.pictures.size(); ++i)
        EXPECT_TRUE(movie.pictures[i].luma == whole.pictures[i].luma) << "picture " << i;
    const auto& sound = movie.firstChannel;
    EXPECT_NE(std::search(sound.begin(), sound.end(), whole.firstChannel.begin(), whole.firstChannel.end()),
              sound.end());
}

void ReadPackets(const std::string& path, const std::function<void(const AVPacket&)>& take) {
    AVFormatContext* context = avformat_alloc_context();
    context->flags |= AVFMT_FLAG_NOFILLIN | AVFMT_FLAG_NOPARSE;
    ASSERT_EQ(avformat_open_input(&context, ("file:" + path).c_str(), nullptr, nullptr), 0);
    const av::Input input(context);
    const av::Packet packet = av::NewPacket();
    while (av_read_frame(context, packet.get()) >= 0) {
        take(*packet);
        av_packet_unref(packet.get());
    }
}

void WithStreams(const std::string& path, const std::function<void(const AVStream&)>& take) {
    AVFormatContext* context = nullptr;
    ASSERT_EQ(avformat_open_input(&context, ("file:" + path).c_str(), nullptr, nullptr), 0);
    const av::Input input(context);
    ASSERT_GE(avformat_find_stream_info(context, nullptr), 0);
    for (unsigned i = 0; i < context->nb_streams; ++i)
        take(*context->streams[i]);
}

double ReadMovie::ToneBegins() const {
    const auto loud = std::find_if(firstChannel.begin(), firstChannel.end(),
                                   [](float sample) { return std::abs(sample) > 0.2F; });
    return audioStart + static_cast<double>(loud - firstChannel.begin()) / sampleRate;
}

ReadMovie WriteAndRead(const TestMovie& movie, const std::function<void(void* file)>& write) {
    const Folder folder;
    void* file = movie.Create(folder / "movie");
    write ? write(file) : movie.WriteAll(file);
    EXPECT_EQ(MWCloseMediaFile(file, nullptr, nullptr), 1) << Latest().szWhat;
    EXPECT_EQ(folder.Names(), std::vector<std::string>{"movie"});
    return ReadMovieFile(folder / "movie");
}

WriterStatus Latest(uint32_t set) {
    WriterStatus status{};
    EXPECT_EQ(MWGetFileStatus(set, MWGetFileCount(set), &status), 1);
    return status;
}
