// What a movie holds, as its container and its first packets tell.
#ifndef MOVIECONV_HOST_SOURCE_SOURCEINFO_H
#define MOVIECONV_HOST_SOURCE_SOURCEINFO_H

#include "host/source/BurnWish.h"
#include "host/source/Completeness.h"
#include "host/source/Crop.h"
#include "host/source/Deinterlace.h"
#include "host/source/TrackWishes.h"
#include "media/Limits.h"

#include <algorithm>
#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

extern "C" {
#include <libavutil/rational.h>
}

namespace movieconv {

/// How a duration was found: told by the source, reckoned from its size and parts of it, or not at all.
enum class Certainty { kKnown, kEstimated, kGuessed };

enum class StreamKind { kPictures, kSound, kSubtitles, kCover, kAttachment, kData };

/// What people call a stream of that kind: "pictures", "cover".
std::string_view KindName(StreamKind kind);

/// The display that the pictures were made for: chromaticities as in CIE 1931, luminances in cd/m².
struct MasteringDisplay {
    double red[2]{}; ///< x, y
    double green[2]{};
    double blue[2]{};
    double white[2]{};
    double darkest = 0;
    double brightest = 0;
};

struct LightLevel {
    int brightestPixel = 0;   ///< cd/m² of the brightest pixel of all pictures.
    int brightestPicture = 0; ///< cd/m², the highest average of a picture.
};

struct PictureStreamInfo {
    int index = -1;           ///< Stream number in the container.
    std::string codec;        ///< Codec name, "h264".
    std::string pixelFormat;  ///< FFmpeg's name, "yuv420p".
    int depth = 8;            ///< Bits of a component.
    bool transparent = false; ///< Has a plane of opacity, which no conversion carries.
    std::string fineColours;  ///< "4:2:2", "RGB": finer than the 4:2:0 that is written; empty when not.
    int width = 0;            ///< As shown, after rotation and cropping.
    int height = 0;
    int quarterTurns = 0;     ///< Clockwise turns by 90 degrees that bring the stored picture upright.
    bool mirrored = false;    ///< The stored picture is mirrored left to right before it is turned.
    AVRational pixelAspect{}; ///< Of a pixel as shown, width to height; 1:1 when the source does not tell.
    AVRational codedAspect{}; ///< As the stored pictures tell it at first; 0:1 when nobody tells.
    double frameRate = 0;     ///< Average pictures per second; 0 when the container tells none.
    double peakRate = 0; ///< Pictures per second where they follow each other closest; at least the average.
    double duration = 0; ///< Seconds; estimated when the container does not tell.
    bool interlaced = false;
    bool topFieldFirst = false;
    bool fullRange = false;
    int colorPrimaries = 2; ///< As in ISO/IEC 23091-2; 2: not stated.
    int colorTransfer = 2;
    int colorMatrix = 2;          ///< 0 of all RGB pictures and of no others.
    bool matrixByPicture = false; ///< Each picture tells its own; the container has no word for all.
    std::optional<MasteringDisplay> masteringDisplay;
    std::optional<LightLevel> lightLevel;
    bool dolbyVision = false;
    bool dolbyVisionAlone = false; ///< Whoever does not know it sees wrong colours.
    bool stereoscopic = false;     ///< Holds the views of both eyes in one picture, by the container's word.
    bool spherical = false;        ///< Shows all directions, or is to be projected otherwise.
    Crop crop{};                   ///< What is cut off; even numbers.
};

/// Width to height of a pixel as shown.
inline double PixelShape(const PictureStreamInfo& pictures) {
    const AVRational aspect = pictures.pixelAspect;
    return aspect.num > 0 && aspect.den > 0 ? av_q2d(aspect) : 1;
}

// Of PictureStreamInfo::colorTransfer.
constexpr int kPerceptualQuantizer = 16;
constexpr int kHybridLogGamma = 18;

/// Whether the pictures are made for more light and colour than usual displays have.
inline bool IsHdr(const PictureStreamInfo& pictures) {
    return pictures.colorTransfer == kPerceptualQuantizer || pictures.colorTransfer == kHybridLogGamma;
}

/// Pictures per second as the engine is told. It takes a higher rate for a mistake, and would have 30 made;
/// told this one, every picture is kept with its own time.
inline double CredibleRate(const PictureStreamInfo& pictures) {
    return std::min(pictures.frameRate, kHighestFrameRate);
}

struct SoundStreamInfo {
    int index = -1;
    std::string codec;
    std::string layout; ///< "stereo", "5.1".
    int sampleRate = 0;
    int channels = 0;
    uint64_t speakers = 0;  ///< FFmpeg's AV_CH_... of the channels, in their order; 0: not told.
    int bitsPerSample = 16; ///< Of the PCM handed out: 16, or 32 for sources that hold more than 16.
    double duration = 0;
};

/// What a stream's author says that it is for.
struct StreamFlags {
    bool isDefault = false;
    bool forced = false;
    bool original = false;
    bool dub = false;
    bool commentary = false;
    bool hearingImpaired = false;
    bool visualImpaired = false;
};

struct StreamInfo {
    int index = -1; ///< Number in the container.
    StreamKind kind = StreamKind::kData;
    std::string codec;
    std::string profile;     ///< Of the codec, "High"; empty when it is not known.
    std::string language;    ///< As the container has it, mostly ISO 639-2; empty when it is undetermined.
    std::string languageTag; ///< BCP 47, "pt-BR", where the container tells more than the language.
    std::string title;
    StreamFlags flags;
    bool decodable = false;
    std::optional<double> begin; ///< Seconds from the start of the source.
    double duration = 0;         ///< Seconds to its end; 0 when the container does not tell.
    int64_t bitRate = 0;         ///< Bits per second; 0 when it is not told.
    std::vector<int> programs;   ///< Numbers of the broadcast programmes that it belongs to.
    std::vector<Tag> tags;       ///< What people wrote about it, but for language and title.

