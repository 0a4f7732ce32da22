#include "writer/Fragments.h"

#include "writer/WriterFailure.h"
#include "writer/WriterStatus.h"

#include <algorithm>
#include <array>
#include <cerrno>
#include <cstdio>
#include <cstring>
#include <new>
#include <numeric>

namespace writer {
namespace {

/// Throws WriterFailure of that kind.
av::Input OpenMovie(AvioFile& file, int kind) {
    av::Options options;
    options.Set("ignore_editlist", "1");
    AVFormatContext* context = avformat_alloc_context();
    if (context == nullptr)
        throw std::bad_alloc();
    context->pb = file.Io();
    context->flags |= AVFMT_FLAG_NOFILLIN | AVFMT_FLAG_NOPARSE;
    const int error = avformat_open_input(&context, nullptr, av_find_input_format("mov"), options.Get());
    av::Input input(context);
    av::CheckMemory(error);
    if (error < 0)
        throw WriterFailure(kind, "The temporary file cannot be read: " + av::ErrorText(error) + ".");
    return input;
}

/// Gives `joined` the streams of `written`. The packets of these codecs have been brought into the
/// container's own form, to which the description in the file belongs and the encoder's does not.
void AddStreams(const AVFormatContext& input, const Muxer& written, Muxer& joined) {
    for (int stream = 0; stream < written.StreamCount(); ++stream) {
        MuxedStream description = written.Stream(stream).description;
        const AVCodecParameters* stored = input.streams[stream]->codecpar;
        const bool reformed = stored->codec_id == AV_CODEC_ID_H264 || stored->codec_id == AV_CODEC_ID_HEVC;
        if (reformed)
            description.parameters = stored;
        joined.AddStream(description);
    }
}

struct Box {
    std::array<char, 4> type;
    int64_t size; ///< With its header, below 2^32; 0 when the header is not whole or makes no sense.
};

Box ReadBox(ByteFile& file, int64_t position) {
    std::array<uint8_t, 8> header{};
    size_t count = 0;
    if (file.Seek(position, SEEK_SET) < 0)
        return {};
    while (count < header.size()) {
        const int64_t got = file.Read(&header[count], static_cast<int64_t>(header.size() - count));
        if (got <= 0)
            break;
        count += static_cast<size_t>(got);
    }
    if (count < header.size())
        return {};
    Box box{{}, std::accumulate(&header[0], &header[4], int64_t{0}, [](int64_t value, uint8_t byte) {
                return value << 8 | byte;
            })};
    std::memcpy(box.type.data(), &header[4], box.type.size());
    return box.size < static_cast<int64_t>(header.size()) ? Box{} : box;
}

[[noreturn]] void ThrowIncomplete() {
    throw WriterFailure(kWriterErrorFinish, "The temporary file does not hold all that was written.");
}

} // namespace

void JoinFragments(const std::shared_ptr<ByteFile>& part, const Muxer& written, const Container& container,
                   AvioFile& out, bool bitExact, const Extras& extras,
                   const std::function<void(double)>& progress) {
    const int64_t end = part->Seek(0, SEEK_END);
    if (WholeFragments(*part, end) != end)
        ThrowIncomplete();
    AvioFile file(part, AvioFile::Mode::kRead);
    const av::Input input = OpenMovie(file, kWriterErrorFinish);
    if (static_cast<int>(input->nb_streams) != written.StreamCount())
        ThrowIncomplete();
    Muxer joined(container, out, false, bitExact, extras);
    AddStreams(*input, written, joined);
    joined.SetChapters(extras.chapters);
    joined.WriteHeader();
    const av::Packet packet = av::NewPacket();
    const auto size = static_cast<double>(std::max<int64_t>(1, file.Size()));
    int error = 0;
    while ((error = av_read_frame(input.get(), packet.get())) >= 0) {
        const int64_t delay = written.Stream(packet->stream_index).delay;
        packet->dts -= delay;
        packet->pts -= delay;
        progress(static_cast<double>(packet->pos) / size);
        joined.Write(*packet, packet->stream_index);
    }
    av::CheckMemory(error);
    if (error != AVERROR_EOF)
        throw WriterFailure(kWriterErrorFinish,
                            "The temporary file cannot be read: " + av::ErrorText(error) + ".", file.Error());
    for (int stream = 0; stream < written.StreamCount(); ++stream)
        if (joined.Stream(stream).packets != written.Stream(stream).packets)
            ThrowIncomplete();
    joined.WriteTrailer();
}

void CheckIndex(const std::shared_ptr<ByteFile>& file, const Muxer& written) {
    AvioFile in(file, AvioFile::Mode::kRead);
    const av::Input input = OpenMovie(in, kWriterErrorEncode);
    for (int stream = 0; stream < written.StreamCount(); ++stream) {
        // Sound that is not compressed is counted in samples.
        if (stream >= static_cast<int>(input->nb_streams) ||
            input->streams[stream]->nb_frames < written.Stream(stream).packets)
            throw WriterFailure(kWriterErrorEncode, "The index is not whole.");
    }
}

int64_t WholeFragments(ByteFile& part, int64_t size) {
    int64_t whole = 0;
    for (int64_t position = 0; position < size;) {
        const Box box = ReadBox(part, position);
        if (box.size == 0 || box.size > size - position)
            break;
        position += box.size;
        // A fragment is a description followed by its data; the file's own description is whole by itself.
        if (std::memcmp(box.type.data(), "moof", 4) != 0)
            whole = position;
    }
    return whole;
}

} // namespace writer
