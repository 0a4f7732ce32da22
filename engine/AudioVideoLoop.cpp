// Pictures and sound. Each iteration takes a picture, writes the sound up to it and then the picture. The
// sound is the master clock: its stamps count the bytes written, and a picture is shifted as the last sound
// block before it was. Where the sound has ended, silence takes its place.
#include "engine/Arithmetic.h"
#include "engine/Conversion.h"
#include "engine/SoundClock.h"
#include "engine/SourceFormat.h"
#include "log/dyLog.h"
#include "thread/Clock.h"

#include <algorithm>
#include <cstdlib>
#include <new>

namespace {

constexpr int32_t kSilenceStep = 400000; // 40 ms
constexpr int32_t kSilenceSize = 1 << 20;
constexpr int64_t kShiftTold = 100000; // 10 ms

/// Iterations between two progress notifications.
int32_t NotifyInterval(int32_t totalFrames) {
    return std::clamp(totalFrames / 7500, 3, 45);
}

} // namespace

class ConvThread::AudioVideoLoop : Conversion {
public:
    explicit AudioVideoLoop(ConvThread& owner) : Conversion(owner) {}

    int Run();

private:
    void Begin();
    unsigned Iterate();
    void TellShift();
    void WriteSound(const VideoImage* picture);
    void WriteBlock(const AudioFrame& block, int64_t pictureTime);
    bool WriteSilence(const VideoImage* picture);
    void WriteSilentBlocks(int32_t gap);
    void WritePicture(const VideoImage& picture);
    void Estimate(uint32_t now);
    bool LastPictureReached() const { return int64_t{nFrame} >= int64_t{nTotalFrames} - 1; }
    bool NotificationDue() const;

    double dSourceRate = 0.0;    // pictures per second
    int32_t nTotalFrames = 0;    // iterations that the conversion is expected to take
    int32_t nNotifyInterval = 0; // iterations
    int32_t nFrame = 0;          // iteration
    int32_t nLastEstimateFrame = -1;
    bool bAudioDone = false;
    bool bVideoDone = false;

    // Time stamps count 100 ns.
    bool bSoundBegun = false;
    int64_t llAudioOrigin = -1; // distance of the first block from the first picture
    int64_t llAudioOut = -1;    // output stamp of the next block
    int64_t llAudioSrc = -1;    // source stamp of the last block
    int64_t llVideoShift = 0;   // from source to output
    int64_t llAudioBytes = 0;   // sound in the current file

    SoundClock clock;
    std::unique_ptr<unsigned char[]> silence;
};

int ConvThread::process() {
    return AudioVideoLoop(*this).Run();
}

int ConvThread::AudioVideoLoop::Run() {
    pVideoFormat = SourceFormat(converter.pVideoDecoder);
    pAudioFormat = SourceFormat(converter.pAudioDecoder);
    if (!pVideoFormat || !pAudioFormat)
        return ReportFailure(MC_RESULT_SOURCE, "A source does not describe itself any more.");
    if (!CreateFirstFile())
        return ReportFailure(MC_RESULT_CANNOT_OPEN, "");
    const unsigned outcome = Guarded([this] {
        Begin();
        return Iterate();
    });

    silence.reset();
    TellShift();
    return Finish(outcome, converter.dConvLength);
}

void ConvThread::AudioVideoLoop::Begin() {
    const double begin = BeginTime();
    if (begin > 0.0) {
        converter.pVideoDecoder->Seek(begin, 1);
        converter.pAudioDecoder->Seek(begin);
    }
    dSourceRate = pVideoFormat->dFrameRate;
    nTotalFrames = Truncate<int32_t>(dSourceRate * converter.dConvLength + 0.5);
    nNotifyInterval = NotifyInterval(nTotalFrames);
    StartClock();
}

unsigned ConvThread::AudioVideoLoop::Iterate() {
    for (;; nFrame = WrapAdd(nFrame, 1)) {
        if (converter.IsStopRequestedAfterPause())
            return kOutcomeStopped;
        if (LengthReached() || (bAudioDone && bVideoDone))
            return kOutcomeCompleted;
        if (!CreateDueClip())
            return kOutcomeFailed;

        VideoImage* picture = converter.pVideoDecoder->GetCurrentImage();
        if (!picture)
            bVideoDone = true;
        if (!bAudioDone)
            WriteSound(picture);
        else if (!WriteSilence(picture))
            return kOutcomeFailed;
        if (!bVideoDone)
            WritePicture(*picture);

        const uint32_t now = MillisecondClock();
        Estimate(now);
        if (!bVideoDone) {
            if (NotificationDue() && !NotifyProgress(now, converter.bPreview ? picture : nullptr))
                return kOutcomeCancelled;
            bVideoDone = converter.pVideoDecoder->DecodeNext(1) < 1;
        }
        if (ClipFull()) {
            CloseClip();
            llAudioOut = 0;
            llAudioBytes = 0;
        }
    }
}

// Writes the sound up to and including the first block that starts at or after the picture; all the rest once
// the pictures have ended.
void ConvThread::AudioVideoLoop::WriteSound(const VideoImage* picture) {
    while (bVideoDone || llAudioSrc < picture->llTime) {
        if (LengthReached())
            return;
        const AudioFrame* block = converter.pAudioDecoder->GetNextFrame();
        if (!block || block->nLength == 0) {
            bAudioDone = true;
            return;
        }
        WriteBlock(*block, picture ? picture->llTime : 0);
    }
}

