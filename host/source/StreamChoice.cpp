#include "host/source/StreamChoice.h"

#include "host/sentence/Say.h"
#include "host/source/Languages.h"
#include "host/source/SourceError.h"

#include <algorithm>
#include <fmt/format.h>
#include <string>
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
    const bool forAll =
        !stream.flags.commentary && !stream.flags.hearingImpaired && !stream.flags.visualImpaired;
    return std::tuple(BelongsTo(programs, stream), forAll, stream.flags.isDefault, stream.sound->channels,
                      -stream.index);
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

Sentence ListOf(const std::vector<StreamInfo>& streams, StreamKind kind) {
    std::string list;
    for (const StreamInfo& stream : streams)
        if (stream.kind == kind)
            list += fmt::format("{}{}{}", list.empty() ? "" : ", ", stream.index,
                                stream.language.empty() ? "" : " (" + stream.language + ")");
    return list.empty() ? Say("none") : Sentence(Sentence::Kind::kName, list);
}

bool IsNumber(const std::string& text) {
    return !text.empty() &&
           std::all_of(text.begin(), text.end(), [](char letter) { return letter >= '0' && letter <= '9'; });
}

} // namespace

bool BelongsTo(const std::vector<int>& programs, const StreamInfo& stream) {
    return programs.empty() || std::any_of(programs.begin(), programs.end(), [&](int program) {
               return std::count(stream.programs.begin(), stream.programs.end(), program) > 0;
           });
}

std::vector<int> WantedTracks(const std::vector<StreamInfo>& streams, StreamKind kind,
                              const TrackList& wanted) {
    std::vector<std::string> missing = wanted.value_or(std::vector<std::string>());
    std::vector<int> found;
    for (const StreamInfo& stream : streams) {
        const auto isMeant = [&](const std::string& name) {
            return IsNumber(name)
                       ? name == std::to_string(stream.index)
                       : !stream.language.empty() && ThreeLetters(name) == ThreeLetters(stream.language);
        };
        if (stream.kind != kind || (wanted && std::none_of(wanted->begin(), wanted->end(), isMeant)))
            continue;
        found.push_back(stream.index);
        missing.erase(std::remove_if(missing.begin(), missing.end(), isMeant), missing.end());
    }
    if (!missing.empty())
        throw TrackError(kind == StreamKind::kSound ? Say("there is no sound \"{}\"; there is: {}",
                                                          missing.front(), ListOf(streams, kind))
                                                    : Say("there are no subtitles \"{}\"; there are: {}",
                                                          missing.front(), ListOf(streams, kind)));
    return found;
}

ChosenStreams ChooseStreams(const std::vector<StreamInfo>& streams, const SourceChoice& choice) {
    ChosenStreams chosen;
    if (choice.pictures)
        chosen.pictures = Best(streams, ArePictures, PictureRank);
    const std::vector<int> programs = chosen.pictures >= 0
                                          ? streams[static_cast<std::size_t>(chosen.pictures)].programs
                                          : std::vector<int>();
    if (choice.sound) {
        const std::vector<int> wanted = WantedTracks(streams, StreamKind::kSound, choice.soundTracks);
        const auto fits = [&](const StreamInfo& stream) {
            return IsSound(stream) && std::count(wanted.begin(), wanted.end(), stream.index) > 0;
        };
        chosen.sound =
            Best(streams, fits, [&](const StreamInfo& stream) { return SoundRank(stream, programs); });
    }
    return chosen;
}

} // namespace movieconv
