// The media writer's table of file formats, gone through and looked into.
#ifndef MOVIECONV_MEDIA_FILEFORMATS_H
#define MOVIECONV_MEDIA_FILEFORMATS_H

#include "media/MediaWriter.h"

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <span>
#include <string_view>
#include <type_traits>

/// The whole table, without the entry that ends it; empty where the writer has none.
inline std::span<const FileFormatInfo> FileFormats() {
    const FileFormatInfo* first = MWGetFileFormatInfos();
    std::size_t count = 0;
    while (first != nullptr && first[count].fccFormat != 0)
        ++count;
    return {first, count};
}

/// The first format of which `matches` holds; null when there is none.
template <class Matches>
const FileFormatInfo* FindFileFormat(Matches matches) {
    const std::span<const FileFormatInfo> formats = FileFormats();
    const auto found = std::find_if(formats.begin(), formats.end(), matches);
    return found == formats.end() ? nullptr : &*found;
}

/// Calls `take` with each of the format's extensions, the usual one first.
template <class Take>
void ForEachExtension(const FileFormatInfo& format, Take take) {
    std::string_view list = format.szExtensions;
    while (!list.empty()) {
        const std::string_view name = list.substr(0, list.find(','));
        take(name);
        list.remove_prefix(std::min(name.size() + 1, list.size()));
    }
}

/// Whether files of the format have that extension, which is given without its dot; ASCII letters in any
/// case.
template <class Char>
bool HasExtension(const FileFormatInfo& format, std::basic_string_view<Char> extension) {
    const auto lower = [](uint32_t code) { return code >= 'A' && code <= 'Z' ? code - 'A' + 'a' : code; };
    bool has = false;
    ForEachExtension(format, [&](std::string_view name) {
        has = has || std::equal(name.begin(), name.end(), extension.begin(), extension.end(),
                                [lower](char one, Char other) {
                                    return lower(static_cast<unsigned char>(one)) ==
                                           lower(static_cast<std::make_unsigned_t<Char>>(other));
                                });
    });
    return has;
}

#endif
