#include "engine/SourceDecoders.h"

#include "engine/Arithmetic.h"
#include "log/dyLog.h"

#include <cmath>
#include <cstdio>

namespace {

/// A length that is not known: the shortest that does not count as an empty source.
constexpr double kUnknownDuration = 0.001;

int32_t ChromaWidth(int32_t width) {
    return width / 2 + width % 2;
}

int64_t Ticks(double seconds) {
    return Truncate<int64_t>(std::round(seconds * kTicksPerSecond));
}

void TellUnusable(const wchar_t* source) {
    LogAt(kLogError,
          L"MovieConv::The table of a %ls source is not complete, or the source cannot be described.\r\n",
          source);
}

} // namespace

void TellSourceError(ResultBook* results, const char* source, const char* what, int code, int64_t count) {
    char text[MC_TEXT_SIZE];
    std::snprintf(text, sizeof text, "The %s source %s (%d) after %lld of its records.", source, what, code,
                  static_cast<long long>(count));
    if (results)
        results->Fail(MC_RESULT_SOURCE, text);
    LogAt(kLogError, L"MovieConv::%s\r\n", text);
}

std::unique_ptr<SourceVideo> SourceVideo::Make(const MCVideoSource* table) {
    if (table->nSize >= sizeof *table && table->pfnGetFormat && table->pfnGetPicture) {
        std::unique_ptr<SourceVideo> made(new SourceVideo(*table));
        VideoFormat& format = made->info.format;
        if (table->pfnGetFormat(table->pUser, &format) != 0 && format.nWidth > 0 && format.nHeight > 0 &&
            format.dFrameRate > 0.0) {
            if (!(format.dDuration > 0.0))
                format.dDuration = kUnknownDuration;
            return made;
        }
    }
    TellUnusable(L"picture");
    return nullptr;
}

// Reads the next picture.
bool SourceVideo::Load() {
    if (isBehind)
        Seek(0.0, 0);
    const VideoFormat& format = info.format;
    const double rate = format.dFrameRate;
    image = {};
    image.nType = kMediaTypePicture;
    image.nFormat = kPictureFormatPlanar420;
    image.nWidth = image.nPitchY = format.nWidth;
    image.nHeight = format.nHeight;
    image.nPitchU = image.nPitchV = ChromaWidth(format.nWidth);
    image.llTime = Ticks(static_cast<double>(number) / rate);
    image.nDuration = Truncate<int32_t>(kTicksPerSecond / rate);
    loaded = false;
    if (ended)
        return false;
    const int result = source.pfnGetPicture(source.pUser, &image);
    if (result < 0)
        Fail("picture", "reported an error", result);
    ended = result <= 0;
    if (ended)
        return false;
    image.llTime2 = image.llTime;
    ++count;
    ++number;
    loaded = true;
    return true;
}

double SourceVideo::Seek(double seconds, int /*mode*/) {
    ended = loaded = isBehind = false;
    if (!source.pfnSeek) {
        // Skipping starts where the source stands, as after the conversion before.
        while (Load() && image.llTime < Ticks(seconds)) {
        }
    } else if (const int result = source.pfnSeek(source.pUser, seconds); result == 0) {
        Fail("picture", "cannot be sought in", result);
    } else {
        number = Truncate<int64_t>(std::round(seconds * info.format.dFrameRate));
    }
    return seconds;
}

VideoImage* SourceVideo::GetCurrentImage() {
    return (loaded && !isBehind) || Load() ? &image : nullptr;
}

int SourceVideo::DecodeNext(int /*mode*/) {
    return Load() ? 1 : 0;
}

std::unique_ptr<SourceAudio> SourceAudio::Make(const MCAudioSource* table) {
    if (table->nSize >= sizeof *table && table->pfnGetFormat && table->pfnGetBlock) {
        std::unique_ptr<SourceAudio> made(new SourceAudio(*table));
        AudioFormat& format = made->info.format;
        if (table->pfnGetFormat(table->pUser, &format) != 0 && format.nSampleRate > 0 &&
            format.nChannels > 0 && format.nBitsPerSample >= 8) {
            if (!(format.dDuration > 0.0))
                format.dDuration = kUnknownDuration;
            if (format.nBytesPerSecond == 0)
                format.nBytesPerSecond =
                    WrapMul(WrapMul(format.nSampleRate, format.nChannels), format.nBitsPerSample / 8);
            return made;
        }
    }
    TellUnusable(L"sound");
    return nullptr;
}

// Reads the next block.
bool SourceAudio::Load() {
    if (isBehind)
        Seek(0.0);
    const AudioFormat& format = info.format;
    block = {};
    block.nType = kMediaTypeSound;
    block.nSampleRate = format.nSampleRate;
    block.nChannels = format.nChannels;
    block.nBitsPerSample = format.nBitsPerSample;
    block.llTime = Ticks(seconds);
    if (ended)
        return false;
    const int result = source.pfnGetBlock(source.pUser, &block);
    if (result < 0)
        Fail("sound", "reported an error", result);
    ended = result <= 0 || block.nLength <= 0;
    if (ended)
        return false;
    if (block.nBufferSize == 0)
        block.nBufferSize = block.nLength;
    const double bytesPerSecond = block.nSampleRate * (block.nChannels * (block.nBitsPerSample / 8.0));
    const double length = bytesPerSecond > 0.0 ? block.nLength / bytesPerSecond : 0.0;
    block.nDuration = Truncate<int32_t>(length * kTicksPerSecond);
    block.llTime2 = block.llTime;
    seconds = static_cast<double>(block.llTime) / kTicksPerSecond + length;
    ++count;
    return true;
}

double SourceAudio::Seek(double to) {
    ended = waits = isBehind = false;
    if (!source.pfnSeek) {
        while (!waits && Load())
            waits = seconds > to || to <= 0.0;
    } else if (const int result = source.pfnSeek(source.pUser, to); result == 0) {
        Fail("sound", "cannot be sought in", result);
    } else {
        seconds = to;
    }
    return to;
}

AudioFrame* SourceAudio::GetNextFrame() {
    if (waits) {
        waits = false;
        return &block;
    }
    return Load() ? &block : nullptr;
}
