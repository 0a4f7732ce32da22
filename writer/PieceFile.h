// A piece of an output file: encoded packets with everything that belongs to them, exactly as the encoders
// gave them. No container does that for all codecs: they round times, derive those of decoding, or lose the
// data beside a packet.
//
//     "MCPIECE1", number of streams, their descriptions
//     'p' stream, times, flags, data beside the packet, data ...
//     'e' totals
//
// Numbers are little-endian, so that a piece made on one machine is joined on another.
#ifndef MOVIECONV_WRITER_PIECEFILE_H
#define MOVIECONV_WRITER_PIECEFILE_H

#include "writer/AvioFile.h"
#include "writer/FileRecord.h"
#include "writer/PacketWriter.h"

#include <cstdint>
#include <memory>
#include <mutex>
#include <optional>
#include <string>
#include <vector>

namespace writer {

constexpr int64_t kTotalsPerSecond = 10'000'000; ///< Of the times in a piece's totals, media time.

/// Writes one. The totals at its end are those of `record`, which outlives it.
class PieceWriter final : public PacketWriter {
public:
    PieceWriter(AvioFile& file, const FileRecord& record) : file_(file), record_(record) {}

    int AddStream(const MuxedStream& stream) override;
    void WriteHeader(int64_t room) override;
    void SetChapters(const std::vector<OutputChapter>&) override {} // the joined file gets them
    void Write(AVPacket& packet, int stream) override;
    void WriteTrailer() override;
    Written Stream(int stream) const override;
    int StreamCount() const override { return static_cast<int>(streams_.size()); }
    int64_t WholeSize(int64_t) const override { return 0; } // what has no end is no piece
    bool Describable() const override { return false; }
    bool Empty() const override;

private:
    struct State {
        MuxedStream description;
        av::CodecParameters parameters;
        int64_t packets = 0;
        int64_t begin = INT64_MAX;
        int64_t end = INT64_MIN;
        int64_t last = INT64_MIN;
    };

    AvioFile& file_;
    const FileRecord& record_;
    mutable std::mutex mutex_; // guards what follows once the header is written
    std::vector<State> streams_;
    bool ended_ = false;
};

/// What a piece says of itself at its end.
struct PieceTotals {
    int64_t picturesReceived = 0;
    int64_t picturesWritten = 0;
    int64_t samplesReceived = 0;
    int64_t samplesWritten = 0;
    int64_t videoReceived = 0; ///< kTotalsPerSecond in a second.
    int64_t audioReceived = 0;
    int64_t sampleRate = 0;
    int64_t audioBitrate = 0;
};

/// Reads one, from its start to its end.
class PieceReader {
public:
    /// Opens `path` and reads its head. Throws WriterFailure, which names the piece.
    explicit PieceReader(const std::string& path);
    PieceReader(const PieceReader&) = delete;
    PieceReader& operator=(const PieceReader&) = delete;

    int StreamCount() const { return static_cast<int>(streams_.size()); }

    /// Valid as long as the reader and the label.
    MuxedStream Stream(int stream, const Container& container, const TrackLabel& label) const;

    /// The description of all streams, to compare with that of another piece.
    const std::vector<uint8_t>& Head() const { return head_; }

    /// Reads the next packet; of the others, too, when `only` is below 0. False at the end, when the totals
    /// are known. Throws WriterFailure.
    bool Read(AVPacket& packet, int only);

    const PieceTotals& Totals() const { return totals_; }

private:
    struct Description {
        av::CodecParameters parameters;
        AVRational unit{};
        AVRational rate{};
        AVRational sampleAspect{};
        int64_t runUp = 0;
        uint32_t codec = 0; ///< Of the carriage.
    };

    [[noreturn]] void Refuse() const;
    Description ReadDescription(const uint8_t* data, std::size_t size) const;
    std::vector<uint8_t> Bytes(int64_t count);
    void ReadBeside(AVPacket& packet);
    void ReadTotals();

    const std::string path_;
    std::unique_ptr<AvioFile> file_;
    std::vector<uint8_t> head_;
    std::vector<Description> streams_;
    PieceTotals totals_;
};

} // namespace writer

#endif
