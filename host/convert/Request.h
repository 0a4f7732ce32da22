// What a conversion is to do, in plain values.
#ifndef MOVIECONV_HOST_CONVERT_REQUEST_H
#define MOVIECONV_HOST_CONVERT_REQUEST_H

#include "host/convert/Preferences.h"
#include "host/source/Crop.h"
#include "host/source/Deinterlace.h"
#include "host/source/TrackWishes.h"

#include <chrono>
#include <cstdint>
#include <optional>
#include <string>
#include <vector>

namespace movieconv {

/// What to do when the disk is full: the file fails, or the conversion waits until there is room.
enum class OnFull { kStop, kWait };

/// How pictures of another shape fill the output's: distorted, or with black borders.
enum class Fit { kStretch, kBorders };

/// What becomes of HDR pictures: they are kept, become usual ones, or are kept where the codec has pictures
/// of 10 bits.
enum class Hdr { kAuto, kKeep, kSdr };

/// A piece of an output. Times are in media time, from the start of the source.
struct PieceCut {
    bool pictures = true;        ///< Pictures only; or all the rest, for which their stamps are read.
    int64_t origin = 0;          ///< Stamp of the output's first picture.
    int64_t begin = 0;           ///< Stamp of this piece's first picture.
    int64_t end = 0;             ///< Stamp of the next piece's first picture, or where the last one ends.
    int64_t until = 0;           ///< Where the pictures end that its encoder looks at, `end` or later.
    bool last = false;           ///< No pictures follow.
    std::optional<int64_t> tick; ///< By the media writer's plan; nothing before the first picture shown.
    int64_t drawnSince = 0; ///< When the first of the subtitles began that are drawn into its first picture.
    bool fromStart = false; ///< The source can only be read from its start.
};

/// The clip with which a conversion into clips begins.
struct ClipStart {
    int number = 0;    ///< From 0.
    int64_t begin = 0; ///< Stamp of its first picture, in media time.
};

struct SubtitleFileWish {
    std::string path;
    std::string language; ///< Of two or three letters; empty when it is not told.
};

/// Names are bytes as the system has them. What is not given is left to the preferences, then to the engine's
/// defaults and the source.
struct Request {
    std::string input;
    std::string output;

    std::optional<uint32_t> format; ///< Four-character code; see Formats.h. By default by the output's name.
    std::optional<uint32_t> videoCodec; ///< Likewise; by default the format's usual one.
    std::optional<uint32_t> audioCodec;
    bool copySound = false; ///< Sound stays as it is coded, instead; its rates and channels are the source's.
    std::optional<Size> size;
    Fit fit = Fit::kBorders;
    std::optional<double> frameRate; ///< Pictures per second, up to 200.
    /// Constant quality on the codec's own scale, lower is better, instead of a bit rate.
    std::optional<double> quality;
    std::optional<Speed> speed;
    std::optional<int32_t> videoRate;    ///< Bits per second, instead of a constant quality.
    std::optional<int32_t> videoMaxRate; ///< Makes videoRate a target.
    std::optional<int32_t> audioRate;
    std::optional<int32_t> audioMaxRate;
    std::optional<int32_t> channels;
    std::optional<int32_t> sampleRate; ///< Samples per second and channel.
    Deinterlace deinterlace = Deinterlace::kFlagged;
    Crop crop{};             ///< Cut off the pictures; odd numbers are lowered by one.
    bool detectCrop = false; ///< Cut off what is black all over the movie, instead.
    Hdr hdr = Hdr::kAuto;
    /// Bits of a picture's components, 8 or 10; by default the source's, as far as the codec has them.
    std::optional<int> depth;
    /// Bytes that the output may have at most: chooses the rates, and where they are low a picture size.
    std::optional<int64_t> maxSize;
    /// The sound and the subtitles of the source that come into the output: numbers as SourceInfo has them,
    /// or languages. Nothing: all, as far as the format holds them; an empty list: none, for sound as
    /// noAudio.
    TrackList audioTracks;
    TrackList subtitles;
    std::vector<SubtitleFileWish> subtitleFiles; ///< Further subtitles of text.
    std::string subtitleCharset;                 ///< Of these files; empty: each is looked at.
    /// Subtitles drawn into the pictures: a number as SourceInfo has it, or a file, in subtitleCharset. A
    /// stream that is drawn is not carried unless `subtitles` asks for it.
    std::string burnSubtitles;
    bool noChapters = false;
    bool noMetadata = false;   ///< None of the source's texts, but the languages of tracks.
    std::vector<Tag> metadata; ///< Texts that replace the source's; an empty value takes one away.
    bool noVideo = false;
    bool noAudio = false;
    bool playlists = false; ///< The input may be a playlist, which names movies in its folder and below.
    Preferences preferences;

    double begin = 0;             ///< Seconds.
    std::optional<double> length; ///< Seconds, at least 0.001; by default all the rest.
    std::optional<double> split;  ///< Seconds of each clip, 0.1 to 2000000; by default one file.

    std::optional<ClipStart> firstClip; ///< The clips before it are there; by default the first.

    bool overwrite = false; ///< Whether a file that exists may be replaced.
    OnFull onFull = OnFull::kStop;
    bool keepPartial = true; ///< Whether the temporary file of a conversion that failed stays; it plays.

    std::optional<PieceCut> piece; ///< Make this piece of the output, to be joined with others.

    /// How far all threads of the conversion stand back behind what else the machine does, 0 to 19.
    int niceness = 0;

    int encoderThreads = 0; ///< Of the picture encoder; 0 leaves it to the writer.
    bool bitExact = false;  ///< Nothing in the file tells time, date or library version.

    /// The shortest time between two pictures for display; nothing: none. The last picture is shown always.
    std::optional<std::chrono::milliseconds> preview;
};

} // namespace movieconv

#endif
