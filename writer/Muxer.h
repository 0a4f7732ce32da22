// Interleaves encoded packets and writes them in a container.
#ifndef MOVIECONV_WRITER_MUXER_H
#define MOVIECONV_WRITER_MUXER_H

#include "ffmpeg/AvHandles.h"
#include "writer/AvioFile.h"
#include "writer/Extras.h"
#include "writer/ExtrasMuxer.h"
#include "writer/FormatTable.h"
#include "writer/HdrLight.h"
#include "writer/PacketWriter.h"

#include <condition_variable>
#include <cstdint>
#include <deque>
#include <mutex>
#include <vector>

namespace writer {

/// Streams are added, the header is written, then packets come from any thread, then the end.
class Muxer final : public PacketWriter {
public:
    struct Form {
        /// It can be played up to wherever it ends, at the price of an index spread all over it.
        bool fragmented;
        bool bitExact; ///< Nothing in it tells time, date or library version.
    };

    /// The file gets what the container carries of `extras`, read as long as the muxer lives: tags with the
    /// header, cover and attachments too where it is not fragmented, chapters by SetChapters. All functions
    /// throw WriterFailure (kWriterErrorEncode) or std::bad_alloc; where `file` has failed, its error is the
    /// real reason.
    Muxer(const Container& container, AvioFile& file, Form form, const Extras& extras);

    /// Returns the stream's number, from 0 on. A fragmented file cannot express times below 0: all its times
    /// are later by the longest run-up.
    int AddStream(const MuxedStream& stream) override;

    /// `room`: bytes that stay free in front of a fragmented file's description; before all of it where that
    /// has to wait for the first packets.
    void WriteHeader(int64_t room) override;

    /// Chapters on the file's timeline, before its end; where it is fragmented, it takes none.
    void SetChapters(const std::vector<OutputChapter>& chapters) override;

    /// Takes the packet's content. Times are in the stream's unit; those of decoding must not fall.
    void Write(AVPacket& packet, int stream) override;

    /// Names a packet that lies at `position` of the file already, in the form that the container gives it:
    /// its times are in the unit that Stream tells, and its content is written there once more. For one
    /// thread.
    void WriteAt(AVPacket& packet, int64_t position);

    /// The end of the file; a second call does nothing.
    void WriteTrailer() override;

    Written Stream(int stream) const override;

    /// How much of the file, of which `size` bytes are on the disk, is whole: what follows is the beginning
    /// of something (a packet, a cluster, a fragment) whose end never came.
    int64_t WholeSize(int64_t size) const override;

    /// Whether the end can be written: there has been a packet of each stream that is described by one.
    bool Describable() const override;

    /// Whether no packet was taken yet.
    bool Empty() const override;

    /// Streams that were added, without those of covers and attachments.
    int StreamCount() const override { return static_cast<int>(streams_.size()); }

private:
    struct State {
        AVRational unit{0, 1};
        int64_t runUp = 0;
        const Carriage* carriage = nullptr;
        const TrackLabel* label = nullptr;
        const HdrLight* light = nullptr;
        bool sparse = false; ///< May be silent for long: nothing waits for it.
        int64_t delay = 0;   ///< In the file's unit.
        int64_t lastDts = AV_NOPTS_VALUE;
        int64_t packets = 0;
        bool begun = false;
        int64_t firstPts = 0; ///< In the stream's own unit, as those below.
        int64_t endPts = 0;
        int64_t lastPts = 0;
    };

    class Turn;

    static void NoteTimes(State& state, const AVPacket& packet);
    void Check(int result, const char* what) const;
    void SetOptions(int64_t room);
    void SetDelays();
    void SetTimes(AVPacket& packet, State& state, const AVStream& out) const;
    void Interleave(AVPacket& packet);
    void TellLastStay();
    int64_t MostApart(int packetSize);
    int64_t LeastLag() const;
    void NoteWhole();
    void FlushNowAndThen(int64_t time);
    void SetLanguageTags();

    const Container& container_;
    AvioFile& file_;
    const bool fragmented_;
    ExtrasMuxer extras_;
    av::Output output_;
    av::Packet packet_;
    // Whether one has its Turn, which guards everything once the header is written.
    mutable bool busy_ = false;
    mutable std::mutex mutex_;
    mutable std::condition_variable changed_;
    std::vector<State> streams_;
    bool ended_ = false;       ///< The end was asked for,
    bool finished_ = false;    ///< and is written.
    int64_t bytesAtFirst_ = 0; ///< Of the packets that came before each stream had begun.
    int64_t headerEnd_ = 0;
    std::deque<int64_t> wholes_;  ///< Sizes at which the file was whole; the first is on the disk.
    int64_t flushed_ = INT64_MIN; ///< Time of the packet after which was flushed, in microseconds.
};

} // namespace writer

#endif
