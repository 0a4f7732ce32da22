#include "host/window/model/Languages.h"

#include "host/window/model/Entry.h"

#include <QCoreApplication>
#include <QLocale>
#include <QStringList>

#include <algorithm>
#include <array>

namespace movieconv::window {
namespace {

struct Language {
    const char* code;
    const char* name;
};

constexpr std::array kLanguages = {Language{"ar", QT_TRANSLATE_NOOP("Languages", "Arabic")},
                                   Language{"bg", QT_TRANSLATE_NOOP("Languages", "Bulgarian")},
                                   Language{"ca", QT_TRANSLATE_NOOP("Languages", "Catalan")},
                                   Language{"cs", QT_TRANSLATE_NOOP("Languages", "Czech")},
                                   Language{"da", QT_TRANSLATE_NOOP("Languages", "Danish")},
                                   Language{"de", QT_TRANSLATE_NOOP("Languages", "German")},
                                   Language{"el", QT_TRANSLATE_NOOP("Languages", "Greek")},
                                   Language{"en", QT_TRANSLATE_NOOP("Languages", "English")},
                                   Language{"es", QT_TRANSLATE_NOOP("Languages", "Spanish")},
                                   Language{"et", QT_TRANSLATE_NOOP("Languages", "Estonian")},
                                   Language{"fa", QT_TRANSLATE_NOOP("Languages", "Persian")},
                                   Language{"fi", QT_TRANSLATE_NOOP("Languages", "Finnish")},
                                   Language{"fr", QT_TRANSLATE_NOOP("Languages", "French")},
                                   Language{"he", QT_TRANSLATE_NOOP("Languages", "Hebrew")},
                                   Language{"hi", QT_TRANSLATE_NOOP("Languages", "Hindi")},
                                   Language{"hr", QT_TRANSLATE_NOOP("Languages", "Croatian")},
                                   Language{"hu", QT_TRANSLATE_NOOP("Languages", "Hungarian")},
                                   Language{"id", QT_TRANSLATE_NOOP("Languages", "Indonesian")},
                                   Language{"it", QT_TRANSLATE_NOOP("Languages", "Italian")},
                                   Language{"ja", QT_TRANSLATE_NOOP("Languages", "Japanese")},
                                   Language{"ko", QT_TRANSLATE_NOOP("Languages", "Korean")},
                                   Language{"lt", QT_TRANSLATE_NOOP("Languages", "Lithuanian")},
                                   Language{"lv", QT_TRANSLATE_NOOP("Languages", "Latvian")},
                                   Language{"nl", QT_TRANSLATE_NOOP("Languages", "Dutch")},
                                   Language{"no", QT_TRANSLATE_NOOP("Languages", "Norwegian")},
                                   Language{"pl", QT_TRANSLATE_NOOP("Languages", "Polish")},
                                   Language{"pt", QT_TRANSLATE_NOOP("Languages", "Portuguese")},
                                   Language{"ro", QT_TRANSLATE_NOOP("Languages", "Romanian")},
                                   Language{"ru", QT_TRANSLATE_NOOP("Languages", "Russian")},
                                   Language{"sk", QT_TRANSLATE_NOOP("Languages", "Slovak")},
                                   Language{"sl", QT_TRANSLATE_NOOP("Languages", "Slovenian")},
                                   Language{"sr", QT_TRANSLATE_NOOP("Languages", "Serbian")},
                                   Language{"sv", QT_TRANSLATE_NOOP("Languages", "Swedish")},
                                   Language{"th", QT_TRANSLATE_NOOP("Languages", "Thai")},
                                   Language{"tr", QT_TRANSLATE_NOOP("Languages", "Turkish")},
                                   Language{"uk", QT_TRANSLATE_NOOP("Languages", "Ukrainian")},
                                   Language{"vi", QT_TRANSLATE_NOOP("Languages", "Vietnamese")},
                                   Language{"zh", QT_TRANSLATE_NOOP("Languages", "Chinese")}};

/// Of two letters where there is such a one; empty for what is no language.
QString ShortCode(const QString& code) {
    const QString language = code.section(QLatin1Char('-'), 0, 0).toLower();
    if (language == QLatin1String("nor")) // the toolkit knows its two forms alone
        return QStringLiteral("no");
    const QLocale::Language known = QLocale::codeToLanguage(language);
    if (known == QLocale::AnyLanguage || known == QLocale::C)
        return language == QLatin1String("no") ? language : QString();
    return QLocale::languageToCode(known);
}

QString NameInTable(const QString& code) {
    for (const Language& language : kLanguages)
        if (code == QLatin1String(language.code))
            return QCoreApplication::translate("Languages", language.name);
    return {};
}

} // namespace

QString LanguageName(const QString& code) {
    const QString known = ShortCode(code);
    if (known.isEmpty())
        return code;
    const QString name = NameInTable(known);
    return name.isEmpty() ? QLocale::languageToString(QLocale::codeToLanguage(known)) : name;
}

std::vector<NamedLanguage> OfferedLanguages() {
    std::vector<NamedLanguage> all;
    all.reserve(std::size(kLanguages));
    for (const Language& language : kLanguages)
        all.push_back(
            {QLatin1String(language.code), QCoreApplication::translate("Languages", language.name)});
    std::sort(all.begin(), all.end(), [](const NamedLanguage& left, const NamedLanguage& right) {
        return QString::localeAwareCompare(left.name, right.name) < 0;
    });
    return all;
}

QString LanguageInName(const std::string& path) {
    QStringList parts = NameOf(path).split(QLatin1Char('.'));
    if (parts.size() < 3)
        return {};
    parts = parts.mid(1, parts.size() - 2); // between the name and the extension
    std::reverse(parts.begin(), parts.end());
    for (const QString& part : parts) {
        QString code = part.size() == 2 || part.size() == 3 ? ShortCode(part) : QString();
        if (!NameInTable(code).isEmpty())
            return code;
    }
    return {};
}

} // namespace movieconv::window
