// Where encoded packets go: a container's multiplexer, or a piece that keeps them as they are.
#ifndef MOVIECONV_WRITER_PACKETWRITER_H
#define MOVIECONV_WRITER_PACKETWRITER_H

#include "ffmpeg/AvHandles.h"
#include "writer/Extras.h"
#include "writer/FormatTable.h"
#include "writer/HdrLight.h"

#include <cstdint>
#include <vector>

namespace writer {

/// One stream as it enters a muxer.
struct MuxedStream {
    const AVCodecParameters* parameters = nullptr; ///< Read during AddStream only.
    AVRational unit{0, 1};                         ///< Unit of the packets' times, in seconds.
    AVRational rate{0, 1};                         ///< Pictures per second; 0/1 for all else.
    AVRational sampleAspect{0, 1};                 ///< Shape of the pixels; 0/1 for all else.
    int64_t runUp = 0;                             ///< How far below 0 times can begin, in the unit.
    const Carriage* carriage = nullptr;            ///< How the container carries its codec.
    const TrackLabel* label = nullptr;             ///< What is said about it; lives as long as the writer.
    const HdrLight* light = nullptr; ///< Of HDR pictures, which lives as long as the writer; may be null.
};

/// Streams are added, the header is written, then packets come from any thread, then the end. All functions
/// throw WriterFailure or std::bad_alloc.
class PacketWriter {
public:
    /// What a reader of the file, and a second writer for the same packets, need to know of a stream.
    struct Written {
        MuxedStream description; ///< In the file's unit.
        int64_t delay; ///< By how much times in the file are later than those that came, in that unit.
        int64_t packets;
        int64_t end;    ///< Of the last packet, in that unit, as it came.
        int64_t last;   ///< When the packet is shown that is shown last, likewise.
        double seconds; ///< From the start of the first packet to the end of the last, without run-up.
    };

    PacketWriter() = default;
    PacketWriter(const PacketWriter&) = delete;
    PacketWriter& operator=(const PacketWriter&) = delete;
    virtual ~PacketWriter() = default;

    /// Returns the stream's number, from 0 on.
    virtual int AddStream(const MuxedStream& stream) = 0;

    /// `room`: bytes that stay free in front of the description of a file that grows in fragments.
    virtual void WriteHeader(int64_t room) = 0;

    /// Chapters on the file's timeline, before its end.
    virtual void SetChapters(const std::vector<OutputChapter>& chapters) = 0;

    /// Takes the packet's content. Times are in the stream's unit; those of decoding must not fall.
    virtual void Write(AVPacket& packet, int stream) = 0;

    /// The end of the file; a second call does nothing.
    virtual void WriteTrailer() = 0;

    virtual Written Stream(int stream) const = 0;

    /// Streams that were added, without those of covers and attachments.
    virtual int StreamCount() const = 0;

    /// How much of the file, of which `size` bytes are on the disk, is whole: what follows is the beginning
    /// of something (a packet, a cluster, a fragment) whose end never came. 0 where no packet is.
    virtual int64_t WholeSize(int64_t size) const = 0;

    /// Whether the end can be written: there has been a packet of each stream that is described by one.
    virtual bool Describable() const = 0;

    /// Whether no packet was taken yet.
    virtual bool Empty() const = 0;
};

} // namespace writer

#endif
