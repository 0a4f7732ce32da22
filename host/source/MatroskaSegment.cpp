#include "host/source/MatroskaSegment.h"

#include <algorithm>
#include <array>

namespace movieconv {
namespace {

constexpr uint64_t kSegment = 0x18538067;
constexpr uint64_t kSeekHead = 0x114D9B74;
constexpr uint64_t kSeek = 0x4DBB;
constexpr uint64_t kSeekId = 0x53AB;
constexpr uint64_t kSeekPosition = 0x53AC;
constexpr uint64_t kTrackType = 0x83;

} // namespace

MatroskaSegment::MatroskaSegment(const InputFile& file)
    : elements_(file, ReadElementHead), segment_(elements_.Find(elements_.Whole(), kSegment)) {}

Part MatroskaSegment::Locate(uint64_t name) {
    if (const Part found = elements_.Find(segment_, name, kMatroskaCluster); found.name == name)
        return found;
    Part located;
    ForEach(elements_.Find(segment_, kSeekHead, kMatroskaCluster), kSeek, [&](const Part& seek) {
        const uint64_t place = elements_.Number(elements_.Find(seek, kSeekPosition));
        if (elements_.Number(elements_.Find(seek, kSeekId)) != name ||
            place >= static_cast<uint64_t>(segment_.end - segment_.begin))
            return;
        const Part part = elements_.At(segment_.begin + static_cast<int64_t>(place), segment_.end);
        if (part.name == name)
            located = part;
    });
    return located;
}

bool MatroskaSegment::BecomesStream(const Part& track) {
    constexpr std::array<uint64_t, 4> kTypes{1, 2, 0x11, 0x21};
    const uint64_t type = elements_.Number(elements_.Find(track, kTrackType));
    return std::find(kTypes.begin(), kTypes.end(), type) != kTypes.end();
}

} // namespace movieconv
