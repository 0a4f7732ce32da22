#include "host/convert/Formats.h"

#include "media/CodeText.h"
#include "media/FileFormats.h"
#include "media/FourCC.h"
#include "writer/WriterStatus.h"

#include <algorithm>
#include <cctype>

namespace movieconv {
namespace {

char Lower(char c) {
    return static_cast<char>(std::tolower(static_cast<unsigned char>(c)));
}

} // namespace

bool SameIgnoringCase(std::string_view a, std::string_view b) {
    return std::equal(a.begin(), a.end(), b.begin(), b.end(),
                      [](char x, char y) { return Lower(x) == Lower(y); });
}

std::string ShortName(const FileFormatInfo& format) {
    const std::string name = format.szName;
    return name.substr(0, name.find(" ("));
}

const FileFormatInfo* FindFormat(std::string_view name) {
    const std::optional<uint32_t> code = ParseCode(name);
    return FindFileFormat([&](const FileFormatInfo& format) {
        return (code && format.fccFormat == *code) || HasExtension(format, name);
    });
}

const FileFormatInfo* FindFormatOfFile(std::string_view path) {
    const std::string_view name = path.substr(path.rfind('/') + 1);
    const std::size_t dot = name.rfind('.');
    if (dot == std::string_view::npos)
        return nullptr;
    return FindFileFormat(
        [&](const FileFormatInfo& format) { return HasExtension(format, name.substr(dot + 1)); });
}

bool Has(const FileFormatInfo& format, uint32_t trait) {
    return (MWGetFormatTraits(format.fccFormat) & trait) != 0;
}

std::optional<uint32_t> ParseCode(std::string_view text) {
    if (text.empty() || text.size() > 4)
        return std::nullopt;
    char code[4] = {' ', ' ', ' ', ' '};
    std::transform(text.begin(), text.end(), code,
                   [](char c) { return static_cast<char>(std::toupper(static_cast<unsigned char>(c))); });
    return FourCC(code[0], code[1], code[2], code[3]);
}

std::optional<QualityRange> QualityRangeOf(uint32_t videoCodec) {
    QualityRange range{};
    return MWGetQualityScale(videoCodec, &range.best, &range.worst) != 0 ? std::optional(range)
                                                                         : std::nullopt;
}

std::string CodeName(uint32_t code) {
    const std::string name = CodeText(code);
    return name.substr(0, name.find_last_not_of(' ') + 1);
}

} // namespace movieconv
