// The programs ffmpeg and ffprobe, which make movies and look at them independently.
#ifndef MOVIECONV_TESTS_SUPPORT_FFMPEG_H
#define MOVIECONV_TESTS_SUPPORT_FFMPEG_H

#include <string>
#include <vector>

namespace test_movies {

using Args = std::vector<std::string>;

template <class... Lists>
Args Join(Lists... lists) {
    Args all;
    (all.insert(all.end(), lists.begin(), lists.end()), ...);
    return all;
}

/// Arguments that hold no spaces, as a user types them.
Args Words(const std::string& text);

/// Arguments for one input a filter graph.
template <class... Graphs>
Args Lavfi(const Graphs&... graphs) {
    return Join(Args{"-f", "lavfi", "-i", graphs}...);
}

/// Runs ffmpeg, which replaces files. Fails the test unless it succeeds.
void Ffmpeg(const Args& arguments);

/// What ffmpeg reads in a movie and writes by `arguments`, a format with its options, to standard output.
/// Fails the test when it complains about anything.
std::string FfmpegReads(const std::string& path, const Args& arguments);

/// What ffprobe prints by `arguments` about a movie.
std::string Ffprobe(const std::string& path, const Args& arguments);

} // namespace test_movies

#endif
