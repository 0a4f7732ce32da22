// Streams that go into the output beside the pictures and the sound that the engine converts.
//
// Whoever writes the file asks for what comes next, up to the time that it has reached; nothing waits for a
// stream that is silent, and nothing is read ahead for one. Times are in media time.
#ifndef MOVIECONV_HOST_SOURCE_BESIDETRACK_H
#define MOVIECONV_HOST_SOURCE_BESIDETRACK_H

#include "host/source/Demuxer.h"
#include "host/source/Failures.h"
#include "host/source/PcmDecoder.h"
#include "media/MediaRecords.h"

#include <atomic>
#include <cstdint>
#include <deque>
#include <functional>
#include <limits>
#include <vector>

namespace movieconv {

/// What part of the source goes into which file.
struct BesideBounds {
    static constexpr int64_t kOpen = std::numeric_limits<int64_t>::max();

    int64_t begin = 0;                   ///< Of the first file.
    bool ends = false;                   ///< The last file ends before the source does.
    bool isCut = false;                  ///< There are several files.
    std::atomic<int64_t> fileEnd{kOpen}; ///< Where the next file begins, once it is known that one follows.
    std::atomic<bool> stopped{false};    ///< The last file ends where pictures and sound do.
};

/// One thread at a time takes from it.
class BesideTrack {
public:
    struct Item {
        const AudioFrame* sound = nullptr; ///< Either a block of sound
        const AVPacket* packet = nullptr;  ///< or a packet. Valid until the next one is asked for.
        int64_t time = 0;
        int64_t duration = 0; ///< 0: up to the next one.
    };

    BesideTrack(const BesideBounds& bounds, Failures& failures) : bounds_(bounds), failures_(failures) {}
    BesideTrack(const BesideTrack&) = delete;
    BesideTrack& operator=(const BesideTrack&) = delete;
    virtual ~BesideTrack() = default;

    /// The next item that begins before `until`; false when there is none at hand, for `closing`: when there
    /// is none that belongs into the file, which ends at `until` unless the bounds say otherwise. What comes
    /// afterwards belongs to the next file. `item.time` is then where the next one begins at the earliest, as
    /// far as that is known.
    bool Next(int64_t until, bool closing, Item& item);

protected:
    virtual bool Find(int64_t until, bool closing, Item& item) = 0;

    const BesideBounds& bounds_;

private:
    Failures& failures_;
};

/// Sound, to the sample: what one file gets and what the next one gets follow each other without a gap.
class BesideSound final : public BesideTrack {
public:
    /// Throws SourceError.
    BesideSound(const PacketReader& reader, const AVStream& stream, const SoundStreamInfo& sound,
                Demuxer& demuxer, const BesideBounds& bounds, Failures& failures);

    const AudioFormat& Format() const { return decoder_.Format(); }
    int Stream() const { return stream_; }

    /// As PcmDecoder's. Once the conversion has ended.
    int64_t Damaged() const { return decoder_.Damaged(); }
    int Corrections() const { return decoder_.Corrections(); }

private:
    struct Stretch {
        PcmDecoder::Chunk sound; // none: silence
        int64_t samples = 0;
    };

    bool Find(int64_t until, bool closing, Item& item) override;
    bool ReadMore(int64_t until, bool closing);
    void HandOut(int64_t samples, Item& item);

    Demuxer& demuxer_;
    const int stream_;
    PcmDecoder decoder_;
    bool begun_ = false;
    bool drained_ = false;
    std::deque<Stretch> stretches_; // decoded
    Stretch current_;               // of which so much has been handed out
    int64_t used_ = 0;
    int64_t position_ = 0; // samples handed out in all
    PcmDecoder::Chunk silence_;
    AudioFrame block_{};
};

/// Packets as they are, such as subtitles. What a cut divides goes into both files.
class BesidePackets final : public BesideTrack {
public:
    /// As Demuxer::TakeBeside. Stamps count in `timeBase` from the source's start.
    using Take = std::function<Demuxer::Beside(int64_t until, bool wait)>;
    using Clock = std::function<int64_t(int64_t stamp, AVRational timeBase)>;

    BesidePackets(Take take, Clock clock, AVRational timeBase, const BesideBounds& bounds,
                  Failures& failures);

    /// Packets from before the begin, which `take` may give once more.
    void Precede(std::vector<av::Packet> packets);

private:
    struct Held {
        av::Packet packet;
        int64_t begin = 0;
        int64_t end = 0;

        bool Ends() const { return end > begin; } // otherwise it lasts up to the next one
    };

    bool Find(int64_t until, bool closing, Item& item) override;
    void BeginFile(int64_t begin);
    void KeepDivided();
    void Hold(av::Packet packet);

    const Take take_;
    const Clock clock_;
    const AVRational timeBase_;
    int64_t fileBegin_;
    int64_t latest_ = 0;        // begin of what was read
    std::deque<Held> pending_;  // by their begins
    std::vector<Held> divided_; // go into the next file once more
    Held current_;              // handed out last
    bool divides_ = false;      // its file ends before it does
};

} // namespace movieconv

#endif
