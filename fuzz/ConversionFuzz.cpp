// Whole conversions: the three loops behind the MC functions, over decoders whose pictures, blocks and
// formats come from the input, into the recording writer; and the helpers for sound.
#include "engine/AudioHelpers.h"
#include "fuzz/Fuzz.h"
#include "tests/engine/ScriptedHost.h"

#include <cmath>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include <time.h>
#include <unistd.h>

namespace {

constexpr size_t kMostRecords = 24;
constexpr size_t kSampleBytes = 4096;

int64_t Add(int64_t a, int64_t b) {
    return static_cast<int64_t>(static_cast<uint64_t>(a) + static_cast<uint64_t>(b));
}
int64_t Subtract(int64_t a, int64_t b) {
    return static_cast<int64_t>(static_cast<uint64_t>(a) - static_cast<uint64_t>(b));
}

int64_t WildTime(FuzzedDataProvider& input, int64_t usual) {
    switch (input.ConsumeIntegralInRange(0, 9)) {
    case 0:
        return WildInteger<int64_t>(input, usual);
    case 1:
        return -1;
    case 2:
        return Add(usual, input.ConsumeIntegral<int32_t>());
    default:
        return usual;
    }
}

/// Which calls to a decoder's description fail: never, always, or from one call on.
class Availability {
public:
    explicit Availability(FuzzedDataProvider& input)
        : calls(input.ConsumeIntegralInRange(0, 7) == 0 ? input.ConsumeIntegralInRange(0, 8) : INT32_MAX) {}

    bool Next() { return calls > 0 && (calls == INT32_MAX || calls-- > 0); }

private:
    int32_t calls;
};

class ListedVideo : public VideoDecoder {
public:
    explicit ListedVideo(FuzzedDataProvider& input)
        : available(input), overwrites(input.ConsumeBool()), stepMs(input.ConsumeIntegralInRange(0U, 1500U)) {
        info.format.nWidth = WildInteger(input, 320);
        info.format.nHeight = WildInteger(input, 240);
        info.format.dFrameRate = WildDouble(input, 25.0);
        info.format.dDuration = WildDouble(input, 1.0);
        int64_t time = WildTime(input, 0);
        for (auto i = input.ConsumeIntegralInRange<size_t>(0, kMostRecords); i > 0; --i) {
            pictures.push_back(MakePicture(input, time));
            results.push_back(WildInteger(input, 1));
            time = Add(time, kSecond / 25);
        }
    }

    VideoSourceInfo* GetVideoInfo() override { return available.Next() ? &info : nullptr; }
    double Seek(double, int) override { return 0.0; }
    VideoImage* GetCurrentImage() override {
        if (position >= pictures.size() || !pictures[position])
            return nullptr;
        if (!overwrites)
            return &*pictures[position];
        record = *pictures[position];
        return &record;
    }
    int DecodeNext(int) override {
        AdvanceClock(stepMs);
        const int result = position < results.size() ? results[position] : 0;
        if (++position < pictures.size() && pictures[position])
            record = *pictures[position];
        return result;
    }

    void Rewind() { position = 0; }

    /// The record that the engine reads as that of picture `index`, which it has written, once it has moved
    /// on.
    const VideoImage& AfterNext(size_t index) const {
        const bool overwritten = overwrites && index + 1 < pictures.size() && pictures[index + 1];
        return *pictures.at(overwritten ? index + 1 : index);
    }
    const VideoImage& Picture(size_t index) const { return pictures.at(index).value(); }

    /// True for what a preview may point to.
    bool IsCurrent(const VideoImage* image) const {
        return overwrites ? image == &record : position < pictures.size() && image == &*pictures[position];
    }

private:
    static std::optional<VideoImage> MakePicture(FuzzedDataProvider& input, int64_t time) {
        if (input.ConsumeIntegralInRange(0, 31) == 0)
            return std::nullopt;
        VideoImage image{};
        image.nType = WildInteger<int32_t>(input, kMediaTypePicture);
        image.nFormat = WildInteger<int32_t>(input, kPictureFormatPlanar420);
        image.nReserved = input.ConsumeIntegral<int16_t>();
        image.nWidth = WildInteger(input, 320);
        image.reserved[11] = input.ConsumeIntegral<uint8_t>();
        image.llTime = WildTime(input, time);
        image.llTime2 = WildTime(input, image.llTime);
        image.nDuration = input.ConsumeIntegral<int16_t>();
        return image;
    }

