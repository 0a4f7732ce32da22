#include "host/presets/Preset.h"

#include "host/presets/BuiltIn.h"
#include "host/presets/PresetReader.h"
#include "host/presets/PresetText.h"
#include "host/sentence/Say.h"
#include "text/Path.h"

#include <algorithm>
#include <cstdlib>
#include <filesystem>
#include <fmt/format.h>
#include <optional>
#include <string_view>
#include <system_error>

namespace movieconv {
namespace {

namespace fs = std::filesystem;

constexpr std::string_view kExtension = ".json";

bool IsFileName(std::string_view name) {
    return name.find('/') != std::string_view::npos || name.ends_with(kExtension);
}

const BuiltInPreset* FindBuiltIn(std::string_view name) {
    const auto& all = BuiltInPresets();
    const auto found =
        std::find_if(all.begin(), all.end(), [&](const auto& one) { return one.name == name; });
    return found == all.end() ? nullptr : &*found;
}

std::string OwnPath(const std::string& name) {
    const std::string folder = OwnPresetFolder();
    return folder.empty() ? "" : fmt::format("{}/{}{}", folder, name, kExtension);
}

bool Exists(const std::string& path) {
    std::error_code ignored;
    return !path.empty() && fs::exists(path, ignored);
}

/// Presets from the one that was asked for to its last parent.
class Chain {
public:
    explicit Chain(const std::string& name) {
        std::optional<std::string> next = name;
        std::string asker;
        while (next) {
            texts_.push_back(Open(*next, asker));
            const PresetText& text = texts_.back();
            ReadPreferences(text, complaints_);
            asker = text.Place("/parent");
            next = ParentOf(text);
        }
    }

    const std::vector<PresetText>& Texts() const { return texts_; }
    std::vector<Sentence>& Complaints() { return complaints_; }

private:
    /// Without a word about it the parent is the standard; null means none.
    static std::optional<std::string> ParentOf(const PresetText& text) {
        const auto parent = text.json.find("parent");
        if (parent == text.json.end())
            return kStandardPreset;
        if (parent->is_null())
            return std::nullopt;
        const auto name = parent->get<std::string>();
        const bool beside = IsFileName(name) && name.front() != '/' && !text.where.empty();
        return beside ? text::FolderOf(text.where) + "/" + name : name;
    }

    bool IsOpen(const std::string& where) const {
        return std::any_of(texts_.begin(), texts_.end(), [&](const PresetText& text) {
            std::error_code ignored;
            return text.where == where || fs::equivalent(text.where, where, ignored);
        });
    }

    /// `asker` is the place that names the preset as its parent; empty for the user.
    PresetText Open(const std::string& name, const std::string& asker) const {
        const std::string path = IsFileName(name) ? name : OwnPath(name);
        const BuiltInPreset* builtIn = IsFileName(name) ? nullptr : FindBuiltIn(name);
        const std::string builtInPlace = fmt::format("preset {}", name);
        if ((IsFileName(name) || Exists(path)) && !IsOpen(path))
            return ReadPresetFile(path);
        if (builtIn != nullptr && !IsOpen(builtInPlace)) // one's own may have the program's as its parent
            return ParsePresetText(std::string(builtIn->text), builtInPlace);
        if (IsFileName(name) || Exists(path) || builtIn != nullptr)
            throw PresetError(Say("{}: the parent \"{}\" has this preset as a parent itself", asker, name));
        throw NoPresetError(asker.empty() ? Say("there is no preset \"{}\"", name)
                                          : Say("{}: there is no preset \"{}\"", asker, name));
    }

    std::vector<PresetText> texts_;
    std::vector<Sentence> complaints_;
};

std::string DescriptionIn(const Json& json) {
    const auto description = json.find("description");
    return description != json.end() && description->is_string() ? description->get<std::string>() : "";
}

/// What a file says of itself, without its parents.
PresetSummary Summarise(const std::string& path) {
    PresetSummary summary{fs::path(path).stem().string(), "", path, ""};
    try {
        const Preset preset = LoadPreset(path);
        summary.description = preset.description;
    } catch (const PresetError& error) {
        summary.failure = error.what();
    }
    return summary;
}

} // namespace

Preset LoadPreset(const std::string& nameOrFile) {
    if (nameOrFile.empty())
        throw PresetError(Say("a preset has a name"));
    Chain chain(nameOrFile);
    const auto& texts = chain.Texts();
    Json merged = Json::object();
    std::for_each(texts.rbegin(), texts.rend(), [&merged](const auto& text) {
        merged.erase("description");
        merged = MergePresets(merged, text.json);
        merged.erase("parent");
        merged.erase("$schema");
    });
    std::vector<Sentence> toldAlready;
    Preset preset{nameOrFile, DescriptionIn(merged), {}, merged.dump(4), std::move(chain.Complaints())};
    preset.preferences = ReadPreferences({nameOrFile, merged, {}}, toldAlready);
    return preset;
}

std::vector<PresetSummary> ListPresets() {
    std::vector<PresetSummary> list;
    for (const BuiltInPreset& preset : BuiltInPresets()) {
        const PresetText text = ParsePresetText(std::string(preset.text), std::string(preset.name));
        list.push_back({std::string(preset.name), DescriptionIn(text.json), "", ""});
    }
    std::vector<std::string> paths;
    std::error_code none;
    const std::string folder = OwnPresetFolder();
    if (!folder.empty())
        for (fs::directory_iterator entry(folder, none), end; !none && entry != end; entry.increment(none))
            if (entry->path().extension() == kExtension)
                paths.push_back(entry->path().string());
    std::sort(paths.begin(), paths.end());
    std::transform(paths.begin(), paths.end(), std::back_inserter(list), Summarise);
    return list;
}

std::string OwnPresetFolder() {
    const auto variable = [](const char* name) -> std::string {
        const char* value = std::getenv(name);
        return value != nullptr && *value == '/' ? value : "";
    };
    const std::string config = variable("XDG_CONFIG_HOME");
    if (!config.empty())
        return config + "/movieconv/presets";
    const std::string home = variable("HOME");
    return home.empty() ? "" : home + "/.config/movieconv/presets";
}

} // namespace movieconv
