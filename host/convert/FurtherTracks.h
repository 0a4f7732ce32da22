// The tracks of an output that are read from the movie beside what the engine converts: opened, and handed to
// the writer.
#ifndef MOVIECONV_HOST_CONVERT_FURTHERTRACKS_H
#define MOVIECONV_HOST_CONVERT_FURTHERTRACKS_H

#include "host/convert/Observer.h"
#include "host/convert/Request.h"
#include "host/source/Movie.h"
#include "media/EncodeParam.h"
#include "writer/WriterStatus.h"

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

namespace movieconv {

/// Subtitles as a track of the writer's set.
struct SubtitleTrack {
    int track;
    StreamInfo stream; ///< Without a number when they come from a file of their own.
};

class FurtherTracks {
public:
    /// All of them outlive it, and the movie outlives what the writer does with the set.
    FurtherTracks(Movie& movie, const Request& request, const FileFormatInfo& format, uint32_t set);

    /// A stream of sound or of subtitles that the format can hold. Throws Failure when it cannot be read.
    void Add(const StreamInfo& stream);

    /// A file of subtitles, as far as the format can hold it. Returns what of it is lost. Throws Failure.
    std::optional<NotCarried> AddFile(const SubtitleFileWish& wish, const std::string& charset);

    /// Hands them to the writer: only now, since what is copied is described by its first packets. Returns
    /// those of subtitles. Throws Failure.
    std::vector<SubtitleTrack> Finish();

private:
    struct Track {
        WriterTrack track;
        BesideTrack* source;
        StreamInfo stream;
        CopiedSound* copied = nullptr;
        av::CodecParameters parameters = nullptr; // of packets, where nobody else keeps them
    };

    void AddSound(const StreamInfo& stream);
    void AddPackets(const StreamInfo& stream);

    Movie& movie_;
    const Request& request_;
    const FileFormatInfo& format_;
    const uint32_t set_;
    std::vector<Track> tracks_;
};

} // namespace movieconv

#endif
