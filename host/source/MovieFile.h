// A movie's file, opened for reading: its bytes, and the demultiplexer that FFmpeg finds for them.
#ifndef MOVIECONV_HOST_SOURCE_MOVIEFILE_H
#define MOVIECONV_HOST_SOURCE_MOVIEFILE_H

#include "ffmpeg/AvHandles.h"
#include "host/source/CompanionFiles.h"
#include "host/source/Completeness.h"
#include "host/source/ContainerNotes.h"
#include "host/source/InputFile.h"

#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <vector>

namespace movieconv {

/// One thread at a time reads from it.
class MovieFile {
public:
    /// Opens `path` (bytes as the system has them) and finds out which streams there are. A movie is one
    /// file: what names other files is opened only if `playlists`, and then may name only movies in its own
    /// folder and below. `interruption` ends this, too. Throws SourceError, PlaylistError for a playlist
    /// that was not allowed.
    MovieFile(const std::string& path, bool playlists, Growth growth,
              const std::shared_ptr<const Interruption>& interruption);
    MovieFile(const MovieFile&) = delete;
    MovieFile& operator=(const MovieFile&) = delete;

    AVFormatContext* Context() const { return input_.get(); }

    /// Bytes in the file; 0 when it has no size.
    int64_t Bytes() const { return bytes_.Size(); }

    /// Whether the bytes come from several files, of which only the one that names them is counted.
    bool IsPlaylist() const;

    /// Whether the file promises more than it holds.
    bool IsCutOff() const { return movieconv::IsCutOff(bytes_, *input_); }

    /// See movieconv::LastPackets.
    std::vector<std::optional<double>> LastPackets() const { return movieconv::LastPackets(bytes_, *input_); }

    /// What it says and FFmpeg does not read.
    ContainerNotes Notes() const { return ReadContainerNotes(bytes_, *input_); }

    /// Why a file that the source names was not read; empty when all were.
    const Sentence& Refusal() const { return companions_.Refusal(); }

private:
    const AVInputFormat& Recognise(const std::string& url, bool playlists);
    void Open(const std::string& url, const AVInputFormat& format);
    int TryToOpen(const std::string& url, const AVInputFormat& format, bool patiently);
    bool MayHoldMore() const;

    const std::string path_;
    CompanionFiles companions_;
    InputFile bytes_;
    av::Input input_;
};

} // namespace movieconv

#endif
