// What is said of a movie and its tracks: texts, languages, titles, flags and chapters, handed to the writer,
// or told.
#ifndef MOVIECONV_HOST_CONVERT_CARRYTEXTS_H
#define MOVIECONV_HOST_CONVERT_CARRYTEXTS_H

#include "host/convert/Observer.h"
#include "host/convert/Request.h"
#include "host/source/SourceInfo.h"
#include "media/EncodeParam.h"

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

namespace movieconv {

/// Gives the writer's set the texts about the movie and what the engine's tracks are called.
void CarryTexts(const SourceInfo& source, const Request& request, const FileFormatInfo& format, uint32_t set);

/// What of these the format cannot hold.
std::vector<NotCarried> LostTexts(const SourceInfo& source, const Request& request,
                                  const FileFormatInfo& format);

/// Says what a track of the writer's set is, as far as the format can.
void LabelTrack(const StreamInfo& stream, const Request& request, const FileFormatInfo& format, uint32_t set,
                int track);

/// What of that the format cannot say; nothing when it can say all.
std::optional<NotCarried> LostLabel(const StreamInfo& stream, const Request& request,
                                    const FileFormatInfo& format);

/// Gives the writer's set the chapters, for a format that holds some. Returns how many were left out, because
/// they make no sense.
int CarryChapters(const SourceInfo& source, const Request& request, const FileFormatInfo& format,
                  uint32_t set);

/// How many chapters lie in front of the movie or behind its end, as far as that is known.
int ChaptersOutside(const SourceInfo& source);

/// What is said of chapters beside their titles: "artist and comment"; empty when nothing is.
Sentence FurtherChapterTexts(const SourceInfo& source);

/// Nothing when there are none, none are wanted, or the format holds them.
std::optional<NotCarried> WhyChaptersStay(const SourceInfo& source, const Request& request,
                                          const FileFormatInfo& format);

} // namespace movieconv

#endif
