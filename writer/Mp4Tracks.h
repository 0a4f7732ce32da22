// What the multiplexer of the MP4 family does not say rightly of tracks, put right in an index that is
// finished.
#ifndef MOVIECONV_WRITER_MP4TRACKS_H
#define MOVIECONV_WRITER_MP4TRACKS_H

#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

namespace writer {

struct Mp4Track {
    std::string language;    ///< Three small letters; other texts leave what is there.
    std::string languageTag; ///< BCP 47, "pt-BR"; may be empty.
    bool hides;              ///< It is not shown unless it is asked for.
};

/// `moov` is the whole box, `tracks` are its first ones in their order. Languages become letters: for MOV the
/// multiplexer writes QuickTime's numbers, of which most languages have none. It lets the first
/// subtitles be shown where none are meant to be, and does not know language tags.
void CorrectTracks(std::vector<uint8_t>& moov, const std::vector<Mp4Track>& tracks);

/// Lets the chapters begin at `begin`, in the movie's units, where the multiplexer has them begin at 0: their
/// track is the first one of texts behind the `tracks` first ones.
void DelayChapters(std::vector<uint8_t>& moov, size_t tracks, uint32_t begin);

} // namespace writer

#endif
