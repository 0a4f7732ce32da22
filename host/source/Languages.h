// Names of languages, which containers and people write in several ways.
#ifndef MOVIECONV_HOST_SOURCE_LANGUAGES_H
#define MOVIECONV_HOST_SOURCE_LANGUAGES_H

#include <string>
#include <string_view>
#include <vector>

namespace movieconv {

/// The three letters of ISO 639-2 (those made from the English name, where there are two) for a code of two
/// or three letters, of which a region may follow behind a dash; other texts in small letters as they are.
std::string ThreeLetters(std::string_view code);

/// A language tag of BCP 47 as it stands in a file, "pt-BR"; empty for what is none, or says nothing.
std::string LanguageTagFrom(const std::string& text);

/// The English name of the language, "French"; of one that is not known the code as it is.
std::string LanguageName(std::string_view code);

/// The codes under which containers may know the language, the nearest to `code` first: itself where it is
/// one of three letters, then those of ISO 639-2.
std::vector<std::string> CodesFor(std::string_view code);

} // namespace movieconv

#endif
