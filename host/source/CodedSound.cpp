#include "host/source/CodedSound.h"

extern "C" {
#include <libavcodec/avcodec.h>
#include <libavutil/intreadwrite.h>
}

#include <algorithm>
#include <array>
#include <cstring>

namespace movieconv {
namespace {

constexpr int kAc3Sync = 0x0B77;

/// AC-3 and E-AC-3.
std::optional<int> Ac3Rate(const uint8_t* data) {
    constexpr std::array kRates{48000, 44100, 32000};
    constexpr int kNewest = 10; // versions of AC-3; what is above is E-AC-3
    const unsigned code = data[4] >> 6;
    const unsigned halved = data[4] >> 4 & 3U; // of E-AC-3 where `code` tells none
    const int version = data[5] >> 3;
    if (AV_RB16(data) != kAc3Sync)
        return std::nullopt;
    if (code < kRates.size())
        return kRates.at(code) >> (version > kNewest ? 0 : std::max(version - 8, 0));
    return version > kNewest && halved < kRates.size() ? std::optional(kRates.at(halved) / 2) : std::nullopt;
}

/// MPEG's layers I to III.
std::optional<int> MpegRate(const uint8_t* data) {
    constexpr std::array kRates{44100, 48000, 32000};
    const unsigned version = data[1] >> 3 & 3U; // 3: 1, 2: 2, 0: 2.5
    const unsigned code = data[2] >> 2 & 3U;
    if ((AV_RB16(data) & 0xFFE0) != 0xFFE0 || version == 1 || code >= kRates.size())
        return std::nullopt;
    return kRates.at(code) >> (version == 0 ? 2U : 3U - version);
}

std::optional<int> DtsRate(const uint8_t* data) {
    constexpr std::array kRates{0,     8000, 16000, 32000, 0,     0,     11025, 22050,
                                44100, 0,    0,     12000, 24000, 48000, 0,     0};
    const int rate = kRates.at(data[8] >> 2 & 0xFU);
    return AV_RB32(data) == 0x7FFE8001 && rate > 0 ? std::optional(rate) : std::nullopt;
}

} // namespace

int Eac3Samples(const AVPacket& packet) {
    constexpr std::array kBlocks{1, 2, 3, 6};
    constexpr int kBlock = 256;
    if (packet.size < 6 || AV_RB16(packet.data) != kAc3Sync)
        return 0;
    const bool hasLowRate = packet.data[4] >> 6 == 3; // which takes the place of the number
    return kBlock * (hasLowRate ? kBlocks.back() : kBlocks.at(packet.data[4] >> 4 & 3U));
}

int64_t OpusSamples(const AVPacket& packet) {
    if (packet.size < 1)
        return 0;
    static constexpr std::array kSilk{480, 960, 1920, 2880};
    static constexpr std::array kHybrid{480, 960};
    static constexpr std::array kCelt{120, 240, 480, 960};
    const unsigned config = packet.data[0] >> 3;
    const int frame = config < 12   ? kSilk.at(config & 3U)
                      : config < 16 ? kHybrid.at(config & 1U)
                                    : kCelt.at(config & 3U);
    const unsigned code = packet.data[0] & 3U;
    const int many = packet.size > 1 ? packet.data[1] & 0x3F : 0;
    return int64_t{frame} * (code == 0 ? 1 : code == 3 ? many : 2);
}

void ForgetWhole(AVCodecParameters& parameters) {
    constexpr int kHeaderSize = 34;
    constexpr int kLength = 13; // its lower half, and four bytes behind
    constexpr int kDigest = 18;
    if (parameters.codec_id != AV_CODEC_ID_FLAC || parameters.extradata_size < kHeaderSize)
        return;
    parameters.extradata[kLength] &= 0xF0;
    std::fill(parameters.extradata + kLength + 1, parameters.extradata + kDigest, uint8_t{0});
    std::fill(parameters.extradata + kDigest, parameters.extradata + kHeaderSize, uint8_t{0});
}

bool HasAdtsHeader(const AVPacket& packet) {
    return packet.size > 7 && packet.data[0] == 0xFF && (packet.data[1] & 0xF6) == 0xF0;
}

int AdtsForm(const AVPacket& packet) {
    constexpr int kPrivateBit = 0x200;
    return AV_RB16(packet.data + 2) & 0xFFC0 & ~kPrivateBit; // kind, rate and channels
}

bool DescribesAnew(const AVPacket& packet, const AVCodecParameters& parameters) {
    size_t size = 0;
    const uint8_t* told = av_packet_get_side_data(&packet, AV_PKT_DATA_NEW_EXTRADATA, &size);
    return told != nullptr && (size != static_cast<size_t>(parameters.extradata_size) ||
                               std::memcmp(told, parameters.extradata, size) != 0);
}

bool IsTail(const AVPacket& packet, AVCodecID codec) {
    if (codec != AV_CODEC_ID_AC3 && codec != AV_CODEC_ID_EAC3)
        return false;
    const int word = packet.size >= 2 ? AV_RB16(packet.data) : 0;
    return word != kAc3Sync && word != 0x770B;
}

int64_t SampleBytes(const AVCodecParameters& parameters) {
    const bool isPcm =
        parameters.codec_id >= AV_CODEC_ID_FIRST_AUDIO && parameters.codec_id < AV_CODEC_ID_ADPCM_IMA_QT;
    const int bits = av_get_exact_bits_per_sample(parameters.codec_id);
    return isPcm && bits >= 8 ? int64_t{bits} / 8 * parameters.ch_layout.nb_channels : 0;
}

std::optional<int> RateTold(const AVPacket& packet, AVCodecID codec) {
    constexpr int kLongestHeader = 9;
    if (packet.size < kLongestHeader)
        return std::nullopt;
    switch (codec) {
    case AV_CODEC_ID_AC3:
    case AV_CODEC_ID_EAC3:
        return Ac3Rate(packet.data);
    case AV_CODEC_ID_MP1:
    case AV_CODEC_ID_MP2:
    case AV_CODEC_ID_MP3:
        return MpegRate(packet.data);
    case AV_CODEC_ID_DTS:
        return DtsRate(packet.data);
    default:
        return std::nullopt;
    }
}

} // namespace movieconv
