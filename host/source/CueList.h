// All subtitles of a stream or a file that lie in the part of a movie that is converted, read ahead of it.
#ifndef MOVIECONV_HOST_SOURCE_CUELIST_H
#define MOVIECONV_HOST_SOURCE_CUELIST_H

#include "ffmpeg/AvHandles.h"
#include "host/sentence/Sentence.h"
#include "host/source/BurnWish.h"
#include "host/source/Source.h"

#include <cstdint>
#include <vector>

namespace movieconv {

struct CueList {
    struct Cue {
        int64_t begin = 0; ///< Media time.
        int64_t end = 0;   ///< Not after the begin: up to the next one.
        av::Packet packet;
    };

    av::CodecParameters parameters;
    std::vector<Cue> cues; ///< By their begins.
    Sentence unread;       ///< What was not looked for; empty where all was.

    /// From when to when each is shown at most.
    struct Span {
        int64_t begin = 0;
        int64_t end = 0;
    };
    std::vector<Span> Spans() const;

    bool IsText() const;

    /// A decoder for packets whose stamps count in `timeBase`. Throws TrackError.
    av::CodecContext OpenDecoder(AVRational timeBase) const;
};

/// Throws TrackError when there are no such subtitles, or they cannot be read or decoded.
CueList ReadCues(const Source& source, const BurnWish& wish, bool playlists);

} // namespace movieconv

#endif
