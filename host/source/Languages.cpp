#include "host/source/Languages.h"

#include <algorithm>
#include <cctype>
#include <utility>

namespace movieconv {
namespace {

struct Language {
    std::string_view two;
    std::string_view three;
    std::string_view other; // three letters made from the language's own name
    std::string_view name;  // in English
};

// clang-format off
constexpr Language kLanguages[] = {
    {"ar", "ara", {}, "Arabic"},         {"bg", "bul", {}, "Bulgarian"},      {"bn", "ben", {}, "Bengali"},
    {"ca", "cat", {}, "Catalan"},        {"cs", "cze", "ces", "Czech"},       {"cy", "wel", "cym", "Welsh"},
    {"da", "dan", {}, "Danish"},         {"de", "ger", "deu", "German"},      {"el", "gre", "ell", "Greek"},
    {"en", "eng", {}, "English"},        {"es", "spa", {}, "Spanish"},        {"et", "est", {}, "Estonian"},
    {"eu", "baq", "eus", "Basque"},      {"fa", "per", "fas", "Persian"},     {"fi", "fin", {}, "Finnish"},
    {"fr", "fre", "fra", "French"},      {"ga", "gle", {}, "Irish"},          {"gl", "glg", {}, "Galician"},
    {"he", "heb", {}, "Hebrew"},         {"hi", "hin", {}, "Hindi"},          {"hr", "hrv", {}, "Croatian"},
    {"hu", "hun", {}, "Hungarian"},      {"hy", "arm", "hye", "Armenian"},    {"id", "ind", {}, "Indonesian"},
    {"is", "ice", "isl", "Icelandic"},   {"it", "ita", {}, "Italian"},        {"ja", "jpn", {}, "Japanese"},
    {"ka", "geo", "kat", "Georgian"},    {"ko", "kor", {}, "Korean"},         {"lt", "lit", {}, "Lithuanian"},
    {"lv", "lav", {}, "Latvian"},        {"mk", "mac", "mkd", "Macedonian"},  {"ms", "may", "msa", "Malay"},
    {"nb", "nob", {}, "Norwegian Bokmål"}, {"nl", "dut", "nld", "Dutch"},       {"nn", "nno", {}, "Norwegian Nynorsk"},
    {"no", "nor", {}, "Norwegian"},      {"pl", "pol", {}, "Polish"},         {"pt", "por", {}, "Portuguese"},
    {"ro", "rum", "ron", "Romanian"},    {"ru", "rus", {}, "Russian"},        {"sk", "slo", "slk", "Slovak"},
    {"sl", "slv", {}, "Slovenian"},      {"sq", "alb", "sqi", "Albanian"},    {"sr", "srp", {}, "Serbian"},
    {"sv", "swe", {}, "Swedish"},        {"ta", "tam", {}, "Tamil"},          {"te", "tel", {}, "Telugu"},
    {"th", "tha", {}, "Thai"},           {"tr", "tur", {}, "Turkish"},        {"uk", "ukr", {}, "Ukrainian"},
    {"ur", "urd", {}, "Urdu"},           {"vi", "vie", {}, "Vietnamese"},     {"zh", "chi", "zho", "Chinese"},
};
// clang-format on

// Where the name that FFmpeg has for QuickTime's number is neither of these.
constexpr std::pair<std::string_view, std::string_view> kQuickTimeNames[] = {
    {"fao", "fo "}, {"gle", "iri"}, {"hrv", "hr "}, {"nno", "nor"},
    {"nob", "nor"}, {"pan", "pa "}, {"srp", "sr "}, {"swe", "sve"},
};

bool HasThreeLetters(std::string_view code) {
    return code.size() == 3 &&
           std::all_of(code.begin(), code.end(), [](char letter) { return letter >= 'a' && letter <= 'z'; });
}

std::string Small(std::string_view code) {
    std::string small(code);
    std::transform(small.begin(), small.end(), small.begin(),
                   [](unsigned char letter) { return static_cast<char>(std::tolower(letter)); });
    return small;
}

/// Null when it is not known.
const Language* Find(const std::string& small) {
    const std::string code = small.substr(0, small.find('-'));
    const auto* const found =
        std::find_if(std::begin(kLanguages), std::end(kLanguages), [&](const Language& each) {
            return code == each.two || code == each.three || (!code.empty() && code == each.other);
        });
    return found != std::end(kLanguages) ? found : nullptr;
}

} // namespace

std::string ThreeLetters(std::string_view code) {
    const std::string small = Small(code);
    for (const auto& [three, name] : kQuickTimeNames)
        if (small == name && name != "nor")
            return std::string(three);
    const Language* language = Find(small);
    return language != nullptr ? std::string(language->three) : small;
}

std::string LanguageTagFrom(const std::string& text) {
    const bool isTag = std::all_of(text.begin(), text.end(), [](unsigned char letter) {
        return letter == '-' || (letter < 0x80 && std::isalnum(letter) != 0);
    });
    return isTag && text != "und" ? text : std::string();
}

std::string LanguageName(std::string_view code) {
    const Language* language = Find(ThreeLetters(code));
    return std::string(language != nullptr ? language->name : code);
}

std::vector<std::string> CodesFor(std::string_view code) {
    const std::string three = ThreeLetters(code);
    std::vector<std::string> codes;
    const auto add = [&](std::string_view name) {
        if (!name.empty() && std::find(codes.begin(), codes.end(), name) == codes.end())
            codes.emplace_back(name);
    };
    if (HasThreeLetters(code) && Find(std::string(code)) != nullptr)
        add(code);
    add(three);
    if (const Language* found = Find(three))
        add(found->other);
    return codes;
}

} // namespace movieconv
