#include "engine/Conversion.h"

#include "engine/Arithmetic.h"
#include "engine/PostMessage.h"
#include "engine/WriterCalls.h"
#include "log/dyLog.h"
#include "media/MediaWriter.h"
#include "text/Utf8.h"
#include "thread/Clock.h"

#include <algorithm>
#include <cmath>
#include <cstdio>
#include <exception>
#include <new>

namespace {

constexpr int32_t kProgressComplete = 10000; // hundredths of a percent

/// What the writer's errors are called in results.
int CategoryOf(int writerError) {
    switch (writerError) {
    case kWriterErrorArgument:
        return MC_RESULT_PARAMETERS;
    case kWriterErrorFormat:
    case kWriterErrorCodec:
        return MC_RESULT_FORMAT;
    case kWriterErrorExists:
        return MC_RESULT_EXISTS;
    case kWriterErrorOpen:
        return MC_RESULT_CANNOT_OPEN;
    case kWriterErrorNoSpace:
        return MC_RESULT_NO_SPACE;
    case kWriterErrorEncode:
        return MC_RESULT_ENCODE;
    case kWriterErrorInternal:
        return MC_RESULT_INTERNAL;
    case kWriterErrorRefused:
        return MC_RESULT_REFUSED;
    default:
        return MC_RESULT_WRITE;
    }
}

/// How the worker's current file stands; all zero when the writer does not tell.
WriterStatus FileStatus() {
    WriterStatus status{};
    status.nSize = sizeof status;
    if (!Writer().getThreadFileStatus || Writer().getThreadFileStatus(&status) == 0)
        status = {};
    return status;
}

/// What is wrong with a picture that was not taken, as far as it shows.
const char* FaultOf(const VideoImage& picture) {
    if (picture.nFormat != kPictureFormatPlanar420 && picture.nFormat != kPictureFormatPlanar420Deep)
        return "A picture was not taken: its format is not planar 4:2:0 (nFormat 2 or 10).";
    if (!picture.pY || !picture.pU || !picture.pV)
        return "A picture was not taken: one of its planes is null.";
    if (picture.nWidth <= 0 || picture.nHeight <= 0)
        return "A picture was not taken: its size makes no sense.";
    return "A picture was not taken by the media writer.";
}

/// An estimate that there is no basis for yet is infinite or not a number; the host gets 0 instead.
double FiniteOrZero(double value) {
    return std::isfinite(value) ? value : 0.0;
}

} // namespace

bool ConvThread::Conversion::CreateFile(const wchar_t* fileName) {
    filePath = text::ToUtf8(fileName);
    bFileEmpty = true;
    nPicturesTaken = nSamplesTaken = 0;
    hFile = MWCreateMediaFile(fileName, &converter.encodeParam, pVideoFormat, pAudioFormat);
    if (hFile) {
        converter.results.Update([](MCResult& result) { ++result.nFilesCreated; });
        return true;
    }
    NoteFailure(MC_RESULT_CANNOT_OPEN, "The media writer could not create the file.");
    return false;
}

void ConvThread::Conversion::CloseFile(ProgressCallback callback, void* context) {
    const bool complete = MWCloseMediaFile(hFile, callback, context) != 0;
    if (!hFile)
        return;
    const WriterStatus status = FileStatus();
    const bool told = status.nState != 0;
    converter.results.Update([&](MCResult& result) {
        result.nFilesComplete += complete ? 1 : 0;
        result.llPicturesWritten += told ? status.llPicturesWritten : nPicturesTaken;
        result.llSamplesWritten += told ? status.llSamplesWritten : nSamplesTaken;
    });
    const bool empty = told ? status.nState == kWriterFileEmpty : bFileEmpty;
    if (!complete && !empty)
        NoteFailure(MC_RESULT_WRITE, "The media writer could not complete the file.");
    hFile = nullptr;
}

