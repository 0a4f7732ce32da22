#include "host/source/SubtitleFile.h"

#include "host/source/InputFile.h"
#include "host/source/SourceError.h"

#include <algorithm>
#include <cerrno>
#include <cstdio>
#include <fmt/format.h>
#include <iconv.h>
#include <string_view>
#include <system_error>
#include <utility>

namespace movieconv {
namespace {

constexpr char kTexts[] =
    "ass,jacosub,lrc,microdvd,mpl2,mpsub,pjs,realtext,sami,srt,stl,subviewer,subviewer1,vplayer,"
    "webvtt";

std::string ReadWhole(const std::string& path, const std::shared_ptr<const Interruption>& interruption) {
    constexpr std::size_t kMost = std::size_t{64} << 20;
    constexpr int kPart = 65536;
    try {
        const InputFile file(path, Growth::kRead, interruption);
        std::string text;
        std::vector<unsigned char> part(kPart);
        int count = 0;
        while (text.size() <= kMost && (count = avio_read(file.Io(), part.data(), kPart)) > 0)
            text.append(reinterpret_cast<const char*>(part.data()), static_cast<std::size_t>(count));
        if (text.size() > kMost)
            throw SourceError("it is too large for subtitles");
        if (file.Io()->error < 0)
            throw SourceError(av::ErrorText(file.Io()->error));
        return text;
    } catch (const std::system_error& error) {
        throw SourceError(fmt::format("cannot open \"{}\": {}", path, error.code().message()));
    }
}

/// Nothing when the text is none in that character set.
std::optional<std::string> Convert(const std::string& text, const std::string& charset) {
    const iconv_t converter = iconv_open("UTF-8", charset.c_str());
    if (converter == reinterpret_cast<iconv_t>(-1))
        throw SourceError(fmt::format("there is no character set \"{}\"", charset));
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

std::string ToUtf8(std::string text, const std::string& charset) {
    if (HasMark(text))
        return text;
    if (!charset.empty()) {
        if (std::optional<std::string> converted = Convert(text, charset))
            return std::move(*converted);
        throw SourceError(fmt::format("it is not in the character set \"{}\"", charset));
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
    const std::string converted = ToUtf8(text, "");
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

SubtitleFile::SubtitleFile(const std::string& path, const std::string& charset,
                           const std::shared_ptr<const Interruption>& interruption) {
    const auto refuse = [&](const std::string& reason) {
        throw SourceError(fmt::format("cannot read subtitles from \"{}\": {}", path, reason));
    };
    try {
        text_ = ToUtf8(ReadWhole(path, interruption), charset);
    } catch (const SourceError& error) {
        refuse(error.what());
    }
    constexpr int kBuffer = 4096;
    io_ = av::NewIo(kBuffer, false, this, Read, nullptr, Seek);
    av::Options settings;
    settings.AllowNoProtocol();
    settings.Set("format_whitelist", kTexts);
    AVFormatContext* context = avformat_alloc_context();
    if (context == nullptr)
        throw std::bad_alloc();
    context->pb = io_.get();
    const std::string url = "file:" + path; // the name helps to find the format
    const int result = avformat_open_input(&context, url.c_str(), nullptr, settings.Get());
    av::CheckMemory(result);
    if (result < 0)
        refuse("it holds none of text");
    input_.reset(context);
    if (context->nb_streams != 1 || context->streams[0]->codecpar->codec_type != AVMEDIA_TYPE_SUBTITLE)
        refuse("it holds none of text");
}

Demuxer::Beside SubtitleFile::Take() {
    av::Packet packet = av::NewPacket();
    const int result = av_read_frame(input_.get(), packet.get());
    av::CheckMemory(result);
    if (result < 0)
        return {nullptr, true};
    return {std::move(packet), false};
}

int SubtitleFile::Read(void* file, uint8_t* data, int size) {
    auto* self = static_cast<SubtitleFile*>(file);
    const auto count =
        static_cast<int>(std::min<int64_t>(size, static_cast<int64_t>(self->text_.size()) - self->position_));
    if (count <= 0)
        return AVERROR_EOF;
    std::copy_n(self->text_.data() + self->position_, count, data);
    self->position_ += count;
    return count;
}

int64_t SubtitleFile::Seek(void* file, int64_t offset, int whence) {
    auto* self = static_cast<SubtitleFile*>(file);
    const auto size = static_cast<int64_t>(self->text_.size());
    if (whence == AVSEEK_SIZE)
        return size;
    const int64_t target = offset + (whence == SEEK_CUR ? self->position_ : whence == SEEK_END ? size : 0);
    if (target < 0 || target > size)
        return AVERROR(EINVAL);
    return self->position_ = target;
}

} // namespace movieconv
