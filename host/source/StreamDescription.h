// Describes a container's streams, chapters and tags.
#ifndef MOVIECONV_HOST_SOURCE_STREAMDESCRIPTION_H
#define MOVIECONV_HOST_SOURCE_STREAMDESCRIPTION_H

#include "ffmpeg/AvHandles.h"
#include "host/source/SourceInfo.h"

#include <vector>

extern "C" {
#include <libavutil/mastering_display_metadata.h>
}

namespace movieconv {

/// All times count from `start`, in media time. Nothing is read; what only decoding would tell is left out.
std::vector<StreamInfo> DescribeStreams(AVFormatContext& context, int64_t start);
std::vector<Chapter> DescribeChapters(const AVFormatContext& context, int64_t start);

/// Describes a stream as one of that codec.
void SetCodec(StreamInfo& info, AVCodecID codec);

/// SourceInfo::isImage, of a source that is known otherwise.
bool IsImage(const AVFormatContext& context, const SourceInfo& info);

/// What people wrote: nothing that a multiplexer notes about its own file.
std::vector<Tag> DescribeTags(const AVDictionary* metadata);

/// What the broadcast service is called to which a stream belongs, as "title", and whose it is.
std::vector<Tag> DescribeService(AVFormatContext& context, int stream);

/// Takes down what a stream or a frame tells of the light that its pictures were made for; null where it does
/// not.
void TakeLight(const AVMasteringDisplayMetadata* display, const AVContentLightMetadata* light,
               PictureStreamInfo& info);

} // namespace movieconv

#endif
