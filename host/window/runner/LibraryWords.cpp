#include "host/window/runner/LibraryWords.h"

#include "host/window/model/Languages.h"

#include <QCoreApplication>
#include <QStringList>

namespace movieconv::window {
namespace {

struct Library {
    Q_DECLARE_TR_FUNCTIONS(Library)
};

/// Sentences of the library's; %1 stands for its name of a format, or for a number.
constexpr const char* kReasons[] = {
    QT_TRANSLATE_NOOP("Library", "%1 cannot hold them"),
    QT_TRANSLATE_NOOP("Library", "%1 cannot hold them, MKV can"),
    QT_TRANSLATE_NOOP("Library", "%1 cannot hold it"),
    QT_TRANSLATE_NOOP("Library", "%1 holds one track of sound, MKV and MP4 hold several"),
    QT_TRANSLATE_NOOP("Library", "%1 of them have no length"),
    QT_TRANSLATE_NOOP("Library", "it cannot be decoded"),
    QT_TRANSLATE_NOOP("Library", "it belongs to another programme"),
    QT_TRANSLATE_NOOP("Library", "one stream of pictures is converted"),
    QT_TRANSLATE_NOOP("Library", "data streams are not converted"),
    QT_TRANSLATE_NOOP("Library", "only one cover is carried"),
    QT_TRANSLATE_NOOP("Library", "it is neither JPEG nor PNG"),
    QT_TRANSLATE_NOOP("Library", "it has no name or no content")};

constexpr const char* kKinds[] = {
    QT_TRANSLATE_NOOP("Library", "pictures"),  QT_TRANSLATE_NOOP("Library", "sound"),
    QT_TRANSLATE_NOOP("Library", "subtitles"), QT_TRANSLATE_NOOP("Library", "chapters"),
    QT_TRANSLATE_NOOP("Library", "cover"),     QT_TRANSLATE_NOOP("Library", "attachment"),
    QT_TRANSLATE_NOOP("Library", "data")};

QString InWindowsLanguage(const QString& reason) {
    for (const char* known : kReasons) {
        const QString pattern = QLatin1String(known);
        if (reason == pattern)
            return Library::tr(known);
        const QString rest = pattern.mid(2); // behind %1
        if (pattern.startsWith(QLatin1String("%1")) && reason.endsWith(rest))
            return Library::tr(known).arg(reason.chopped(rest.size()));
    }
    return reason;
}

QString KindOf(const QString& kind) {
    for (const char* known : kKinds)
        if (kind == QLatin1String(known))
            return Library::tr(known);
    return kind;
}

} // namespace

QString LineOf(const NotCarried& what) {
    QString line = KindOf(QString::fromStdString(what.kind));
    if (what.number)
        line += QStringLiteral(" %1").arg(*what.number);
    QStringList details;
    if (!what.codec.empty())
        details += QString::fromStdString(what.codec);
    if (!what.language.empty())
        details += LanguageName(QString::fromStdString(what.language));
    if (!details.isEmpty())
        line += QStringLiteral(" (%1)").arg(details.join(QStringLiteral(", ")));
    return QStringLiteral("%1: %2").arg(line, InWindowsLanguage(QString::fromStdString(what.reason)));
}

} // namespace movieconv::window
