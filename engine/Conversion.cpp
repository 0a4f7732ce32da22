#include "engine/Conversion.h"

#include "engine/Arithmetic.h"
#include "engine/PostMessage.h"
#include "media/MediaWriter.h"
#include "thread/Clock.h"

#include <algorithm>
#include <cmath>

namespace {

constexpr int32_t kProgressComplete = 10000; // hundredths of a percent

uintptr_t CallbackInfo(const ProgressInfo* info) {
    return reinterpret_cast<uintptr_t>(info);
}

/// An estimate that there is no basis for yet is infinite or not a number; the host gets 0 instead.
double FiniteOrZero(double value) {
    return std::isfinite(value) ? value : 0.0;
}

} // namespace

bool ConvThread::Conversion::CreateFile(const wchar_t* fileName) {
    hFile = MWCreateMediaFile(fileName, &converter.encodeParam, pVideoFormat, pAudioFormat);
    return hFile != nullptr;
}

bool ConvThread::Conversion::CreateFirstFile() {
    if (converter.nSplitMode != 1)
        return CreateFile(converter.strOutputFile.c_str());
    const wchar_t* name = converter.CreateNewClip();
    return name && CreateFile(name);
}

bool ConvThread::Conversion::CreateDueClip() {
    if (converter.nSplitMode != 1 || hFile)
        return true;
    const wchar_t* name = converter.CreateNewClip();
    if (!name)
        return false;
    CreateFile(name); // one that fails is tried again under the next name
    return true;
}

double ConvThread::Conversion::BeginTime() {
    if (converter.dBeginTime < 0.0)
        converter.dBeginTime = 0.0;
    return converter.dBeginTime;
}

void ConvThread::Conversion::StartClock() {
    tStart = tLastEstimate = MillisecondClock();
}

bool ConvThread::Conversion::LengthReached() const {
    return converter.dLength > 0.001 && dPosition >= converter.dLength;
}

bool ConvThread::Conversion::ClipFull() const {
    return converter.nSplitMode == 1 && Truncate<int32_t>((dPosition - dClipStart) * 1000.0) >=
                                            static_cast<int32_t>(converter.nSplitValue);
}

void ConvThread::Conversion::CloseClip() {
    MWCloseMediaFile(hFile, nullptr, nullptr);
    hFile = nullptr;
    dClipStart = dPosition;
}

bool ConvThread::Conversion::EstimateDue(uint32_t now) const {
    const uint32_t since = now - tLastEstimate;
    return since >= 2000 || (since >= 1000 && now - tStart < 3000);
}

ProgressInfo ConvThread::Conversion::MakeProgressInfo(int32_t nProgress, uint32_t elapsed) const {
    ProgressInfo info{};
    info.dTotalLength = converter.dConvLength;
    info.dPosition = dPosition;
    info.nPercent = nProgress / 100;
    info.nProgress = nProgress;
    info.tElapsed = GetTimeData(elapsed);
    info.dDoneLength = dPosition;
    info.dSpeed = FiniteOrZero(dSpeed);
    return info;
}

int ConvThread::Conversion::Post(unsigned wParam, unsigned lParam) const {
    return converter.bEvents ? PostMessage(converter.hProgressWnd, kProgressMessage, wParam, lParam) : 1;
}

bool ConvThread::Conversion::NotifyProgress(uint32_t now, VideoImage* preview) {
    const double progress = FiniteOrZero(10000.0 * dPosition / converter.dConvLength);
    const int32_t nProgress = std::min(Truncate<int32_t>(progress), kProgressComplete);
    ProgressInfo info = MakeProgressInfo(nProgress, now - tStart);
    info.pPreviewImage = preview;
    const auto remaining = Truncate<int32_t>(FiniteOrZero(dRemaining * 1000.0 + 0.5));
    info.tRemaining = GetTimeData(static_cast<uint32_t>(remaining));

    const auto value = static_cast<unsigned>(nProgress);
    Post(kMessageProgress, value);
    return converter.pfnProgress(converter.pProgressContext, 0, value, CallbackInfo(&info)) != 0;
}

int ConvThread::Conversion::Finish(unsigned outcome, double doneLength) {
    MWCloseMediaFile(hFile, converter.pfnProgress, converter.pProgressContext);

    ProgressInfo info = MakeProgressInfo(kProgressComplete, MillisecondClock() - tStart);
    info.dDoneLength = doneLength;
    if (outcome == kOutcomeCompleted) {
        Post(kMessageProgress, kProgressComplete);
        if (converter.pfnProgress)
            converter.pfnProgress(converter.pProgressContext, 0, kProgressComplete, CallbackInfo(&info));
    }
    return NotifyFinished(outcome, outcome == kOutcomeFailed ? nullptr : &info);
}

int ConvThread::Conversion::ReportFailure() {
    return NotifyFinished(kOutcomeFailed, nullptr);
}

int ConvThread::Conversion::NotifyFinished(unsigned outcome, ProgressInfo* info) {
    const int posted = Post(kMessageFinished, outcome);
    if (!converter.pfnProgress)
        return posted;
    return static_cast<int>(
        converter.pfnProgress(converter.pProgressContext, 1, outcome, CallbackInfo(info)));
}
