#include "writer/Fragments.h"

#include "ffmpeg/Mp4Box.h"
#include "writer/Mp4Index.h"
#include "writer/PartFile.h"
#include "writer/TextRows.h"
#include "writer/WriterFailure.h"
#include "writer/WriterStatus.h"

#include <algorithm>
#include <array>
#include <cerrno>
#include <cstdio>
#include <functional>
#include <new>
#include <optional>
#include <vector>

namespace writer {
namespace {

/// Throws WriterFailure of that kind. `flags` are more of the demultiplexer's.
av::Input OpenMovie(AvioFile& file, int kind, int flags = 0) {
    av::Options options;
    options.Set("ignore_editlist", "1");
    AVFormatContext* context = avformat_alloc_context();
    if (context == nullptr)
        throw std::bad_alloc();
    context->pb = file.Io();
    context->flags |= AVFMT_FLAG_NOFILLIN | AVFMT_FLAG_NOPARSE | flags;
    const int error = avformat_open_input(&context, nullptr, av_find_input_format("mov"), options.Get());
    av::Input input(context);
    av::CheckMemory(error);
    if (error < 0)
        throw WriterFailure(kind, "The temporary file cannot be read: " + av::ErrorText(error) + ".");
    return input;
}

/// Gives `index` the streams of `written`. The packets of these codecs have been brought into the
/// container's own form, to which the description in the file belongs and the encoder's does not.
void AddStreams(const AVFormatContext& input, const PacketWriter& written, Mp4Index& index) {
    for (int stream = 0; stream < written.StreamCount(); ++stream) {
        const PacketWriter::Written taken = written.Stream(stream);
        MuxedStream description = taken.description;
        const AVCodecParameters* stored = input.streams[stream]->codecpar;
        const bool reformed = stored->codec_id == AV_CODEC_ID_H264 || stored->codec_id == AV_CODEC_ID_HEVC;
        if (reformed)
            description.parameters = stored;
        index.AddStream(description, taken.delay);
    }
}

/// Whether all of it could be read.
bool ReadAll(ByteFile& file, int64_t position, uint8_t* data, int64_t size) {
    if (file.Seek(position, SEEK_SET) < 0)
        return false;
    while (size > 0) {
        const int64_t got = file.Read(data, size);
        if (got <= 0)
            return false;
        data += got;
        size -= got;
    }
    return true;
}

/// The head of the box at `position`, of the `left` bytes that follow; nothing when it is not whole, or makes
/// no sense.
std::optional<av::BoxHead> ReadBoxHead(ByteFile& file, int64_t position, int64_t left) {
    std::array<uint8_t, av::BoxHead::kMostSize> bytes{};
    const int64_t count = std::min<int64_t>(left, bytes.size());
    const auto head = ReadAll(file, position, bytes.data(), count)
                          ? av::ReadBoxHead(bytes.data(), static_cast<size_t>(count))
                          : std::nullopt;
    return head && head->size != av::BoxHead::kOpen ? head : std::nullopt;
}

/// Whether it is of a type that a fragmented file consists of.
bool IsPartOfFile(const av::BoxHead& box) {
    constexpr std::array kTypes{av::BoxType("ftyp"), av::BoxType("free"), av::BoxType("moov"),
                                av::BoxType("moof"), av::BoxType("mdat"), av::BoxType("mfra")};
    return std::find(kTypes.begin(), kTypes.end(), box.type) != kTypes.end();
}

/// Whether the fragment whose head begins at `head` has its data in `data`, the box at `dataAt`, and nothing
/// else is there. Without memory to find out: as if it were so.
bool HoldsAll(ByteFile& part, int64_t head, int64_t dataAt, const av::BoxHead& data) {
    if (data.type != av::BoxType("mdat"))
        return false;
    const int64_t end = dataAt + data.size;
    int64_t begin = end;
    int64_t reached = dataAt;
    int64_t sum = 0;
    try {
        std::vector<uint8_t> bytes(static_cast<size_t>(dataAt - head));
        if (!ReadAll(part, head, bytes.data(), dataAt - head))
            return false;
        ReadFragment(bytes, head, [&](const PlacedPacket& packet) {
            begin = std::min(begin, packet.position);
            reached = std::max(reached, packet.position + packet.size);
            sum += packet.size;
        });
    } catch (const std::bad_alloc&) {
        return true;
    } catch (const WriterFailure&) {
        return false;
    }
    return begin == dataAt + data.headSize && reached == end && sum == end - begin;
}

[[noreturn]] void ThrowIncomplete() {
    throw WriterFailure(kWriterErrorFinish, "The temporary file does not hold all that was written.");
}

/// The beginning of a packet's content, as much as its index could depend on.
std::vector<uint8_t> ReadStart(ByteFile& file, const PlacedPacket& packet) {
    constexpr int64_t kMost = 4096;
    std::vector<uint8_t> start(static_cast<size_t>(std::min(packet.size, kMost)));
    if (!ReadAll(file, packet.position, start.data(), static_cast<int64_t>(start.size())))
        ThrowIncomplete();
    return start;
}

bool IsText(const PacketWriter& written, int stream) {
    return written.Stream(stream).description.parameters->codec_id == AV_CODEC_ID_MOV_TEXT;
}

/// Calls `take` with all packets. In fragments a picture lasts until the next one is decoded, which may be
/// long after the last one was shown, or long before that one ends.
void ForEachPacket(const FragmentLog& log, const PacketWriter& written,
                   const std::function<void(const PlacedPacket&)>& take) {
    std::vector<PacketWriter::Written> streams;
    for (int stream = 0; stream < written.StreamCount(); ++stream) {
        streams.push_back(written.Stream(stream));
    }
    log.ForEach([&](PlacedPacket packet) {
        if (packet.stream < 0 || static_cast<size_t>(packet.stream) >= streams.size())
            ThrowIncomplete();
        const PacketWriter::Written& stream = streams[static_cast<size_t>(packet.stream)];
        const bool isLast = stream.description.parameters->codec_type == AVMEDIA_TYPE_VIDEO &&
                            packet.pts == stream.last + stream.delay;
        if (const int64_t left = stream.end + stream.delay - packet.pts; left > 0)
            packet.duration = isLast ? left : std::min(packet.duration, left);
        take(packet);
    });
}

/// Gives the texts to the index, before all else: the multiplexer puts samples of its own wherever the times
/// of another stream pass a text's end. They have no place in the file.
TextRows AddTexts(const FragmentLog& log, const PacketWriter& written, int64_t size, Mp4Index& index) {
    TextRows rows;
    std::optional<PacketWriter::Written> text;
    for (int stream = 0; stream < written.StreamCount(); ++stream)
        if (IsText(written, stream))
            text = written.Stream(stream);
    if (!text)
        return rows;
    int64_t end = 0;
    ForEachPacket(log, written, [&](const PlacedPacket& packet) {
        if (packet.position + packet.size > size)
            ThrowIncomplete();
        if (IsText(written, packet.stream))
            rows.Add(packet);
        else
            end = std::max(end, av_rescale_q(packet.pts + packet.duration,
                                             written.Stream(packet.stream).description.unit,
                                             text->description.unit));
    });
    for (const PlacedPacket& packet : rows.Make(text->delay, end))
        index.Add(packet);
    return rows;
}

/// Throws WriterFailure when the index of `file` does not name all that `written` took: the multiplexer
/// leaves out without a word what it has no memory for.
void CheckIndex(ByteFile& file, const PacketWriter& written) {
    AvioFile in(std::shared_ptr<ByteFile>(std::shared_ptr<ByteFile>(), &file), AvioFile::Mode::kRead);
    const av::Input input = OpenMovie(in, kWriterErrorEncode);
    for (int stream = 0; stream < written.StreamCount(); ++stream) {
        // Sound that is not compressed is counted in samples.
        if (stream >= static_cast<int>(input->nb_streams) ||
            input->streams[stream]->nb_frames < written.Stream(stream).packets)
            throw WriterFailure(kWriterErrorEncode, "The index is not whole.");
    }
}

} // namespace

void FinishFragments(const PartFile& part, const FilePlan& plan, const Extras& extras,
                     const std::function<void(double)>& progress) {
    const std::shared_ptr<ByteFile>& bytes = part.File();
    const PacketWriter& written = part.Streams();
    const FragmentLog& log = part.Fragments();
    // The multiplexer does not tell of data that it had no memory for.
    const int64_t end = bytes->Seek(0, SEEK_END);
    if (log.End() != end)
        ThrowIncomplete();
    AvioFile file(bytes, AvioFile::Mode::kRead);
    const av::Input input = OpenMovie(file, kWriterErrorFinish, AVFMT_FLAG_IGNIDX);
    if (static_cast<int>(input->nb_streams) != written.StreamCount())
        ThrowIncomplete();
    const auto makeIndex = [&](int64_t place) {
        Mp4Index index(*plan.container, plan.bitExact, extras, place);
        AddStreams(*input, written, index);
        const TextRows texts = AddTexts(log, written, end, index);
        ForEachPacket(log, written, [&](const PlacedPacket& packet) {
            if (IsText(written, packet.stream))
                return;
            if (packet.position + packet.size > end)
                ThrowIncomplete();
            progress(static_cast<double>(packet.position) / static_cast<double>(end));
            index.Add(packet,
                      index.WantsContent(packet) ? ReadStart(*bytes, packet) : std::vector<uint8_t>{});
        });
        for (int stream = 0; stream < written.StreamCount(); ++stream)
            if ((IsText(written, stream) ? texts.Texts(stream) : index.Packets(stream)) !=
                written.Stream(stream).packets)
                ThrowIncomplete();
        return index.Finish();
    };
    part.Room()->Finish(*bytes, makeIndex, Mp4Index::MostTexts(extras),
                        [&written](ByteFile& plain) { CheckIndex(plain, written); });
}

int64_t WholeFragments(ByteFile& part, int64_t size) {
    int64_t whole = 0;
    bool holdsAny = false;
    int64_t head = -1; // where that of a fragment begins whose data comes next
    for (int64_t position = 0;;) {
        const bool boxFollows = size - position >= int64_t{av::BoxHead::kLeastSize};
        const std::optional<av::BoxHead> box = ReadBoxHead(part, position, size - position);
        // Data that is shorter than its box says ends in the midst of another one.
        if (boxFollows && (!box || !IsPartOfFile(*box)))
            return whole;
        if (head < 0 && holdsAny)
            whole = position;
        if (!box || box->size > size - position)
            return whole;
        if (head >= 0 && !HoldsAll(part, head, position, *box))
            return whole;
        holdsAny = holdsAny || head >= 0;
        head = box->type == av::BoxType("moof") ? position : -1;
        position += box->size;
    }
}

} // namespace writer
