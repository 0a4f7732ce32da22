#include "host/convert/OutputCheck.h"

#include "api/MovieConv.h"
#include "host/convert/Failure.h"
#include "text/Path.h"
#include "text/Utf8.h"

#include <algorithm>
#include <cerrno>
#include <cmath>
#include <cstring>
#include <dirent.h>
#include <fmt/format.h>
#include <memory>
#include <string_view>
#include <sys/stat.h>
#include <unistd.h>
#include <utility>

namespace movieconv {
namespace {

constexpr std::size_t kLongestClipExtension = 19; // the engine's limit, in characters
constexpr std::size_t kClipNumberRoom = 12;       // "_" and the number

std::string NameOf(const std::string& path) {
    return path.substr(path.rfind('/') + 1);
}

bool SameFile(const struct stat& a, const struct stat& b) {
    return a.st_dev == b.st_dev && a.st_ino == b.st_ino;
}

/// Refuses a file that the conversion would replace.
void CheckTarget(const std::string& path, const struct stat* input, const Request& request) {
    struct stat target {};
    if (stat(path.c_str(), &target) != 0) {
        if (lstat(path.c_str(), &target) == 0) {
            throw Failure(
                Category::kOutput,
                fmt::format("\"{}\" is a link to a missing file; name that file, or remove the link", path));
        }
        return;
    }
    if (input != nullptr && SameFile(*input, target)) {
        throw Failure(Category::kRequest,
                      fmt::format("\"{}\" is the source itself; give the output another name", path));
    }
    if (S_ISDIR(target.st_mode))
        throw Failure(Category::kOutput, fmt::format("\"{}\" is a folder; name a file in it", path));
    if (!S_ISREG(target.st_mode)) {
        throw Failure(Category::kOutput,
                      fmt::format("\"{}\" is not a file but a device or a pipe; name a file", path));
    }
    if (!request.overwrite) {
        throw Failure(Category::kOutput, fmt::format("\"{}\" exists", path), Reason::kExists);
    }
}

void CheckFolder(const std::string& folder) {
    struct stat status {};
    if (stat(folder.c_str(), &status) != 0) {
        throw Failure(Category::kOutput, fmt::format("the output's folder \"{}\" cannot be used: {}", folder,
                                                     std::strerror(errno)));
    }
    if (!S_ISDIR(status.st_mode))
        throw Failure(Category::kOutput, fmt::format("\"{}\" is not a folder", folder));
    if (access(folder.c_str(), W_OK | X_OK) != 0) {
        throw Failure(Category::kOutput,
                      fmt::format("cannot create files in \"{}\": {}; choose another folder", folder,
                                  std::strerror(errno)));
    }
}

/// The name up to its last dot, and the rest.
std::pair<std::string_view, std::string_view> SplitName(std::string_view name) {
    const std::size_t dot = std::min(name.rfind('.'), name.size());
    return {name.substr(0, dot), name.substr(dot)};
}

/// Whether `name` is a clip name made of `base` and `extension`: base_00.ext and so on.
bool IsClipName(std::string_view name, std::string_view base, std::string_view extension) {
    const std::size_t frame = base.size() + 1 + extension.size();
    if (name.size() < frame + 2 || name.substr(0, base.size()) != base || name[base.size()] != '_' ||
        name.substr(name.size() - extension.size()) != extension)
        return false;
    const std::string_view number = name.substr(base.size() + 1, name.size() - frame);
    return std::all_of(number.begin(), number.end(), [](char c) { return c >= '0' && c <= '9'; });
}

/// The last clip's number as the engine writes it; of a source of unknown length as if it lasted a day.
std::string LastClipNumber(const Request& request) {
    constexpr double kDay = 86400;
    return fmt::format("{:02}", std::llround(request.length.value_or(kDay) / *request.split));
}

void CheckClips(const Request& request, const struct stat* input) {
    const std::string name = NameOf(request.output);
    const auto [base, extension] = SplitName(name);
    if (base.empty() || extension.empty()) {
        throw Failure(
            Category::kRequest,
            fmt::format("the name of a split output needs an extension, as in \"{}.mp4\"", request.output));
    }
    const std::size_t pathCharacters = text::FromUtf8(request.output).size();
    if (pathCharacters + kClipNumberRoom > MC_MAX_TARGET_NAME || extension.size() > kLongestClipExtension) {
        throw Failure(
            Category::kRequest,
            fmt::format("the name \"{}\" is too long to number clips; choose a shorter one", request.output));
    }
    const std::string folder = text::FolderOf(request.output);
    CheckName(fmt::format("{}/{}_{}{}", folder, base, LastClipNumber(request), extension));
    const std::unique_ptr<DIR, int (*)(DIR*)> listing(opendir(folder.c_str()), closedir);
    while (const dirent* entry = listing ? readdir(listing.get()) : nullptr)
        if (IsClipName(entry->d_name, base, extension))
            CheckTarget(folder + "/" + entry->d_name, input, request);
}

} // namespace

bool AreSame(const std::string& path, const std::string& other) {
    struct stat a {};
    struct stat b {};
    return stat(path.c_str(), &a) == 0 && stat(other.c_str(), &b) == 0 && SameFile(a, b);
}

bool IsOutput(const std::string& path, const Request& request) {
    if (AreSame(path, request.output))
        return true;
    if (!AreSame(text::FolderOf(path), text::FolderOf(request.output)))
        return false;
    std::string name = NameOf(path);
    constexpr std::string_view kSuffix = ".part";
    if (name.size() > kSuffix.size() && name.ends_with(kSuffix))
        name.resize(name.size() - kSuffix.size());
    const std::string output = NameOf(request.output);
    const auto [base, extension] = SplitName(output);
    return name == output || (request.split && IsClipName(name, base, extension));
}

void CheckName(const std::string& path, const std::string& suffix) {
    const std::string whole = path + suffix;
    const long most = pathconf(text::FolderOf(path).c_str(), _PC_NAME_MAX); // -1: no limit is known
    struct stat status {};
    const bool refused = lstat(whole.c_str(), &status) != 0 && errno == ENAMETOOLONG;
    const std::string name = NameOf(whole);
    if (refused || (most >= 0 && name.size() > static_cast<std::size_t>(most))) {
        throw Failure(
            Category::kOutput,
            fmt::format("the name \"{}\" is too long for its file system; choose a shorter one", path));
    }
}

void CheckOutput(const Request& request) {
    struct stat inputStatus {};
    const struct stat* input = stat(request.input.c_str(), &inputStatus) == 0 ? &inputStatus : nullptr;
    CheckFolder(text::FolderOf(request.output));
    if (request.split) {
        CheckClips(request, input);
    } else {
        CheckName(request.output);
        CheckTarget(request.output, input, request);
    }
}

} // namespace movieconv
