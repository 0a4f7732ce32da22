// Whole conversions: the three loops behind the MC functions, over decoders whose pictures, blocks and
// formats come from the input, into the recording writer; and the helpers for sound.
#include "engine/AudioHelpers.h"
#include "fuzz/ConversionInspection.h"
#include "fuzz/Fuzz.h"
#include "fuzz/ListedDecoders.h"
#include "tests/engine/ScriptedHost.h"

#include <cmath>
#include <string>
#include <vector>

#include <time.h>
#include <unistd.h>

namespace {

void CheckRecord(const ListedVideo& video, const ProgressInfo& info) {
    FUZZ_CHECK(info.nProgress <= 10000 && info.nPercent == info.nProgress / 100);
    FUZZ_CHECK(std::isfinite(info.dSpeed));
    for (const TimeData& time : {info.tElapsed, info.tRemaining})
        FUZZ_CHECK(time.nMinutes < 60 && time.nSeconds < 60 && time.nMilliseconds < 1000);
    FUZZ_CHECK(info.pPreviewImage == nullptr || video.IsCurrent(info.pPreviewImage));
}

EncodeParam MakeParam(FuzzedDataProvider& input) {
    EncodeParam param{};
    param.nWidth = WildInteger(input, 0);
    param.dFrameRate = WildDouble(input, 0.0);
    param.nVideoRateMode = input.ConsumeBool() ? 1 : 0;
    param.nVideoBitrate = WildInteger(input, 0);
    param.nVideoMaxBitrate = WildInteger(input, 0);
    param.nSampleRate = WildInteger(input, 8000);
    param.nChannels = WildInteger(input, 2);
    param.nBitsPerSample = WildInteger(input, 16);
    param.nAudioBitrate = WildInteger(input, 0);
    param.bNoVideo = input.ConsumeIntegralInRange(0, 7) == 0 ? 1 : 0;
    param.bNoAudio = input.ConsumeIntegralInRange(0, 7) == 0 ? 1 : 0;
    param.fccFileFormat = input.ConsumeBool() ? FourCC("MP4 ") : FourCC("COPY");
    return param;
}

std::wstring MakeName(FuzzedDataProvider& input) {
    std::wstring name =
        input.PickValueInArray<const wchar_t*>({L"out.mp4", L"", L"no extension", L"a.b/c", L"."});
    if (input.ConsumeIntegralInRange(0, 15) == 0)
        name.append(input.ConsumeIntegralInRange<size_t>(0, 520),
                    input.PickValueInArray({L'x', L'%', L'\x1F3AC'}));
    return name;
}

void FuzzConversion(FuzzedDataProvider& input) {
    ListedVideo video(input);
    ListedAudio audio(input);
    const bool hasVideo = input.ConsumeIntegralInRange(0, 7) != 0;
    const bool hasAudio = input.ConsumeIntegralInRange(0, 7) != 0;
    ScriptedHost host;
    host.handle = MCCreate(hasVideo ? &video : nullptr, hasAudio ? &audio : nullptr);
    host.hasCallback = input.ConsumeBool();
    const unsigned abortAt = input.ConsumeIntegralInRange(0U, 15U);
    unsigned calls = 0;
    host.onCallback = [&](unsigned, const ProgressInfo* info) {
        if (info)
            CheckRecord(video, *info);
        MCEnablePreview(host.handle, calls % 2);
        FUZZ_CHECK(MCPause(host.handle) <= 1 && MCResume(host.handle) == 0);
        if (++calls == abortAt)
            MCAbort(host.handle);
    };
    const EncodeParam param = MakeParam(input);
    if (input.ConsumeBool())
        MCSetEncodeParam(host.handle, &param);
    const std::wstring name = MakeName(input);
    MCSetOutputFile(host.handle, name.c_str());

    for (int round = input.ConsumeIntegralInRange(1, 2); round > 0; --round) {
        video.Rewind();
        audio.Rewind();
        const int split = input.ConsumeIntegralInRange(0, 2);
        MCSetSplitParam(host.handle, split, WildInteger<unsigned long>(input, 100));
        const int firstFailure = input.ConsumeIntegralInRange(0, 8);
        const int secondFailure = firstFailure + input.ConsumeIntegralInRange(0, 8);
        recorder::Reset({.failingCreates = {firstFailure, secondFailure}});
        host.cancelAt = input.ConsumeIntegralInRange(0U, 15U);
        const int before = MCGetTargetCount(host.handle);
        const int started = host.Start(WildDouble(input, 0.0), WildDouble(input, 0.0));
        FUZZ_CHECK(MCWait(host.handle, MC_INFINITE) == (host.handle ? 0 : -1));
        if (started != 0) {
            FUZZ_CHECK(Trace(Part::kWithoutLog).empty());
            continue;
        }
        Inspection inspection(video, audio, host.hasCallback);
        inspection.Run();
        const auto clips = static_cast<size_t>(MCGetTargetCount(host.handle) - before);
        FUZZ_CHECK(clips == 0 ? inspection.creates <= 1 : split == 1 && clips == inspection.creates);
    }
}

/// Pieces of sound: all of every block, in order.
void FuzzPieces(FuzzedDataProvider& input) {
    ListedAudio audio(input);
    get_small_frame(nullptr);
    size_t block = 0;
    int64_t done = 0;
    constexpr int kMostPieces = 2000;
    for (int pieces = 0; pieces < kMostPieces; ++pieces) {
        const AudioFrame* piece = get_small_frame(&audio);
        if (piece == nullptr) {
            FUZZ_CHECK(done == 0);
            break;
        }
        const AudioFrame& source = audio.Block(block);
        FUZZ_CHECK(piece->nLength == piece->nBufferSize && piece->llTime == piece->llTime2);
        FUZZ_CHECK(source.nLength <= 0 ? piece->nLength == source.nLength : piece->nLength > 0);
        FUZZ_CHECK(source.pData == nullptr || piece->pData == source.pData + done);
        done += piece->nLength;
        if (done == source.nLength) {
            ++block;
            done = 0;
        }
    }
    get_small_frame(nullptr);
}

void FuzzStereo(FuzzedDataProvider& input) {
    const int bits = WildInteger(input, input.ConsumeBool() ? 8 : 16);
    const int channels = WildInteger(input, input.ConsumeIntegralInRange(0, 6));
    const auto source = input.ConsumeRemainingBytes<unsigned char>();
    const int count = static_cast<int>(bits == 8 ? source.size() : source.size() / 2);
    std::vector<short> target(static_cast<size_t>(count) * (channels == 2 ? 1 : 2));
    const int written =
        ConvertTo16BitsStero(target.data(), bits, channels, const_cast<unsigned char*>(source.data()), count);
    FUZZ_CHECK(written == (channels == 0 ? 0 : count * (2 / channels)));
}

void FuzzEstimate(FuzzedDataProvider& input) {
    const EncodeParam param = MakeParam(input);
    MCGetEstimateDiskSpaceEx(&param, WildDouble(input, 10.0));
}

} // namespace

/// Takes the place of the system's, in the engine too: what polls every 10 ms need not be waited for.
extern "C" __attribute__((visibility("default"))) int usleep(useconds_t) {
    const timespec moment{0, 20000};
    return nanosleep(&moment, nullptr);
}

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    FuzzedDataProvider input(data, size);
    switch (input.ConsumeIntegralInRange(0, 15)) {
    case 0:
        FuzzPieces(input);
        break;
    case 1:
        FuzzStereo(input);
        break;
    case 2:
        FuzzEstimate(input);
        break;
    default:
        FuzzConversion(input);
    }
    return 0;
}
