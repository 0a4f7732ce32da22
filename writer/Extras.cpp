#include "writer/Extras.h"

#include "media/MediaRecords.h"
#include "writer/BigEndian.h"

#include <algorithm>
#include <array>
#include <cmath>
#include <cstddef>
#include <cstring>
#include <optional>
#include <utility>

namespace writer {
namespace {

/// Size of the record in its first version.
constexpr size_t kLeastTrack = offsetof(WriterTrack, pContext) + sizeof(WriterTrack::pContext);

struct Size {
    int width;
    int height;
};

int SideFrom(const uint8_t* bytes, size_t size) {
    return static_cast<int>(BigEndian(bytes, size));
}

std::optional<Size> PngSize(const std::vector<uint8_t>& data) {
    static constexpr std::array<uint8_t, 8> kSignature{0x89, 'P', 'N', 'G', '\r', '\n', 0x1A, '\n'};
    if (data.size() < 24 || !std::equal(kSignature.begin(), kSignature.end(), data.begin()))
        return std::nullopt;
    return Size{SideFrom(&data[16], 4), SideFrom(&data[20], 4)};
}

/// Its first frame header tells.
std::optional<Size> JpegSize(const std::vector<uint8_t>& data) {
    if (data.size() < 4 || data[0] != 0xFF || data[1] != 0xD8)
        return std::nullopt;
    for (size_t at = 2; at + 9 < data.size() && data[at] == 0xFF;) {
        const uint8_t marker = data[at + 1];
        const bool isFrame =
            marker >= 0xC0 && marker <= 0xCF && marker != 0xC4 && marker != 0xC8 && marker != 0xCC;
        if (isFrame)
            return Size{SideFrom(&data[at + 7], 2), SideFrom(&data[at + 5], 2)};
        at += marker == 0xFF ? 1 : 2 + BigEndian(&data[at + 2], 2);
    }
    return std::nullopt;
}

} // namespace

bool SetTag(Tags& tags, const char* key, const char* value) {
    if (key == nullptr || *key == '\0')
        return false;
    if (value == nullptr || *value == '\0')
        tags.erase(key);
    else
        tags[key] = value;
    return true;
}

TrackLabel* FindLabel(Extras& extras, int track) {
    if (track == kWriterTrackPictures)
        return &extras.pictures;
    if (track == kWriterTrackSound)
        return &extras.sound;
    const int further = track - kWriterTrackFurther;
    return further >= 0 && further < static_cast<int>(extras.tracks.size())
               ? &extras.tracks[static_cast<size_t>(further)].label
               : nullptr;
}

bool AddTrack(Extras& extras, const WriterTrack* track) {
    if (track == nullptr || track->nSize < kLeastTrack || track->pfnNext == nullptr)
        return false;
    const bool isSound = track->nSampleRate > 0 && track->nChannels > 0 && track->nBitsPerSample > 0;
    if (isSound == (track->pParameters != nullptr))
        return false;
    Track made{.label = {},
               .sampleRate = track->nSampleRate,
               .channels = track->nChannels,
               .bitsPerSample = track->nBitsPerSample,
               .bitrate = track->nBitrate,
               .speakers = track->nSize < sizeof *track ? 0 : track->nChannelMask,
               .parameters = isSound ? nullptr : av::CopyOf(*track->pParameters),
               .next = track->pfnNext,
               .context = track->pContext,
               .lostCues = std::make_shared<std::atomic<int64_t>>(0)};
    extras.tracks.push_back(std::move(made));
    return true;
}

Cover MakeCover(const void* data, int64_t size) {
    Cover cover;
    if (data == nullptr || size <= 0 || size > INT32_MAX)
        return cover;
    const auto* bytes = static_cast<const uint8_t*>(data);
    cover.data = std::make_shared<std::vector<uint8_t>>(bytes, bytes + size);
    const std::optional<Size> png = PngSize(*cover.data);
    const std::optional<Size> found = png ? png : JpegSize(*cover.data);
    if (found && found->width > 0 && found->height > 0) {
        cover.codec = png ? AV_CODEC_ID_PNG : AV_CODEC_ID_MJPEG;
        cover.width = found->width;
        cover.height = found->height;
    }
    return cover;
}

Extras ExtrasWithin(Extras extras, int64_t begin, double seconds) {
    const int64_t length = std::llround(seconds * kTicksPerSecond);
    for (const OutputChapter& chapter : std::exchange(extras.chapters, {})) {
        const int64_t from = std::max<int64_t>(0, chapter.begin - begin);
        const int64_t to = std::min(length, chapter.end - begin);
        if (to - from >= kWriterShortestChapter)
            extras.chapters.push_back({from, to, chapter.title});
    }
    std::stable_sort(
        extras.chapters.begin(), extras.chapters.end(),
        [](const OutputChapter& one, const OutputChapter& other) { return one.begin < other.begin; });
    return extras;
}

} // namespace writer
