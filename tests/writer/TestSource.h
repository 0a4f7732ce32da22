// Pictures, sound and parameters for tests of the writer.
#ifndef MOVIECONV_TESTS_WRITER_TESTSOURCE_H
#define MOVIECONV_TESTS_WRITER_TESTSOURCE_H

#include "media/EncodeParam.h"
#include "media/FourCC.h"
#include "media/MediaRecords.h"
#include "media/MediaWriter.h"
#include "writer/WriterStatus.h"

#include <cstdint>
#include <functional>
#include <string>
#include <vector>

/// One picture: a moving ramp with a bright block whose place tells the picture's number.
class TestPicture {
public:
    /// `pitchExtra` bytes follow every row; they hold bytes that must never be seen.
    TestPicture(int width, int height, int pitchExtra = 0);

    /// Paints picture `number` and stamps it; `time` in 100 ns units.
    const VideoImage& Paint(int number, int64_t time);

private:
    std::vector<unsigned char> planes_[3];
    VideoImage image_{};
};

/// A tone in blocks, after `quiet` seconds of silence.
class TestSound {
public:
    TestSound(int rate, int channels, int bits, double quiet = 0.0);

    /// The next `samples` sample frames, stamped `time`.
    const AudioFrame& Next(int samples, int64_t time);

private:
    std::vector<unsigned char> data_;
    AudioFrame frame_{};
    double quiet_;
    int64_t position_ = 0;
};

/// Options that are registered for as long as this object lives.
class RegisteredOptions {
public:
    explicit RegisteredOptions(const WriterOptions& options) : set_(MWRegisterOptions(&options)) {}
    RegisteredOptions(const RegisteredOptions&) = delete;
    RegisteredOptions& operator=(const RegisteredOptions&) = delete;
    ~RegisteredOptions() { MWUnregisterOptions(set_); }

    uint32_t Set() const { return set_; }

private:
    const uint32_t set_;
};

/// What a test writes, with the defaults of most tests.
struct TestMovie {
    int width = 160;
    int height = 120;
    double rate = 25.0;
    int pictures = 50;
    int pitchExtra = 0;
    int sampleRate = 44100;
    int channels = 2;
    int bits = 16;
    double soundSeconds = 2.0;
    double quietSeconds = 0.0; ///< Silence at the start of the sound.
    EncodeParam param = Param();
    bool hasVideo = true;
    bool hasAudio = true;

    static EncodeParam Param();

    /// Names the options that the file is to have.
    void Use(const RegisteredOptions& options) { param.nReserved[kWriterSetWord] = options.Set(); }

    VideoFormat Video() const { return {width, height, rate, pictures / rate}; }
    AudioFormat Audio() const {
        return {sampleRate, channels, bits, sampleRate * channels * bits / 8, soundSeconds};
    }

    /// Creates the file; null when the writer refuses.
    void* Create(const std::string& path) const;

    /// Writes everything in the order of the engine: sound up to a picture's time, then the picture. `before`
    /// is called with the number of every picture before it is written.
    void WriteAll(void* file, const std::function<void(int)>& before = nullptr) const;

    /// Creates, writes and closes; true when the writer says that the file is complete.
    bool Write(const std::string& path) const;
};

#endif
