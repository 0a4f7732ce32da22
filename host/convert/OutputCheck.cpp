#include "host/convert/OutputCheck.h"

#include "api/MovieConv.h"
#include "host/convert/Failure.h"
#include "text/FileNames.h"
#include "text/Path.h"
#include "text/Utf8.h"

#include <algorithm>
#include <cerrno>
#include <charconv>
#include <cmath>
#include <cstring>
#include <dirent.h>
#include <fmt/format.h>
#include <memory>
#include <optional>
#include <set>
#include <string_view>
#include <sys/stat.h>
#include <unistd.h>

namespace movieconv {
namespace {

constexpr std::size_t kClipNumberRoom = 12; // "_" and the number

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

/// The number of the clip of `output` that has this name; nothing when none has it.
std::optional<std::size_t> ClipNumber(std::string_view name, std::string_view output) {
    const auto [base, extension] = text::SplitName(output);
    std::size_t number = 0;
    const char* digits = name.data() + std::min(base.size() + 1, name.size());
    const bool isClip = std::from_chars(digits, name.data() + name.size(), number).ec == std::errc() &&
                        name == text::ClipName(output, number);
    return isClip ? std::optional(number) : std::nullopt;
}

/// The numbers of the clips of the output `name` that are in its folder. A folder that cannot be listed holds
/// none as far as one can tell.
std::set<std::size_t> ClipsIn(const std::string& folder, const std::string& name) {
    std::set<std::size_t> numbers;
    const std::unique_ptr<DIR, int (*)(DIR*)> listing(opendir(folder.c_str()), closedir);
    while (const dirent* entry = listing ? readdir(listing.get()) : nullptr)
        if (const std::optional<std::size_t> number = ClipNumber(entry->d_name, name))
            numbers.insert(*number);
    return numbers;
}

/// The last clip's number; of a source of unknown length as if it lasted a day.
std::size_t LastClip(const Request& request) {
    constexpr double kDay = 86400;
    return static_cast<std::size_t>(std::llround(request.length.value_or(kDay) / *request.split));
}

void CheckClips(const Request& request, const struct stat* input) {
    const std::string name = text::NameOf(request.output);
    const auto [base, extension] = text::SplitName(std::string_view(name));
    if (base.empty() || extension.empty()) {
        throw Failure(
            Category::kRequest,
            fmt::format("the name of a split output needs an extension, as in \"{}.mp4\"", request.output));
    }
    const std::size_t pathCharacters = text::FromUtf8(request.output).size();
    if (pathCharacters + kClipNumberRoom > MC_MAX_TARGET_NAME ||
        extension.size() > text::kLongestClipExtension) {
        throw Failure(
            Category::kRequest,
            fmt::format("the name \"{}\" is too long to number clips; choose a shorter one", request.output));
    }
    const std::string folder = text::FolderOf(request.output);
    CheckName(folder + "/" + text::ClipName(std::string_view(name), LastClip(request)));
    for (const std::size_t number : ClipsIn(folder, name)) // the first one is what a refusal names
        CheckTarget(folder + "/" + text::ClipName(std::string_view(name), number), input, request);
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
    std::string name = text::NameOf(path);
    if (name.size() > text::kPartialSuffix.size() && name.ends_with(text::kPartialSuffix))
        name.resize(name.size() - text::kPartialSuffix.size());
    const std::string output = text::NameOf(request.output);
    return name == output || (request.split && ClipNumber(name, output));
}

void CheckName(const std::string& path, const std::string& suffix) {
    const std::string whole = path + suffix;
    const long most = pathconf(text::FolderOf(path).c_str(), _PC_NAME_MAX); // -1: no limit is known
    struct stat status {};
    const bool refused = lstat(whole.c_str(), &status) != 0 && errno == ENAMETOOLONG;
    const std::string name = text::NameOf(whole);
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
