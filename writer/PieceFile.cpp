#include "writer/PieceFile.h"

#include "writer/WriterFailure.h"

extern "C" {
#include <libavutil/intreadwrite.h>
}

#include <algorithm>
#include <array>
#include <cerrno>
#include <cmath>
#include <cstring>
#include <fcntl.h>
#include <new>
#include <unistd.h>
#include <utility>

namespace writer {
namespace {

constexpr std::array<uint8_t, 8> kMagic{'M', 'C', 'P', 'I', 'E', 'C', 'E', '1'};
constexpr uint8_t kPacket = 'p';
constexpr uint8_t kEnd = 'e';
constexpr int64_t kMostStreams = 1000;
constexpr int64_t kMostDescription = 64 << 20;

/// A file that is only read.
class ReadFile final : public ByteFile {
public:
    explicit ReadFile(const std::string& path) : descriptor_(open(path.c_str(), O_RDONLY | O_CLOEXEC)) {
        if (descriptor_ < 0)
            throw SystemFailure(kWriterErrorRefused, errno, "The piece \"%s\" cannot be opened",
                                path.c_str());
    }
    ~ReadFile() override { close(descriptor_); }

    int64_t Write(const uint8_t*, int64_t) override { return -EBADF; }
    int64_t Read(uint8_t* data, int64_t size) override {
        const ssize_t count = read(descriptor_, data, static_cast<std::size_t>(size));
        return count < 0 ? -errno : count;
    }
    int64_t Seek(int64_t offset, int whence) override {
        const off_t place = lseek(descriptor_, static_cast<off_t>(offset), whence);
        return place < 0 ? -errno : place;
    }
    int64_t Truncate(int64_t) override { return -EBADF; }
    int64_t Sync() override { return 0; }

private:
    const int descriptor_;
};

/// Puts numbers behind each other.
struct Sink {
    std::vector<uint8_t> bytes;

    void Number(int64_t value) {
        for (int shift = 0; shift < 64; shift += 8)
            bytes.push_back(static_cast<uint8_t>(static_cast<uint64_t>(value) >> shift));
    }
    void Block(const uint8_t* data, int size) {
        Number(size);
        bytes.insert(bytes.end(), data, data + size);
    }
};

/// Takes them from there again; 0 beyond the end, which `whole` then tells.
struct Draw {
    const uint8_t* data;
    std::size_t left;
    bool whole = true;

