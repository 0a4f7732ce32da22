#include "host/terminal/Preview.h"

#include "ffmpeg/AvHandles.h"
#include "host/convert/Failure.h"
#include "text/FileNames.h"

extern "C" {
#include <libavutil/crc.h>
}

#include <cerrno>
#include <chrono>
#include <cstdio>
#include <cstring>
#include <fmt/format.h>
#include <memory>
#include <new>
#include <sys/stat.h>
#include <system_error>
#include <utility>

namespace movieconv {
namespace {

constexpr std::chrono::seconds kPictureInterval{1};
constexpr std::size_t kPngHead = 33; // signature and header chunk, which come first

/// The text chunk behind the head by which our pictures are known again.
const std::string& Mark() {
    static const std::string mark = [] {
        std::string chunk("tEXtSoftware\0MovieConv preview", 30);
        const AVCRC* table = av_crc_get_table(AV_CRC_32_IEEE_LE);
        const uint32_t crc =
            ~av_crc(table, UINT32_MAX, reinterpret_cast<const uint8_t*>(chunk.data()), chunk.size());
        const auto bigEndian = [](uint32_t value) {
            return std::string{static_cast<char>(value >> 24), static_cast<char>(value >> 16),
                               static_cast<char>(value >> 8), static_cast<char>(value)};
        };
        return bigEndian(static_cast<uint32_t>(chunk.size()) - 4) + chunk + bigEndian(crc);
    }();
    return mark;
}

bool WriteMarked(std::FILE* file, const AVPacket& png) {
    const auto rest = static_cast<std::size_t>(png.size) - kPngHead;
    return std::fwrite(png.data, 1, kPngHead, file) == kPngHead &&
           std::fwrite(Mark().data(), 1, Mark().size(), file) == Mark().size() &&
           std::fwrite(png.data + kPngHead, 1, rest, file) == rest;
}

FileId IdOf(std::FILE* file) {
    struct stat status {};
    fstat(fileno(file), &status);
    return {status.st_dev, status.st_ino};
}

/// Blue, green, red, 255, top row first, to the red, green, blue that PNG wants.
av::Frame ToRgb(const std::vector<uint8_t>& bgra, int width, int height) {
    av::Frame frame = av::NewFrame();
    frame->format = AV_PIX_FMT_RGB24;
    frame->width = width;
    frame->height = height;
    if (av_frame_get_buffer(frame.get(), 0) < 0)
        return nullptr;
    const uint8_t* source = bgra.data();
    for (int y = 0; y < height; ++y) {
        uint8_t* target = frame->data[0] + static_cast<ptrdiff_t>(y) * frame->linesize[0];
        for (int x = 0; x < width; ++x, source += 4, target += 3) {
            target[0] = source[2];
            target[1] = source[1];
            target[2] = source[0];
        }
    }
    return frame;
}

av::Packet EncodePng(const AVFrame& frame) {
    const AVCodec* codec = avcodec_find_encoder(AV_CODEC_ID_PNG);
    const av::CodecContext context(codec != nullptr ? avcodec_alloc_context3(codec) : nullptr);
    av::Packet packet = av::NewPacket();
    if (!context)
        return nullptr;
    context->width = frame.width;
    context->height = frame.height;
    context->pix_fmt = AV_PIX_FMT_RGB24;
    context->time_base = {1, 1};
    context->thread_count = 1;
    context->compression_level = 1;
    const bool encoded = avcodec_open2(context.get(), codec, nullptr) >= 0 &&
                         avcodec_send_frame(context.get(), &frame) >= 0 &&
                         avcodec_receive_packet(context.get(), packet.get()) >= 0;
    return encoded ? std::move(packet) : nullptr;
}

/// A new file beside `path`, whose name goes to `temporary`. Null with errno set.
std::FILE* CreateBeside(const std::string& path, std::string& temporary) {
    std::FILE* file = nullptr;
    for (int number = 1; number <= text::kMostPartials && file == nullptr; ++number) {
        temporary = path + text::PartialSuffix(number);
        file = std::fopen(temporary.c_str(), "wbxe");
        if (file == nullptr && errno != EEXIST)
            break;
    }
    return file;
}

} // namespace

std::optional<FileId> CheckPreview(const std::string& path, bool overwrite) {
    try {
        const SideFile file = LookAtSideFile(path, Mark(), kPngHead);
        RequireWritable(file, "--preview", path, "a preview", overwrite);
        return file.kind == SideFile::Kind::kMissing ? std::nullopt : std::optional(file.id);
    } catch (const std::system_error& error) {
        throw Failure(Category::kOutput, fmt::format("--preview \"{}\" cannot be looked at: {}", path,
                                                     std::strerror(error.code().value())));
    }
}

Preview::Preview(std::string path, bool overwrite)
    : path_(std::move(path)), replaceable_(CheckPreview(path_, overwrite)), thread_(&Preview::Run, this) {}

Preview::~Preview() {
    Join();
}

void Preview::Offer(std::shared_ptr<const ShownPicture> picture) noexcept {
    {
        const std::lock_guard lock(mutex_);
        latest_ = std::move(picture);
    }
    changed_.notify_all();
}

void Preview::Join() {
    {
        const std::lock_guard lock(mutex_);
        finishing_ = true;
    }
    changed_.notify_all();
    if (thread_.joinable())
        thread_.join();
}

std::string Preview::Finish() {
    Join();
    return failure_.empty() ? failure_ : fmt::format("cannot write the preview \"{}\": {}", path_, failure_);
}

void Preview::Run() {
    std::unique_lock lock(mutex_);
    for (;;) {
        changed_.wait(lock, [&] { return latest_ || finishing_; });
        if (!latest_)
            return;
        const std::shared_ptr<const ShownPicture> picture = std::move(latest_);
        lock.unlock();
        try {
            Write(*picture);
        } catch (const std::bad_alloc&) {
            failure_ = "no memory"; // short enough to need none
        }
        lock.lock();
        changed_.wait_for(lock, kPictureInterval, [&] { return finishing_; });
    }
}

/// Empty on success, else what went wrong.
std::string Preview::ReplaceFile(const AVPacket& content) {
    std::string temporary;
    std::FILE* file = CreateBeside(path_, temporary);
    if (file == nullptr)
        return std::strerror(errno);
    const FileId written = IdOf(file);
    std::string reason;
    if (!WriteMarked(file, content))
        reason = std::strerror(errno);
    if (std::fclose(file) != 0 && reason.empty())
        reason = std::strerror(errno);
    if (reason.empty()) {
        const int error = ReplaceExpected(temporary, path_, replaceable_);
        reason = error == 0        ? ""
                 : error == EEXIST ? "another file has come there meanwhile"
                                   : std::strerror(error);
    }
    if (reason.empty())
        replaceable_ = written;
    else
        std::remove(temporary.c_str());
    return reason;
}

void Preview::Write(const ShownPicture& picture) {
    const av::Frame rgb = ToRgb(picture.bgra, picture.width, picture.height);
    const av::Packet png = rgb ? EncodePng(*rgb) : nullptr;
    std::string reason = png ? ReplaceFile(*png) : "the picture could not be encoded";
    if (failure_.empty())
        failure_ = std::move(reason);
}

} // namespace movieconv
