// Keeps a PNG file of the picture just written.
#ifndef MOVIECONV_HOST_TERMINAL_PREVIEW_H
#define MOVIECONV_HOST_TERMINAL_PREVIEW_H

#include "host/convert/Observer.h"
#include "host/terminal/SideFile.h"

#include <condition_variable>
#include <memory>
#include <mutex>
#include <optional>
#include <string>
#include <thread>

struct AVPacket;

namespace movieconv {

/// Throws Failure when a preview must not be written there: to what is no file or a symbolic link, and
/// without `overwrite` to a file that is no preview. The file that is to be replaced; nothing when there is
/// none.
std::optional<FileId> CheckPreview(const std::string& path, bool overwrite);

/// Writes at most once a second, on a thread of its own, to a temporary file that then takes the name. The
/// last picture offered is always written. What others put there meanwhile is left alone.
class Preview {
public:
    /// Checks as CheckPreview does.
    Preview(std::string path, bool overwrite);
    Preview(const Preview&) = delete;
    Preview& operator=(const Preview&) = delete;
    ~Preview();

    /// The main thread.
    void Offer(std::shared_ptr<const ShownPicture> picture) noexcept;

    /// Waits until the last picture is written. What went wrong first; empty when nothing did.
    std::string Finish();

private:
    void Run();
    void Join();
    void Write(const ShownPicture& picture);
    std::string ReplaceFile(const AVPacket& content);

    const std::string path_;
    std::optional<FileId> replaceable_; // by the next picture
    std::mutex mutex_;
    std::condition_variable changed_;
    std::shared_ptr<const ShownPicture> latest_; // null once written
    bool finishing_ = false;
    std::string failure_;
    std::thread thread_;
};

} // namespace movieconv

#endif
