#include "host/source/Languages.h"

#include <algorithm>
#include <cctype>

namespace movieconv {
namespace {

struct Language {
    std::string_view two;
    std::string_view three;
    std::string_view other; // three letters made from the language's own name
};

// clang-format off
constexpr Language kLanguages[] = {
    {"ar", "ara", {}},    {"bg", "bul", {}},    {"bn", "ben", {}},    {"ca", "cat", {}},    {"cs", "cze", "ces"},
    {"cy", "wel", "cym"}, {"da", "dan", {}},    {"de", "ger", "deu"}, {"el", "gre", "ell"}, {"en", "eng", {}},
    {"es", "spa", {}},    {"et", "est", {}},    {"eu", "baq", "eus"}, {"fa", "per", "fas"}, {"fi", "fin", {}},
    {"fr", "fre", "fra"}, {"ga", "gle", {}},    {"gl", "glg", {}},    {"he", "heb", {}},    {"hi", "hin", {}},
    {"hr", "hrv", {}},    {"hu", "hun", {}},    {"hy", "arm", "hye"}, {"id", "ind", {}},    {"is", "ice", "isl"},
    {"it", "ita", {}},    {"ja", "jpn", {}},    {"ka", "geo", "kat"}, {"ko", "kor", {}},    {"lt", "lit", {}},
    {"lv", "lav", {}},    {"mk", "mac", "mkd"}, {"ms", "may", "msa"}, {"nb", "nob", {}},    {"nl", "dut", "nld"},
    {"nn", "nno", {}},    {"no", "nor", {}},    {"pl", "pol", {}},    {"pt", "por", {}},    {"ro", "rum", "ron"},
    {"ru", "rus", {}},    {"sk", "slo", "slk"}, {"sl", "slv", {}},    {"sq", "alb", "sqi"}, {"sr", "srp", {}},
    {"sv", "swe", {}},    {"ta", "tam", {}},    {"te", "tel", {}},    {"th", "tha", {}},    {"tr", "tur", {}},
    {"uk", "ukr", {}},    {"ur", "urd", {}},    {"vi", "vie", {}},    {"zh", "chi", "zho"},
};
// clang-format on

} // namespace

std::string ThreeLetters(std::string_view code) {
    std::string small(code);
    std::transform(small.begin(), small.end(), small.begin(),
                   [](unsigned char letter) { return static_cast<char>(std::tolower(letter)); });
    const std::string language = small.substr(0, small.find('-'));
    const auto* const found =
        std::find_if(std::begin(kLanguages), std::end(kLanguages), [&](const Language& each) {
            return language == each.two || language == each.three || language == each.other;
        });
    return found != std::end(kLanguages) ? std::string(found->three) : small;
}

} // namespace movieconv
