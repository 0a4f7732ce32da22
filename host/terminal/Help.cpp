#include "host/terminal/Help.h"

#include "host/convert/Preferences.h"
#include "host/terminal/Listings.h"

#include <CLI/CLI.hpp>
#include <algorithm>
#include <array>
#include <string>
#include <string_view>
#include <utility>

namespace movieconv {
namespace {

constexpr std::size_t kHelpColumn = 26;

/// What most people need, and --help shows.
constexpr std::array<std::string_view, 18> kUsual{
    "INPUT",     "OUTPUT",      "begin",       "length",       "split",        "preset",
    "format",    "video-codec", "audio-codec", "size",         "quality",      "max-size",
    "overwrite", "quiet",       "info",        "list-formats", "list-presets", "help-all"};

class HelpFormatter final : public CLI::Formatter {
public:
    /// As a reader expects it; the library's own lists every positional's type.
    std::string make_usage(const CLI::App* /*app*/, std::string /*name*/) const override {
        return "Usage: movieconv [OPTIONS] INPUT OUTPUT\n       movieconv --into FOLDER [OPTIONS] INPUT...\n";
    }

    std::string make_help(const CLI::App* app, std::string name, CLI::AppFormatMode mode) const override {
        whole_ = mode == CLI::AppFormatMode::All;
        std::string help = Formatter::make_help(app, std::move(name), mode);
        // Where a group has nothing to show, its empty lines remain.
        for (std::size_t at = help.find("\n\n\n"); at != std::string::npos; at = help.find("\n\n\n"))
            help.erase(at, 1);
        return help;
    }

    std::string make_group(std::string group, bool positional,
                           std::vector<const CLI::Option*> options) const override {
        if (!whole_)
            std::erase_if(options, [](const CLI::Option* option) { return !IsUsual(*option); });
        return options.empty() ? "" : Formatter::make_group(std::move(group), positional, std::move(options));
    }

private:
    static bool IsUsual(const CLI::Option& option) {
        const std::string name =
            option.get_positional() ? option.get_name(true) : option.get_lnames().front();
        return std::find(kUsual.begin(), kUsual.end(), name) != kUsual.end();
    }

    mutable bool whole_ = false; // between the two functions
};

std::vector<std::string> SplitAt(const std::string& text, char separator) {
    std::vector<std::string> parts{""};
    for (const char c : text) {
        if (c == separator)
            parts.emplace_back();
        else
            parts.back() += c;
    }
    return parts;
}

/// Without those in capitals, which stand for something, as LIST does.
std::vector<std::string> WordsAmong(std::vector<std::string> choices) {
    const auto stands = [](const std::string& choice) {
        return std::all_of(choice.begin(), choice.end(),
                           [](char each) { return each >= 'A' && each <= 'Z'; });
    };
    choices.erase(std::remove_if(choices.begin(), choices.end(), stands), choices.end());
    return choices;
}

void DescribeValue(const CLI::Option& option, OptionEntry& entry) {
    const std::string type = option.get_type_name();
    // Alone, "N|FILE" or "FILE[:LANG]".
    const bool isFile = type.find("FILE") != std::string::npos || type == "FOLDER";
    entry.value = option.get_items_expected_max() == 0 ? OptionEntry::Value::kNone
                  : isFile                             ? OptionEntry::Value::kFile
                  : type == "PRESET"                   ? OptionEntry::Value::kPreset
                                                       : OptionEntry::Value::kFree;
    if (type.find('|') != std::string::npos && !isFile)
        entry.choices = WordsAmong(SplitAt(type, '|'));
    else if (entry.longName == "format")
        entry.choices = ExtensionNames();
    else if (entry.longName == "video-codec" || entry.longName == "audio-codec")
        entry.choices = CodecNames(entry.longName == "audio-codec");
    else if (entry.longName == "speed")
        entry.choices.assign(kSpeedNames.begin(), kSpeedNames.end());
    if (!entry.choices.empty())
        entry.value = OptionEntry::Value::kChoice;
}

} // namespace

std::shared_ptr<CLI::FormatterBase> MakeHelpFormatter() {
    auto formatter = std::make_shared<HelpFormatter>();
    formatter->column_width(kHelpColumn);
    return formatter;
}

std::vector<OptionEntry> OptionEntries(const CLI::App& app) {
    std::vector<OptionEntry> entries;
    for (const CLI::Option* option : app.get_options()) {
        if (option->get_positional())
            continue;
        OptionEntry entry;
        entry.longName = option->get_lnames().front();
        entry.shortName = option->get_snames().empty() ? "" : option->get_snames().front();
        entry.help = option->get_description();
        std::replace(entry.help.begin(), entry.help.end(), '\n', ' ');
        entry.repeatable = option->get_multi_option_policy() == CLI::MultiOptionPolicy::TakeAll;
        DescribeValue(*option, entry);
        entries.push_back(std::move(entry));
    }
    return entries;
}

} // namespace movieconv
