// Starting, steering and ending a conversion, and the worker's choice of a loop.
#include "engine/ConvThread.h"
#include "engine/Conversion.h"
#include "engine/ProgressInfo.h"
#include "engine/SourceFormat.h"
#include "log/dyLog.h"
#include "thread/SingleLock.h"

#include <algorithm>

namespace {

constexpr double kMinSourceDuration = 0.001; // seconds; what is shorter counts as empty
constexpr double kMinLength = 0.001;         // seconds; what is shorter means all the rest
constexpr int kCannotOpenSource = 3;

template <class Decoder>
bool IsEmpty(Decoder* decoder) {
    return SourceDuration(decoder) < kMinSourceDuration;
}

/// The longer of the two streams, in seconds. Pictures without a rate do not count.
double LongestDuration(VideoDecoder* video, AudioDecoder* audio) {
    double duration = 0.0;
    const VideoFormat* pictures = SourceFormat(video);
    if (pictures && pictures->dFrameRate > 0.0001)
        duration = pictures->dDuration;
    const AudioFormat* sound = SourceFormat(audio);
    return sound && sound->dDuration > duration ? sound->dDuration : duration;
}

void LogDiskSpace(long long estimate, long long freeSpace, const wchar_t* outputFile) {
    LogEx(L"MovieConv::Estimate Space[%lld Bytes];", estimate);
    LogEx(L"MovieConv::Disk Free Space[%lld Bytes];", freeSpace);
    if (freeSpace < estimate)
        LogAt(kLogWarning, L"Without enough Disk space to generate file[%ls].\r\n", outputFile);
}

} // namespace

int ConvThread::Start(double begin, double length, OpaqueWindowPtr* window, ProgressCallback callback,
                      void* context) {
    if (IsActive())
        return 0;
    results.Begin();
    dBeginTime = begin;
    dLength = length;
    LogEx(L"MovieConv::StartThread(): BeginTime[%0.3fs], Length[%0.3fs]", begin, length);
    if (!pVideoDecoder)
        Log(L"MovieConv::Without Video Decoder.");
    if (!pAudioDecoder)
        Log(L"MovieConv::Without Audio Decoder.");

    const double rest = LongestDuration(pVideoDecoder, pAudioDecoder) - begin;
    dConvLength = length < kMinLength || length > rest ? rest : length;
    if (!pVideoDecoder && !pAudioDecoder)
        dLength = 0.0;
    LogEx(L"MovieConv::StartThread(): ConvLength[%0.3fs]", dLength);
    if (pVideoDecoder && !SourceFormat(pVideoDecoder)) {
        LogAt(kLogError, L"Failed to open file.\r\n");
        results.Fail(MC_RESULT_SOURCE, "The picture source does not describe itself.");
        results.End(kOutcomeFailed, false);
        return kCannotOpenSource;
    }

    Log(L"MovieConv::Estimate DiskSpace...");
    const long long estimate = GetEstimateDiskSpace();
    LogDiskSpace(estimate, GetDiskFreeSpace(strOutputFile.c_str()), strOutputFile.c_str());

    hProgressWnd = window;
    pfnProgress = callback;
    pProgressContext = context;
    LogEx(L"Encoding thread Starting .");
    if (BaseThread::Start() == 0) {
        results.Fail(MC_RESULT_INTERNAL, "No thread could be made for the conversion.");
        results.End(kOutcomeFailed, false);
    }
    return 0;
}

int ConvThread::svc() {
    if (ownVideo)
        ownVideo->BeginConversion();
    if (ownAudio)
        ownAudio->BeginConversion();
    try {
        Dispatch();
    } catch (...) {
        // A source that threw before there was a file.
        Conversion(*this).ReportException();
    }
    LogEx(L"Encoding thread Exit.");
    return 0;
}

void ConvThread::Dispatch() {
    if (!pVideoDecoder && !pAudioDecoder) {
        LogAt(kLogError, L"MovieConv::decoder is null");
        Conversion(*this).ReportFailure(MC_RESULT_SOURCE, "There is no source.", false);
    } else if (encodeParam.bNoVideo || IsEmpty(pVideoDecoder)) {
        Drop(pVideoDecoder, encodeParam.bNoVideo);
        process_audio_only();
    } else if (encodeParam.bNoAudio || IsEmpty(pAudioDecoder)) {
        Drop(pAudioDecoder, encodeParam.bNoAudio);
        process_video_only();
    } else {
        process();
    }
}

template <class Decoder>
void ConvThread::Drop(Decoder*& decoder, int32_t& bNoStream) {
    const bool empty = IsEmpty(decoder);
    const CSingleLock guard(&sharedLock);
    if (empty)
        decoder = nullptr;
    bNoStream = 1;
}

unsigned ConvThread::EnablePreview(unsigned enable) {
    return bPreview = enable;
}

unsigned ConvThread::EnableStopOnFailure(unsigned enable) {
    return bStopOnFailure = enable;
}

int ConvThread::GetResult(MCResult* out) const {
    return results.Copy(out) ? 1 : 0;
}

unsigned ConvThread::EnableEvents(unsigned enable) {
    return bEvents = enable;
}

int ConvThread::Pause() {
    if (!IsActive())
        return nPauseCount;
    const int count = ++nPauseCount;
    SettleState();
    // A stop asked for meanwhile may have released the pauses already; the worker must not sleep through it.
    if (IsStopRequested()) {
        ReleasePauses();
        return 0;
    }
    return count;
}

int ConvThread::Resume() {
    if (!IsActive())
        return nPauseCount;
    int32_t count = nPauseCount;
    while (count > 0 && !nPauseCount.compare_exchange_weak(count, count - 1)) {
    }
    SettleState();
    return std::max(count - 1, 0);
}

int ConvThread::Stop(unsigned, unsigned) {
    const CSingleLock guard(&lock);
    BaseThread::Abort();
    BaseThread::Wait(kWaitInfinite);
    return 0;
}

int ConvThread::Abort(unsigned, unsigned) {
    return BaseThread::Abort();
}
