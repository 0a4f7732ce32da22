#include "host/source/StreamChoice.h"

#include <algorithm>
#include <tuple>

namespace movieconv {
namespace {

bool ArePictures(const StreamInfo& stream) {
    return stream.kind == StreamKind::kPictures && stream.decodable && stream.pictures->width > 0 &&
           stream.pictures->height > 0;
}

bool IsSound(const StreamInfo& stream) {
    return stream.kind == StreamKind::kSound && stream.decodable && stream.sound->sampleRate > 0 &&
           stream.sound->channels > 0;
}

auto PictureRank(const StreamInfo& stream) {
    const int64_t area = static_cast<int64_t>(stream.pictures->width) * stream.pictures->height;
    return std::tuple(stream.flags.isDefault, area, -stream.index);
}

auto SoundRank(const StreamInfo& stream, const std::vector<int>& programs) {
    const bool together = programs.empty() || std::any_of(programs.begin(), programs.end(), [&](int program) {
                              return std::count(stream.programs.begin(), stream.programs.end(), program) > 0;
                          });
    const bool forAll =
        !stream.flags.commentary && !stream.flags.hearingImpaired && !stream.flags.visualImpaired;
    return std::tuple(together, forAll, stream.flags.isDefault, stream.sound->channels, -stream.index);
}

/// The number of the stream with the highest rank among those that fit, -1 without one.
template <class Fits, class Rank>
int Best(const std::vector<StreamInfo>& streams, Fits fits, Rank rank) {
    const StreamInfo* best = nullptr;
    for (const StreamInfo& stream : streams)
        if (fits(stream) && (best == nullptr || rank(stream) > rank(*best)))
            best = &stream;
    return best != nullptr ? best->index : -1;
}

} // namespace

ChosenStreams ChooseStreams(const std::vector<StreamInfo>& streams, const SourceChoice& choice) {
    ChosenStreams chosen;
    if (choice.pictures)
        chosen.pictures = Best(streams, ArePictures, PictureRank);
    const std::vector<int> programs = chosen.pictures >= 0
                                          ? streams[static_cast<std::size_t>(chosen.pictures)].programs
                                          : std::vector<int>();
    if (choice.sound) {
        chosen.sound =
            Best(streams, IsSound, [&](const StreamInfo& stream) { return SoundRank(stream, programs); });
    }
    return chosen;
}

} // namespace movieconv
