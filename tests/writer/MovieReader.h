// Reads a movie with FFmpeg's libraries, not with the host's decoders, and says what is in it.
#ifndef MOVIECONV_TESTS_WRITER_MOVIEREADER_H
#define MOVIECONV_TESTS_WRITER_MOVIEREADER_H

#include "TestSource.h"
#include "ffmpeg/AvHandles.h"
#include "writer/WriterStatus.h"

#include <cstdint>
#include <functional>
#include <map>
#include <string>
#include <vector>

/// One decoded picture.
struct ReadPicture {
    double time = 0; ///< Seconds.
    bool isKeyFrame = false;
    int width = 0;
    int height = 0;
    std::vector<uint8_t> luma; ///< Rows without padding.

    int At(int x, int y) const { return luma[static_cast<size_t>(y) * width + x]; }
};

/// One decoded movie. Streams that are missing leave their fields as they are.
struct ReadMovie {
    bool readable = false;
    double duration = 0; ///< Seconds, as the container says.

    int videoStreams = 0;
    AVCodecID videoCodec = AV_CODEC_ID_NONE;
    AVRational sampleAspect{0, 1};
    std::vector<ReadPicture> pictures;

    int audioStreams = 0;
    AVCodecID audioCodec = AV_CODEC_ID_NONE;
    int sampleRate = 0;
    int channels = 0;
    double audioStart = 0;           ///< Seconds; time of the first sample that is heard.
    int64_t samples = 0;             ///< Sample frames decoded.
    std::vector<float> firstChannel; ///< Decoded samples, -1 to 1.
    std::map<uint64_t, float>
        loudest; ///< Sample of each loudspeaker (AV_CH_...), with its usual layout untold.

    /// Seconds at which the sound is no longer silent.
    double ToneBegins() const;
};

/// Decodes everything in `path`. `readable` is false when the file cannot be opened or its data ends in
/// errors.
ReadMovie ReadMovieFile(const std::string& path);

/// Fails the test when `movie` is not `whole`. It may have its codec's run-up before its sound, as files of
/// the MP4 family have without their index.
void ExpectSame(const ReadMovie& movie, const ReadMovie& whole);

/// Calls `take` for every packet of a file, in its order and unchanged, or for every stream.
void ReadPackets(const std::string& path, const std::function<void(const AVPacket&)>& take);
void WithStreams(const std::string& path, const std::function<void(const AVStream&)>& take);

/// Writes a file with everything in `movie`, or with what `write` writes, and reads it. Fails the test when
/// the writer does not say that the file is complete.
ReadMovie WriteAndRead(const TestMovie& movie, const std::function<void(void* file)>& write = nullptr);

/// The status of the file created last with this set of options.
WriterStatus Latest(uint32_t set = kWriterDefaultSet);

#endif
