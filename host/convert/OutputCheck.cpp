#include "host/convert/OutputCheck.h"

#include "api/MovieConv.h"
#include "host/convert/Preview.h"
#include "host/terminal/ExitCode.h"
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
#include <sys/statvfs.h>
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

/// Refuses a name that the file system of its folder cannot take. `suffix` is what it gets behind it for a
/// while, if that is not shortened there.
void CheckName(const std::string& path, const std::string& suffix = "") {
    const std::string whole = path + suffix;
    const long most = pathconf(text::FolderOf(path).c_str(), _PC_NAME_MAX); // -1: no limit is known
    struct stat status {};
    const bool refused = lstat(whole.c_str(), &status) != 0 && errno == ENAMETOOLONG;
    const std::string name = NameOf(whole);
    if (refused || (most >= 0 && name.size() > static_cast<std::size_t>(most))) {
        throw Failure(
            ExitCode::kCannotWrite,
            fmt::format("the name \"{}\" is too long for its file system; choose a shorter one", path));
    }
}

/// Refuses a file that the conversion would replace.
void CheckTarget(const std::string& path, const struct stat* input, const Options& options) {
    struct stat target {};
    if (stat(path.c_str(), &target) != 0) {
        if (lstat(path.c_str(), &target) == 0) {
            throw Failure(
                ExitCode::kCannotWrite,
                fmt::format("\"{}\" is a link to a missing file; name that file, or remove the link", path));
        }
        return;
    }
    if (input != nullptr && SameFile(*input, target)) {
        throw Failure(ExitCode::kUsage,
                      fmt::format("\"{}\" is the source itself; give the output another name", path));
    }
    if (S_ISDIR(target.st_mode))
        throw Failure(ExitCode::kCannotWrite, fmt::format("\"{}\" is a folder; name a file in it", path));
    if (!S_ISREG(target.st_mode)) {
        throw Failure(ExitCode::kCannotWrite,
                      fmt::format("\"{}\" is not a file but a device or a pipe; name a file", path));
    }
    if (!options.overwrite) {
        throw Failure(ExitCode::kCannotWrite,
                      fmt::format("\"{}\" exists; use another name or --overwrite", path));
    }
}

void CheckFolder(const std::string& folder) {
    struct stat status {};
    if (stat(folder.c_str(), &status) != 0) {
        throw Failure(ExitCode::kCannotWrite, fmt::format("the output's folder \"{}\" cannot be used: {}",
                                                          folder, std::strerror(errno)));
    }
    if (!S_ISDIR(status.st_mode))
        throw Failure(ExitCode::kCannotWrite, fmt::format("\"{}\" is not a folder", folder));
    if (access(folder.c_str(), W_OK | X_OK) != 0) {
        throw Failure(ExitCode::kCannotWrite,
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
std::string LastClipNumber(const Options& options) {
    constexpr double kDay = 86400;
    return fmt::format("{:02}", std::llround(options.length.value_or(kDay) / *options.split));
}

void CheckClips(const Options& options, const struct stat* input) {
    const std::string name = NameOf(options.output);
    const auto [base, extension] = SplitName(name);
    if (base.empty() || extension.empty()) {
        throw Failure(
            ExitCode::kUsage,
            fmt::format("with --split the output needs an extension, as in \"{}.mp4\"", options.output));
    }
    const std::size_t pathCharacters = text::FromUtf8(options.output).size();
    if (pathCharacters + kClipNumberRoom > MC_MAX_TARGET_NAME || extension.size() > kLongestClipExtension) {
        throw Failure(
            ExitCode::kUsage,
            fmt::format("the name \"{}\" is too long to number clips; choose a shorter one", options.output));
    }
    const std::string folder = text::FolderOf(options.output);
    CheckName(fmt::format("{}/{}_{}{}", folder, base, LastClipNumber(options), extension));
    const std::unique_ptr<DIR, int (*)(DIR*)> listing(opendir(folder.c_str()), closedir);
    while (const dirent* entry = listing ? readdir(listing.get()) : nullptr)
        if (IsClipName(entry->d_name, base, extension))
            CheckTarget(folder + "/" + entry->d_name, input, options);
}

bool AreSame(const std::string& path, const std::string& other) {
    struct stat a {};
    struct stat b {};
    return stat(path.c_str(), &a) == 0 && stat(other.c_str(), &b) == 0 && SameFile(a, b);
}

/// Whether a file of that name is or becomes the output, a clip of it, or what they are called until they are
/// complete.
bool IsOutput(const std::string& path, const Options& options) {
    if (AreSame(path, options.output))
        return true;
    if (!AreSame(text::FolderOf(path), text::FolderOf(options.output)))
        return false;
    std::string name = NameOf(path);
    for (const std::string_view suffix : {".joined.part", ".part"})
        if (name.size() > suffix.size() && name.ends_with(suffix))
            name.resize(name.size() - suffix.size());
    const std::string output = NameOf(options.output);
    const auto [base, extension] = SplitName(output);
    return name == output || (options.split && IsClipName(name, base, extension));
}

void CheckSideFile(const char* option, const std::string& path, const Options& options) {
    const char* other = AreSame(path, options.input)                         ? "the source"
                        : !options.output.empty() && IsOutput(path, options) ? "the output or a part of it"
                                                                             : nullptr;
    if (other != nullptr) {
        throw Failure(ExitCode::kUsage,
                      fmt::format("{} \"{}\" is {}; give it another name", option, path, other));
    }
}

} // namespace

int64_t FreeBytes(const std::string& folder) {
    struct statvfs status {};
    if (statvfs(folder.c_str(), &status) != 0 || status.f_blocks == 0)
        return -1;
    return static_cast<int64_t>(status.f_bavail) * static_cast<int64_t>(status.f_frsize);
}

void CheckOutput(const Options& options) {
    struct stat inputStatus {};
    const struct stat* input = stat(options.input.c_str(), &inputStatus) == 0 ? &inputStatus : nullptr;
    CheckFolder(text::FolderOf(options.output));
    if (options.split) {
        CheckClips(options, input);
    } else {
        CheckName(options.output);
        CheckTarget(options.output, input, options);
    }
}

void CheckSideFiles(const Options& options) {
    if (options.log)
        CheckSideFile("--log", *options.log, options);
    if (options.preview) {
        CheckSideFile("--preview", *options.preview, options);
        CheckName(*options.preview, ".part1000");
        CheckPreview(*options.preview, options.overwrite);
    }
    if (options.log && options.preview &&
        (*options.log == *options.preview || AreSame(*options.log, *options.preview)))
        throw Failure(ExitCode::kUsage, "--log and --preview name the same file");
}

} // namespace movieconv