void ConvThread::AudioVideoLoop::WriteBlock(const AudioFrame& block, int64_t pictureTime) {
    if (!bSoundBegun) {
        bSoundBegun = true;
        llAudioOrigin = WrapSub(block.llTime, pictureTime);
        llAudioOut = llAudioOrigin;
    }
    AudioFrame copy = block;
    copy.llTime2 = llAudioOut;
    copy.llTime = llAudioOut;
    Send(copy);

    llAudioSrc = block.llTime;
    llVideoShift = WrapSub(llAudioOut, llAudioSrc);
    llAudioBytes = WrapAdd<int64_t>(llAudioBytes, block.nLength);
    const int32_t bytesPerSecond = pAudioFormat->nBytesPerSecond;
    clock.Add(block.llTime, block.nLength, bytesPerSecond);
    llAudioOut = llAudioOrigin;
    if (bytesPerSecond > 0) { // bytes of no known rate take no time
        dPosition += static_cast<double>(block.nLength) / bytesPerSecond;
        llAudioOut = WrapAdd(WrapMul(llAudioBytes, kTicksPerSecond) / bytesPerSecond, llAudioOrigin);
    }
}

// Covers the source time from the last block's stamp to the picture's. False without memory for it.
bool ConvThread::AudioVideoLoop::WriteSilence(const VideoImage* picture) {
    if (!picture) {
        if (dSourceRate > 0.0)
            dPosition += 1.0 / dSourceRate;
        return true;
    }
    if (!silence) {
        silence.reset(new (std::nothrow) unsigned char[kSilenceSize]());
        if (!silence) {
            LogAt(kLogError, L"MovieConv::No memory for silence.\r\n");
            converter.results.Fail(MC_RESULT_INTERNAL, "There was no memory for silence.");
            return false;
        }
    }
    const auto gap =
        static_cast<int32_t>(static_cast<uint32_t>(picture->llTime) - static_cast<uint32_t>(llAudioSrc));
    if (gap > 0)
        WriteSilentBlocks(gap);
    return true;
}

void ConvThread::AudioVideoLoop::WriteSilentBlocks(int32_t gap) {
    const EncodeParam& param = converter.encodeParam;
    AudioFrame block{};
    block.nType = kMediaTypeSilence;
    block.nSampleRate = param.nSampleRate;
    block.nChannels = param.nChannels;
    block.nBitsPerSample = param.nBitsPerSample;
    block.pData = silence.get();
    block.nBufferSize = kSilenceSize;
    block.llTime2 = llAudioOut;
    block.llTime = llAudioOut;
    for (int32_t covered = 0; covered < gap; covered += block.nDuration) {
        const int32_t step = std::min(gap - covered, kSilenceStep);
        const double bytes = static_cast<double>(step) / kTicksPerSecond * param.nSampleRate *
                             param.nChannels * param.nBitsPerSample * 0.125;
        block.nLength = std::clamp(Truncate<int32_t>(bytes + 0.5), 0, kSilenceSize);
        block.nDuration = step;
        Send(block);
        llAudioBytes += block.nLength;
        block.llTime2 = WrapAdd<int64_t>(block.llTime2, step);
        block.llTime = WrapAdd<int64_t>(block.llTime, step);
        llAudioSrc = WrapAdd<int64_t>(llAudioSrc, step);
    }
    llAudioOut = WrapAdd<int64_t>(llAudioOut, gap);
    dPosition += static_cast<double>(gap) / kTicksPerSecond;
}

void ConvThread::AudioVideoLoop::WritePicture(const VideoImage& picture) {
    VideoImage copy = picture;
    copy.llTime2 = WrapAdd(copy.llTime2, llVideoShift);
    copy.llTime = WrapAdd(copy.llTime, llVideoShift);
    Send(copy);

    if (const int64_t shift = clock.Shift(); std::abs(shift) > kShiftTold)
        converter.results.CountRestamped(shift);
}

void ConvThread::AudioVideoLoop::TellShift() {
    MCResult result{};
    result.nSize = sizeof result;
    if (!converter.results.Copy(&result) || result.llPicturesRestamped == 0)
        return;
    LogAt(
        kLogWarning,
        L"MovieConv::Sound is the clock: %lld pictures were moved, by up to %0.3fs, since blocks of sound do "
        L"not follow each other as their stamps say.\r\n",
        static_cast<long long>(result.llPicturesRestamped),
        static_cast<double>(result.llLargestShift) / kTicksPerSecond);
}

void ConvThread::AudioVideoLoop::Estimate(uint32_t now) {
    if (!EstimateDue(now) && !LastPictureReached())
        return;
    const uint32_t since = now - tLastEstimate;
    const int32_t frame = WrapSub(nFrame, 1);
    int32_t frames = WrapSub(frame, nLastEstimateFrame);
    if (frames == 1 && nFrame <= 1)
        frames = 5;
    dRemaining = (static_cast<double>(nTotalFrames) - frame) * (since / 1000.0) / frames;
    dSpeed = frames * 1000.0 / since / dSourceRate;
    tLastEstimate = now;
    nLastEstimateFrame = frame;
}

bool ConvThread::AudioVideoLoop::NotificationDue() const {
    return converter.pfnProgress && (WrapSub(nFrame, 1) % nNotifyInterval == 0 || LastPictureReached());
}