    VideoSourceInfo info{};
    Availability available;
    std::vector<std::optional<VideoImage>> pictures;
    std::vector<int> results;
    VideoImage record{};
    bool overwrites;
    uint32_t stepMs;
    size_t position = 0;
};

class ListedAudio : public AudioDecoder {
public:
    explicit ListedAudio(FuzzedDataProvider& input)
        : available(input), stepMs(input.ConsumeIntegralInRange(0U, 1500U)) {
        info.format.nSampleRate = WildInteger(input, 8000);
        info.format.nChannels = WildInteger(input, 2);
        info.format.nBitsPerSample = WildInteger(input, 16);
        info.format.nBytesPerSecond = WildInteger(input, 32000);
        info.format.dDuration = WildDouble(input, 1.0);
        int64_t time = WildTime(input, 0);
        for (auto i = input.ConsumeIntegralInRange<size_t>(0, kMostRecords); i > 0; --i) {
            blocks.push_back(MakeBlock(input, time));
            time = Add(time, kSecond / 20);
        }
    }

    AudioSourceInfo* GetAudioInfo() override { return available.Next() ? &info : nullptr; }
    double Seek(double) override { return 0.0; }
    AudioFrame* GetNextFrame() override {
        AdvanceClock(stepMs);
        if (position >= blocks.size() || !blocks[position++])
            return nullptr;
        return &*blocks[position - 1];
    }

    void Rewind() { position = 0; }

    const AudioFrame& Block(size_t index) const { return blocks.at(index).value(); }
    const AudioFormat& Format() const { return info.format; }

private:
    std::optional<AudioFrame> MakeBlock(FuzzedDataProvider& input, int64_t time) {
        if (input.ConsumeIntegralInRange(0, 31) == 0)
            return std::nullopt;
        AudioFrame frame{};
        frame.nType =
            input.ConsumeBool() ? kMediaTypeSound : 0; // never that of silence, which the engine makes
        frame.nSampleRate = WildInteger(input, 8000);
        frame.nChannels = WildInteger(input, 2);
        frame.nBitsPerSample = WildInteger(input, 16);
        frame.nLength = WildInteger(input, 1600);
        frame.pData = frame.nLength <= static_cast<int32_t>(kSampleBytes) ? samples : nullptr;
        frame.nBufferSize = input.ConsumeIntegral<int16_t>();
        frame.llTime = WildTime(input, time);
        frame.llTime2 = WildTime(input, frame.llTime);
        return frame;
    }
    AudioSourceInfo info{};
    Availability available;
    std::vector<std::optional<AudioFrame>> blocks;
    unsigned char samples[kSampleBytes] = {};
    uint32_t stepMs;
    size_t position = 0;
};

/// Goes through what one conversion did and holds it against what is promised.
class Inspection {
public:
    Inspection(const ListedVideo& pictureSource, const ListedAudio& soundSource, bool hasCallback)
        : video(pictureSource), audio(soundSource), reports(hasCallback) {}

    void Run() {
        for (const std::string& line : recording.trace)
            if (line.rfind("log ", 0) != 0)
                Read(line);
        FUZZ_CHECK(open == 0);
        FUZZ_CHECK(!called || !eventOutcome || *called == *eventOutcome);
        FUZZ_CHECK(called.has_value() == reports);
        FUZZ_CHECK(called || eventOutcome || creates == 0);
    }

    size_t creates = 0;
    std::optional<int> called;       // outcome told by the callback
    std::optional<int> eventOutcome; // outcome told by an event

private:
    bool Take(std::string_view prefix) {
        if (rest.substr(0, prefix.size()) != prefix)
            return false;
        rest.remove_prefix(prefix.size());
        return true;
    }
    int Number() const { return std::atoi(std::string(rest).c_str()); }