void ConvThread::Conversion::Send(const VideoImage& picture) {
    const bool taken = MWWriteVideoFrame(hFile, &picture) != 0;
    bFileEmpty = false;
    nPicturesTaken += taken ? 1 : 0;
    converter.results.CountPicture(taken);
    if (!taken)
        NoteFailure(MC_RESULT_REFUSED, FaultOf(picture));
}

void ConvThread::Conversion::Send(const AudioFrame& block) {
    const bool taken = MWWriteAudioData(hFile, &block) != 0;
    if (block.nLength <= 0) // silence of no length
        return;
    bFileEmpty = false;
    const int32_t frame = WrapMul(block.nChannels, block.nBitsPerSample) / 8;
    const int32_t samples = frame > 0 ? block.nLength / frame : 0;
    nSamplesTaken += taken ? samples : 0;
    converter.results.CountSamples(samples, taken);
    if (!taken)
        NoteFailure(MC_RESULT_REFUSED,
                    "A block of sound was not taken by the media writer: its format makes no sense, "
                    "or it has no data.");
}

// The writer's own word where it has one.
void ConvThread::Conversion::NoteFailure(int category, const char* what) {
    const WriterStatus status = FileStatus();
    if (status.nError != kWriterErrorNone)
        converter.results.Fail(CategoryOf(status.nError), status.szWhat, filePath.c_str(),
                               status.nSystemError);
    else
        converter.results.Fail(category, what, filePath.c_str());
    if (converter.bStopOnFailure)
        converter.Abort(0, 0);
}

void ConvThread::Conversion::NoteException() {
    try {
        throw;
    } catch (const std::bad_alloc&) {
        converter.results.Fail(MC_RESULT_INTERNAL, "There was no memory.");
    } catch (const std::exception& error) {
        char what[MC_TEXT_SIZE];
        std::snprintf(what, sizeof what, "A decoder threw an exception: %s", error.what());
        converter.results.Fail(MC_RESULT_SOURCE, what);
    } catch (...) {
        converter.results.Fail(MC_RESULT_SOURCE, "A decoder threw an exception.");
    }
    LogAt(kLogError, L"MovieConv::An exception came out of a decoder.\r\n");
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
    CloseFile(nullptr, nullptr);
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
    return CallBack(0, value, &info) != 0;
}

int ConvThread::Conversion::Finish(unsigned outcome, double doneLength) {
    CloseFile(converter.pfnProgress, converter.pProgressContext);

    ProgressInfo info = MakeProgressInfo(kProgressComplete, MillisecondClock() - tStart);
    info.dDoneLength = doneLength;
    if (outcome == kOutcomeCompleted) {
        Post(kMessageProgress, kProgressComplete);
        CallBack(0, kProgressComplete, &info);
    }
    return NotifyFinished(outcome, outcome == kOutcomeFailed ? nullptr : &info, true);
}

int ConvThread::Conversion::ReportFailure(int category, const char* what, bool event) {
    converter.results.Fail(category, what);
    return NotifyFinished(kOutcomeFailed, nullptr, event);
}

int ConvThread::Conversion::ReportException() {
    NoteException();
    return NotifyFinished(kOutcomeFailed, nullptr, true);
}

int ConvThread::Conversion::NotifyFinished(unsigned outcome, ProgressInfo* info, bool event) {
    converter.results.End(outcome, pVideoFormat != nullptr);
    const int posted = event ? Post(kMessageFinished, outcome) : 1;
    return converter.pfnProgress ? static_cast<int>(CallBack(1, outcome, info)) : posted;
}

unsigned ConvThread::Conversion::CallBack(unsigned kind, unsigned value, const ProgressInfo* info) {
    if (!converter.pfnProgress)
        return 1;
    try {
        return converter.pfnProgress(converter.pProgressContext, kind, value,
                                     reinterpret_cast<uintptr_t>(info));
    } catch (...) {
        converter.results.Fail(MC_RESULT_CALLBACK, "The progress callback threw an exception.");
        LogAt(kLogError, L"MovieConv::An exception came out of the progress callback.\r\n");
        return 0; // which cancels
    }
}
