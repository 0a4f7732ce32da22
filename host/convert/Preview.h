// Keeps a PNG file of the picture just written.
#ifndef MOVIECONV_HOST_CONVERT_PREVIEW_H
#define MOVIECONV_HOST_CONVERT_PREVIEW_H

#include "media/MediaRecords.h"

#include <condition_variable>
#include <cstdint>
#include <mutex>
#include <string>
#include <thread>
#include <vector>

namespace movieconv {

/// Writes at most once a second, on a thread of its own, to a temporary file that then takes the name. The
/// last picture offered is always written.
class Preview {
public:
    explicit Preview(std::string path);
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

    const std::string path_;
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
