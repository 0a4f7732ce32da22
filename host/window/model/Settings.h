// The user's choices that outlast the program.
#ifndef MOVIECONV_HOST_WINDOW_MODEL_SETTINGS_H
#define MOVIECONV_HOST_WINDOW_MODEL_SETTINGS_H

#include "host/window/model/Naming.h"

#include <QByteArray>
#include <QSettings>

namespace movieconv::window {

/// What happens when everything is converted, beside the notification.
struct AtEnd {
    enum class Then { kNothing, kQuit, kSuspend };
    bool sound = false;
    Then then = Then::kNothing;
};

class Settings {
public:
    /// The user's own, or those in a file.
    Settings();
    explicit Settings(const QString& path);

    Naming LoadNaming() const;
    void Save(const Naming& naming);
    Wishes LoadWishes() const;
    void Save(const Wishes& wishes);
    int LoadAtOnce() const;
    void SaveAtOnce(int count);
    AtEnd LoadAtEnd() const;
    void Save(const AtEnd& atEnd);
    QByteArray LoadGeometry() const;
    void SaveGeometry(const QByteArray& geometry);
    QByteArray LoadSplitter() const;
    void SaveSplitter(const QByteArray& state);
    QString LoadFolder() const; ///< Where movies were opened last.
    void SaveFolder(const QString& folder);
    /// Writes what is not written yet.
    void Settle();

private:
    QSettings settings_;
};

} // namespace movieconv::window

#endif
