// What a movie holds beside the pictures and the sound that are converted: handed to the writer, or told.
#ifndef MOVIECONV_HOST_CONVERT_CARRYOVER_H
#define MOVIECONV_HOST_CONVERT_CARRYOVER_H

#include "host/convert/FurtherTracks.h"
#include "host/convert/Observer.h"
#include "host/convert/Request.h"
#include "host/source/Movie.h"
#include "media/EncodeParam.h"

#include <cstdint>
#include <vector>

namespace movieconv {

struct Carried {
    std::vector<SubtitleTrack> subtitles;
    std::vector<NotCarried> left; ///< What stays behind.
};

/// Gives the writer's set what the format can carry of the movie: texts, chapters, cover, attachments,
/// further tracks, which are read from the movie while it is converted.
Carried CarryOver(Movie& movie, const Request& request, const FileFormatInfo& format, uint32_t writerSet);

/// Those of the subtitles of which some texts could not be converted. Once the files are closed.
std::vector<NotCarried> LostCues(const std::vector<SubtitleTrack>& subtitles, uint32_t writerSet);

} // namespace movieconv

#endif
