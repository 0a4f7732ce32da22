// The functions on texts: the log module's, UTF-8, a program's place as a URL, the notations of the command
// line.
#include "fuzz/Fuzz.h"
#include "host/convert/Amounts.h"
#include "host/presets/Notation.h"
#include "log/dyLog.h"
#include "platform/BundleUrl.h"
#include "tests/log/ScriptedBundle.h"
#include "text/Utf8.h"

#include <cmath>
#include <memory>
#include <string>
#include <string_view>
#include <vector>

namespace {

struct Replaced {
    std::string text;
    int count = 0;
};

Replaced Replace(std::string_view text, std::string_view pattern, char ch) {
    Replaced result;
    for (size_t i = 0; i < text.size();) {
        const bool found = text.substr(i, pattern.size()) == pattern;
        result.text += found ? ch : text[i];
        result.count += found ? 1 : 0;
        i += found ? pattern.size() : 1;
    }
    return result;
}

/// The text up to its first zero, in a block of exactly its size.
std::unique_ptr<char[]> Copy(const std::string& text) {
    const size_t size = std::strlen(text.c_str()) + 1;
    auto copy = std::make_unique<char[]>(size);
    std::memcpy(copy.get(), text.c_str(), size);
    return copy;
}

void FuzzReplace(FuzzedDataProvider& input) {
    const auto pattern = Copy(input.ConsumeRandomLengthString(4));
    const char ch = input.ConsumeIntegral<char>();
    const auto text = Copy(input.ConsumeRemainingBytesAsString());
    if (pattern[0] == '\0')
        return;
    const Replaced expected = Replace(text.get(), pattern.get(), ch);
    FUZZ_CHECK(replace_str_2_char(text.get(), pattern.get(), ch) == expected.count);
    FUZZ_CHECK(std::strcmp(text.get(), expected.text.c_str()) == 0);
}

std::string AppDirectory(const std::string& url, size_t capacity) {
    constexpr std::string_view kApp = ".app/";
    std::string path = url.size() < 511 ? Replace(url, "%20", ' ').text : "";
    if (path.find("file://localhost/") != std::string::npos)
        path.erase(0, 16);
    if (path.size() >= capacity)
        return "";
    if (path.size() >= kApp.size() && path.substr(path.size() - kApp.size()) == kApp)
        path += "Contents/MacOS";
    else if (!path.empty())
        path.pop_back();
    return path.size() < capacity ? path : "";
}

void FuzzAppPath(FuzzedDataProvider& input) {
    g_bundle.missing = input.PickValueInArray({Missing::Nothing, Missing::Nothing, Missing::Nothing,
                                               Missing::Bundle, Missing::Url, Missing::String});
    const auto size = input.ConsumeIntegralInRange<size_t>(0, 600);
    std::string url = input.PickValueInArray({"", "file://localhost/", "file:///"});
    url.append(input.ConsumeIntegralInRange<size_t>(0, 520), 'a');
    url += input.PickValueInArray({"", "/", "%20b.app/", ".app/"});
    url += Copy(input.ConsumeRemainingBytesAsString()).get();
    g_bundle.url = url;
    const std::vector<char> untouched(size, 'x');
    std::vector<char> path = untouched;
    GetAppPathA(path.data(), static_cast<int>(size));
    FUZZ_CHECK(g_bundle.urlsOut == 0);
    if (size > 0)
        FUZZ_CHECK(path.data() ==
                   (g_bundle.missing == Missing::Nothing ? AppDirectory(url, size) : std::string()));
    GetAppPathA(path.data(), -static_cast<int>(size));
}

void FuzzBundleUrl(FuzzedDataProvider& input) {
    const std::string url = BundleUrl("/" + input.ConsumeRemainingBytesAsString());
    FUZZ_CHECK(url.rfind("file://localhost/", 0) == 0 && url.back() == '/');
    for (const char byte : url)
        FUZZ_CHECK(byte > ' ' && byte < 0x7F);
}

void FuzzUtf8(FuzzedDataProvider& input) {
    std::wstring wide(input.ConsumeIntegralInRange<size_t>(0, 8), L' ');
    for (wchar_t& character : wide)
        character = WildInteger<wchar_t>(input, input.ConsumeIntegral<char16_t>());
    const std::string encoded = text::ToUtf8(wide);
    FUZZ_CHECK(text::ToUtf8(text::FromUtf8(encoded)) == encoded);
    const std::string bytes = input.ConsumeRemainingBytesAsString();
    FUZZ_CHECK(text::ToUtf8(text::FromUtf8(bytes)) == bytes);
}

void FuzzUnits(FuzzedDataProvider& input) {
    const double seconds = WildDouble(input, input.ConsumeFloatingPointInRange(0.0, 1e6));
    const auto shown = movieconv::ParseTime(movieconv::FormatTime(seconds, true));
    FUZZ_CHECK(shown && (!(seconds >= 0 && seconds <= 1e9) || std::abs(*shown - seconds) < 0.000501));
    FUZZ_CHECK(!movieconv::FormatBytes(input.ConsumeIntegral<int64_t>()).empty());

    const std::string text = input.ConsumeRemainingBytesAsString();
    const auto time = movieconv::ParseTime(text);
    FUZZ_CHECK(!time || (std::isfinite(*time) && *time >= 0));
    const auto rate = movieconv::ParseRate(text);
    FUZZ_CHECK(!rate || *rate > 0);
    const auto size = movieconv::ParseSize(text);
    FUZZ_CHECK(!size ||
               (size->width >= 2 && size->width <= 32768 && size->height >= 2 && size->height <= 32768));
    const auto pictures = movieconv::ParseFrameRate(text);
    FUZZ_CHECK(!pictures || (*pictures > 0 && *pictures <= 200));
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    FuzzedDataProvider input(data, size);
    constexpr void (*kTargets[])(FuzzedDataProvider&) = {FuzzReplace, FuzzAppPath, FuzzBundleUrl, FuzzUtf8,
                                                         FuzzUnits};
    input.PickValueInArray(kTargets)(input);
    return 0;
}