    void Read(const std::string& line) {
        rest = line;
        FUZZ_CHECK(!called); // it comes last
        if (Take("create "))
            Create(line);
        else if (Take("close #"))
            Close(Number());
        else if (Take("picture #"))
            Picture(Number());
        else if (Take("sound #") || Take("silence #"))
            Sound(Number());
        else if (Take("event finished "))
            Finish(eventOutcome);
        else if (Take("finished "))
            Finish(called);
        else if (Take("progress "))
            FUZZ_CHECK(before == "event progress " + std::to_string(Number()));
        before = line;
    }

    void Create(const std::string& line) {
        FUZZ_CHECK(open == 0 && !eventOutcome);
        ++creates;
        const size_t arrow = line.rfind(" -> ");
        FUZZ_CHECK(arrow != std::string::npos);
        open = line.compare(arrow, 5, " -> #") == 0 ? std::atoi(line.c_str() + arrow + 5) : 0;
        const std::string formats = line.substr(0, arrow);
        const bool noSound = formats.size() > 2 && formats.compare(formats.size() - 2, 2, " -") == 0;
        if (noSound) {
            loop = Loop::kPictures;
        } else {
            const size_t sound = formats.rfind(' ');
            loop = formats.compare(sound - 2, 2, " -") == 0 ? Loop::kSound : Loop::kBoth;
        }
    }

    void Close(int file) {
        FUZZ_CHECK(file == open);
        open = 0;
        expected = 0;
        bytes = 0;
        if (loop == Loop::kPictures && pictures > 0) {
            clipBase = video.AfterNext(pictures - 1).llTime;
            clipBase2 = video.AfterNext(pictures - 1).llTime2;
        }
    }

    void Picture(int file) {
        FUZZ_CHECK(file == open && loop != Loop::kSound);
        const VideoImage source = video.Picture(pictures);
        const VideoImage written = recording.pictures.at(pictures++);
        VideoImage moved = source;
        if (loop == Loop::kBoth) {
            moved.llTime = Add(source.llTime, shift);
            moved.llTime2 = Add(source.llTime2, shift);
        } else {
            moved.llTime = Subtract(source.llTime, clipBase);
            moved.llTime2 = Subtract(source.llTime2, clipBase2);
        }
        FUZZ_CHECK(SameBytes(written, moved));
    }

    void Sound(int file) {
        FUZZ_CHECK(file == open && loop != Loop::kPictures);
        const AudioFrame written = recording.sounds.at(sounds++);
        if (written.nType == kMediaTypeSilence)
            Silence(written);
        else
            Block(written);
    }

    void Silence(const AudioFrame& written) {
        FUZZ_CHECK(loop == Loop::kBoth);
        FUZZ_CHECK(written.llTime == expected && written.llTime2 == expected);
        FUZZ_CHECK(written.nDuration > 0 && written.nDuration <= 400000);
        FUZZ_CHECK(written.nLength >= 0 && written.nLength <= written.nBufferSize &&
                   written.nBufferSize == 1 << 20);
        expected = Add(expected, written.nDuration);
        silent = true;
    }

    void Block(const AudioFrame& written) {
        const AudioFrame& source = audio.Block(blocks++);
        FUZZ_CHECK(!silent); // there is no sound after the end of the sound
        if (loop == Loop::kSound) {
            FUZZ_CHECK(SameBytes(written, source));
            return;
        }
        if (blocks == 1)
            expected = origin = written.llTime;
        AudioFrame moved = source;
        moved.llTime = moved.llTime2 = expected;
        FUZZ_CHECK(SameBytes(written, moved));
        shift = Subtract(expected, source.llTime);
        bytes += source.nLength;
        const int32_t rate = audio.Format().nBytesPerSecond;
        expected = origin;
        if (rate > 0)
            expected = Add(origin, static_cast<int64_t>(static_cast<uint64_t>(bytes) * kSecond) / rate);
    }

