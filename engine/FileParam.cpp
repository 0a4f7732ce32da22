#include "engine/FileParam.h"

#include "media/FileFormats.h"
#include "media/FourCC.h"

#include <algorithm>
#include <string_view>

namespace {

constexpr int32_t kVideoBitrate = 4000000;
constexpr int32_t kAudioBitrate = 160000;

/// What follows the last dot of the file's own name.
std::wstring_view Extension(std::wstring_view path) {
    const size_t dot = path.rfind(L'.');
    if (dot == std::wstring_view::npos || path.find(L'/', dot) != std::wstring_view::npos)
        return {};
    return path.substr(dot + 1);
}

/// The usual codec where the format carries it, else the format's first; 0 when it carries none.
uint32_t Choose(const uint32_t (&carried)[32], uint32_t usual) {
    const bool has = std::find(std::begin(carried), std::end(carried), usual) != std::end(carried);
    return has ? usual : carried[0];
}

} // namespace

bool ParamForFile(const wchar_t* fileName, EncodeParam* param) {
    if (!fileName || !param)
        return false;
    const std::wstring_view extension = Extension(fileName);
    const FileFormatInfo* format =
        FindFileFormat([&](const FileFormatInfo& each) { return HasExtension(each, extension); });
    if (!format)
        return false;
    EncodeParam filled{};
    filled.fccVideo = Choose(format->fccVideoCodecs, FourCC("H264"));
    filled.fccColorFormat = FourCC("YV12");
    filled.nBitCount = 12;
    filled.nVideoBitrate = kVideoBitrate;
    filled.fccAudio = Choose(format->fccAudioCodecs, FourCC("AAC "));
    filled.nAudioBitrate = kAudioBitrate;
    filled.bNoVideo = format->bHasVideo ? 0 : 1;
    filled.bNoAudio = format->bHasAudio ? 0 : 1;
    filled.fccFileFormat = format->fccFormat;
    *param = filled;
    return true;
}
