// Keeps a PNG file of the picture just written.
#ifndef MOVIECONV_HOST_CONVERT_PREVIEW_H
#define MOVIECONV_HOST_CONVERT_PREVIEW_H

#include "host/convert/SideFile.h"
#include "media/MediaRecords.h"

#include <condition_variable>
#include <cstdint>
#include <mutex>
#include <optional>
#include <string>
#include <thread>
#include <vector>

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

    /// Copies a planar 4:2:0 picture and returns; without memory it is not shown. Any one thread.
    void Offer(const VideoImage& image) noexcept;

    /// Waits until the last picture is written. What went wrong first; empty when nothing did.
    std::string Finish();

private:
    struct Picture {
        int width = 0;
        int height = 0;
        std::vector<uint8_t> planes; // Y, U, V without gaps
    };

    void Run();
    void Join();
    void Write(Picture& picture);
    std::string ReplaceFile(const AVPacket& content);

    const std::string path_;
    std::optional<FileId> replaceable_; // by the next picture
    std::mutex mutex_;
    std::condition_variable changed_;
    Picture latest_;
    bool fresh_ = false;
    bool finishing_ = false;
    std::string failure_;
    std::thread thread_;
};

} // namespace movieconv

#endif
