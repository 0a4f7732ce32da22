// Sound alone: the decoder's blocks go to the writer as they are, into one file.
#include "engine/Arithmetic.h"
#include "engine/Conversion.h"
#include "engine/SourceFormat.h"
#include "log/dyLog.h"
#include "thread/Clock.h"

namespace {

constexpr double kShortestSound = 0.0001; // seconds
constexpr int32_t kNotifyBlocks = 30;
constexpr int32_t kNotifySamples = 1000;

} // namespace

class ConvThread::AudioLoop : Conversion {
public:
    explicit AudioLoop(ConvThread& owner) : Conversion(owner) {}

    int Run();

private:
    unsigned Iterate();
    void Count(int32_t bytes);
    void Estimate(uint32_t now);
    bool NotificationDue() const;

    int32_t nFrame = 0; // iteration
    int32_t nSamples = 0;
    int32_t nLastNotifiedSamples = 0;
    double dLastEstimatePosition = 0.0; // seconds
};

int ConvThread::process_audio_only() {
    return AudioLoop(*this).Run();
}

int ConvThread::AudioLoop::Run() {
    pAudioFormat = SourceFormat(converter.pAudioDecoder);
    if (!pAudioFormat || pAudioFormat->dDuration < kShortestSound) {
        LogAt(kLogError, L"MovieConv::Without audio decoder or zero length.");
        return ReportFailure(MC_RESULT_SOURCE, "There is no sound to convert.");
    }
    if (!CreateFile(converter.strOutputFile.c_str()))
        return ReportFailure(MC_RESULT_CANNOT_OPEN, "");
    const unsigned outcome = Guarded([this] {
        converter.pAudioDecoder->Seek(BeginTime());
        StartClock();
        return Iterate();
    });
    return Finish(outcome, converter.dLength);
}

unsigned ConvThread::AudioLoop::Iterate() {
    for (;; nFrame = WrapAdd(nFrame, 1)) {
        if (converter.IsStopRequestedAfterPause())
            return kOutcomeStopped;
        const AudioFrame* block = converter.pAudioDecoder->GetNextFrame();
        if (!block || block->nLength == 0 || LengthReached())
            return kOutcomeCompleted;

        Send(*block);
        Count(block->nLength);

        const uint32_t now = MillisecondClock();
        Estimate(now);
        if (NotificationDue()) {
            if (!NotifyProgress(now, nullptr))
                return kOutcomeCancelled;
            nLastNotifiedSamples = nSamples;
        }
    }
}

void ConvThread::AudioLoop::Count(int32_t bytes) {
    const int32_t bytesPerSample = pAudioFormat->nBitsPerSample / 8;
    if (bytesPerSample > 0)
        nSamples = WrapAdd(nSamples, bytes / bytesPerSample);
    if (pAudioFormat->nBytesPerSecond > 0) // bytes of no known rate take no time
        dPosition += static_cast<double>(bytes) / pAudioFormat->nBytesPerSecond;
}

void ConvThread::AudioLoop::Estimate(uint32_t now) {
    if (!EstimateDue(now) && nFrame > 1)
        return;
    dSpeed = (dPosition - dLastEstimatePosition) / ((now - tLastEstimate) / 1000.0);
    dRemaining = (converter.dConvLength - dPosition) / dSpeed;
    tLastEstimate = now;
    dLastEstimatePosition = dPosition;
}

bool ConvThread::AudioLoop::NotificationDue() const {
    return converter.pfnProgress && WrapSub(nFrame, 1) % kNotifyBlocks == 0 &&
           WrapSub(nSamples, nLastNotifiedSamples) > kNotifySamples;
}
