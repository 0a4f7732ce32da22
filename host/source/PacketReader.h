// Reads a movie's packets: the streams that are wanted, on the movie's clock, from its start again if need
// be.
#ifndef MOVIECONV_HOST_SOURCE_PACKETREADER_H
#define MOVIECONV_HOST_SOURCE_PACKETREADER_H

#include "ffmpeg/AvHandles.h"
#include "host/source/MovieFile.h"

#include <cstdint>
#include <memory>
#include <string>
#include <vector>

namespace movieconv {

/// One thread at a time reads; Interrupt may be called from any.
class PacketReader {
public:
    /// Opens as MovieFile does. Throws SourceError.
    PacketReader(const std::string& path, bool playlists, Growth growth,
                 std::shared_ptr<Interruption> interruption);

    /// Streams are the context's only until Rewind or Reopen, their numbers stay.
    AVFormatContext* Context() const { return file_->Context(); }
    const MovieFile& File() const { return *file_; }

    /// The container's first stamp in media time.
    int64_t Start() const { return start_; }

    /// Lets nothing but these streams be read.
    void Select(std::vector<int> streams);

    /// Lets these be read as well; they have no say in where reading begins.
    void SelectBeside(std::vector<int> streams);

    /// A stamp in media time, from the start of the source.
    int64_t MediaTime(int64_t stamp, AVRational timeBase) const;

    /// False for a pipe: trying to seek would lose what was read ahead.
    bool IsSeekable() const;

    /// Goes back to the first packet. False when it fails; where the source is then is not known.
    bool Rewind();

    /// Opens the file once more, at its start. Throws SourceError.
    void Reopen();

    /// Makes every read fail from now on, also one that is under way.
    void Interrupt() { interruption_->Interrupt(); }

    /// For another reader, which is then interrupted together with this one.
    const std::shared_ptr<Interruption>& Interruptible() const { return interruption_; }

private:
    void DiscardOthers();

    const std::string path_;
    const bool playlists_;
    const Growth growth_;
    const std::shared_ptr<Interruption> interruption_;
    std::unique_ptr<MovieFile> file_;
    int64_t start_ = 0;
    std::vector<int> selected_;
    std::vector<int> beside_;
};

} // namespace movieconv

#endif
