#include "api/MovieConv.h"

#include "engine/ConvThread.h"
#include "engine/Estimate.h"
#include "engine/FileParam.h"
#include "engine/WriterCalls.h"
#include "log/dyLog.h"

#include <new>

static_assert(MC_MAX_TARGET_NAME == kClipNameSize);
static_assert(int{MC_LOG_ERROR} == int{kLogError} && int{MC_LOG_WARNING} == int{kLogWarning});
static_assert(int{MC_LOG_INFO} == int{kLogInfo} && int{MC_LOG_DEBUG} == int{kLogDebug});
static_assert(MC_INFINITE == kWaitInfinite && MC_WAIT_TIMEOUT == kWaitTimeout);

namespace {

/// Calls `operation` on the converter behind a handle. Without a converter, and when it throws, the result is
/// `failure`.
template <class Result, class Operation>
Result Call(MCHandle converter, Result failure, Operation operation) noexcept {
    if (!converter)
        return failure;
    try {
        return operation(*static_cast<ConvThread*>(converter));
    } catch (...) {
        return failure;
    }
}

/// Whether the media writer is one for this engine. One that does not tell its version has the five functions
/// that every version calls.
bool WriterFits() {
    if (!Writer().getVersion)
        return true;
    const unsigned version = Writer().getVersion();
    if (version >> 16 == MC_VERSION_MAJOR)
        return true;
    LogAt(kLogError, L"MovieConv::The media writer is of version %u.%u, this engine wants one of %u.\r\n",
          version >> 16, version >> 8 & 0xFF, MC_VERSION_MAJOR);
    return false;
}

/// True, with a line in the log, on the converter's own worker, which cannot wait for its own end.
bool RefusedOnWorker(MCHandle converter, const wchar_t* function) {
    if (!converter || !static_cast<ConvThread*>(converter)->IsWorker())
        return false;
    LogAt(kLogError,
          L"MovieConv::%ls is refused on the converter's worker thread; there a callback returns 0 or calls "
          L"MCAbort.\r\n",
          function);
    return true;
}

} // namespace

unsigned MCGetVersion(void) {
    return MC_VERSION;
}

int MCSetLogCallback(MCLogFunction function, void* user) {
    if (LogRouteSet(function, user) == 0)
        return 0;
    if (Writer().forwardLog)
        Writer().forwardLog(function ? 1 : 0);
    return 1;
}

MCHandle MCCreate(VideoDecoder* video, AudioDecoder* audio) {
    if ((!video && !audio) || !WriterFits())
        return nullptr;
    try {
        return new ConvThread(video, audio);
    } catch (...) {
        return nullptr;
    }
}

MCHandle MCCreateFromSources(const MCVideoSource* video, const MCAudioSource* audio) {
    if ((!video && !audio) || !WriterFits())
        return nullptr;
    try {
        return ConvThread::FromSources(video, audio).release();
    } catch (...) {
        return nullptr;
    }
}

void MCDestroy(MCHandle converter) {
    if (RefusedOnWorker(converter, L"MCDestroy"))
        return;
    delete static_cast<ConvThread*>(converter);
}

int MCSetEncodeParam(MCHandle converter, const EncodeParam* param) {
    return Call(converter, 0, [=](ConvThread& c) { return c.SetEncodeParam(param); });
}

int MCGetEncodeParam(MCHandle converter, EncodeParam* out) {
    return Call(converter, 0, [=](ConvThread& c) { return c.GetEncodeParam(out); });
}

int MCEncodeParamForFile(const wchar_t* fileName, EncodeParam* param) {
    return ParamForFile(fileName, param) ? 1 : 0;
}

int MCSetOutputFile(MCHandle converter, const wchar_t* path) {
    return Call(converter, 0, [=](ConvThread& c) { return c.SetOutputFile(path); });
}

int MCSetSplitParam(MCHandle converter, int mode, unsigned long value) {
    return Call(converter, 0, [=](ConvThread& c) { return c.SetSplitParam(mode, value); });
}

unsigned MCEnablePreview(MCHandle converter, unsigned enable) {
    return Call(converter, 0U, [=](ConvThread& c) { return c.EnablePreview(enable); });
}

unsigned MCEnableEvents(MCHandle converter, unsigned enable) {
    return Call(converter, 0U, [=](ConvThread& c) { return c.EnableEvents(enable); });
}

long long MCGetEstimateDiskSpace(MCHandle converter) {
    return Call(converter, 0LL, [](ConvThread& c) { return c.GetEstimateDiskSpace(); });
}

long long MCGetEstimateDiskSpaceEx(const EncodeParam* param, double seconds) {
    return EstimateDiskSpace(param, seconds);
}

long long MCGetDiskFreeSpace(const wchar_t* path) {
    return ConvThread::GetDiskFreeSpace(path);
}

int MCStart(MCHandle converter, double begin, double length, OpaqueWindowPtr* window,
            ProgressCallback callback, void* context) {
    return Call(converter, -1,
                [=](ConvThread& c) { return c.Start(begin, length, window, callback, context); });
}

int MCPause(MCHandle converter) {
    return Call(converter, 0, [](ConvThread& c) { return c.Pause(); });
}

int MCResume(MCHandle converter) {
    return Call(converter, 0, [](ConvThread& c) { return c.Resume(); });
}

int MCStop(MCHandle converter) {
    if (RefusedOnWorker(converter, L"MCStop"))
        return 0;
    return Call(converter, 0, [](ConvThread& c) { return c.Stop(0, 0); });
}

int MCAbort(MCHandle converter) {
    return Call(converter, 0, [](ConvThread& c) { return c.Abort(0, 0); });
}

int MCWait(MCHandle converter, unsigned timeoutMs) {
    if (RefusedOnWorker(converter, L"MCWait"))
        return MC_WAIT_TIMEOUT;
    return Call(converter, -1, [=](ConvThread& c) { return static_cast<int>(c.Wait(timeoutMs)); });
}

int MCSetThreadPriority(MCHandle /*converter*/, int /*priority*/) {
    return 0;
}

int MCGetResult(MCHandle converter, MCResult* result) {
    return Call(converter, 0, [=](ConvThread& c) { return c.GetResult(result); });
}

unsigned MCEnableStopOnFailure(MCHandle converter, unsigned enable) {
    return Call(converter, 0U, [=](ConvThread& c) { return c.EnableStopOnFailure(enable); });
}

int MCGetTargetCount(MCHandle converter) {
    return Call(converter, 0, [](ConvThread& c) { return c.GetTargetCount(); });
}

int MCGetTargetFileName(MCHandle converter, wchar_t* buffer, int index) {
    return Call(converter, 0, [=](ConvThread& c) { return c.GetTargetFileName(buffer, index); });
}
