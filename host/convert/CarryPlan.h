// Which of a movie's streams an output takes beside the pictures and the sound that are converted, and why
// the others stay behind. Decides only: no file is opened for it.
#ifndef MOVIECONV_HOST_CONVERT_CARRYPLAN_H
#define MOVIECONV_HOST_CONVERT_CARRYPLAN_H

#include "host/convert/Observer.h"
#include "host/convert/Request.h"
#include "host/source/SourceInfo.h"
#include "media/EncodeParam.h"

#include <optional>
#include <string>
#include <vector>

namespace movieconv {

class CarryPlan {
public:
    /// Of a source as AsAskedFor gives it. All of them outlive the plan. Throws TrackError when a track that
    /// is asked for is not there.
    CarryPlan(const SourceInfo& source, const Request& request, const FileFormatInfo& format);

    /// The streams that become further tracks, by their numbers in the source, in the order of the tracks.
    const std::vector<int>& FurtherTracks() const { return further_; }

    /// Those of them that are sound which the engine does not convert.
    std::vector<int> FurtherSound() const;

    /// Whether the user wants a stream of that kind and number.
    bool Wants(const StreamInfo& stream) const;

    /// Why a wanted stream stays behind. Empty when the format can hold it, or it is of a kind of which the
    /// source itself tells.
    Sentence WhyItStays(const StreamInfo& stream) const;

    /// Texts, labels and chapters that the format has no room for.
    std::vector<NotCarried> LostByFormat() const;

private:
    Sentence WhySoundStays(const StreamInfo& stream) const;
    void AddUnfollowedChapters(std::vector<NotCarried>& left) const;
    void AddLostChapters(std::vector<NotCarried>& left) const;
    std::optional<NotCarried> LostCoverTitle() const;

    const SourceInfo& source_;
    const Request& request_;
    const FileFormatInfo& format_;
    std::vector<int> sounds_; // wanted ones
    std::vector<int> subtitles_;
    std::vector<int> further_;
};

/// What an output loses of a file of subtitles that holds this stream.
std::optional<NotCarried> LostOfFile(const StreamInfo& stream, const Request& request,
                                     const FileFormatInfo& format);

/// Why subtitles stay behind; empty when they do not.
Sentence WhySubtitlesStay(const StreamInfo& stream, const FileFormatInfo& format);

/// The report of a stream that stays behind, or is changed, for `reason`.
NotCarried LeftOf(const StreamInfo& stream, Sentence reason);

/// What CarryOver is going to leave behind of a source as AsAskedFor gives it. Opens no file: covers and
/// chapters that turn out to be of no use are not among it.
std::vector<NotCarried> ForetellLeftBehind(const SourceInfo& source, const Request& request,
                                           const FileFormatInfo& format);

} // namespace movieconv

#endif
