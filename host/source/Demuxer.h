// Reads packets ahead on a thread of its own and hands them to the decoding threads.
//
// One thread reads; at most one thread takes the packets of each stream. Reading stops while the queues hold
// enough. An empty one makes it go on, since a badly interleaved file may need many packets of one stream
// before the next one of the other arrives; but where sound stays away for long, its taker is told that there
// is silence, or the pictures of all the rest would be queued.
#ifndef MOVIECONV_HOST_SOURCE_DEMUXER_H
#define MOVIECONV_HOST_SOURCE_DEMUXER_H

#include "host/source/Failures.h"
#include "host/source/KeySeeker.h"
#include "host/source/LateStreams.h"
#include "host/source/PacketClock.h"
#include "host/source/PacketQueues.h"
#include "host/source/Source.h"
#include "thread/Stall.h"

#include <condition_variable>
#include <mutex>
#include <optional>
#include <thread>
#include <variant>
#include <vector>

namespace movieconv {

class Demuxer {
public:
    /// What ends the reading early is noted in `failures`.
    Demuxer(Source& source, Failures& failures);
    ~Demuxer();
    Demuxer(const Demuxer&) = delete;
    Demuxer& operator=(const Demuxer&) = delete;

    /// Reads these streams beside the others, for TakeBeside; also one that is read for Take, whose packets
    /// both get. Only before everything else.
    void ReadBeside(const std::vector<int>& streams);

    /// A copy of the first packet of a stream that is read beside the others, which stays to be taken; waits
    /// for it. Null when there is none, or not within what is read ahead. Nothing can be sought afterwards.
    av::Packet FirstBeside(int stream);

    /// Moves so far back that everything from `seconds` on can be decoded. Only before the first packet is
    /// taken; a second call with the same time does nothing, so that both decoders may ask. False when the
    /// source cannot be sought: it is then read from its start.
    bool Seek(double seconds);

    /// Reads all from the source's start: Seek does nothing and tells false. Only before Seek.
    void StayAtStart() { staysAtStart_ = true; }

    /// The next packet of a stream; waits for it. Null at the end of the stream or after Stop.
    av::Packet Take(int stream);

    /// The same for sound, or the media time up to which there is none, when that is known: reading is far
    /// beyond it.
    std::variant<av::Packet, int64_t> TakeOrSilence(int stream);

    /// What TakeBeside found.
    struct Beside {
        av::Packet packet; ///< Null when there is none.
        bool ended;        ///< None will come any more.
    };

    /// The next packet of a stream that is read beside the others. What is silent for long never makes
    /// reading run on: without `wait` there may just be none at hand. With it the answer is certain, as far
    /// as sources keep what belongs together within ten seconds: there is none that begins before `until`.
    Beside TakeBeside(int stream, int64_t until, bool wait);

    /// Ends reading and wakes everyone who waits.
    void Stop();

    /// Where the last packet of a stream ends that was read so far, in media time; nothing without one.
    std::optional<int64_t> EndOf(int stream) const;

    /// Bytes read ahead and not taken yet.
    std::size_t Bytes() const;

    /// Times that the source's clock jumped and was put right.
    int ClockJumps() const { return clock_.Jumps(); }

    /// Streams of pictures and sound that came up while reading and were left out.
    std::vector<LateStreams::Left> LeftOut() const;

private:
    using Queue = PacketQueues::Queue;

    void Start();
    void Run();
    template <class Known>
    av::Packet Take(std::unique_lock<std::mutex>& lock, Queue& queue, Known known);
    template <class Reached>
    void AwaitBeside(std::unique_lock<std::mutex>& lock, Queue& queue, int64_t until, Reached reached);
    bool AwaitDemand();
    bool ReadOne();
    void TakeUp(av::Packet packet);
    void GiveOutRepaired(bool all);
    void GiveOut(av::Packet packet);
    std::optional<int64_t> EndOf(const AVPacket& packet) const;

    Source& source_;
    Failures& failures_;
    KeySeeker seeker_;
    double soughtSeconds_ = -1;
    bool soughtWell_ = false;
    bool staysAtStart_ = false;

    mutable std::mutex mutex_;
    std::condition_variable changed_;
    PacketQueues queues_;
    bool started_ = false;
    bool stopping_ = false;
    bool ended_ = false;
    PacketClock clock_; // changed by the reading thread alone
    LateStreams late_;  // likewise

    int failedReads_ = 0;
    std::thread thread_;
};

} // namespace movieconv

#endif
