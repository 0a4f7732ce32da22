// The movie to convert: opened, described, its streams chosen and probed. Nothing is decoded here.
#ifndef MOVIECONV_HOST_SOURCE_SOURCE_H
#define MOVIECONV_HOST_SOURCE_SOURCE_H

#include "host/source/PacketReader.h"
#include "host/source/SourceError.h"
#include "host/source/SourceInfo.h"

#include <memory>
#include <string>

namespace movieconv {

/// One thread at a time reads from it.
class Source {
public:
    /// Opens `path` (bytes as the system has them) and chooses what is converted. Throws SourceError,
    /// PlaylistError for a playlist that was not allowed. `interruption` ends this, too.
    Source(const std::string& path, const SourceChoice& choice,
           std::shared_ptr<Interruption> interruption = std::make_shared<Interruption>());
    Source(const Source&) = delete;
    Source& operator=(const Source&) = delete;

    const SourceInfo& Info() const { return info_; }
    PacketReader& Reader() { return reader_; }
    const PacketReader& Reader() const { return reader_; }

    /// The content of a cover or an attachment; empty for other streams.
    std::vector<uint8_t> StoredFile(int stream) const;

    /// What a decoder or a multiplexer has to know of a stream: what FFmpeg's demultiplexer tells, with the
    /// codec of Info(), which that one may not know.
    av::CodecParameters ParametersOf(int stream) const;

    /// Null without such a stream. Valid until the reader rewinds.
    const AVStream* PictureStream() const;
    const AVStream* SoundStream() const;

private:
    void Probe();
    void CropPictures(const Crop& crop);
    StreamInfo& StreamOf(int index);

    PacketReader reader_;
    SourceInfo info_;
};

} // namespace movieconv

#endif
