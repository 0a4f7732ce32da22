#include "engine/ConvThread.h"

#include "engine/SourceFormat.h"
#include "log/dyLog.h"
#include "media/FileFormats.h"
#include "media/FourCC.h"
#include "media/Limits.h"
#include "thread/SingleLock.h"

#include <new>
#include <utility>

namespace {

// Bits per second of sound in parameters that leave it at 0: half of what a converter begins with. Hosts
// count on both figures.
constexpr int32_t kCompletedAudioBitrate = 64'000;

EncodeParam DefaultEncodeParam() {
    EncodeParam param{};
    param.fccVideo = kEngineVideoCodec;
    param.fccColorFormat = FourCC("YV12");
    param.nBitCount = 12;
    param.nWidth = 320;
    param.nHeight = 240;
    param.dFrameRate = 24.0;
    param.nVideoBitrate = kUsualVideoBitrate;
    param.fccAudio = kEngineAudioCodec;
    param.nSampleRate = 22050;
    param.nChannels = 2;
    param.nBitsPerSample = 16;
    param.nAudioBitrate = kUsualAudioBitrate;
    param.fccFileFormat = FourCC("MP4 ");
    return param;
}

/// Switches off what the file format cannot carry, by the media writer's table.
void DropUnsupportedStreams(EncodeParam& param) {
    const FileFormatInfo* format =
        FindFileFormat([&](const FileFormatInfo& each) { return each.fccFormat == param.fccFileFormat; });
    if (format && !format->bHasVideo)
        param.bNoVideo = 1;
    if (format && !format->bHasAudio)
        param.bNoAudio = 1;
}

void CompleteFrom(const VideoFormat& source, EncodeParam& param) {
    if (param.dFrameRate <= 0.0)
        param.dFrameRate = source.dFrameRate;
    if (param.nWidth == 0)
        param.nWidth = source.nWidth;
    if (param.nHeight == 0)
        param.nHeight = source.nHeight;
    if (param.nVideoBitrate == 0)
        param.nVideoBitrate = kUsualVideoBitrate;
}

void CompleteFrom(const AudioFormat& source, EncodeParam& param) {
    if (param.nSampleRate == 0)
        param.nSampleRate = source.nSampleRate;
    if (param.nChannels == 0)
        param.nChannels = source.nChannels;
    if (param.nBitsPerSample == 0)
        param.nBitsPerSample = source.nBitsPerSample;
    if (param.nAudioBitrate == 0)
        param.nAudioBitrate = kCompletedAudioBitrate;
}

/// The four characters of a code as text.
struct FourCCText {
    explicit FourCCText(uint32_t code) {
        for (unsigned i = 0; i < 4; ++i)
            text[i] = static_cast<wchar_t>(code >> 8 * i & 0xFF);
    }
    wchar_t text[5] = {};
};

/// The lines of the log are part of the interface, down to the spelling; see docs/abi.md.
void LogEncodeParam(const EncodeParam& param) {
    LogEx(L"Halvane::SetEncodeParam: Flie format[%ls], Video[%ls] (%dx%d) %ffps, %dbps %d %dbps "
          L"Resize:%d\t\tAudio[%ls]%dchannels %dHz , %dbps %d %dbps",
          FourCCText(param.fccFileFormat).text, FourCCText(param.fccVideo).text, param.nWidth, param.nHeight,
          param.dFrameRate, param.nVideoBitrate, param.nVideoRateMode, param.nVideoMaxBitrate, param.bResize,
          FourCCText(param.fccAudio).text, param.nChannels, param.nSampleRate, param.nAudioBitrate,
          param.nAudioRateMode, param.nAudioMaxBitrate);
}

} // namespace

ConvThread::ConvThread(VideoDecoder* video, AudioDecoder* audio)
    : pVideoDecoder(video), pAudioDecoder(audio), encodeParam(DefaultEncodeParam()) {
    if (!hStopEvent || !hExitEvent)
        throw std::bad_alloc();
    if (const VideoFormat* source = SourceFormat(video)) {
        encodeParam.nWidth = source->nWidth;
        encodeParam.nHeight = source->nHeight;
        encodeParam.dFrameRate = source->dFrameRate;
    }
    if (const AudioFormat* source = SourceFormat(audio)) {
        encodeParam.nSampleRate = source->nSampleRate;
        encodeParam.nChannels = source->nChannels;
    }
}

std::unique_ptr<ConvThread> ConvThread::FromSources(const MCVideoSource* video, const MCAudioSource* audio) {
    std::unique_ptr<SourceVideo> pictures = video ? SourceVideo::Make(video) : nullptr;
    std::unique_ptr<SourceAudio> sound = audio ? SourceAudio::Make(audio) : nullptr;
    if ((video && !pictures) || (audio && !sound))
        return nullptr;
    auto converter = std::make_unique<ConvThread>(pictures.get(), sound.get());
    if (pictures)
        pictures->JoinConverter(converter->results);
    if (sound)
        sound->JoinConverter(converter->results);
    converter->ownVideo = std::move(pictures);
    converter->ownAudio = std::move(sound);
    return converter;
}

ConvThread::~ConvThread() {
    Stop(0, 0);
    pthread_mutex_destroy(&sharedLock);
    pthread_mutex_destroy(&lock);
}

int ConvThread::SetEncodeParam(const EncodeParam* param) {
    EncodeParam completed = param ? *param : encodeParam;
    const EncodeParam asked = completed;

    DropUnsupportedStreams(completed);
    const VideoFormat* videoSource = SourceFormat(pVideoDecoder);
    if (videoSource)
        CompleteFrom(*videoSource, completed);
    const AudioFormat* audioSource = SourceFormat(pAudioDecoder);
    if (audioSource)
        CompleteFrom(*audioSource, completed);

    LogEncodeParam(asked);
    if (videoSource)
        LogEx(L"Halvane::Source Video Info: (%dx%d) %ffps, %f seconds.", videoSource->nWidth,
              videoSource->nHeight, videoSource->dFrameRate, videoSource->dDuration);
    if (pVideoDecoder && completed.dFrameRate > kHighestFrameRate)
        completed.dFrameRate = 30.0;
    if (audioSource)
        LogEx(L"Halvane::Source Audio Info: %dHz %dchannels, %dbps %dbits %esecond.",
              audioSource->nSampleRate, audioSource->nChannels, audioSource->nBytesPerSecond,
              audioSource->nBitsPerSample, audioSource->dDuration);

    const CSingleLock guard(&sharedLock);
    encodeParam = completed;
    return 1;
}

int ConvThread::GetEncodeParam(EncodeParam* out) const {
    if (out) {
        const CSingleLock guard(&sharedLock);
        *out = encodeParam;
    }
    return 1;
}

int ConvThread::SetOutputFile(const wchar_t* path) {
    strOutputFile = path ? path : L"";
    return 1;
}
