// The movie file to convert: opened, its streams chosen and described. Nothing is decoded here.
#ifndef MOVIECONV_HOST_SOURCE_SOURCE_H
#define MOVIECONV_HOST_SOURCE_SOURCE_H

#include "ffmpeg/AvHandles.h"
#include "host/source/Completeness.h"
#include "host/source/MovieFile.h"
#include "host/source/SourceError.h"

#include <cstdint>
#include <limits>
#include <memory>
#include <optional>
#include <string>

namespace movieconv {

/// How a duration was found: told by the source, reckoned from its size and parts of it, or not at all.
enum class Certainty { kKnown, kEstimated, kGuessed };

struct PictureStreamInfo {
    int index = -1;          ///< Stream number in the container.
    std::string codec;       ///< Codec name, "h264".
    std::string pixelFormat; ///< FFmpeg's name, "yuv420p".
    int width = 0;           ///< As shown, after rotation.
    int height = 0;
    int quarterTurns = 0;  ///< Clockwise turns by 90 degrees that bring the stored picture upright.
    bool mirrored = false; ///< The stored picture is mirrored left to right before it is turned.
    AVRational
        pixelAspect{};    ///< Shape of a pixel as shown, width to height; 1:1 when the source does not tell.
    double frameRate = 0; ///< Average pictures per second.
    double peakRate = 0;  ///< Pictures per second where they follow each other closest; at least the average.
    double duration = 0;  ///< Seconds; estimated when the container does not tell.
    bool interlaced = false;
    int colorPrimaries = 2; ///< As in ISO/IEC 23091-2; 2: not stated.
    int colorTransfer = 2;
    int colorMatrix = 2;
};

struct SoundStreamInfo {
    int index = -1;
    std::string codec;
    std::string layout; ///< "stereo", "5.1".
    int sampleRate = 0;
    int channels = 0;
    int bitsPerSample = 16; ///< Of the PCM handed out: 16, or 32 for sources that hold more than 16.
    double duration = 0;
};

struct SourceInfo {
    std::string path;
    std::string container;                   ///< FFmpeg's long name.
    int64_t bytes = 0;                       ///< Size of the file, 0 when it has none.
    double duration = 0;                     ///< Seconds; the longer of the streams'.
    Certainty certainty = Certainty::kKnown; ///< Of `duration`.
    std::optional<PictureStreamInfo> pictures;
    std::optional<SoundStreamInfo> sound;
    Promise promise;
};

struct SourceChoice {
    bool pictures = true;   ///< Look for pictures at all.
    bool sound = true;      ///< Look for sound at all.
    bool playlists = false; ///< Also open what names other movies, in its own folder and below.
};

/// An opened movie. One thread at a time reads from it; Interrupt may be called from any.
class Source {
public:
    /// Opens `path` (bytes as the system has them) and finds the first stream of pictures and of sound that
    /// can be decoded. Throws SourceError, PlaylistError for a playlist that was not allowed.
    Source(const std::string& path, SourceChoice choice);
    Source(const Source&) = delete;
    Source& operator=(const Source&) = delete;

    const SourceInfo& Info() const { return info_; }
    AVFormatContext* Context() const { return file_->Context(); }
    const AVStream* PictureStream() const;
    const AVStream* SoundStream() const;

    /// A stamp of `stream` in media time, from the start of the source.
    int64_t MediaTime(int64_t stamp, const AVStream* stream) const;

    /// False for a pipe: trying to seek would lose what was read ahead.
    bool IsSeekable() const;

    /// Why a file that the source names was not read; empty when all were. The reading thread's.
    const std::string& Refusal() const { return file_->Refusal(); }

    /// Goes back to the first packet. False when it fails; where the source is then is not known.
    bool Rewind();

    /// Makes every read fail from now on, also one that is under way.
    void Interrupt() { file_->Interrupt(); }

private:
    /// What the packets of a part of the source tell, in seconds from its start.
    struct Stretch {
        int64_t bytes = 0;
        double first = std::numeric_limits<double>::infinity(); // stamp
        double last = 0;
        double end = 0;    // of what lasts longest
        int packets = 0;   // of one stream, pictures if there are any
        double length = 0; // of these packets
    };

    void Open();
    void ChooseStreams();
    void DescribePictures(int index);
    void DescribeSound(int index);
    double BeginOf(const AVStream* stream) const;
    double EndOf(const AVStream* stream) const;
    void FindFrameRate();
    double CountFrameRate();
    void FindDuration();
    void FindPromise(bool measured);
    void MeasureDuration();
    Stretch ReadStretch(int64_t mostBytes, int mostPackets = std::numeric_limits<int>::max());
    void ReturnToBegin();

    const SourceChoice choice_;
    std::unique_ptr<MovieFile> file_;
    int64_t start_ = 0; // the container's first stamp, in media time
    SourceInfo info_;
};

} // namespace movieconv

#endif
