// The files beside a source that a playlist may name. Whatever FFmpeg's demultiplexers want to open comes by
// here.
#ifndef MOVIECONV_HOST_SOURCE_COMPANIONFILES_H
#define MOVIECONV_HOST_SOURCE_COMPANIONFILES_H

#include "ffmpeg/AvHandles.h"
#include "host/sentence/Sentence.h"
#include "host/source/InputFile.h"

#include <map>
#include <memory>
#include <string>

namespace movieconv {

class CompanionFiles {
public:
    /// For the source at `path`. Unless `allowed`, no file but the source itself is opened; otherwise also
    /// regular files in its folder and below, as they lie once all symbolic links are followed.
    CompanionFiles(std::string path, bool allowed, std::shared_ptr<const Interruption> interruption);
    CompanionFiles(const CompanionFiles&) = delete;
    CompanionFiles& operator=(const CompanionFiles&) = delete;

    /// Makes the context ask here for every further file. Must outlive it.
    void Guard(AVFormatContext& context);

    /// Where the file called `url` lies, all links followed. Throws SourceError with the reason when it must
    /// not be read.
    std::string Permit(const std::string& url) const;

    /// A file that Permit gave. Throws std::system_error.
    std::unique_ptr<InputFile> Open(const std::string& path) const;

    /// From now on a file may be opened as often as its parts are needed: the source has been opened. Until
    /// then that is a playlist that names itself, in which the demultiplexer would never come to an end.
    void AllowRepetition() { repetition_ = true; }

    /// Why the first file that was not permitted was refused; empty when none was.
    const Sentence& Refusal() const { return refusal_; }

private:
    static int OnOpen(AVFormatContext* context, AVIOContext** io, const char* url, int flags,
                      AVDictionary** options);
    static int OnClose(AVFormatContext* context, AVIOContext* io);

    const std::string source_;
    const bool allowed_;
    const std::shared_ptr<const Interruption> interruption_;
    bool repetition_ = false;
    std::map<std::string, int> openings_; // of each file
    Sentence refusal_;
    std::map<const AVIOContext*, std::unique_ptr<InputFile>> open_;
};

} // namespace movieconv

#endif
