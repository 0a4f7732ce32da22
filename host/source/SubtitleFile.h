// A file of subtitles beside the movie.
#ifndef MOVIECONV_HOST_SOURCE_SUBTITLEFILE_H
#define MOVIECONV_HOST_SOURCE_SUBTITLEFILE_H

#include "ffmpeg/AvHandles.h"
#include "host/source/Demuxer.h"
#include "host/source/Interruption.h"

#include <cstdint>
#include <memory>
#include <string>
#include <vector>

namespace movieconv {

/// A text in UTF-8, from one in `charset`; by default UTF-8 or UTF-16 if it can be that, else Windows-1252.
/// One that begins with a byte order mark stays as it is. Throws SourceError when there is no such character
/// set, or the text is none in it.
std::string ToUtf8(std::string text, const std::string& charset);

/// Whether packets of the codec are nothing but text.
bool IsPlainText(AVCodecID codec);

/// A packet of subtitles made of plain text, in UTF-8 whatever it is in. Whether it had to be changed.
bool MakeUtf8(AVPacket& packet);

/// For one thread.
class SubtitleFile {
public:
    /// Reads `path`, in `charset`, see ToUtf8. Throws SourceError when it cannot be read or is not text with
    /// subtitles; of a pipe as much comes as is written into it.
    SubtitleFile(const std::string& path, const std::string& charset,
                 const std::shared_ptr<const Interruption>& interruption = std::make_shared<Interruption>());
    SubtitleFile(const SubtitleFile&) = delete;
    SubtitleFile& operator=(const SubtitleFile&) = delete;

    const AVStream& Stream() const { return *input_->streams[0]; }

    /// The next packet.
    Demuxer::Beside Take();

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
