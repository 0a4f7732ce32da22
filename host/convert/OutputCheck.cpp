#include "host/convert/OutputCheck.h"

#include "api/MovieConv.h"
#include "host/convert/Failure.h"
#include "host/sentence/Say.h"
#include "text/FileNames.h"
#include "text/Path.h"
#include "text/Utf8.h"

#include <algorithm>
#include <cerrno>
#include <charconv>
#include <cmath>
#include <cstring>
#include <dirent.h>
#include <iterator>
#include <memory>
#include <optional>
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
void CheckTarget(const std::string& path, const Request& request) {
    struct stat target {};
    if (stat(path.c_str(), &target) != 0) {
        if (lstat(path.c_str(), &target) == 0) {
            throw Failure(
                Category::kOutput,
                Say("\"{}\" is a link to a missing file; name that file, or remove the link", path));
        }
        return;
    }
    if (const Sentence role = WhatIsReadFrom(path, request); !role.IsEmpty())
        throw Failure(Category::kRequest, Say("\"{}\" is {}; give the output another name", path, role));
    if (S_ISDIR(target.st_mode))
        throw Failure(Category::kOutput, Say("\"{}\" is a folder; name a file in it", path));
    if (!S_ISREG(target.st_mode)) {
        throw Failure(Category::kOutput,
                      Say("\"{}\" is not a file but a device or a pipe; name a file", path));
    }
    if (!request.overwrite) {
        throw Failure(Category::kOutput, Say("\"{}\" exists", path), Reason::kExists);
    }
}

void CheckFolder(const std::string& folder) {
    struct stat status {};
    if (stat(folder.c_str(), &status) != 0) {
        throw Failure(Category::kOutput,
                      Say("the output's folder \"{}\" cannot be used: {}", folder, std::strerror(errno)));
    }
    if (!S_ISDIR(status.st_mode))
        throw Failure(Category::kOutput, Say("\"{}\" is not a folder", folder));
    if (access(folder.c_str(), W_OK | X_OK) != 0) {
        throw Failure(Category::kOutput, Say("cannot create files in \"{}\": {}; choose another folder",
                                             folder, std::strerror(errno)));
    }
}

/// The number of the clip of `output` that has that name.
std::optional<int> ClipNumber(std::string_view name, std::string_view output) {
    const auto [base, extension] = text::SplitName(output);
    int number = 0;
    const char* digits = name.data() + std::min(base.size() + 1, name.size());
    const bool isNumber = std::from_chars(digits, name.data() + name.size(), number).ec == std::errc();
    return isNumber && number >= 0 && name == text::ClipName(output, static_cast<std::size_t>(number))
               ? std::optional(number)
               : std::nullopt;
}

/// The last clip's number; of a source of unknown length as if it lasted a day.
std::size_t LastClip(const Request& request) {
    constexpr double kDay = 86400;
    return static_cast<std::size_t>(std::llround(request.length.value_or(kDay) / *request.split));
}

void CheckClips(const Request& request) {
    const std::string name = text::NameOf(request.output);
    const auto [base, extension] = text::SplitName(std::string_view(name));
    if (base.empty() || extension.empty()) {
        throw Failure(Category::kRequest, Say("the name of a split output needs an extension, as in \"{}\"",
                                              request.output + ".mp4"));
    }
    const std::size_t pathCharacters = text::FromUtf8(request.output).size();
    if (pathCharacters + kClipNumberRoom > MC_MAX_TARGET_NAME ||
        extension.size() > text::kLongestClipExtension) {
        throw Failure(
            Category::kRequest,
            Say("the name \"{}\" is too long to number clips; choose a shorter one", request.output));
    }
    const std::string folder = text::FolderOf(request.output);
    CheckName(folder + "/" + text::ClipName(std::string_view(name), LastClip(request)));
    for (const auto& [number, clip] : ClipsOf(request.output))
        CheckTarget(clip, request);
}

} // namespace

bool AreSame(const std::string& path, const std::string& other) {
    struct stat a {};
    struct stat b {};
    return stat(path.c_str(), &a) == 0 && stat(other.c_str(), &b) == 0 && SameFile(a, b);
}

std::map<int, std::string> ClipsOf(const std::string& output) {
    const std::string name = text::NameOf(output);
    const std::string folder = text::FolderOf(output);
    std::map<int, std::string> clips;
    const std::unique_ptr<DIR, int (*)(DIR*)> listing(opendir(folder.c_str()), closedir);
    while (const dirent* entry = listing ? readdir(listing.get()) : nullptr)
        if (const std::optional<int> number = ClipNumber(entry->d_name, name))
            clips.emplace(*number, folder + "/" + entry->d_name);
    return clips;
}

std::optional<Warning> OlderClips(const std::string& output, int firstFree) {
    const std::map<int, std::string> clips = ClipsOf(output);
    const auto first = clips.lower_bound(firstFree);
    const auto count = std::distance(first, clips.end());
    if (count == 0)
        return std::nullopt;
    return Warning{
        Warning::Kind::kOlderClips,
        SayCounted(count, Say("\"{}\" of an earlier conversion stays beside the new clips", first->second),
                   Say("\"{}\" to \"{}\" of an earlier conversion stay beside the new clips", first->second,
                       clips.rbegin()->second))};
}

Sentence WhatIsReadFrom(const std::string& path, const Request& request) {
    if (AreSame(path, request.input))
        return Say("the source itself");
    const auto isPath = [&path](const SubtitleFileWish& wish) { return AreSame(path, wish.path); };
    const bool isText = std::any_of(request.subtitleFiles.begin(), request.subtitleFiles.end(), isPath) ||
                        AreSame(path, request.burnSubtitles);
    return isText ? Say("a file of subtitles that is read") : Sentence();
}

void RemoveUnfinished(const std::string& output, const Request& request) {
    const std::string left = output + text::PartialSuffix(1);
    if (WhatIsReadFrom(left, request).IsEmpty())
        unlink(left.c_str());
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
        throw Failure(Category::kOutput,
                      Say("the name \"{}\" is too long for its file system; choose a shorter one", path));
    }
}

void CheckOutput(const Request& request) {
    CheckFolder(text::FolderOf(request.output));
    if (request.split) {
        CheckClips(request);
    } else {
        CheckName(request.output);
        CheckTarget(request.output, request);
    }
}

} // namespace movieconv
