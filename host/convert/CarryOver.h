// What a movie holds beside the pictures and the sound that are converted: handed to the writer, or told.
#ifndef MOVIECONV_HOST_CONVERT_CARRYOVER_H
#define MOVIECONV_HOST_CONVERT_CARRYOVER_H

#include "host/convert/Observer.h"
#include "host/source/Movie.h"
#include "media/EncodeParam.h"

#include <cstdint>
#include <vector>

namespace movieconv {

/// Gives the writer's set what the format can carry of the movie: texts, chapters, cover, attachments.
/// Returns what stays behind.
std::vector<NotCarried> CarryOver(const Movie& movie, const FileFormatInfo& format, uint32_t writerSet);

} // namespace movieconv

#endif
