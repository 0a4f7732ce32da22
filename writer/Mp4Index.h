// The index of a plain file of the MP4 family over data that lies in a file already. A second multiplexer
// writes it, whose data goes nowhere: only positions are followed.
#ifndef MOVIECONV_WRITER_MP4INDEX_H
#define MOVIECONV_WRITER_MP4INDEX_H

#include "ffmpeg/AvHandles.h"
#include "writer/AvioFile.h"
#include "writer/Extras.h"
#include "writer/FragmentLog.h"
#include "writer/Mp4Tracks.h"
#include "writer/Muxer.h"

#include <cstdint>
#include <memory>
#include <vector>

namespace writer {

/// Whether something of these comes into a file with its index alone.
bool NeedsIndex(const Extras& extras);

/// Streams are added, then packets in the order of the file, then the index is taken. All functions throw
/// WriterFailure (kWriterErrorEncode, or kWriterErrorFinish for a packet of a stream that there is not) or
/// std::bad_alloc.
class Mp4Index {
public:
    /// `extras` outlives it; its chapters are on the file's timeline. `place`: where in the file the texts
    /// go.
    Mp4Index(const Container& container, bool bitExact, const Extras& extras, int64_t place);
    Mp4Index(const Mp4Index&) = delete;
    Mp4Index& operator=(const Mp4Index&) = delete;
    ~Mp4Index();

    /// The most bytes that the texts take, which are the timecode and the titles of the chapters, and that
    /// all of it takes in index and texts.
    static int64_t MostTexts(const Extras& extras);
    static int64_t MostOf(const Extras& extras);

    /// `delay`: by how much the stream's times in the file are later than they are to be, in `stream.unit`.
    void AddStream(const MuxedStream& stream, int64_t delay);

    /// Whether the index depends on what is in the packet, beside its size.
    bool WantsContent(const PlacedPacket& packet) const;

    /// `content`: the packet's first bytes, or none.
    void Add(const PlacedPacket& packet, const std::vector<uint8_t>& content = {});

    /// The index, and the texts that it names.
    struct Result {
        std::vector<uint8_t> texts;
        std::vector<uint8_t> moov;
    };
    Result Finish();

    /// Packets that a stream has got.
    int64_t Packets(int stream) const { return streams_[static_cast<size_t>(stream)].packets; }

private:
    struct Stream {
        AVRational unit; ///< In the file.
        int64_t delay;
        AVCodecID codec;
        bool describedByPacket;
        /// Of the first packet, where every one is looked at: the others begin like it.
        std::vector<uint8_t> start;
        int64_t packets = 0;
        AVRational muxedUnit{0, 1};
    };
    class Sink;

    void Begin();

    const Extras& extras_;
    const int64_t place_;
    const std::shared_ptr<Sink> sink_;
    AvioFile file_;
    Muxer muxer_;
    av::Packet packet_;
    std::vector<Stream> streams_;
    std::vector<Mp4Track> tracks_;
    std::vector<uint8_t> content_; ///< What stands in for a packet's.
    std::vector<uint8_t> head_;    ///< What the multiplexer writes before all packets, with the timecode.
    bool begun_ = false;
};

} // namespace writer

#endif
