// Streams that come up while a source is read: broadcasts announce others between two programmes.
#ifndef MOVIECONV_HOST_SOURCE_LATESTREAMS_H
#define MOVIECONV_HOST_SOURCE_LATESTREAMS_H

#include "ffmpeg/AvHandles.h"
#include "host/source/SourceInfo.h"

#include <cstddef>
#include <cstdint>
#include <map>
#include <vector>

namespace movieconv {

/// Knows which of them go on with a stream that is taken, and what is left out of the others.
class LateStreams {
public:
    /// Of pictures or sound, in media time.
    struct Left {
        StreamKind kind;
        int64_t begin;
        int64_t end;
    };

    /// `known`: the number of streams that there are at first.
    explicit LateStreams(std::size_t known) : known_(static_cast<int>(known)) {}

    /// A packet of a stream that is taken was read: remembers where the stream stands in its programme.
    void See(const AVFormatContext& context, int stream);

    /// The stream that one takes the place of: it stands where that one stood among its kind in the
    /// programme, which does not name that one any more. -1 without one.
    int Replaced(const AVFormatContext& context, int stream) const;

    /// A packet of a stream that nobody takes was read; `replaces`: the stream has the place of another one.
    void Leave(const AVFormatContext& context, int stream, bool replaces, int64_t begin, int64_t end);

    /// In the order of their numbers.
    std::vector<Left> AllLeft() const;

private:
    struct Place {
        int program;
        std::size_t position; // among its kind
    };

    bool IsOfOtherProgramme(const AVFormatContext& context, int stream) const;

    const int known_;
    std::map<int, Place> places_; // by stream
    std::map<int, Left> left_;
};

/// Whether the packets of both can go to one decoder.
bool AreAlike(const AVStream& one, const AVStream& other);

} // namespace movieconv

#endif
