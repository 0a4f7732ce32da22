// Puts what a file carries beside pictures and sound into its container.
#ifndef MOVIECONV_WRITER_EXTRASMUXER_H
#define MOVIECONV_WRITER_EXTRASMUXER_H

#include "ffmpeg/AvHandles.h"
#include "writer/Extras.h"
#include "writer/FormatTable.h"

#include <vector>

namespace writer {

/// What of `extras` the container holds, in the order in which a multiplexer wants it. Reads `extras` as long
/// as it lives. Functions that return a number return FFmpeg's error; all throw std::bad_alloc.
class ExtrasMuxer {
public:
    /// A fragmented file has neither cover nor attachments nor chapters.
    ExtrasMuxer(const Container& container, bool fragmented, const Extras& extras)
        : container_(container), fragmented_(fragmented), extras_(extras) {}

    void SetMovieTags(AVFormatContext& output) const;
    void SetLabel(AVStream& stream, const TrackLabel& label) const;

    /// Streams for cover and attachments, once all others are there.
    void AddStreams(AVFormatContext& output);

    /// For containers that have them in their header.
    void SetEarlyChapters(AVFormatContext& output) const;

    /// Right after the header.
    int WriteCover(AVFormatContext& output) const;

    /// On the file's timeline, before its end; for all other containers.
    void SetChapters(AVFormatContext& output, const std::vector<OutputChapter>& chapters) const;

    /// Whether languages have a place for a tag beside their code.
    bool IsMatroska() const;

    /// Whether the cover is a stream, which never gets a second packet.
    bool HasCoverStream() const { return coverStream_ >= 0; }

private:
    bool Carries(uint32_t what) const { return (container_.carries & what) != 0; }
    void AddAttachments(AVFormatContext& output) const;
    void AddChapters(AVFormatContext& output, const std::vector<OutputChapter>& chapters) const;
    void AddCover(AVFormatContext& output);

    const Container& container_;
    const bool fragmented_;
    const Extras& extras_;
    int coverStream_ = -1;
};

} // namespace writer

#endif