    std::optional<PictureStreamInfo> pictures; ///< Of pictures and covers.
    std::optional<SoundStreamInfo> sound;
    bool textual = false;       ///< Subtitles made of text, not of bitmaps.
    bool holdsChapters = false; ///< Data that are the chapters once more, as texts.
    std::string fileName;       ///< Of attachments and covers.
    std::string mimeType;
    int64_t bytes = 0; ///< Size of attachments and covers.
};

struct Chapter {
    double begin = 0; ///< Seconds from the start of the source.
    double end = 0;
    std::string title;
    std::vector<Tag> tags; ///< But for the title.
    int64_t number = 0;    ///< The container's.
};

struct SourceInfo {
    std::string path;
    std::string container;                   ///< FFmpeg's long name.
    int64_t bytes = 0;                       ///< Size of the file, 0 when it has none.
    double duration = 0;                     ///< Seconds; the longer of the converted streams'.
    Certainty certainty = Certainty::kKnown; ///< Of `duration`.
    std::vector<StreamInfo> streams;         ///< All of them, in the container's order.
    std::vector<Chapter> chapters;
    int unreadChapters = 0;     ///< Others, of further editions or within these.
    int disorderedChapters = 0; ///< Others that stand behind later ones.
    int foreignChapters = 0;    ///< Others, which stand for parts of other files.
    bool chaptersOrder = false; ///< Players show the parts that the chapters name, in their order.
    int furtherTitles = 0;      ///< Chapters with titles in further languages, which are none of the above.
    std::vector<Tag> tags;      ///< What people wrote about the movie.

    std::optional<PictureStreamInfo> pictures; ///< The stream that is converted, probed.
    std::optional<SoundStreamInfo> sound;
    Promise promise;            ///< Of these two.
    bool isImage = false;       ///< A file of one picture, as cameras and scanners write them.
    bool clockRestarts = false; ///< Its stamps are known not to tell places in it.
};

struct SourceChoice {
    bool pictures = true; ///< Look for pictures at all.
    bool sound = true;    ///< Look for sound at all.
    TrackList soundTracks{};
    TrackList subtitles{};
    Deinterlace deinterlace = Deinterlace::kFlagged;
    std::optional<BurnWish> burn{};
    bool deep = false;       ///< Pictures of more than 8 bits are handed out with 10; otherwise with 8.
    Crop crop{};             ///< Cut off the pictures; odd numbers are lowered by one.
    bool keepHdr = false;    ///< HDR pictures are handed out as they are; otherwise as BT.709.
    bool stampsOnly = false; ///< Do not decode the pictures.
    bool fromStart = false;  ///< Read from the start of the source, whatever the begin.
    bool playlists = false;  ///< Also open what names other movies, in its own folder and below.
    bool untilNow = false;   ///< Leave out what is written to the file after it was opened.
};

} // namespace movieconv

#endif
