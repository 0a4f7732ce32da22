// Languages of sound and subtitles, by the names that people know.
#ifndef MOVIECONV_HOST_WINDOW_MODEL_LANGUAGES_H
#define MOVIECONV_HOST_WINDOW_MODEL_LANGUAGES_H

#include <QString>

#include <string>
#include <vector>

namespace movieconv::window {

/// In the window's language, for a code of two or three letters, perhaps with a region behind a dash. The
/// code itself when it is not known.
QString LanguageName(const QString& code);

struct NamedLanguage {
    QString code; ///< Of two letters.
    QString name;
};

/// Those that are offered, in the order of their names.
std::vector<NamedLanguage> OfferedLanguages();

/// The code of two letters in a file name such as "Harbour.de.srt" or "Harbour.ger.forced.srt"; empty when it
/// tells none.
QString LanguageInName(const std::string& path);

} // namespace movieconv::window

#endif
