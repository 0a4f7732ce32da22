// What containers say of a movie and FFmpeg does not read.
#ifndef MOVIECONV_HOST_SOURCE_CONTAINERNOTES_H
#define MOVIECONV_HOST_SOURCE_CONTAINERNOTES_H

#include "ffmpeg/AvHandles.h"
#include "host/source/InputFile.h"
#include "host/source/TrackWishes.h"

#include <cstdint>
#include <string>
#include <vector>

namespace movieconv {

/// Texts are empty where the container tells none, and in whatever character set it has them.
struct ContainerNotes {
    struct Stream {
        std::string languageTag;            ///< By BCP 47, "pt-BR".
        std::string title;                  ///< Of the family of MP4.
        AVCodecID codec = AV_CODEC_ID_NONE; ///< Where FFmpeg has none for Matroska's name of it.
    };
    struct File {
        std::string name;
        std::string description;
    };
    struct Titles {
        std::string first;
        std::string last; ///< Which is the one that FFmpeg takes.
    };
    std::vector<Stream> streams; ///< For each stream of FFmpeg's.

    // Of Matroska:
    std::string title;             ///< Where a tag of that name hides it.
    std::vector<Tag> repeated;     ///< Texts that are there several times: all of them, ";" in between.
    std::vector<File> files;       ///< Attached ones that are described.
    int chapters = 0;              ///< All there are, of every edition and within each other.
    int disordered = 0;            ///< Of the first edition, those that begin before one in front of them.
    std::vector<Titles> titles;    ///< Of each chapter that has several, in several languages.
    bool ordersParts = false;      ///< Players show what the chapters name, in their order.
    std::vector<uint64_t> foreign; ///< The chapters, by their numbers, that stand for parts of other files.
};

ContainerNotes ReadContainerNotes(const InputFile& file, const AVFormatContext& context);

/// What ReadContainerNotes gives of Matroska and WebM, with the tracks as streams.
ContainerNotes ReadMatroskaNotes(const InputFile& file);

} // namespace movieconv

#endif
