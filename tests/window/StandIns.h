// Services of a desktop that answer on a bus of the test's own and keep what they were asked.
#ifndef MOVIECONV_TESTS_WINDOW_STANDINS_H
#define MOVIECONV_TESTS_WINDOW_STANDINS_H

#include <QDBusUnixFileDescriptor>
#include <QDBusVariant>
#include <QObject>
#include <QStringList>
#include <QVariantMap>

#include <utility>

/// Everything of a desktop that the window speaks to.
class Desktop : public QObject {
    Q_OBJECT
public:
    QStringList calls;
    QVariantMap hints;
    QDBusUnixFileDescriptor lock; ///< Handed out to who keeps the machine awake.
};

class Login : public QObject {
    Q_OBJECT
    Q_CLASSINFO("D-Bus Interface", "org.freedesktop.login1.Manager")
public:
    explicit Login(Desktop& desktop) : desktop_(desktop) {}
    Q_SLOT QDBusUnixFileDescriptor Inhibit(const QString& what, const QString&, const QString&,
                                           const QString& mode) {
        desktop_.calls += QStringLiteral("inhibit ") + what + QLatin1Char(' ') + mode;
        return std::exchange(desktop_.lock, {});
    }
    Q_SLOT void Suspend(bool asking) {
        desktop_.calls += asking ? QStringLiteral("suspend, asking") : QStringLiteral("suspend");
    }

private:
    Desktop& desktop_;
};

class Notifications : public QObject {
    Q_OBJECT
    Q_CLASSINFO("D-Bus Interface", "org.freedesktop.Notifications")
public:
    explicit Notifications(Desktop& desktop) : desktop_(desktop) {}
    Q_SLOT uint Notify(const QString&, uint replaced, const QString&, const QString& title,
                       const QString& text, const QStringList&, const QVariantMap& hints, int) {
        desktop_.calls += QStringLiteral("notify %1 %2: %3").arg(replaced).arg(title, text);
        desktop_.hints = hints;
        return 7;
    }
Q_SIGNALS:
    void ActionInvoked(uint id, const QString& action);

private:
    Desktop& desktop_;
};

class FileManager : public QObject {
    Q_OBJECT
    Q_CLASSINFO("D-Bus Interface", "org.freedesktop.FileManager1")
public:
    explicit FileManager(Desktop& desktop) : desktop_(desktop) {}
    Q_SLOT void ShowItems(const QStringList& addresses, const QString&) {
        desktop_.calls += QStringLiteral("show ") + addresses.join(QLatin1Char(' '));
    }

private:
    Desktop& desktop_;
};

class Portal : public QObject {
    Q_OBJECT
    Q_CLASSINFO("D-Bus Interface", "org.freedesktop.portal.Settings")
public:
    Q_SLOT QDBusVariant Read(const QString&, const QString&) {
        return QDBusVariant(QVariant::fromValue(QDBusVariant(1U)));
    }
Q_SIGNALS:
    void SettingChanged(const QString& space, const QString& key, const QDBusVariant& value);
};

#endif
