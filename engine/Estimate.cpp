#include "engine/Estimate.h"

#include "engine/Arithmetic.h"
#include "engine/ConvThread.h"
#include "engine/SourceFormat.h"
#include "log/dyLog.h"
#include "thread/SingleLock.h"

#include <algorithm>

namespace {

constexpr int32_t kMaxSeconds = 36000; // no estimate covers more than ten hours

/// Bits per second that a stream is expected to take on average. A stream with an upper rate stays below it
/// mostly.
int32_t AverageBitrate(int32_t rateMode, int32_t bitrate, int32_t maxBitrate) {
    if (rateMode == 0)
        return bitrate;
    return WrapMul(4, bitrate) / 10 + WrapMul(6, maxBitrate) / 10;
}

bool ExceedsLimit(double seconds) {
    const auto whole = Truncate<int32_t>(seconds);
    return whole > kMaxSeconds || whole < -kMaxSeconds;
}

} // namespace

long long EstimateDiskSpace(const EncodeParam* param, double seconds) {
    if (!param || seconds < 0.00001)
        return 0;
    const int32_t video = param->bNoVideo ? 0
                                          : AverageBitrate(param->nVideoRateMode, param->nVideoBitrate,
                                                           param->nVideoMaxBitrate);
    const int32_t audio = param->bNoAudio ? 0
                                          : AverageBitrate(param->nAudioRateMode, param->nAudioBitrate,
                                                           param->nAudioMaxBitrate);
    const int32_t bytesPerSecond = WrapAdd(video, audio) / 8;
    return Truncate<long long>(bytesPerSecond * seconds);
}

long long ConvThread::GetEstimateDiskSpace() const {
    VideoDecoder* video = nullptr;
    AudioDecoder* audio = nullptr;
    EncodeParam param;
    {
        const CSingleLock guard(&sharedLock);
        video = pVideoDecoder;
        audio = pAudioDecoder;
        param = encodeParam;
    }

    double length = 0.0;
    if (video && !param.bNoVideo)
        length = SourceDuration(video);
    LogEx(L"MovieConv::EstimateDiskSpace() dLength: %0.3fs\r\n", length);
    if (audio && !param.bNoAudio) {
        double audioLength = SourceDuration(audio);
        if (ExceedsLimit(audioLength)) {
            LogEx(L"Audio Length: %0.3fs\r\n", audioLength);
            audioLength = kMaxSeconds;
        }
        length = std::max(audioLength, length);
    }
    if (ExceedsLimit(length)) {
        LogEx(L"Length = %0.3fs\r\n", length);
        length = kMaxSeconds;
    }
    return EstimateDiskSpace(&param, length);
}

long long ConvThread::GetDiskFreeSpace(const wchar_t* path) {
    return path && *path ? 0xFFFFFFFFLL : 0;
}
