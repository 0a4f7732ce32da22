// What containers say of a movie and FFmpeg does not read.
#ifndef MOVIECONV_HOST_SOURCE_CONTAINERNOTES_H
#define MOVIECONV_HOST_SOURCE_CONTAINERNOTES_H

#include "ffmpeg/AvHandles.h"
#include "host/source/InputFile.h"

#include <string>
#include <vector>

namespace movieconv {

/// Texts are empty where the container tells none.
struct ContainerNotes {
    struct Stream {
        std::string languageTag; ///< By BCP 47, "pt-BR".
        std::string title;       ///< Of the family of MP4.
    };
    std::vector<Stream> streams; ///< For each stream of FFmpeg's.
    std::string title;           ///< Of Matroska, where a tag of that name hides it.
    int chapters = 0;            ///< All there are in Matroska, of every edition and within each other.
};

ContainerNotes ReadContainerNotes(const InputFile& file, const AVFormatContext& context);

} // namespace movieconv

#endif
