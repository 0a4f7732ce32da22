#include "host/source/SubtitleFile.h"

#include "host/sentence/Say.h"
#include "host/source/Charset.h"
#include "host/source/InputFile.h"
#include "host/source/SourceError.h"

#include <algorithm>
#include <cerrno>
#include <cstdio>
#include <new>
#include <system_error>
#include <utility>
#include <vector>

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
            throw SourceError(Say("it is too large for subtitles"));
        if (file.Io()->error < 0)
            throw SourceError(Sentence(av::ErrorText(file.Io()->error)));
        return text;
    } catch (const std::system_error& error) {
        throw SourceError(Say("cannot open \"{}\": {}", path, error.code().message()));
    }
}

} // namespace

SubtitleFile::SubtitleFile(const std::string& path, const std::string& charset,
                           const std::shared_ptr<const Interruption>& interruption) {
    const auto refuse = [&](const Sentence& reason) {
        throw SourceError(Say("cannot read subtitles from \"{}\": {}", path, reason));
    };
    try {
        text_ = Decoded(ReadWhole(path, interruption), charset);
    } catch (const SourceError& error) {
        refuse(error.Words());
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
        refuse(Say("it holds none of text"));
    input_.reset(context);
    if (context->nb_streams != 1 || context->streams[0]->codecpar->codec_type != AVMEDIA_TYPE_SUBTITLE)
        refuse(Say("it holds none of text"));
}

av::Packet SubtitleFile::Take() {
    av::Packet packet = av::NewPacket();
    const int result = av_read_frame(input_.get(), packet.get());
    av::CheckMemory(result);
    return result < 0 ? nullptr : std::move(packet);
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
