// One window for a user, however often the program is started.
#ifndef MOVIECONV_HOST_WINDOW_DESKTOP_INSTANCE_H
#define MOVIECONV_HOST_WINDOW_DESKTOP_INSTANCE_H

#include <QDBusConnection>
#include <QObject>
#include <QStringList>
#include <QVariantMap>

#include <string>
#include <utility>
#include <vector>

namespace movieconv::window {

/// The program under its name on the user's bus. Without a bus every program is the only one.
class Instance : public QObject {
    Q_OBJECT
    Q_CLASSINFO("D-Bus Interface", "org.freedesktop.Application")
public:
    explicit Instance(QDBusConnection bus = QDBusConnection::sessionBus()) : bus_(std::move(bus)) {}

    /// Hands movies to the program that is there already, which shows itself. False when there is none that
    /// answers: from then on this is it.
    bool HandOver(const std::vector<std::string>& movies);

Q_SIGNALS:
    /// Somebody wants the window to be seen, with these movies in its queue.
    void Asked(const std::vector<std::string>& movies);

public Q_SLOTS: // what others call
    void Activate(const QVariantMap& platform);
    void Open(const QStringList& addresses, const QVariantMap& platform);

private:
    QDBusConnection bus_;
};

} // namespace movieconv::window

#endif
