// What a file carries beside pictures and sound; see writer/WriterStatus.h.
#ifndef MOVIECONV_WRITER_EXTRAS_H
#define MOVIECONV_WRITER_EXTRAS_H

#include "ffmpeg/AvHandles.h"
#include "writer/WriterStatus.h"

#include <atomic>
#include <cstdint>
#include <map>
#include <memory>
#include <string>
#include <vector>

namespace writer {

using Tags = std::map<std::string, std::string>;
using Bytes = std::shared_ptr<const std::vector<uint8_t>>;

struct OutputChapter {
    int64_t begin; ///< 100 ns units.
    int64_t end;
    std::string title;
};

struct Cover {
    AVCodecID codec = AV_CODEC_ID_NONE; ///< None where there is no cover.
    int width = 0;
    int height = 0;
    Bytes data;
    std::string fileName; ///< Empty: the usual one.
    std::string description;
};

struct Attachment {
    std::string fileName;
    std::string mimeType;
    std::string description;
    Bytes data;
};

/// What is said about a stream.
struct TrackLabel {
    Tags tags;
    int flags = 0; ///< FFmpeg's AV_DISPOSITION_...

    /// "" without such a text.
    std::string Text(const char* key) const {
        const auto found = tags.find(key);
        return found != tags.end() ? found->second : std::string();
    }
};

/// A track beside the engine's; see WriterTrack.
struct Track {
    TrackLabel label;
    int sampleRate = 0; ///< Of sound to encode; 0: there are packets.
    int channels = 0;
    int bitsPerSample = 0;
    int64_t bitrate = 0;
    uint64_t speakers = 0;                         ///< As in WriterOptions::nChannelMask.
    std::shared_ptr<AVCodecParameters> parameters; ///< Of packets.
    WriterTrackReader next = nullptr;
    void* context = nullptr;
    std::shared_ptr<std::atomic<int64_t>> lostCues; ///< In all files that it went into.
};

/// Whether its packets are sound.
inline bool IsSound(const Track& track) {
    return track.parameters && track.parameters->codec_type == AVMEDIA_TYPE_AUDIO;
}

/// Of one set. Copies share the large data.
struct Extras {
    Tags tags;
    TrackLabel pictures;
    TrackLabel sound;
    std::vector<Track> tracks;
    std::vector<OutputChapter> chapters; ///< In the source's time, or in the file's.
    Cover cover;
    std::vector<Attachment> attachments;
};

/// Sets, or takes away where there is no value. False for an empty key.
bool SetTag(Tags& tags, const char* key, const char* value);

/// The label of a track by its number; null when there is none.
TrackLabel* FindLabel(Extras& extras, int track);

/// Adds what the caller's record describes. False when that makes no sense. Throws std::bad_alloc.
bool AddTrack(Extras& extras, const WriterTrack* track);

/// A cover with its codec and size; without a codec when it is neither JPEG nor PNG.
Cover MakeCover(const void* data, int64_t size);

/// What a file of that many seconds carries which begins at `begin` in the source: of the chapters those that
/// lie in it, on the file's timeline.
Extras ExtrasWithin(Extras extras, int64_t begin, double seconds);

} // namespace writer

#endif
