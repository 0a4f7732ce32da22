// What a movie holds beside the pictures and the sound that are converted: handed to the writer, or told.
#ifndef MOVIECONV_HOST_CONVERT_CARRYOVER_H
#define MOVIECONV_HOST_CONVERT_CARRYOVER_H

#include "host/convert/Observer.h"
#include "host/convert/Request.h"
#include "host/source/Movie.h"
#include "media/EncodeParam.h"

#include <cstdint>
#include <vector>

namespace movieconv {

/// The streams of sound that go into the output beside the one that the engine converts.
std::vector<int> FurtherSound(const SourceInfo& source, const Request& request, const FileFormatInfo& format);

struct Carried {
    /// Subtitles as a track of the writer's set.
    struct Subtitles {
        int track;
        StreamInfo stream; ///< Without a number when they come from a file of their own.
    };
    std::vector<Subtitles> subtitles;
    std::vector<NotCarried> left; ///< What stays behind.
};

/// Gives the writer's set what the format can carry of the movie: texts, chapters, cover, attachments,
/// further tracks, which are read from the movie while it is converted.
Carried CarryOver(Movie& movie, const Request& request, const FileFormatInfo& format, uint32_t writerSet);

/// Those of the subtitles of which some texts could not be converted. Once the files are closed.
std::vector<NotCarried> LostCues(const std::vector<Carried::Subtitles>& subtitles, uint32_t writerSet);

/// What CarryOver is going to leave behind of a source as AsAskedFor gives it. Opens no file: covers and
/// chapters that turn out to be of no use are not among it.
std::vector<NotCarried> ForetellLeftBehind(const SourceInfo& source, const Request& request,
                                           const FileFormatInfo& format);

} // namespace movieconv

#endif