    int64_t Number() {
        whole = whole && left >= 8;
        if (!whole)
            return 0;
        const auto value = static_cast<int64_t>(AV_RL64(data));
        data += 8;
        left -= 8;
        return value;
    }
    std::vector<uint8_t> Block() {
        const int64_t size = Number();
        whole = whole && size >= 0 && static_cast<uint64_t>(size) <= left;
        if (!whole)
            return {};
        std::vector<uint8_t> block(data, data + size);
        data += size;
        left -= static_cast<std::size_t>(size);
        return block;
    }
};

/// Hands `archive` every number of a stream's parameters, in a fixed order.
template <class Archive>
void Numbers(AVCodecParameters& p, Archive archive) {
    archive(p.codec_type);
    archive(p.codec_id);
    archive(p.codec_tag);
    archive(p.format);
    archive(p.bit_rate);
    archive(p.bits_per_coded_sample);
    archive(p.bits_per_raw_sample);
    archive(p.profile);
    archive(p.level);
    archive(p.width);
    archive(p.height);
    archive(p.sample_aspect_ratio.num);
    archive(p.sample_aspect_ratio.den);
    archive(p.field_order);
    archive(p.color_range);
    archive(p.color_primaries);
    archive(p.color_trc);
    archive(p.color_space);
    archive(p.chroma_location);
    archive(p.video_delay);
    archive(p.sample_rate);
    archive(p.block_align);
    archive(p.frame_size);
    archive(p.initial_padding);
    archive(p.trailing_padding);
    archive(p.seek_preroll);
    archive(p.ch_layout.order);
    archive(p.ch_layout.nb_channels);
    archive(p.ch_layout.u.mask);
}

void Describe(Sink& sink, const MuxedStream& stream, AVCodecParameters& parameters) {
    for (const AVRational& ratio : {stream.unit, stream.rate, stream.sampleAspect}) {
        sink.Number(ratio.num);
        sink.Number(ratio.den);
    }
    sink.Number(stream.runUp);
    sink.Number(stream.carriage->codec);
    const AVChannelLayout layout = parameters.ch_layout;
    if (layout.order == AV_CHANNEL_ORDER_CUSTOM) // which is a list elsewhere
        parameters.ch_layout = {AV_CHANNEL_ORDER_UNSPEC, layout.nb_channels, {0}, nullptr};
    Numbers(parameters, [&sink](const auto& value) { sink.Number(static_cast<int64_t>(value)); });
    parameters.ch_layout = layout;
    sink.Block(parameters.extradata, parameters.extradata_size);
}

void Put(AVIOContext& io, int64_t value) {
    avio_wl64(&io, static_cast<uint64_t>(value));
}

void PutBeside(AVIOContext& io, const AVPacket& packet) {
    Put(io, packet.side_data_elems);
    for (int i = 0; i < packet.side_data_elems; ++i) {
        const AVPacketSideData& beside = packet.side_data[i];
        Put(io, beside.type);
        Put(io, static_cast<int64_t>(beside.size));
        avio_write(&io, beside.data, static_cast<int>(beside.size));
    }
}

} // namespace

int PieceWriter::AddStream(const MuxedStream& stream) {
    State state{stream, av::CopyOf(*stream.parameters)};
    state.description.parameters = state.parameters.get();
    // cppcheck-suppress danglingLifetime ; the parameters move along and stay where they are
    streams_.push_back(std::move(state));
    return StreamCount() - 1;
}

void PieceWriter::WriteHeader(int64_t /*room*/) {
    AVIOContext& io = *file_.Io();
    avio_write(&io, kMagic.data(), kMagic.size());
    Sink head;
    for (const State& stream : streams_) {
        Sink description;
        Describe(description, stream.description, *stream.parameters);
        head.Block(description.bytes.data(), static_cast<int>(description.bytes.size()));
    }
    Put(io, static_cast<int64_t>(streams_.size()));
    Put(io, static_cast<int64_t>(head.bytes.size()));
    avio_write(&io, head.bytes.data(), static_cast<int>(head.bytes.size()));
}

void PieceWriter::Write(AVPacket& packet, int stream) {
    const std::lock_guard lock(mutex_);
    State& state = streams_[static_cast<std::size_t>(stream)];
    ++state.packets;
    state.begin = std::min(state.begin, packet.pts);
    state.last = std::max(state.last, packet.pts);
    state.end = std::max(state.end, packet.pts + packet.duration);
    AVIOContext& io = *file_.Io();
    avio_w8(&io, kPacket);
    for (const int64_t number :
         {int64_t{stream}, packet.pts, packet.dts, packet.duration, int64_t{packet.flags}})
        Put(io, number);
    PutBeside(io, packet);
    Put(io, packet.size);
    avio_write(&io, packet.data, packet.size);
    if (file_.Error() != 0)
        throw WriterFailure(kWriterErrorWrite, "");
}

void PieceWriter::WriteTrailer() {
    const std::lock_guard lock(mutex_);
    if (std::exchange(ended_, true))
        return;
    const WriterStatus status = record_.Snapshot();
    AVIOContext& io = *file_.Io();
    avio_w8(&io, kEnd);
    for (const int64_t number :
         {status.llPicturesReceived, status.llPicturesWritten, status.llSamplesReceived,
          status.llSamplesWritten, int64_t{std::llround(status.dVideoReceived * kTotalsPerSecond)},
          int64_t{std::llround(status.dAudioReceived * kTotalsPerSecond)}, int64_t{status.nSampleRate},
          int64_t{status.nAudioBitrate}})
        Put(io, number);
}

PacketWriter::Written PieceWriter::Stream(int stream) const {
    const std::lock_guard lock(mutex_);
    const State& state = streams_[static_cast<std::size_t>(stream)];
    const int64_t length =
        state.packets > 0 ? state.end - state.begin - state.parameters->initial_padding : 0;
    return {.description = state.description,
            .delay = 0,
            .packets = state.packets,
            .end = state.end,
            .last = state.last,
            .seconds = static_cast<double>(std::max<int64_t>(0, length)) * av_q2d(state.description.unit)};
}

bool PieceWriter::Empty() const {
    const std::lock_guard lock(mutex_);
    return std::all_of(streams_.begin(), streams_.end(),
                       [](const State& stream) { return stream.packets == 0; });
}

PieceReader::PieceReader(const std::string& path)
    : path_(path),
      file_(std::make_unique<AvioFile>(std::make_shared<ReadFile>(path), AvioFile::Mode::kRead)) {
    if (const std::vector<uint8_t> magic = Bytes(kMagic.size());
        !std::equal(kMagic.begin(), kMagic.end(), magic.begin()))
        Refuse();
    const auto count = static_cast<int64_t>(avio_rl64(file_->Io()));
    const auto size = static_cast<int64_t>(avio_rl64(file_->Io()));
    if (count < 0 || count > kMostStreams || size < 0 || size > kMostDescription)
        Refuse();
    head_ = Bytes(size);
    Draw draw{head_.data(), head_.size()};
    for (int64_t i = 0; i < count; ++i) {
        const std::vector<uint8_t> description = draw.Block();
        if (!draw.whole)
            Refuse();
        streams_.push_back(ReadDescription(description.data(), description.size()));
    }
}

PieceReader::Description PieceReader::ReadDescription(const uint8_t* data, std::size_t size) const {
    Description stream;
    Draw draw{data, size};
    for (AVRational* ratio : {&stream.unit, &stream.rate, &stream.sampleAspect}) {
        ratio->num = static_cast<int>(draw.Number());
        ratio->den = static_cast<int>(draw.Number());
    }
    stream.runUp = draw.Number();
    stream.codec = static_cast<uint32_t>(draw.Number());
    stream.parameters = av::NewParameters();
    AVCodecParameters& parameters = *stream.parameters;
    Numbers(parameters,
            [&draw](auto& value) { value = static_cast<std::decay_t<decltype(value)>>(draw.Number()); });
    const std::vector<uint8_t> extra = draw.Block();
    AVChannelLayout& layout = parameters.ch_layout;
    const bool isListed = layout.order == AV_CHANNEL_ORDER_CUSTOM;
    if (isListed) // nothing that could be freed
        layout = {};
    const bool isSound = parameters.codec_type == AVMEDIA_TYPE_AUDIO;
    if (!draw.whole || isListed || (isSound && av_channel_layout_check(&layout) == 0) ||
        stream.unit.num <= 0 || stream.unit.den <= 0 || stream.rate.den < 0 || stream.sampleAspect.den < 0)
        Refuse();
    if (!extra.empty()) {
        parameters.extradata = static_cast<uint8_t*>(av_mallocz(extra.size() + AV_INPUT_BUFFER_PADDING_SIZE));
        if (parameters.extradata == nullptr)
            throw std::bad_alloc();
        std::copy(extra.begin(), extra.end(), parameters.extradata);
        parameters.extradata_size = static_cast<int>(extra.size());
    }
    return stream;
}

MuxedStream PieceReader::Stream(int stream, const Container& container, const TrackLabel& label) const {
    const Description& found = streams_.at(static_cast<std::size_t>(stream));
    return {.parameters = found.parameters.get(),
            .unit = found.unit,
            .rate = found.rate,
            .sampleAspect = found.sampleAspect,
            .runUp = found.runUp,
            .carriage = &FindCarriage(container, found.codec),
            .label = &label};
}

bool PieceReader::Read(AVPacket& packet, int only) {
    AVIOContext* io = file_->Io();
    for (;;) {
        av_packet_unref(&packet);
        const int kind = avio_r8(io);
        if (kind == kEnd) {
            ReadTotals();
            return false;
        }
        const auto next = [io] { return static_cast<int64_t>(avio_rl64(io)); };
        const int64_t stream = next();
        const int64_t pts = next();
        const int64_t dts = next();
        const int64_t duration = next();
        const auto flags = static_cast<int>(next());
        if (kind != kPacket || avio_feof(io) != 0 || stream < 0 || stream >= StreamCount())
            Refuse();
        ReadBeside(packet);
        const int64_t size = next();
        if (size < 0 || size > file_->Size())
            Refuse();
        if (only >= 0 && stream != only) {
            avio_skip(io, size);
            continue;
        }
        av::CheckMemory(av_grow_packet(&packet, static_cast<int>(size))); // keeps what is beside the data
        if (avio_read(io, packet.data, static_cast<int>(size)) != size)
            Refuse();
        packet.stream_index = static_cast<int>(stream);
        packet.pts = pts;
        packet.dts = dts;
        packet.duration = duration;
        packet.flags = flags;
        return true;
    }
}

void PieceReader::ReadBeside(AVPacket& packet) {
    constexpr int64_t kMostBeside = 100;
    const auto count = static_cast<int64_t>(avio_rl64(file_->Io()));
    if (count < 0 || count > kMostBeside)
        Refuse();
    for (int64_t i = 0; i < count; ++i) {
        const auto type = static_cast<int64_t>(avio_rl64(file_->Io()));
        const auto size = static_cast<int64_t>(avio_rl64(file_->Io()));
        if (type < 0 || type >= AV_PKT_DATA_NB)
            Refuse();
        const std::vector<uint8_t> data = Bytes(size);
        uint8_t* beside =
            av_packet_new_side_data(&packet, static_cast<AVPacketSideDataType>(type), data.size());
        if (beside == nullptr)
            throw std::bad_alloc();
        std::copy(data.begin(), data.end(), beside);
    }
}

void PieceReader::ReadTotals() {
    for (int64_t* number : {&totals_.picturesReceived, &totals_.picturesWritten, &totals_.samplesReceived,
                            &totals_.samplesWritten, &totals_.videoReceived, &totals_.audioReceived,
                            &totals_.sampleRate, &totals_.audioBitrate})
        *number = static_cast<int64_t>(avio_rl64(file_->Io()));
    if (avio_feof(file_->Io()) != 0)
        Refuse();
}

std::vector<uint8_t> PieceReader::Bytes(int64_t count) {
    if (count < 0 || count > file_->Size())
        Refuse();
    std::vector<uint8_t> bytes(static_cast<std::size_t>(count));
    if (avio_read(file_->Io(), bytes.data(), static_cast<int>(count)) != count)
        Refuse();
    return bytes;
}

void PieceReader::Refuse() const {
    throw WriterFailure(kWriterErrorRefused, "\"" + path_ + "\" is not a whole piece.");
}

} // namespace writer
