#include "host/window/desktop/Desktop.h"

#include "text/Path.h"

#include <QCoreApplication>
#include <QDBusConnection>
#include <QDBusMessage>
#include <QDBusPendingCallWatcher>
#include <QDBusPendingReply>
#include <QDesktopServices>
#include <QStringList>
#include <QVariantMap>

namespace movieconv::window {
namespace {

const QString kLogin = QStringLiteral("org.freedesktop.login1");
const QString kLoginPath = QStringLiteral("/org/freedesktop/login1");
const QString kLoginManager = QStringLiteral("org.freedesktop.login1.Manager");
const QString kNotifications = QStringLiteral("org.freedesktop.Notifications");
const QString kNotificationsPath = QStringLiteral("/org/freedesktop/Notifications");
const QString kPortal = QStringLiteral("org.freedesktop.portal.Desktop");
const QString kPortalPath = QStringLiteral("/org/freedesktop/portal/desktop");
const QString kPortalSettings = QStringLiteral("org.freedesktop.portal.Settings");
const QString kAppearance = QStringLiteral("org.freedesktop.appearance");
const QString kColourScheme = QStringLiteral("color-scheme");
constexpr uint kPrefersDark = 1;

template <class Handle>
void Call(const QDBusConnection& bus, const QDBusMessage& message, QObject* context, Handle handle) {
    auto* watcher = new QDBusPendingCallWatcher(bus.asyncCall(message), context);
    QObject::connect(watcher, &QDBusPendingCallWatcher::finished, context,
                     [handle](QDBusPendingCallWatcher* finished) {
                         finished->deleteLater();
                         handle(*finished);
                     });
}

} // namespace

QUrl UrlOf(const std::string& path) {
    return QUrl::fromEncoded("file://" + QByteArray::fromStdString(path).toPercentEncoding("/"));
}

void SleepGuard::Hold() {
    if (wanted_)
        return;
    wanted_ = true;
    QDBusMessage message =
        QDBusMessage::createMethodCall(kLogin, kLoginPath, kLoginManager, QStringLiteral("Inhibit"));
    message << QStringLiteral("idle:sleep") << QStringLiteral("MovieConv") << tr("Movies are being converted")
            << QStringLiteral("block");
    Call(QDBusConnection::systemBus(), message, this, [this](const QDBusPendingCall& call) {
        const QDBusPendingReply<QDBusUnixFileDescriptor> reply = call;
        if (reply.isError())
            Q_EMIT Refused(tr("The machine may go to sleep while movies are converted: %1")
                               .arg(reply.error().message()));
        else if (wanted_)
            lock_ = reply.value();
    });
}

void SleepGuard::Release() {
    wanted_ = false;
    lock_ = QDBusUnixFileDescriptor();
}

Notifier::Notifier(QObject* parent) : QObject(parent) {
    QDBusConnection::sessionBus().connect(kNotifications, kNotificationsPath, kNotifications,
                                          QStringLiteral("ActionInvoked"), this,
                                          SLOT(OnAction(uint, QString)));
}

void Notifier::Notify(const QString& title, const QString& text, bool audibly) {
    QDBusMessage message = QDBusMessage::createMethodCall(kNotifications, kNotificationsPath, kNotifications,
                                                          QStringLiteral("Notify"));
    QVariantMap hints{{QStringLiteral("desktop-entry"), QStringLiteral("org.movieconv.MovieConv")}};
    if (audibly)
        hints.insert(QStringLiteral("sound-name"), QStringLiteral("complete"));
    else
        hints.insert(QStringLiteral("suppress-sound"), true);
    message << QStringLiteral("MovieConv") << last_ << QStringLiteral("org.movieconv.MovieConv") << title
            << text << QStringList{QStringLiteral("default"), tr("Show")} << hints << -1;
    Call(QDBusConnection::sessionBus(), message, this, [this](const QDBusPendingCall& call) {
        const QDBusPendingReply<uint> reply = call;
        if (!reply.isError())
            last_ = reply.value();
    });
}

void Notifier::OnAction(uint id, const QString&) {
    if (id == last_)
        Q_EMIT Chosen();
}

ColourWish::ColourWish(QObject* parent) : QObject(parent) {
    QDBusConnection::sessionBus().connect(kPortal, kPortalPath, kPortalSettings,
                                          QStringLiteral("SettingChanged"), this,
                                          SLOT(OnChanged(QString, QString, QDBusVariant)));
}

void ColourWish::Ask() {
    QDBusMessage message =
        QDBusMessage::createMethodCall(kPortal, kPortalPath, kPortalSettings, QStringLiteral("Read"));
    message << kAppearance << kColourScheme;
    Call(QDBusConnection::sessionBus(), message, this, [this](const QDBusPendingCall& call) {
        const QDBusPendingReply<QDBusVariant> reply = call;
        if (reply.isError())
            return;
        QVariant value = reply.value().variant(); // the answer may be wrapped twice
        if (value.userType() == qMetaTypeId<QDBusVariant>())
            value = value.value<QDBusVariant>().variant();
        Q_EMIT Told(value.toUInt() == kPrefersDark);
    });
}

void ColourWish::OnChanged(const QString& space, const QString& key, const QDBusVariant& value) {
    if (space == kAppearance && key == kColourScheme)
        Q_EMIT Told(value.variant().toUInt() == kPrefersDark);
}

void Suspend() {
    QDBusMessage message =
        QDBusMessage::createMethodCall(kLogin, kLoginPath, kLoginManager, QStringLiteral("Suspend"));
    message << false;
    QDBusConnection::systemBus().send(message);
}

void OpenFile(const std::string& path) {
    QDesktopServices::openUrl(UrlOf(path));
}

void ShowInFolder(const std::string& path) {
    const QString manager = QStringLiteral("org.freedesktop.FileManager1");
    QDBusMessage message = QDBusMessage::createMethodCall(
        manager, QStringLiteral("/org/freedesktop/FileManager1"), manager, QStringLiteral("ShowItems"));
    message << QStringList{UrlOf(path).toString(QUrl::FullyEncoded)} << QString();
    Call(QDBusConnection::sessionBus(), message, qApp, [path](const QDBusPendingCall& call) {
        if (const QDBusPendingReply<> reply = call; reply.isError())
            OpenFile(text::FolderOf(path));
    });
}

} // namespace movieconv::window
