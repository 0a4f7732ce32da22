#include "host/window/desktop/Instance.h"

#include "host/window/desktop/Desktop.h"
#include "host/window/model/Intake.h"

#include <QDBusMessage>

namespace movieconv::window {
namespace {

const QString kService = QStringLiteral("org.movieconv.MovieConv");
const QString kPath = QStringLiteral("/org/movieconv/MovieConv");
const QString kInterface = QStringLiteral("org.freedesktop.Application");

} // namespace

bool Instance::HandOver(const std::vector<std::string>& movies) {
    constexpr int kPatience = 5000; // milliseconds
    bus_.registerObject(kPath, this, QDBusConnection::ExportAllSlots);
    if (!bus_.isConnected() || bus_.registerService(kService))
        return false;
    QDBusMessage message = QDBusMessage::createMethodCall(
        kService, kPath, kInterface, movies.empty() ? QStringLiteral("Activate") : QStringLiteral("Open"));
    if (!movies.empty()) {
        QStringList addresses;
        for (const std::string& movie : movies)
            addresses += UrlOf(movie).toString(QUrl::FullyEncoded);
        message << addresses;
    }
    message << QVariantMap();
    return bus_.call(message, QDBus::BlockWithGui, kPatience).type() == QDBusMessage::ReplyMessage;
}

void Instance::Activate(const QVariantMap&) {
    Q_EMIT Asked({});
}

void Instance::Open(const QStringList& addresses, const QVariantMap&) {
    QStringList others; // are none of this machine
    Q_EMIT Asked(PathsOfUriList(addresses.join(QLatin1Char('\n')).toUtf8(), others));
}

} // namespace movieconv::window
