// All streams of a movie that go into the output beside the pictures and the sound that the engine converts.
#ifndef MOVIECONV_HOST_SOURCE_BESIDETRACKS_H
#define MOVIECONV_HOST_SOURCE_BESIDETRACKS_H

#include "host/source/BesideTrack.h"
#include "host/source/CopiedSound.h"
#include "host/source/Demuxer.h"
#include "host/source/EarlierCues.h"
#include "host/source/Failures.h"
#include "host/source/Source.h"
#include "host/source/SubtitleFile.h"

#include <atomic>
#include <cstdint>
#include <map>
#include <memory>
#include <string>
#include <vector>

namespace movieconv {

/// The tracks live as long as this. They are opened before the conversion, each stream once.
class BesideTracks {
public:
    /// All of them outlive it.
    BesideTracks(Source& source, const SourceChoice& choice, Demuxer& demuxer, Failures& failures);

    /// How the output divides the source, in seconds. Before any track is opened.
    void SetBounds(double begin, bool ends, bool isCut);

    /// Reads a stream as PCM or as its packets. Throws SourceError.
    BesideSound& ReadSound(int stream);
    BesidePackets& ReadPackets(int stream);

    /// Likewise, packets of sound. Its Describe is for DescribeCopied to call.
    CopiedSound& CopySound(int stream);

    /// CopiedSound::Describe, for which reading begins: once all tracks are open.
    const AVCodecParameters& DescribeCopied(CopiedSound& sound);

    /// Subtitles of a file of their own, whose times are the movie's. `stream` is set to their description.
    /// Throws SourceError.
    BesidePackets& ReadFile(const std::string& path, const std::string& charset, const AVStream*& stream);

    /// Where the file ends that is being written, in media time, when another one follows it.
    /// BesideBounds::kOpen when it is not known (any more). Any thread.
    void EndFileAt(int64_t time) { bounds_.fileEnd = time; }

    /// The files end where pictures and sound do. Any thread.
    void Stop() { bounds_.stopped = true; }

    /// Whether that stream goes into the output as its packets.
    bool Copies(int stream) const;

    /// As Movie's.
    std::vector<Sentence> Complaints() const;

private:
    template <class Track>
    Track& Add(int stream, std::unique_ptr<Track> track);
    const AVStream& StreamOf(int stream) const;
    std::vector<av::Packet> CuesBefore(int stream);

    Source& source_;
    const SourceChoice& choice_;
    Demuxer& demuxer_;
    Failures& failures_;
    double begin_ = 0; // seconds
    BesideBounds bounds_;
    EarlierCues earlierCues_;
    bool earlierCuesRead_ = false;
    std::atomic<int64_t> cuesInOtherCharset_{0};
    std::vector<int> streams_; // that are read
    std::vector<int> copied_;  // of these
    std::vector<std::unique_ptr<SubtitleFile>> files_;
    std::vector<std::unique_ptr<BesideTrack>> tracks_;
    std::vector<const BesideSound*> sounds_; // of these
};

} // namespace movieconv

#endif
