#include "host/window/runner/LibraryWords.h"

#include "host/window/model/CodecNames.h"
#include "host/window/model/Entry.h"
#include "host/window/model/Languages.h"
#include "host/window/runner/LibrarySentences.h"

#include <QCoreApplication>
#include <QLocale>
#include <QRegularExpression>
#include <QStringList>

#include <utility>
#include <vector>

namespace movieconv::window {
namespace {

constexpr int kMostParts = 6; // of a sentence

QString Tr(const char* text) {
    return QCoreApplication::translate("Library", text);
}

using Sentence = std::pair<QRegularExpression, const char*>;

/// What fits a sentence of the library's, with its parts as captures. A part ends with the first that can be
/// its end: what follows may hold further ones that look like it.
QRegularExpression PatternOf(const char* sentence) {
    QString plain = QString::fromUtf8(sentence);
    for (const char* mark : {"“", "”"})
        plain.replace(QString::fromUtf8(mark), QStringLiteral("\""));
    QString pattern = QRegularExpression::escape(plain);
    for (int number = 1; number <= kMostParts; ++number)
        pattern.replace(QStringLiteral("\\%%1").arg(number), QStringLiteral("(.+?)"));
    return QRegularExpression(QRegularExpression::anchoredPattern(pattern),
                              QRegularExpression::DotMatchesEverythingOption);
}

const std::vector<Sentence>& Sentences() {
    static const std::vector<Sentence> sentences = [] {
        std::vector<Sentence> all;
        for (const char* sentence : LibrarySentences())
            all.emplace_back(PatternOf(sentence), sentence);
        return all;
    }();
    return sentences;
}

/// A word of the library's, or what has a name of its own.
QString Word(const QString& word) {
    for (const char* known : LibraryNouns()) {
        if (word == QLatin1String(known))
            return Tr(known);
        const QString begin = QString::fromLatin1(known).section(QLatin1String("%1"), 0, 0);
        if (begin.endsWith(QLatin1Char(' ')) && word.startsWith(begin))
            return Tr(known).arg(word.mid(begin.size()));
    }
    return word;
}

/// "a", "a and b", "a, b and c".
QString List(const QString& list) {
    QStringList items = list.split(QLatin1String(" and "));
    QString last = Word(items.takeLast());
    if (items.isEmpty())
        return last;
    items = items.join(QLatin1String(" and ")).split(QLatin1String(", "));
    for (QString& item : items)
        item = Word(item);
    return QCoreApplication::translate("Library", "%1 and %2", "the last two of a list")
        .arg(items.join(QLatin1String(", ")), last);
}

/// An amount such as "1.2 GB" with the point of the user's language.
QString Amount(QString text) {
    static const QRegularExpression amount(QStringLiteral("^\\d+\\.\\d [kMGT]B$"));
    if (amount.match(text).hasMatch())
        text.replace(QLatin1Char('.'), QLocale().decimalPoint());
    return text;
}

QString Translated(const QString& text);

/// What is in quotes is a name, of a file or of a codec.
QString PartOf(const QString& sentence, int number, const QString& part) {
    if (sentence.contains(QStringLiteral("“%%1”").arg(number)))
        return CodecName(part);
    const QString clause = Translated(part);
    return clause == part ? Amount(List(part)) : clause;
}

/// `words` with its parts in their places. What a part holds is no place for another.
QString Filled(const QString& words, const QStringList& parts) {
    QString filled;
    for (qsizetype at = 0; at < words.size(); ++at) {
        const int number =
            words[at] == QLatin1Char('%') && at + 1 < words.size() ? words[at + 1].digitValue() : 0;
        if (number < 1 || number > parts.size()) {
            filled += words[at];
            continue;
        }
        filled += parts[number - 1];
        ++at;
    }
    return filled;
}

QString Translated(const QString& text) {
    for (const auto& [pattern, sentence] : Sentences()) {
        const QRegularExpressionMatch match = pattern.match(text);
        if (!match.hasMatch())
            continue;
        QStringList parts;
        for (int number = 1; number <= match.lastCapturedIndex(); ++number)
            parts += PartOf(QString::fromUtf8(sentence), number, match.captured(number));
        return Filled(Tr(sentence), parts);
    }
    return text;
}

} // namespace

QString InWindowsLanguage(const std::string& text) {
    QString own = Shown(text);
    own.remove(QLatin1String("; see \"movieconv --list-presets\"")); // which is for the terminal
    return Translated(own);
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
