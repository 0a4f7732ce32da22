#include "writer/FormatTable.h"

#include "writer/CodecRows.h"
#include "writer/ContainerRows.h"
#include "writer/WriterStatus.h"

extern "C" {
#include <libavformat/avformat.h>
#include <libavutil/avstring.h>
}

#include <algorithm>
#include <cctype>
#include <cstring>
#include <limits>
#include <span>
#include <string_view>
#include <vector>

namespace writer {
namespace {

/// Whether `name` is one of those that stand in `list` between commas, in small letters.
bool IsListed(const char* list, const std::string& name) {
    std::string small(name);
    std::transform(small.begin(), small.end(), small.begin(),
                   [](unsigned char letter) { return static_cast<char>(std::tolower(letter)); });
    const std::string_view all(list);
    for (size_t at = all.find(small); at != std::string_view::npos; at = all.find(small, at + 1)) {
        const size_t end = at + small.size();
        if ((at == 0 || all[at - 1] == ',') && (end == all.size() || all[end] == ','))
            return true;
    }
    return false;
}

/// The code in capitals, other names replaced by the table's.
uint32_t Canonical(uint32_t code) {
    uint32_t upper = 0;
    for (int shift = 0; shift < 32; shift += 8) {
        const auto byte = static_cast<unsigned char>(code >> shift);
        upper |= static_cast<uint32_t>(std::toupper(byte) & 0xFF) << shift;
    }
    for (const CodecAlias& alias : CodecAliases())
        if (alias.name == upper)
            return alias.code;
    return upper;
}

template <typename Row>
const Row* FindByCode(std::span<const Row> table, uint32_t code) {
    const auto found =
        std::find_if(table.begin(), table.end(), [code](const auto& row) { return row.code == code; });
    return found == table.end() ? nullptr : &*found;
}

template <typename Row>
const Row* FindFitting(std::span<const Row> table, const std::array<uint32_t, 12>& fitting, uint32_t code) {
    const uint32_t canonical = Canonical(code);
    const bool fits = canonical != 0 && std::find(fitting.begin(), fitting.end(), canonical) != fitting.end();
    return fits ? FindByCode(table, canonical) : nullptr;
}

template <typename Row>
bool CanEncode(std::span<const Row> table, uint32_t code) {
    const auto* codec = FindByCode(table, code);
    return codec != nullptr && avcodec_find_encoder_by_name(codec->encoder) != nullptr;
}

/// The codes from `fitting` that can be encoded here, into the zeroed list `codes`; true when there is one.
template <typename Row>
bool CopyEncodable(std::span<const Row> table, const std::array<uint32_t, 12>& fitting, uint32_t* codes) {
    const auto canEncode = [&](uint32_t code) { return code != 0 && CanEncode(table, code); };
    return std::copy_if(fitting.begin(), fitting.end(), codes, canEncode) != codes;
}

FileFormatInfo Describe(const Container& container) {
    FileFormatInfo info{};
    info.fccFormat = container.code;
    std::strncpy(info.szName, container.name, sizeof info.szName - 1);
    std::strncpy(info.szExtensions, container.extensions, sizeof info.szExtensions - 1);
    info.bHasVideo = CopyEncodable(PictureCodecs(), container.video, info.fccVideoCodecs) ? 1 : 0;
    info.bHasAudio = CopyEncodable(SoundCodecs(), container.audio, info.fccAudioCodecs) ? 1 : 0;
    return info;
}

} // namespace

const Container* FindContainer(uint32_t code) {
    return code == 0 ? nullptr : FindByCode(Containers(), Canonical(code));
}

const PictureCodec* FindPictureCodec(uint32_t code) {
    return FindByCode(PictureCodecs(), Canonical(code));
}

const PictureCodec* FindPictureCodec(const Container& container, uint32_t code) {
    return FindFitting(PictureCodecs(), container.video, code);
}

const SoundCodec* FindSoundCodec(const Container& container, uint32_t code) {
    return FindFitting(SoundCodecs(), container.audio, code);
}

bool TakesDeep(const PictureCodec& codec) {
    const AVCodec* encoder = codec.deep ? FindEncoder(codec) : nullptr;
    if (encoder == nullptr || encoder->pix_fmts == nullptr)
        return false;
    const AVPixelFormat* format = encoder->pix_fmts;
    while (*format != AV_PIX_FMT_NONE && *format != AV_PIX_FMT_YUV420P10)
        ++format;
    return *format != AV_PIX_FMT_NONE;
}

const AVCodec* FindEncoder(const PictureCodec& codec) {
    return avcodec_find_encoder_by_name(codec.encoder);
}

const AVCodec* FindEncoder(const SoundCodec& codec, int bitsPerSample) {
    if (codec.code != kPcm)
        return avcodec_find_encoder_by_name(codec.encoder);
    switch (bitsPerSample) {
    case 8:
        return avcodec_find_encoder(AV_CODEC_ID_PCM_U8);
    case 24:
        return avcodec_find_encoder(AV_CODEC_ID_PCM_S24LE);
    case 32:
        return avcodec_find_encoder(AV_CODEC_ID_PCM_S32LE);
    default:
        return avcodec_find_encoder(AV_CODEC_ID_PCM_S16LE);
    }
}

AVCodecID PacketForm(const Container& container, AVCodecID codec) {
    const AVCodecDescriptor* descriptor = avcodec_descriptor_get(codec);
    if (descriptor != nullptr && descriptor->type == AVMEDIA_TYPE_AUDIO && container.copiedSound != nullptr)
        return av_match_list(descriptor->name, container.copiedSound, ',') > 0 ? codec : AV_CODEC_ID_NONE;
    if (descriptor == nullptr || descriptor->type != AVMEDIA_TYPE_SUBTITLE || container.subtitles == nullptr)
        return AV_CODEC_ID_NONE;
    if (av_match_list(descriptor->name, container.subtitles, ',') > 0)
        return codec;
    const std::string list(container.subtitles);
    const AVCodecDescriptor* usual = avcodec_descriptor_get_by_name(list.substr(0, list.find(',')).c_str());
    const bool bothTexts =
        usual != nullptr && (usual->props & descriptor->props & AV_CODEC_PROP_TEXT_SUB) != 0;
    const bool convertible = bothTexts && codec != AV_CODEC_ID_EIA_608 &&
                             avcodec_find_decoder(codec) != nullptr &&
                             avcodec_find_encoder(usual->id) != nullptr;
    return convertible ? usual->id : AV_CODEC_ID_NONE;
}

bool CarriesTag(const Container& container, const std::string& key, const std::string& value) {
    const size_t most = (container.ways & kTinyTags) != 0    ? 255
                        : (container.ways & kShortTags) != 0 ? 65535
                                                             : std::numeric_limits<size_t>::max();
    return (container.carries & kWriterFormatTags) != 0 &&
           (container.tags == nullptr || IsListed(container.tags, key)) && value.size() <= most;
}

bool CarriesTrackTag(const Container& container, const std::string& key, const std::string& value) {
    if (key == "title")
        return (container.carries & kWriterFormatTrackTitles) != 0;
    if (key == "language_tag")
        return (container.ways & kLanguageTags) != 0;
    if (key != "language")
        return (container.ways & kTrackTexts) != 0;
    if ((container.carries & kWriterFormatLanguages) == 0)
        return false;
    constexpr size_t kLetters = 3;
    return container.tags == nullptr ||
           (value.size() == kLetters && std::all_of(value.begin(), value.end(), [](char letter) {
                return letter >= 'a' && letter <= 'z';
            }));
}

const Carriage& FindCarriage(const Container& container, uint32_t codec) {
    static constexpr Carriage kUsual;
    for (const Carriage& carriage : Carriages())
        if (carriage.container == container.code && carriage.codec == codec)
            return carriage;
    return kUsual;
}

const Carriage& FindCarriage(const Container& container, AVCodecID soundCodec) {
    for (const SoundCodec& codec : SoundCodecs())
        if (codec.id == soundCodec)
            return FindCarriage(container, codec.code);
    return FindCarriage(container, soundCodec == AV_CODEC_ID_EAC3 ? kEac3 : 0);
}

uint32_t FormatTraits(uint32_t code) {
    const Container* container = FindContainer(code);
    if (container == nullptr)
        return 0;
    return container->carries |
           (container->kind == ContainerKind::kSteadyRate ? uint32_t{kWriterFormatSteadyRate} : 0U);
}

const FileFormatInfo* FileFormatInfos() {
    static const auto table = [] {
        std::vector<FileFormatInfo> entries;
        for (const Container& container : Containers()) {
            const FileFormatInfo info = Describe(container);
            if (av_guess_format(container.muxer, nullptr, nullptr) != nullptr &&
                (info.bHasVideo != 0 || info.bHasAudio != 0))
                entries.push_back(info);
        }
        entries.emplace_back(); // ends the table
        return entries;
    }();
    return table.data();
}

} // namespace writer
