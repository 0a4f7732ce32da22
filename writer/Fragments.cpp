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

av::Input OpenPart(AvioFile& file) {
    av::Input input(avformat_alloc_context());
    if (!input)
        throw std::bad_alloc();
    input->pb = file.Io();
    input->flags |= AVFMT_FLAG_NOFILLIN | AVFMT_FLAG_NOPARSE;
    av::Options options;
    options.Set("ignore_editlist", "1");
    AVFormatContext* context = input.release();
    const int error = avformat_open_input(&context, nullptr, av_find_input_format("mov"), options.Get());
    input.reset(context);
    if (error < 0)
        throw WriterFailure(kWriterErrorFinish,
                            "The temporary file cannot be read: " + av::ErrorText(error) + ".");
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
    int64_t size; ///< With its header; 0 when the header is not whole or makes no sense.
};

Box ReadBox(ByteFile& file, int64_t position) {
    std::array<uint8_t, 16> header{};
    size_t count = 0;
    if (file.Seek(position, SEEK_SET) < 0)
        return {};
    while (count < header.size()) {
        const int64_t got = file.Read(&header[count], static_cast<int64_t>(header.size() - count));
        if (got <= 0)
            break;
        count += static_cast<size_t>(got);
    }
    const auto number = [&](size_t from, size_t length) {
        return std::accumulate(&header[from], &header[from] + length, int64_t{0},
                               [](int64_t value, uint8_t byte) { return value << 8 | byte; });
    };
    Box box{{}, count < 8 ? 0 : number(0, 4)};
    std::memcpy(box.type.data(), &header[4], box.type.size());
    if (box.size == 1)
        box.size = count < 16 ? 0 : number(8, 8);
    return box.size < 8 ? Box{} : box;
}

} // namespace

void JoinFragments(const std::shared_ptr<ByteFile>& part, const Muxer& written, const Container& container,
                   AvioFile& out, bool bitExact, const std::function<void(double)>& progress) {
    AvioFile file(part, AvioFile::Mode::kRead);
    const av::Input input = OpenPart(file);
    if (static_cast<int>(input->nb_streams) != written.StreamCount())
        throw WriterFailure(kWriterErrorFinish,
                            "The temporary file does not hold the streams that were written.");
    Muxer joined(container, out, false, bitExact);
    AddStreams(*input, written, joined);
    joined.WriteHeader();
    const av::Packet packet(av_packet_alloc());
    if (!packet)
        throw std::bad_alloc();
    const auto size = static_cast<double>(std::max<int64_t>(1, file.Size()));
    int error = 0;
    while ((error = av_read_frame(input.get(), packet.get())) >= 0) {
        const int64_t delay = written.Stream(packet->stream_index).delay;
        packet->dts -= delay;
        packet->pts -= delay;
        progress(static_cast<double>(packet->pos) / size);
        joined.Write(*packet, packet->stream_index);
    }
    if (error != AVERROR_EOF)
        throw WriterFailure(kWriterErrorFinish,
                            "The temporary file cannot be read: " + av::ErrorText(error) + ".", file.Error());
    joined.WriteTrailer();
}

int64_t CutToWholeFragments(ByteFile& part) {
    const int64_t end = part.Seek(0, SEEK_END);
    int64_t whole = 0;
    for (int64_t position = 0; position < end;) {
        const Box box = ReadBox(part, position);
        if (box.size == 0 || box.size > end - position)
            break;
        position += box.size;
        // A fragment is a description followed by its data; the file's own description is whole by itself.
        if (std::memcmp(box.type.data(), "moof", 4) != 0)
            whole = position;
    }
    if (whole == end)
        return end;
    const int64_t result = part.Truncate(whole);
    return result < 0 ? result : whole;
}

} // namespace writer
