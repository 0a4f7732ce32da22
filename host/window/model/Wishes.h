// What the user wants of one movie, in the terms that the window shows.
#ifndef MOVIECONV_HOST_WINDOW_MODEL_WISHES_H
#define MOVIECONV_HOST_WINDOW_MODEL_WISHES_H

#include <QJsonObject>
#include <QList>
#include <QString>

#include <optional>
#include <string>
#include <vector>

namespace movieconv::window {

/// A file of subtitles that come into the movie.
struct SubtitleFile {
    std::string path;
    QString language; ///< Of two or three letters; empty when it is not told.

    bool operator==(const SubtitleFile&) const = default;
};

/// Subtitles that are drawn into the pictures: a track of the source's, or a file, or none.
struct Burning {
    std::optional<int> track; ///< Its number.
    std::string file;

    bool IsWanted() const { return track || !file.empty(); }
    bool operator==(const Burning&) const = default;
};

/// Pixels to cut off.
struct Margins {
    int top = 0;
    int bottom = 0;
    int left = 0;
    int right = 0;

    bool operator==(const Margins&) const = default;
};

/// What is not given is left to the preset and to the source.
struct Wishes {
    enum class Deinterlace { kAuto, kOff, kAll };
    enum class Hdr { kAuto, kKeep, kUsual };

    QString preset = QStringLiteral("standard");
    std::optional<QString> format;       ///< A file name's extension, "mkv".
    std::optional<int> quality;          ///< 0, small and poor, to 100, large and good.
    std::optional<int> height;           ///< Lines of the picture; its width follows the source's shape.
    std::optional<double> rate;          ///< Pictures a second.
    double begin = 0;                    ///< Seconds.
    std::optional<double> end;           ///< Seconds.
    std::optional<double> clip;          ///< Seconds of each clip.
    std::optional<QList<int>> sounds;    ///< Numbers of sound tracks, as the source counts them.
    std::optional<QList<int>> subtitles; ///< Numbers of subtitle tracks; nothing: all that are not drawn.
    std::vector<SubtitleFile> subtitleFiles;
    QString subtitleCharset;       ///< Of these files; empty: what they look like.
    Burning burning;               ///< Subtitles drawn into the pictures.
    std::optional<bool> copySound; ///< Sound stays as it is coded.
    std::optional<int> channels;   ///< 1 or 2.
    Deinterlace deinterlace = Deinterlace::kAuto;
    bool crop = false;          ///< Cut black borders off.
    std::optional<Margins> cut; ///< Cut that off instead.
    Hdr hdr = Hdr::kAuto;
    std::optional<int> depth;     ///< Bits per sample, 8 or 10.
    bool chapters = true;         ///< Carry them over.
    bool texts = true;            ///< Carry the movie's texts over: title, date and so on.
    std::optional<QString> title; ///< Instead of the movie's own; empty: none.
    bool withPictures = true;
    bool withSound = true;

    bool operator==(const Wishes&) const = default;
};

/// Without what belongs to one movie alone, such as its range and its tracks.
Wishes ForAnyMovie(const Wishes& wishes);

/// `general`, with what belongs to one movie alone from `own`.
Wishes WithOwn(const Wishes& general, const Wishes& own);

/// Other ends of the range, as far as they make sense in a movie of that length in seconds.
void SetBegin(Wishes& wishes, double begin, double length);
void SetEnd(Wishes& wishes, std::optional<double> end, double length);

/// Has subtitles drawn into the pictures. A track that was chosen to be carried is not any more.
void Burn(Wishes& wishes, const Burning& burning);

/// Only what differs from the defaults.
QJsonObject ToJson(const Wishes& wishes);

/// Takes what makes sense and leaves the rest at its default.
Wishes WishesFromJson(const QJsonObject& json);

} // namespace movieconv::window

#endif
