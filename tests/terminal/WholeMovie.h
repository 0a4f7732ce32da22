// A movie that holds everything that is carried over, and what independent programs read in others.
#ifndef MOVIECONV_TESTS_TERMINAL_WHOLEMOVIE_H
#define MOVIECONV_TESTS_TERMINAL_WHOLEMOVIE_H

#include "tests/support/Folder.h"

#include <nlohmann/json.hpp>
#include <string>
#include <vector>

namespace whole_movie {

using Json = nlohmann::json;

/// Presentation graphics, as on discs of films: white boxes of 60x16 in pictures of 160x120, one a pair of
/// times in seconds.
std::string BitmapSubtitles(const std::vector<std::pair<double, double>>& cues);

/// Three seconds in Matroska: pictures, three sounds, five subtitles, three chapters, texts, a cover and a
/// font. All pictures `black`, or a test card.
std::string Make(bool black = false);

/// The same file's streams, chapters and texts as ffprobe tells them.
Json Probe(const std::string& path);

/// What mkvmerge tells.
Json Identify(const std::string& path);

/// The texts about the movie, with keys in small letters, wherever the container keeps them.
std::vector<std::pair<std::string, std::string>> TagsOf(const Json& probe);

struct Cue {
    int begin; // milliseconds from the first picture
    int end;
    std::string text; // without marks and line breaks
};

/// The cues of a movie's subtitles `number`, counted from 0.
std::vector<Cue> CuesOf(const std::string& path, int number);

/// Sizes of the packets of subtitles.
std::vector<int> PacketsOf(const std::string& path, int number);

} // namespace whole_movie

#endif
