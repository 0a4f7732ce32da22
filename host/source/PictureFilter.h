// Changes what decoded pictures show: interlaced ones become progressive, HDR becomes what every display
// shows.
#ifndef MOVIECONV_HOST_SOURCE_PICTUREFILTER_H
#define MOVIECONV_HOST_SOURCE_PICTUREFILTER_H

#include "ffmpeg/AvHandles.h"
#include "ffmpeg/FilterGraph.h"
#include "host/source/Deinterlace.h"
#include "host/source/SourceInfo.h"

#include <cstdint>
#include <deque>
#include <functional>
#include <optional>
#include <string>

namespace movieconv {

/// Gives a picture for each that it takes, in order, some of them one later. Pictures that need nothing pass
/// as they are, until the first one that does.
class PictureFilter {
public:
    /// Takes a picture by moving its content out; false ends the work.
    using Sink = std::function<bool(AVFrame& picture, std::optional<int64_t> stamp)>;

    PictureFilter(const PictureStreamInfo& pictures, const SourceChoice& choice);

    /// False when the sink wanted no more. Throws SourceError when the pictures cannot be filtered.
    bool Push(AVFrame& picture, std::optional<int64_t> stamp, const Sink& sink);

    /// Hands out what is still held.
    bool Finish(const Sink& sink);

    /// Whether any picture was deinterlaced.
    bool Deinterlaced() const { return deinterlaced_; }

    /// Whether any picture that says it is interlaced was to stay so.
    bool LeftInterlaced() const { return leftInterlaced_; }

private:
    std::string Chain() const;
    bool HandOut(const Sink& sink);

    const Deinterlace deinterlace_;
    const bool deep_;
    const int transfer_;           // of HDR that becomes SDR; 0: none does
    const char* matrix_ = nullptr; // of its latest picture
    bool deinterlaced_ = false;
    bool leftInterlaced_ = false;
    std::optional<av::FilterGraph> graph_;
    int64_t count_ = 0;
    std::deque<std::optional<int64_t>> stamps_; // of the pictures in the graph
};

} // namespace movieconv

#endif
