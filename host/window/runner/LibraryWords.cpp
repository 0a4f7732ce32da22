#include "host/window/runner/LibraryWords.h"

#include "host/window/model/CodecNames.h"
#include "host/window/model/Languages.h"

#include <QCoreApplication>
#include <QRegularExpression>
#include <QStringList>

#include <utility>
#include <vector>

namespace movieconv::window {
namespace {

struct Library {
    Q_DECLARE_TR_FUNCTIONS(Library)
};

/// Clauses and sentences of the library's, which has other quotes. %1 to %3 stand for names, numbers and
/// lists. The first that fits is taken.
constexpr const char* kSentences[] = {
    // Why something stays behind.
    QT_TRANSLATE_NOOP("Library", "%1 cannot hold them, MKV can"),
    QT_TRANSLATE_NOOP("Library", "%1 cannot hold them"),
    QT_TRANSLATE_NOOP("Library", "%1 cannot hold it as it is"),
    QT_TRANSLATE_NOOP("Library", "%1 cannot hold it"), QT_TRANSLATE_NOOP("Library", "%1 cannot hold its %2"),
    QT_TRANSLATE_NOOP("Library", "%1 cannot hold one of %2 bytes"),
    QT_TRANSLATE_NOOP("Library", "%1 holds one track of sound, MKV and MP4 hold several"),
    QT_TRANSLATE_NOOP("Library", "%1 of them have no length"),
    QT_TRANSLATE_NOOP("Library", "it cannot be decoded"),
    QT_TRANSLATE_NOOP("Library", "it belongs to another programme"),
    QT_TRANSLATE_NOOP("Library", "one stream of pictures is converted"),
    QT_TRANSLATE_NOOP("Library", "data streams are not converted"),
    QT_TRANSLATE_NOOP("Library", "only one cover is carried"),
    QT_TRANSLATE_NOOP("Library", "it is neither JPEG nor PNG"),
    QT_TRANSLATE_NOOP("Library", "it has no name or no content"),
    QT_TRANSLATE_NOOP("Library", "it belongs to the pictures"),
    QT_TRANSLATE_NOOP("Library", "“%1” makes no sense"),
    QT_TRANSLATE_NOOP("Library", "one of their texts could not be converted"),
    QT_TRANSLATE_NOOP("Library", "%1 of their texts could not be converted"),
    QT_TRANSLATE_NOOP("Library", "%1 of them are in other editions or within others"),
    // Why a conversion is refused.
    QT_TRANSLATE_NOOP("Library", "%1 cannot hold “%2” sound as it is; no format can"),
    QT_TRANSLATE_NOOP("Library", "%1 cannot hold “%2” sound as it is; %3 can"),
    QT_TRANSLATE_NOOP("Library", "%1 cannot begin the sound as it is %2 s behind the pictures; MKV can"),
    QT_TRANSLATE_NOOP("Library", "%1 cannot carry pictures as “%2”"),
    QT_TRANSLATE_NOOP("Library", "%1 cannot carry sound as “%2”"),
    QT_TRANSLATE_NOOP("Library", "%1 carries nothing that “%2” holds; choose another format"),
    QT_TRANSLATE_NOOP("Library", "the extension of “%1” tells no file format"),
    QT_TRANSLATE_NOOP("Library", "the begin, %1 s, is not before the end of “%2”, which is %3 s long"),
    QT_TRANSLATE_NOOP("Library", "“%1” has pictures of %2 bits; HEVC, VP90 and AV01 have some of 10"),
    QT_TRANSLATE_NOOP("Library", "HDR needs pictures of 10 bits; “%1” has 8 here"),
    QT_TRANSLATE_NOOP("Library", "there is no sound “%1”; there is: %2"),
    QT_TRANSLATE_NOOP("Library", "there are no subtitles “%1”; there are: %2"),
    QT_TRANSLATE_NOOP("Library", "the subtitles “%1” cannot be decoded"),
    QT_TRANSLATE_NOOP("Library", "“%1” does not tell how long it is"),
    QT_TRANSLATE_NOOP("Library", "“%1” is the source itself; give the output another name"),
    QT_TRANSLATE_NOOP("Library", "“%1” is a folder; name a file in it"),
    QT_TRANSLATE_NOOP("Library", "“%1” is not a file but a device or a pipe; name a file"),
    QT_TRANSLATE_NOOP("Library", "“%1” is not a folder"), QT_TRANSLATE_NOOP("Library", "“%1” exists"),
    QT_TRANSLATE_NOOP("Library", "the output's folder “%1” cannot be used: %2"),
    QT_TRANSLATE_NOOP("Library", "cannot create files in “%1”: %2; choose another folder"),
    // What goes wrong with a source or an output.
    QT_TRANSLATE_NOOP("Library", "“%1” holds nothing to convert"),
    QT_TRANSLATE_NOOP("Library", "cannot open “%1”: %2"),
    QT_TRANSLATE_NOOP("Library", "cannot read “%1”: %2"),
    QT_TRANSLATE_NOOP("Library", "cannot read the streams of “%1”: %2"),
    QT_TRANSLATE_NOOP("Library", "it is a text, not a movie"),
    QT_TRANSLATE_NOOP("Library", "it is not a movie, but says where to find one"),
    QT_TRANSLATE_NOOP("Library", "it is a playlist, which names other files"),
    QT_TRANSLATE_NOOP("Library", "“%1” has changed meanwhile"),
    QT_TRANSLATE_NOOP("Library", "reading “%1” failed after %2: %3; what was read is converted"),
    QT_TRANSLATE_NOOP("Library", "the conversion broke off after %1"),
    QT_TRANSLATE_NOOP("Library", "cannot write “%1”: %2; what was written so far is in “%3”"),
    QT_TRANSLATE_NOOP("Library", "cannot write “%1”: %2"),
    QT_TRANSLATE_NOOP("Library", "“%1” vanished while it was written: %2"),
    QT_TRANSLATE_NOOP("Library", "“%1” was written but stands there no more: it vanished meanwhile"),
    QT_TRANSLATE_NOOP("Library", "“%1” was written, but another file stands there now"),
    // What is told on the way.
    QT_TRANSLATE_NOOP("Library", "“%1” needs about %2, but only %3 are free"),
    QT_TRANSLATE_NOOP("Library", "no space is left for “%1”; waiting until there is room for %2"),
    QT_TRANSLATE_NOOP("Library", "no black borders were found"),
    // Texts that stay behind: after all that begins likewise.
    QT_TRANSLATE_NOOP("Library", "%1 cannot hold %2")};

constexpr const char* kWords[] = {
    QT_TRANSLATE_NOOP("Library", "pictures"),  QT_TRANSLATE_NOOP("Library", "sound"),
    QT_TRANSLATE_NOOP("Library", "subtitles"), QT_TRANSLATE_NOOP("Library", "chapters"),
    QT_TRANSLATE_NOOP("Library", "cover"),     QT_TRANSLATE_NOOP("Library", "attachment"),
    QT_TRANSLATE_NOOP("Library", "data"),      QT_TRANSLATE_NOOP("Library", "tags"),
    QT_TRANSLATE_NOOP("Library", "label"),     QT_TRANSLATE_NOOP("Library", "language"),
    QT_TRANSLATE_NOOP("Library", "title"),     QT_TRANSLATE_NOOP("Library", "flags"),
    QT_TRANSLATE_NOOP("Library", "timecode")};

using Sentence = std::pair<QRegularExpression, const char*>;

/// What fits a sentence of the library's, with its parts as captures.
QRegularExpression PatternOf(const char* sentence) {
    QString plain = QString::fromUtf8(sentence);
    for (const char* mark : {"“", "”"})
        plain.replace(QString::fromUtf8(mark), QStringLiteral("\""));
    QString pattern = QRegularExpression::escape(plain);
    for (const char* part : {"\\%1", "\\%2", "\\%3"})
        pattern.replace(QLatin1String(part), QLatin1String("(.+)"));
    return QRegularExpression(QRegularExpression::anchoredPattern(pattern),
                              QRegularExpression::DotMatchesEverythingOption);
}

const std::vector<Sentence>& Sentences() {
    static const std::vector<Sentence> sentences = [] {
        std::vector<Sentence> all;
        for (const char* sentence : kSentences)
            all.emplace_back(PatternOf(sentence), sentence);
        return all;
    }();
    return sentences;
}

QString Word(const QString& word) {
    for (const char* known : kWords)
        if (word == QLatin1String(known))
            return Library::tr(known);
    return word;
}

/// "a", "a and b", "a, b and c".
QString List(const QString& list) {
    QStringList items = list.split(QLatin1String(" and "));
    const QString last = Word(items.takeLast());
    if (items.isEmpty())
        return last;
    items = items.join(QLatin1String(" and ")).split(QLatin1String(", "));
    for (QString& item : items)
        item = Word(item);
    return Library::tr("%1 and %2", "the last two of a list").arg(items.join(QLatin1String(", ")), last);
}

QString Translated(const QString& text);

/// What is in quotes is a name, of a file or of a codec.
QString PartOf(const char* sentence, int number, const QString& part) {
    if (QString::fromUtf8(sentence).contains(QStringLiteral("“%%1”").arg(number)))
        return CodecName(part);
    const QString clause = Translated(part);
    return clause == part ? List(part) : clause;
}

QString Translated(const QString& text) {
    for (const auto& [pattern, sentence] : Sentences()) {
        const QRegularExpressionMatch match = pattern.match(text);
        if (!match.hasMatch())
            continue;
        const auto part = [&, sentence = sentence](int number) {
            return PartOf(sentence, number, match.captured(number));
        };
        const QString words = Library::tr(sentence);
        switch (match.lastCapturedIndex()) {
        case 0:
            return words;
        case 1:
            return words.arg(part(1));
        case 2:
            return words.arg(part(1), part(2));
        default:
            return words.arg(part(1), part(2), part(3));
        }
    }
    return text;
}

} // namespace

QString InWindowsLanguage(const std::string& text) {
    return Translated(QString::fromStdString(text));
}

QString SentenceOf(const std::string& text) {
    QString sentence = InWindowsLanguage(text);
    if (!sentence.isEmpty())
        sentence[0] = sentence[0].toUpper();
    return sentence.endsWith(QLatin1Char('.')) || sentence.isEmpty() ? sentence : sentence + QLatin1Char('.');
}

QString LineOf(const NotCarried& what) {
    QString line = Word(QString::fromStdString(what.kind));
    if (what.number)
        line += QStringLiteral(" %1").arg(*what.number);
    QStringList details;
    if (!what.codec.empty())
        details += CodecName(QString::fromStdString(what.codec));
    if (!what.language.empty())
        details += LanguageName(QString::fromStdString(what.language));
    if (!details.isEmpty())
        line += QStringLiteral(" (%1)").arg(details.join(QStringLiteral(", ")));
    return QStringLiteral("%1: %2").arg(line, InWindowsLanguage(what.reason));
}

} // namespace movieconv::window
