// What a file carries beside pictures and sound; see writer/WriterStatus.h.
#ifndef MOVIECONV_WRITER_EXTRAS_H
#define MOVIECONV_WRITER_EXTRAS_H

#include <cstdint>
#include <map>
#include <memory>
#include <string>
#include <vector>

extern "C" {
#include <libavcodec/codec_id.h>
}

namespace writer {

using Tags = std::map<std::string, std::string>;
using Bytes = std::shared_ptr<const std::vector<uint8_t>>;

struct Chapter {
    int64_t begin; ///< 100 ns units.
    int64_t end;
    std::string title;
};

struct Cover {
    AVCodecID codec = AV_CODEC_ID_NONE; ///< None where there is no cover.
    int width = 0;
    int height = 0;
    Bytes data;
};

struct Attachment {
    std::string fileName;
    std::string mimeType;
    Bytes data;
};

/// Of one set. Copies share the large data.
struct Extras {
    Tags tags;
    Tags pictureTags;
    Tags soundTags;
    std::vector<Chapter> chapters; ///< In the source's time, or in the file's.
    Cover cover;
    std::vector<Attachment> attachments;
};

/// Sets, or takes away where there is no value. False for an empty key.
bool SetTag(Tags& tags, const char* key, const char* value);

/// A cover with its codec and size; without a codec when it is neither JPEG nor PNG.
Cover MakeCover(const void* data, int64_t size);

/// The chapters that lie in a file of `length` that begins at `begin` in the source, on the file's timeline,
/// in their order.
std::vector<Chapter> ChaptersWithin(const std::vector<Chapter>& chapters, int64_t begin, int64_t length);

} // namespace writer

#endif
