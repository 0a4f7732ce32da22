#include "host/pieces/ClipJournal.h"

#include "host/convert/Failure.h"
#include "host/pieces/CheckedLine.h"
#include "host/pieces/WholeFile.h"
#include "text/Path.h"

#include <filesystem>
#include <fmt/format.h>
#include <sstream>
#include <unistd.h>
#include <vector>

namespace movieconv {
namespace {

constexpr int kClipListVersion = 1;
constexpr int64_t kLargestClipList = 256 << 20;

/// By which a finished clip is known again, wherever its folder is now.
Json MarkOfClip(const std::string& path) {
    Json mark = MarkAsJson(MarkOf(path));
    mark.erase("path");
    return mark;
}

} // namespace

ClipJournal::ClipJournal(const Request& request) : request_(request), path_(request.output + ".clips") {}

bool ClipJournal::Exists() const {
    return access(path_.c_str(), F_OK) == 0;
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
    if (!header || header->value("version", 0) != kClipListVersion)
        throw Failure(Category::kRequest, fmt::format("\"{}\" is damaged, or no list of clips", path_),
                      Reason::kCannotResume);
    const Json now = Json::parse(Header());
    if (const std::string what = DifferenceIn(*header, now, {"madeWith", "source", "settings"});
        !what.empty())
        throw Failure(Category::kRequest, fmt::format("\"{}\" is of another conversion: {}", path_, what),
                      Reason::kCannotResume);
    kept_ = line + "\n";
    std::optional<ClipStart> next;
    while (std::getline(lines, line)) {
        const std::optional<Json> entry = ObjectOn(line);
        if (!entry || !IsFinished(*entry))
            break;
        kept_ += line + "\n";
        next = ClipStart{entry->at("next").get<int>(), entry->at("begin").get<int64_t>()};
    }
    return next;
}

/// Whether the clip stands there as it was finished.
bool ClipJournal::IsFinished(const Json& entry) const {
    const std::string clip = text::FolderOf(request_.output) + "/" + entry.at("clip").get<std::string>();
    if (access(clip.c_str(), F_OK) != 0)
        return false;
    if (MarkOfClip(clip) == entry.at("mark"))
        return true;
    if (request_.overwrite)
        return false;
    throw Failure(Category::kOutput, fmt::format("\"{}\" was changed since it was finished", clip),
                  Reason::kExists);
}

void ClipJournal::Begin() {
    WriteWhole(path_, kept_.empty() ? Header() : kept_);
}

void ClipJournal::NoteFinished(const std::string& clip, ClipStart next) {
    AppendWhole(path_, CheckedLine({{"clip", text::NameOf(clip)},
                                    {"mark", MarkOfClip(clip)},
                                    {"next", next.number},
                                    {"begin", next.begin}}));
}

void ClipJournal::Remove() const {
    unlink(path_.c_str());
}

} // namespace movieconv
