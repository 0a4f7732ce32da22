#include "host/pieces/ClipJournal.h"

#include "host/convert/Failure.h"
#include "host/convert/OutputCheck.h"
#include "host/pieces/CheckedLine.h"
#include "host/pieces/FileBirth.h"
#include "host/pieces/MarkText.h"
#include "host/pieces/OutputNames.h"
#include "host/pieces/PlanChecks.h"
#include "host/pieces/WholeFile.h"
#include "text/Path.h"

#include <algorithm>
#include <filesystem>
#include <fmt/format.h>
#include <map>
#include <sstream>
#include <stdexcept>
#include <string_view>
#include <unistd.h>
#include <vector>

namespace movieconv {
namespace {

constexpr int kClipListVersion = 1;
constexpr int64_t kLargestClipList = 256 << 20;
constexpr std::string_view kClipListHead = "{\"version\":"; // with which Header begins
constexpr const char* kOpened = "opened";

/// By which a finished clip is known again, wherever its folder is now.
Json MarkOfClip(const std::string& path) {
    Json mark = MarkAsJson(MarkOf(path));
    mark.erase("path");
    return mark;
}

std::string FirstLine(const std::string& text) {
    return text.substr(0, text.find('\n'));
}

/// BirthOf a clip, on a line that tells nothing else.
std::optional<std::string> OpenedOn(const std::string& line) {
    const std::optional<Json> json = ObjectOn(line);
    if (json && json->size() == 1 && json->contains(kOpened) && json->at(kOpened).is_string())
        return json->at(kOpened).get<std::string>();
    return std::nullopt;
}

bool IsHeader(const std::optional<Json>& line) {
    const auto isObject = [&line](const char* part) {
        return line->contains(part) && line->at(part).is_object();
    };
    return line && line->value("version", Json()) == kClipListVersion && isObject("madeWith") &&
           isObject("source") && isObject("settings");
}

} // namespace

ClipJournal::ClipJournal(const Request& request) : request_(request), path_(ClipListFor(request.output)) {}

bool ClipJournal::Exists() const {
    std::error_code unknown; // a link that leads nowhere is there, too
    return exists(std::filesystem::symlink_status(path_, unknown));
}

void ClipJournal::RequirePlace() const {
    const auto isList = [this] {
        try {
            return IsHeader(ObjectOn(FirstLine(ReadWhole(path_, kLargestClipList))));
        } catch (const Failure&) {
            return false;
        }
    };
    if (Exists() && !isList())
        throw Failure(Category::kOutput,
                      fmt::format("the list of clips would replace another file, \"{}\"; give "
                                  "the output another name, or remove that file",
                                  path_));
}

bool ClipJournal::IsPossible() const {
    std::error_code error;
    return !request_.playlists && std::filesystem::is_regular_file(request_.input, error);
}

std::string ClipJournal::Header() const {
    Request request = request_;
    const std::vector<SourceMark> texts = MarkTexts(request);
    Json settings = WishesAsJson(request);
    settings["split"] = *request.split;
    settings["texts"] = MarksAsJson(texts);
    return CheckedLine({{"version", kClipListVersion},
                        {"madeWith", CurrentVersions()},
                        {"source", MarkAsJson(MarkOf(request_.input))},
                        {"settings", settings}});
}

std::optional<ClipStart> ClipJournal::Leftover() {
    if (!Exists())
        return std::nullopt;
    std::istringstream lines(ReadWhole(path_, kLargestClipList));
    std::string line;
    std::getline(lines, line);
    const std::optional<Json> header = ObjectOn(line);
    if (!IsHeader(header))
        throw Failure(Category::kRequest, fmt::format("\"{}\" is damaged, or no list of clips", path_),
                      Reason::kCannotResume);
    const Json now = Json::parse(Header());
    if (const std::string what = DifferenceIn(*header, now, {"madeWith", "source", "settings"});
        !what.empty())
        throw Failure(Category::kRequest, fmt::format("\"{}\" is of another conversion: {}", path_, what),
                      Reason::kCannotResume);
    kept_ = line + "\n";
    std::optional<ClipStart> next;
    bool follows = true;
    while (std::getline(lines, line)) {
        if (const std::optional<std::string> opened = OpenedOn(line)) {
            births_.insert(*opened);
            continue;
        }
        const std::optional<Entry> entry = EntryOn(line);
        follows = follows && entry && IsFinished(*entry);
        if (follows) {
            kept_ += line + "\n";
            next = entry->next;
        } else if (entry) {
            further_.push_back(*entry);
        }
        if (entry)
            births_.insert(entry->opened);
    }
    next_ = next ? next->number : 0;
    return next;
}

bool ClipJournal::IsOurs(const std::string& clip) const {
    return births_.count(BirthOf(clip)) > 0 ||
           std::any_of(further_.begin(), further_.end(), [&](const Entry& entry) {
               return entry.clip == text::NameOf(clip) && MarkOfClip(clip) == entry.mark;
           });
}

bool ClipJournal::HasClips() const {
    const std::map<int, std::string> clips = ClipsOf(request_.output);
    return std::any_of(clips.begin(), clips.end(), [this](const auto& clip) { return IsOurs(clip.second); });
}

std::optional<ClipJournal::Entry> ClipJournal::EntryOn(const std::string& line) {
    const std::optional<Json> json = ObjectOn(line);
    try {
        if (json && json->at("next").get<int>() > 0)
            return Entry{NameFromJson(json->at("clip")),
                         json->at("mark"),
                         {json->at("next").get<int>(), json->at("begin").get<int64_t>()},
                         json->value(kOpened, "")};
    } catch (const Json::exception&) { // of another kind
    } catch (const std::invalid_argument&) {
    }
    return std::nullopt;
}

/// Whether the clip stands there as it was finished.
bool ClipJournal::IsFinished(const Entry& entry) const {
    const std::string clip = text::FolderOf(request_.output) + "/" + entry.clip;
    if (access(clip.c_str(), F_OK) != 0)
        return false;
    if (MarkOfClip(clip) == entry.mark)
        return true;
    if (request_.overwrite)
        return false;
    throw Failure(Category::kOutput, fmt::format("\"{}\" was changed since it was finished", clip),
                  Reason::kExists);
}

/// Clips further on stay known as long as they stand there: this run may be stopped before it replaces them.
void ClipJournal::Begin(const std::string& opened) {
    std::string text = kept_.empty() ? Header() : kept_;
    for (const auto& [number, clip] : ClipsOf(request_.output))
        if (number >= next_ && IsOurs(clip))
            text += CheckedLine({{kOpened, BirthOf(clip)}});
    births_.insert(opened);
    WriteWhole(path_, text + CheckedLine({{kOpened, opened}}));
}

void ClipJournal::NoteFinished(const std::string& clip, ClipStart next, const std::string& opened) {
    AppendWhole(path_, CheckedLine({{"clip", NameAsJson(text::NameOf(clip))},
                                    {"mark", MarkOfClip(clip)},
                                    {"next", next.number},
                                    {"begin", next.begin},
                                    {kOpened, opened}}));
}

void ClipJournal::Remove() const {
    unlink(path_.c_str());
    std::error_code ignored;
    for (const std::filesystem::path& left : FilesThatBegin(path_))
        if (IsInTheMaking(left, path_) && BeginsLike(left, kClipListHead) &&
            WhatIsReadFrom(left.string(), request_).IsEmpty())
            std::filesystem::remove(left, ignored);
}

} // namespace movieconv
