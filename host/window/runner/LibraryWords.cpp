#include "host/window/runner/LibraryWords.h"

#include "host/window/model/CodecNames.h"
#include "host/window/model/Entry.h"
#include "host/window/model/Languages.h"

#include <QCoreApplication>
#include <QLocale>
#include <QStringList>

#include <algorithm>
#include <iterator>
#include <string>
#include <vector>

namespace movieconv::window {
namespace {

/// Texts that come without a pattern: what a stream is, texts about movies, and errors of FFmpeg's.
constexpr const char* kTexts[] = {QT_TRANSLATE_NOOP("Library", "pictures"),
                                  QT_TRANSLATE_NOOP("Library", "sound"),
                                  QT_TRANSLATE_NOOP("Library", "subtitles"),
                                  QT_TRANSLATE_NOOP("Library", "chapters"),
                                  QT_TRANSLATE_NOOP("Library", "cover"),
                                  QT_TRANSLATE_NOOP("Library", "attachment"),
                                  QT_TRANSLATE_NOOP("Library", "data"),
                                  QT_TRANSLATE_NOOP("Library", "tags"),
                                  QT_TRANSLATE_NOOP("Library", "label"),
                                  QT_TRANSLATE_NOOP("Library", "language"),
                                  QT_TRANSLATE_NOOP("Library", "title"),
                                  QT_TRANSLATE_NOOP("Library", "timecode"),
                                  QT_TRANSLATE_NOOP("Library", "Invalid data found when processing input"),
                                  QT_TRANSLATE_NOOP("Library", "Generic error in an external library"),
                                  QT_TRANSLATE_NOOP("Library", "Unknown error occurred")};

QString Tr(const char* text) {
    return QCoreApplication::translate("Library", text);
}

QString Known(const std::string& text) {
    const bool isKnown = std::find(std::begin(kTexts), std::end(kTexts), text) != std::end(kTexts);
    return isKnown ? Tr(text.c_str()) : Shown(text);
}

/// Patterns have straight quotes, in pairs; a translation has its language's.
QString WithEnglishQuotes(QString words) {
    bool opens = true;
    for (QChar& sign : words) {
        if (sign != QLatin1Char('"'))
            continue;
        sign = opens ? QChar(0x201C) : QChar(0x201D);
        opens = !opens;
    }
    return words;
}

/// With the parts in their places: "{}" or "{:.1f}" is the next part, "{0}" the first one.
QString Filled(const QString& words, const std::vector<Sentence>& parts) {
    QString filled;
    std::size_t next = 0;
    for (qsizetype at = 0; at < words.size(); ++at) {
        const qsizetype end = words[at] == QLatin1Char('{') ? words.indexOf(QLatin1Char('}'), at) : -1;
        if (end < 0) {
            filled += words[at];
            continue;
        }
        const int number = words[at + 1].digitValue();
        const std::size_t part = number >= 0 ? static_cast<std::size_t>(number) : next++;
        if (part < parts.size())
            filled += InWindowsLanguage(parts[part]);
        at = end;
    }
    return filled;
}

/// "a", "a and b", "a, b and c".
QString Listed(const std::vector<Sentence>& items) {
    QStringList words;
    for (const Sentence& item : items)
        words += InWindowsLanguage(item);
    if (words.size() < 2)
        return words.join(QString());
    const QString last = words.takeLast();
    return QCoreApplication::translate("Library", "%1 and %2", "the last two of a list")
        .arg(words.join(QLatin1String(", ")), last);
}

} // namespace

QString InWindowsLanguage(const Sentence& sentence) {
    switch (sentence.Is()) {
    case Sentence::Kind::kName:
        return Shown(sentence.Text());
    case Sentence::Kind::kCodec:
        return CodecName(Shown(sentence.Text()));
    case Sentence::Kind::kAmount:
        return Shown(sentence.Text()).replace(QLatin1Char('.'), QLocale().decimalPoint());
    case Sentence::Kind::kList:
        return Listed(sentence.Parts());
    case Sentence::Kind::kWords:
        break;
    }
    return sentence.Pattern() != nullptr ? Filled(WithEnglishQuotes(Tr(sentence.Pattern())), sentence.Parts())
                                         : Known(sentence.Text());
}

QString SentenceOf(const Sentence& sentence) {
    QString words = InWindowsLanguage(sentence);
    if (!words.isEmpty())
        words[0] = words[0].toUpper();
    return words.endsWith(QLatin1Char('.')) || words.isEmpty() ? words : words + QLatin1Char('.');
}

QString LineOf(const NotCarried& what) {
    QString line = Known(what.kind);
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
