// What the window asks of the desktop around it, over D-Bus. Nothing here waits for an answer, and a desktop
// that has none of it is no error.
#ifndef MOVIECONV_HOST_WINDOW_DESKTOP_DESKTOP_H
#define MOVIECONV_HOST_WINDOW_DESKTOP_DESKTOP_H

#include <QDBusUnixFileDescriptor>
#include <QDBusVariant>
#include <QObject>
#include <QString>
#include <QUrl>

#include <string>

namespace movieconv::window {

/// Keeps the machine from going to sleep by itself.
class SleepGuard : public QObject {
    Q_OBJECT
public:
    using QObject::QObject;

    void Hold();
    void Release();

Q_SIGNALS:
    /// The machine may go to sleep meanwhile, for the reason told.
    void Refused(const QString& sentence);

private:
    bool wanted_ = false;
    QDBusUnixFileDescriptor lock_; // sleep is held off as long as it is open
};

/// Shows a notification beside the user's other ones; an earlier one is replaced.
class Notifier : public QObject {
    Q_OBJECT
public:
    explicit Notifier(QObject* parent = nullptr);

    /// `audibly`: with the desktop's sound for it, if it has one.
    void Notify(const QString& title, const QString& text, bool audibly);

Q_SIGNALS:
    /// The user chose it.
    void Chosen();

private:
    Q_SLOT void OnAction(uint id, const QString& action);

    uint last_ = 0;
};

/// Whether the user wants light or dark windows, now and when that changes.
class ColourWish : public QObject {
    Q_OBJECT
public:
    explicit ColourWish(QObject* parent = nullptr);

    /// Asks; the answer is a signal.
    void Ask();

Q_SIGNALS:
    void Told(bool dark);

private Q_SLOTS:
    void OnChanged(const QString& space, const QString& key, const QDBusVariant& value);
};

/// Puts the machine to sleep.
void Suspend();

/// The address of a file whose name may have any bytes.
QUrl UrlOf(const std::string& path);

/// Opens a file with what the desktop has for it.
void OpenFile(const std::string& path);

/// Opens the folder of a file with the file selected, or the folder alone where that is not understood.
void ShowInFolder(const std::string& path);

} // namespace movieconv::window

#endif
