// A file of subtitles beside the movie.
#ifndef MOVIECONV_HOST_SOURCE_SUBTITLEFILE_H
#define MOVIECONV_HOST_SOURCE_SUBTITLEFILE_H

#include "ffmpeg/AvHandles.h"
#include "host/source/Interruption.h"

#include <cstdint>
#include <memory>
#include <string>

namespace movieconv {

/// For one thread.
class SubtitleFile {
public:
    /// Reads `path`, in `charset`, see Decoded. Throws SourceError when it cannot be read or is not text with
    /// subtitles; of a pipe as much comes as is written into it.
    SubtitleFile(const std::string& path, const std::string& charset,
                 const std::shared_ptr<const Interruption>& interruption = std::make_shared<Interruption>());
    SubtitleFile(const SubtitleFile&) = delete;
    SubtitleFile& operator=(const SubtitleFile&) = delete;

    const AVStream& Stream() const { return *input_->streams[0]; }

    /// The next packet; null at the end.
    av::Packet Take();

private:
    static int Read(void* file, uint8_t* data, int size);
    static int64_t Seek(void* file, int64_t offset, int whence);

    std::string text_;
    int64_t position_ = 0;
    av::Io io_;
    av::Input input_;
};

} // namespace movieconv

#endif
