#include "host/pieces/WholeFile.h"

#include "host/convert/Failure.h"
#include "text/Descriptor.h"
#include "text/LastingFile.h"
#include "text/Path.h"
#include "text/WriteAll.h"

#include <algorithm>
#include <array>
#include <cerrno>
#include <cstring>
#include <fcntl.h>
#include <fmt/format.h>
#include <sys/stat.h>
#include <unistd.h>

namespace movieconv {
namespace {

constexpr std::string_view kMaking = ".making-";

Failure CannotWrite(const std::string& path) {
    const bool full = errno == ENOSPC || errno == EDQUOT;
    return {full ? Category::kNoSpace : Category::kOutput,
            fmt::format("cannot write \"{}\": {}", path, std::strerror(errno))};
}

} // namespace

std::string ReadWhole(const std::string& path, int64_t most) {
    const auto refuse = [&](const std::string& why) {
        return Failure(Category::kSource, fmt::format("cannot read \"{}\": {}", path, why));
    };
    const text::Descriptor file(open(path.c_str(), O_RDONLY | O_CLOEXEC | O_NONBLOCK));
    struct stat status {};
    if (file.Number() < 0 || fstat(file.Number(), &status) != 0)
        throw refuse(std::strerror(errno));
    if (!S_ISREG(status.st_mode))
        throw refuse("it is not a file");
    std::string text;
    std::array<char, 65536> buffer{};
    for (;;) {
        const ssize_t count = read(file.Number(), buffer.data(), buffer.size());
        if (count < 0 && errno == EINTR)
            continue;
        if (count < 0)
            throw refuse(std::strerror(errno));
        if (count == 0)
            return text;
        text.append(buffer.data(), static_cast<std::size_t>(count));
        if (static_cast<int64_t>(text.size()) > most)
            throw refuse("it is too large");
    }
}

void WriteWhole(const std::string& path, std::string_view text) {
    if (!text::ReplaceLastingly(path, NameInTheMaking(path), text, 0666))
        throw CannotWrite(path);
}

bool WriteNew(const std::string& path, std::string_view text) {
    if (text::AddLastingly(path, NameInTheMaking(path), text, 0666))
        return true;
    if (errno == EEXIST)
        return false;
    throw CannotWrite(path);
}

void AppendWhole(const std::string& path, std::string_view text) {
    text::Descriptor file(
        open(path.c_str(), O_WRONLY | O_CREAT | O_APPEND | O_NOFOLLOW | O_NONBLOCK | O_CLOEXEC, 0666));
    if (file.Number() < 0 || !text::WriteAll(file.Number(), text) || fsync(file.Number()) != 0 ||
        !file.Close())
        throw CannotWrite(path);
}

std::string NameInTheMaking(const std::string& path) {
    std::array<char, 65> host{};
    gethostname(host.data(), host.size() - 1);
    return fmt::format("{}{}{}-{}", path, kMaking, host.data(), getpid());
}

bool IsInTheMaking(const std::filesystem::path& file, const std::string& path) {
    const std::string prefix = text::NameOf(path) + std::string(kMaking);
    const std::string name = file.filename().string();
    const std::size_t number = name.find_last_not_of("0123456789") + 1;
    return name.compare(0, prefix.size(), prefix) == 0 && number > prefix.size() && number < name.size() &&
           name[number - 1] == '-';
}

bool BeginsLike(const std::filesystem::path& file, std::string_view head) {
    const text::Descriptor opened(open(file.c_str(), O_RDONLY | O_CLOEXEC | O_NONBLOCK));
    struct stat status {};
    if (opened.Number() < 0 || fstat(opened.Number(), &status) != 0 || !S_ISREG(status.st_mode))
        return false;
    const auto length = std::min(head.size(), static_cast<std::size_t>(status.st_size));
    std::string beginning(length, ' ');
    return pread(opened.Number(), beginning.data(), length, 0) == static_cast<ssize_t>(length) &&
           beginning == head.substr(0, length);
}

std::vector<std::filesystem::path> FilesThatBegin(const std::string& path) {
    std::vector<std::filesystem::path> found;
    const std::string prefix = text::NameOf(path);
    std::error_code error;
    const std::filesystem::directory_iterator end;
    for (std::filesystem::directory_iterator file(text::FolderOf(path), error); !error && file != end;
         file.increment(error))
        if (file->path().filename().string().compare(0, prefix.size(), prefix) == 0)
            found.push_back(file->path());
    return found;
}

} // namespace movieconv
