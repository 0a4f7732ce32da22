#include "host/source/Charset.h"

#include "ffmpeg/AvHandles.h"
#include "host/sentence/Say.h"
#include "host/source/SourceError.h"

#include <algorithm>
#include <iconv.h>
#include <optional>
#include <string_view>
#include <utility>

namespace movieconv {
namespace {

/// Nothing when the text is none in that character set.
std::optional<std::string> Convert(const std::string& text, const std::string& charset) {
    const iconv_t converter = iconv_open("UTF-8", charset.c_str());
    if (converter == reinterpret_cast<iconv_t>(-1))
        throw SourceError(Say("there is no character set \"{}\"", charset));
    std::string converted(text.size() * 4 + 16, '\0');
    std::string from = text;
    char* in = from.data();
    char* out = converted.data();
    std::size_t inLeft = from.size();
    std::size_t outLeft = converted.size();
    constexpr auto kFailed = static_cast<std::size_t>(-1);
    // Where accents follow their letters, the last letter is kept until it is asked for.
    const bool isConverted = iconv(converter, &in, &inLeft, &out, &outLeft) != kFailed &&
                             iconv(converter, nullptr, nullptr, &out, &outLeft) != kFailed;
    iconv_close(converter);
    converted.resize(converted.size() - outLeft);
    return isConverted ? std::optional(std::move(converted)) : std::nullopt;
}

bool HasMark(std::string_view text) {
    return text.substr(0, 3) == "\xEF\xBB\xBF" || text.substr(0, 2) == "\xFF\xFE" ||
           text.substr(0, 2) == "\xFE\xFF";
}

} // namespace

std::string Decoded(std::string text, const std::string& charset) {
    if (HasMark(text))
        return text;
    if (!charset.empty()) {
        if (std::optional<std::string> converted = Convert(text, charset))
            return std::move(*converted);
        throw SourceError(Say("it is not in the character set \"{}\"", charset));
    }
    if (Convert(text, "UTF-8"))
        return text;
    if (std::optional<std::string> western = Convert(text, "WINDOWS-1252"))
        return std::move(*western);
    return std::move(*Convert(text, "ISO-8859-1")); // which has a letter for every byte
}

bool IsPlainText(AVCodecID codec) {
    return codec == AV_CODEC_ID_SUBRIP || codec == AV_CODEC_ID_TEXT || codec == AV_CODEC_ID_ASS ||
           codec == AV_CODEC_ID_SSA || codec == AV_CODEC_ID_WEBVTT;
}

bool MakeUtf8(AVPacket& packet) {
    const std::string text(reinterpret_cast<const char*>(packet.data), static_cast<std::size_t>(packet.size));
    const std::string converted = Decoded(text);
    if (converted == text)
        return false;
    const av::Packet made = av::NewPacket();
    av::CheckMemory(av_new_packet(made.get(), static_cast<int>(converted.size())));
    std::copy(converted.begin(), converted.end(), made->data);
    av::CheckMemory(av_packet_copy_props(made.get(), &packet));
    av_packet_unref(&packet);
    av_packet_move_ref(&packet, made.get());
    return true;
}

} // namespace movieconv
