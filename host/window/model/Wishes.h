// What the user wants of one movie, in the terms that the window shows.
#ifndef MOVIECONV_HOST_WINDOW_MODEL_WISHES_H
#define MOVIECONV_HOST_WINDOW_MODEL_WISHES_H

#include <QJsonObject>
#include <QList>
#include <QString>

#include <optional>

namespace movieconv::window {

/// What is not given is left to the preset and to the source.
struct Wishes {
    enum class Deinterlace { kAuto, kOff, kAll };

    QString preset = QStringLiteral("standard");
    std::optional<QString> format;       ///< A file name's extension, "mkv".
    std::optional<int> quality;          ///< 0, small and poor, to 100, large and good.
    std::optional<int> height;           ///< Lines of the picture; its width follows the source's shape.
    std::optional<double> rate;          ///< Pictures a second.
    double begin = 0;                    ///< Seconds.
    std::optional<double> end;           ///< Seconds.
    std::optional<double> clip;          ///< Seconds of each clip.
    std::optional<QList<int>> sounds;    ///< Numbers of sound tracks, as the source counts them.
    std::optional<QList<int>> subtitles; ///< Numbers of subtitle tracks.
    std::optional<int> channels;         ///< 1 or 2.
    Deinterlace deinterlace = Deinterlace::kAuto;
    bool crop = false; ///< Cut black borders off.
    bool withPictures = true;
    bool withSound = true;

    bool operator==(const Wishes&) const = default;
};

/// Only what differs from the defaults.
QJsonObject ToJson(const Wishes& wishes);

/// Takes what makes sense and leaves the rest at its default.
Wishes WishesFromJson(const QJsonObject& json);

} // namespace movieconv::window

#endif
