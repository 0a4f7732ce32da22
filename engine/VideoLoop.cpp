// Pictures alone: the first file keeps the decoder's stamps, each later clip begins where the clip before
// ended.
#include "engine/Arithmetic.h"
#include "engine/Conversion.h"
#include "engine/SourceFormat.h"
#include "log/dyLog.h"
#include "media/FourCC.h"
#include "thread/Clock.h"

namespace {

constexpr double kShortestPictures = 0.001;  // seconds
constexpr uint32_t kEstimateInterval = 1000; // ms
constexpr uint32_t kNotifyInterval = 80;     // ms
constexpr int64_t kNoTime = -1;

} // namespace

class ConvThread::VideoLoop : Conversion {
public:
    explicit VideoLoop(ConvThread& owner) : Conversion(owner) {}

    int Run();

private:
    int ReportNoPictures();
    unsigned Iterate();
    void WritePicture(const VideoImage& picture);
    void MoveTo(int64_t time);
    void Estimate(uint32_t now);
    bool Notify(uint32_t now, VideoImage* picture);

    // Time stamps count 100 ns.
    int64_t llOrigin = kNoTime; // stamp of the first picture that has one
    int64_t llClipBase2 = 0;    // what the current clip's stamps are reduced by
    int64_t llClipBase = 0;

    double dLastEstimatePosition = 0.0; // seconds
    uint32_t tLastNotified = 0;         // ms
};

int ConvThread::process_video_only() {
    return VideoLoop(*this).Run();
}

int ConvThread::VideoLoop::Run() {
    pVideoFormat = SourceFormat(converter.pVideoDecoder);
    if (!pVideoFormat || pVideoFormat->dDuration < kShortestPictures)
        return ReportNoPictures();
    if (!CreateFirstFile())
        return ReportFailure(MC_RESULT_CANNOT_OPEN, "");
    const unsigned outcome = Guarded([this] {
        const double begin = BeginTime();
        if (begin > 0.0)
            converter.pVideoDecoder->Seek(begin, 1);
        StartClock();
        tLastNotified = tStart;
        return Iterate();
    });
    return Finish(outcome, converter.dConvLength);
}

// Unlike every other failure this one comes without an event.
int ConvThread::VideoLoop::ReportNoPictures() {
    LogAt(kLogError, L"MovieConv::Without video decoder.");
    return ReportFailure(MC_RESULT_SOURCE, "There are no pictures to convert.", false);
}

unsigned ConvThread::VideoLoop::Iterate() {
    for (;;) {
        if (converter.IsStopRequestedAfterPause())
            return kOutcomeStopped;
        VideoImage* picture = converter.pVideoDecoder->GetCurrentImage();
        if (!picture || LengthReached())
            return kOutcomeCompleted;
        if (!CreateDueClip())
            return kOutcomeFailed;

        WritePicture(*picture);
        MoveTo(picture->llTime);

        const uint32_t now = MillisecondClock();
        Estimate(now);
        if (converter.pfnProgress && now - tLastNotified >= kNotifyInterval && !Notify(now, picture))
            return kOutcomeCancelled;
        if (converter.pVideoDecoder->DecodeNext(1) < 1)
            return kOutcomeCompleted;
        if (ClipFull()) {
            CloseClip();
            // Whatever the decoder's record holds by now, the picture written or the next one.
            llClipBase2 = picture->llTime2;
            llClipBase = picture->llTime;
        }
    }
}

void ConvThread::VideoLoop::WritePicture(const VideoImage& picture) {
    VideoImage copy = picture;
    copy.llTime2 = WrapSub(copy.llTime2, llClipBase2);
    copy.llTime = WrapSub(copy.llTime, llClipBase);
    Send(copy);
}

void ConvThread::VideoLoop::MoveTo(int64_t time) {
    if (llOrigin == kNoTime)
        llOrigin = time;
    if (time != kNoTime)
        dPosition = static_cast<double>(WrapSub(time, llOrigin)) / kTicksPerSecond;
}

void ConvThread::VideoLoop::Estimate(uint32_t now) {
    const uint32_t since = now - tLastEstimate;
    if (since < kEstimateInterval)
        return;
    dSpeed = 1000.0 * (dPosition - dLastEstimatePosition) / since;
    tLastEstimate = now;
    dLastEstimatePosition = dPosition;
}

bool ConvThread::VideoLoop::Notify(uint32_t now, VideoImage* picture) {
    const bool preview = converter.bPreview && converter.encodeParam.fccFileFormat != FourCC("COPY");
    dRemaining = (converter.dConvLength - dPosition) / dSpeed;
    tLastNotified = now;
    return NotifyProgress(now, preview ? picture : nullptr);
}