    void Finish(std::optional<int>& outcome) {
        FUZZ_CHECK(open == 0 && !outcome);
        outcome = Number();
        FUZZ_CHECK(*outcome >= 0 && *outcome <= 3);
        const bool withRecord = rest.find("without record") == std::string_view::npos;
        FUZZ_CHECK(&outcome != &called || withRecord == (*outcome != 3 || creates > 1));
        if (*outcome == 0 && &outcome == &eventOutcome)
            FUZZ_CHECK(before.rfind(reports ? "progress 10000" : "event progress 10000", 0) == 0);
    }

    enum class Loop { kNone, kBoth, kPictures, kSound };

    const ListedVideo& video;
    const ListedAudio& audio;
    const bool reports;
    const recorder::Recording recording = recorder::Recorded();
    std::string_view rest;
    std::string before;
    Loop loop = Loop::kNone;
    int open = 0;
    size_t sounds = 0;
    size_t pictures = 0;
    size_t blocks = 0;
    bool silent = false;
    int64_t origin = -1;
    int64_t expected = -1;
    int64_t bytes = 0;
    int64_t shift = 0;
    int64_t clipBase = 0;
    int64_t clipBase2 = 0;
};

void CheckRecord(const ListedVideo& video, const ProgressInfo& info) {
    FUZZ_CHECK(info.nProgress <= 10000 && info.nPercent == info.nProgress / 100);
    FUZZ_CHECK(std::isfinite(info.dSpeed));
    for (const TimeData& time : {info.tElapsed, info.tRemaining})
        FUZZ_CHECK(time.nMinutes < 60 && time.nSeconds < 60 && time.nMilliseconds < 1000);
    FUZZ_CHECK(info.pPreviewImage == nullptr || video.IsCurrent(info.pPreviewImage));
}

EncodeParam MakeParam(FuzzedDataProvider& input) {
    EncodeParam param{};
    param.nWidth = WildInteger(input, 0);
    param.dFrameRate = WildDouble(input, 0.0);
    param.nVideoRateMode = input.ConsumeBool() ? 1 : 0;
    param.nVideoBitrate = WildInteger(input, 0);
    param.nVideoMaxBitrate = WildInteger(input, 0);
    param.nSampleRate = WildInteger(input, 8000);
    param.nChannels = WildInteger(input, 2);
    param.nBitsPerSample = WildInteger(input, 16);
    param.nAudioBitrate = WildInteger(input, 0);
    param.bNoVideo = input.ConsumeIntegralInRange(0, 7) == 0 ? 1 : 0;
    param.bNoAudio = input.ConsumeIntegralInRange(0, 7) == 0 ? 1 : 0;
    param.fccFileFormat = input.ConsumeBool() ? FourCC("MP4 ") : FourCC("COPY");
    return param;
}

std::wstring MakeName(FuzzedDataProvider& input) {
    std::wstring name =
        input.PickValueInArray<const wchar_t*>({L"out.mp4", L"", L"no extension", L"a.b/c", L"."});
    if (input.ConsumeIntegralInRange(0, 15) == 0)
        name.append(input.ConsumeIntegralInRange<size_t>(0, 520),
                    input.PickValueInArray({L'x', L'%', L'\x1F3AC'}));
    return name;
}

void FuzzConversion(FuzzedDataProvider& input) {
    ListedVideo video(input);
    ListedAudio audio(input);
    const bool hasVideo = input.ConsumeIntegralInRange(0, 7) != 0;
    const bool hasAudio = input.ConsumeIntegralInRange(0, 7) != 0;
    ScriptedHost host;
    host.handle = MCCreate(hasVideo ? &video : nullptr, hasAudio ? &audio : nullptr);
    host.hasCallback = input.ConsumeBool();
    const unsigned abortAt = input.ConsumeIntegralInRange(0U, 15U);
    unsigned calls = 0;
    host.onCallback = [&](unsigned, const ProgressInfo* info) {
        if (info)
            CheckRecord(video, *info);
        MCEnablePreview(host.handle, calls % 2);
        FUZZ_CHECK(MCPause(host.handle) <= 1 && MCResume(host.handle) == 0);
        if (++calls == abortAt)
            MCAbort(host.handle);
    };
    const EncodeParam param = MakeParam(input);
    if (input.ConsumeBool())
        MCSetEncodeParam(host.handle, &param);
    const std::wstring name = MakeName(input);
    MCSetOutputFile(host.handle, name.c_str());

    for (int round = input.ConsumeIntegralInRange(1, 2); round > 0; --round) {
        video.Rewind();
        audio.Rewind();
        const int split = input.ConsumeIntegralInRange(0, 2);
        MCSetSplitParam(host.handle, split, WildInteger<unsigned long>(input, 100));
        const int firstFailure = input.ConsumeIntegralInRange(0, 8);
        const int secondFailure = firstFailure + input.ConsumeIntegralInRange(0, 8);
        recorder::Reset({.failingCreates = {firstFailure, secondFailure}});
        host.cancelAt = input.ConsumeIntegralInRange(0U, 15U);
        const int before = MCGetTargetCount(host.handle);
        const int started = host.Start(WildDouble(input, 0.0), WildDouble(input, 0.0));
        FUZZ_CHECK(MCWait(host.handle, MC_INFINITE) == (host.handle ? 0 : -1));
        if (started != 0) {
            FUZZ_CHECK(Trace(Part::kWithoutLog).empty());
            continue;
        }
        Inspection inspection(video, audio, host.hasCallback);
        inspection.Run();
        const auto clips = static_cast<size_t>(MCGetTargetCount(host.handle) - before);
        FUZZ_CHECK(clips == 0 ? inspection.creates <= 1 : split == 1 && clips == inspection.creates);
    }
}

/// Pieces of sound: all of every block, in order.
void FuzzPieces(FuzzedDataProvider& input) {
    ListedAudio audio(input);
    get_small_frame(nullptr);
    size_t block = 0;
    int64_t done = 0;
    constexpr int kMostPieces = 2000;
    for (int pieces = 0; pieces < kMostPieces; ++pieces) {
        const AudioFrame* piece = get_small_frame(&audio);
        if (piece == nullptr) {
            FUZZ_CHECK(done == 0);
            break;
        }
        const AudioFrame& source = audio.Block(block);
        FUZZ_CHECK(piece->nLength == piece->nBufferSize && piece->llTime == piece->llTime2);
        FUZZ_CHECK(source.nLength <= 0 ? piece->nLength == source.nLength : piece->nLength > 0);
        FUZZ_CHECK(source.pData == nullptr || piece->pData == source.pData + done);
        done += piece->nLength;
        if (done == source.nLength) {
            ++block;
            done = 0;
        }
    }
    get_small_frame(nullptr);
}

void FuzzStereo(FuzzedDataProvider& input) {
    const int bits = WildInteger(input, input.ConsumeBool() ? 8 : 16);
    const int channels = WildInteger(input, input.ConsumeIntegralInRange(0, 6));
    const auto source = input.ConsumeRemainingBytes<unsigned char>();
    const int count = static_cast<int>(bits == 8 ? source.size() : source.size() / 2);
    std::vector<short> target(static_cast<size_t>(count) * (channels == 2 ? 1 : 2));
    const int written =
        ConvertTo16BitsStero(target.data(), bits, channels, const_cast<unsigned char*>(source.data()), count);
    FUZZ_CHECK(written == (channels == 0 ? 0 : count * (2 / channels)));
}

void FuzzEstimate(FuzzedDataProvider& input) {
    const EncodeParam param = MakeParam(input);
    MCGetEstimateDiskSpaceEx(&param, WildDouble(input, 10.0));
}

} // namespace

/// Takes the place of the system's, in the engine too: what polls every 10 ms need not be waited for.
extern "C" __attribute__((visibility("default"))) int usleep(useconds_t) {
    const timespec moment{0, 20000};
    return nanosleep(&moment, nullptr);
}

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    FuzzedDataProvider input(data, size);
    switch (input.ConsumeIntegralInRange(0, 15)) {
    case 0:
        FuzzPieces(input);
        break;
    case 1:
        FuzzStereo(input);
        break;
    case 2:
        FuzzEstimate(input);
        break;
    default:
        FuzzConversion(input);
    }
    return 0;
}
