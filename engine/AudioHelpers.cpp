#include "engine/AudioHelpers.h"

#include "engine/Arithmetic.h"
#include "media/MediaRecords.h"

#include <cstring>

namespace {

/// Bytes of the next piece, of `left` that remain of a block of this format.
int32_t PieceLength(const AudioFrame& block, int32_t left) {
    const int32_t frameBits = WrapMul(block.nBitsPerSample, block.nChannels);
    const int32_t bytesOf50ms = WrapMul(frameBits, block.nSampleRate) / 160;
    if (left < bytesOf50ms)
        return left;
    const auto samples = Truncate<int32_t>(block.nSampleRate * 0.03 + 0.5);
    const int32_t length = WrapMul(samples, frameBits / 8);
    return length > 0 && length < left ? length : left; // a format that makes no sense is not cut
}

/// Time that `bytes` take, in 100 ns units.
int32_t Duration(int32_t bytes, int32_t bytesPerSecond) {
    return bytesPerSecond == 0
               ? 0
               : Truncate<int32_t>(static_cast<double>(bytes) / bytesPerSecond * kTicksPerSecond);
}

} // namespace

AudioFrame* get_small_frame(AudioDecoder* decoder) {
    static AudioFrame frame{};
    static int32_t nPos = 0;                 // bytes of the block handed out
    static AudioFrame* pLastFrame = nullptr; // the decoder's block

    if (!decoder || !pLastFrame || pLastFrame->nLength == nPos) {
        frame.pData = nullptr;
        frame.nLength = 0;
        frame.nBufferSize = 0;
        nPos = 0;
        pLastFrame = decoder ? decoder->GetNextFrame() : nullptr;
        if (!pLastFrame)
            return nullptr;
        frame = *pLastFrame;
    }

    const AudioFrame& block = *pLastFrame;
    const int32_t length = PieceLength(block, WrapSub(block.nLength, nPos));
    const int32_t bytesPerSecond =
        WrapMul(WrapMul(block.nChannels, block.nSampleRate), block.nBitsPerSample) / 8;
    frame.pData = block.pData ? block.pData + nPos : nullptr;
    frame.nLength = length;
    frame.nBufferSize = length;
    frame.nDuration = Duration(length, bytesPerSecond);
    frame.llTime = WrapAdd<int64_t>(block.llTime, Duration(nPos, bytesPerSecond));
    frame.llTime2 = frame.llTime;
    nPos = WrapAdd(nPos, length);
    return &frame;
}

int ConvertTo16BitsStero(short* destination, int bits, int channels, unsigned char* source, int count) {
    if (channels == 0)
        return 0;
    const bool stereo = channels == 2;
    if (stereo && bits != 8 && bits != 16)
        return count;
    for (int i = 0; i < count; ++i) {
        short value;
        if (bits == 8)
            value = static_cast<short>(source[i] * 128);
        else
            std::memcpy(&value, source + 2 * static_cast<size_t>(i), sizeof value);
        *destination++ = value;
        if (!stereo)
            *destination++ = value;
    }
    return WrapMul(count, 2 / channels);
}

AudioSourceInfo* PlayAudio(AudioDecoder* decoder) {
    return decoder->GetAudioInfo();
}
