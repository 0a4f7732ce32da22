// What a conversion's pictures do not have of the source's.
#ifndef MOVIECONV_HOST_SOURCE_PICTURELOSSES_H
#define MOVIECONV_HOST_SOURCE_PICTURELOSSES_H

#include "host/source/PictureDecoder.h"

#include <string>
#include <vector>

namespace movieconv {

/// For people, each the end of a sentence: "the transparency of its pictures was left out". Of the pictures
/// that `decoder` has given so far.
std::vector<Sentence> PictureLosses(const PictureStreamInfo& pictures, const SourceChoice& choice,
                                    const PictureDecoder& decoder);

} // namespace movieconv

#endif
