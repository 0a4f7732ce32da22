#include "host/terminal/TaskChecks.h"

#include "host/convert/Failure.h"
#include "host/terminal/OptionTable.h"

#include <CLI/CLI.hpp>
#include <algorithm>
#include <fmt/format.h>
#include <string>
#include <vector>

namespace movieconv {
namespace {

struct KnownTask {
    const char* option;
    std::vector<std::string> headings;     // of the options that it takes
    std::vector<std::string> further = {}; // such options under other headings
};

struct Omission {
    const char* option;
    const char* value;
    const char* claim;
    const char* heading;              // of the options that have no effect then
    std::vector<std::string> further; // such options under other headings
    std::vector<std::string> spared;  // options under the heading that have one
};

const KnownTask* FindTask(const CLI::Option& option) {
    using namespace heading;
    static const std::vector<KnownTask> kTasks{
        {"--plan", {kRange, kEncoding, kPictures, kSound, kPieces, kCarried, kReports}, {"--overwrite"}},
        // What is converted, and to what, stands in the plan.
        {"--piece", {kPieces, kReports}, {"--overwrite", "--on-full"}},
        {"--join", {kPieces, kReports}, {"--overwrite", "--on-full"}},
        // What decides which streams would be converted; --overwrite gives leave to append to the log.
        {"--info",
         {kReports},
         {"--allow-playlists", "--no-video", "--no-audio", "--crop", "--audio-tracks", "--subtitles",
          "--overwrite"}},
        {"--estimate", {kRange, kEncoding, kPictures, kSound, kMany, kPieces, kCarried, kOutput, kReports}},
        {"--list-formats", {kReports}, {"--overwrite"}},
        {"--list-presets", {kReports}, {"--overwrite"}},
        {"--show-preset", {kReports}, {"--overwrite"}},
        {"--completion", {kReports}, {"--overwrite"}},
    };
    const auto found = std::find_if(kTasks.begin(), kTasks.end(),
                                    [&](const KnownTask& task) { return option.get_name() == task.option; });
    return found != kTasks.end() ? &*found : nullptr;
}

std::vector<const CLI::Option*> GivenOptions(const CLI::App& app) {
    return app.get_options([](const CLI::Option* option) { return option->count() > 0; });
}

[[noreturn]] void Refuse(const std::string& text) {
    throw Failure(Category::kRequest, text);
}

bool Holds(const std::vector<std::string>& list, const std::string& entry) {
    return std::find(list.begin(), list.end(), entry) != list.end();
}

bool Takes(const KnownTask& task, const CLI::Option& option) {
    return option.get_positional() || FindTask(option) != nullptr ||
           Holds(task.headings, option.get_group()) || Holds(task.further, option.get_name());
}

/// Refuses what says how to make the pictures or the sound when they are left out.
void CheckOmissions(const std::vector<const CLI::Option*>& given) {
    static const std::vector<Omission> kOmissions{
        {"--no-video",
         "true",
         "--no-video leaves the pictures out",
         heading::kPictures,
         {"--video-codec", "--preview"},
         {"--max-size"}},
        {"--no-audio",
         "true",
         "--no-audio leaves the sound out",
         heading::kSound,
         {"--audio-codec", "--audio-tracks"},
         {}},
        {"--audio-tracks",
         "none",
         "--audio-tracks none leaves the sound out",
         heading::kSound,
         {"--audio-codec"},
         {}},
    };
    for (const Omission& omission : kOmissions) {
        const bool isMeant = std::any_of(given.begin(), given.end(), [&](const CLI::Option* option) {
            return option->get_name() == omission.option && option->results().back() == omission.value;
        });
        for (const CLI::Option* option : given) {
            const std::string name = option->get_name();
            const bool hasNoEffect =
                Holds(omission.further, name) ||
                (option->get_group() == omission.heading && !Holds(omission.spared, name));
            if (isMeant && hasNoEffect)
                Refuse(fmt::format("{}: it excludes {}", omission.claim, name));
        }
    }
}

} // namespace

void CheckTask(const CLI::App& app) {
    const std::vector<const CLI::Option*> given = GivenOptions(app);
    const KnownTask* task = nullptr;
    for (const CLI::Option* option : given) {
        const auto& values = option->results();
        if (!option->get_positional() && std::find(values.begin(), values.end(), "") != values.end())
            Refuse(fmt::format("{} has an empty value", option->get_name()));
        const KnownTask* asked = FindTask(*option);
        if (asked != nullptr && task != nullptr)
            Refuse(fmt::format("{} and {} exclude each other", task->option, asked->option));
        task = asked != nullptr ? asked : task;
    }
    for (const CLI::Option* option : given) {
        if (task != nullptr && !Takes(*task, *option))
            Refuse(fmt::format("{} does not go with {}", option->get_name(), task->option));
    }
    CheckOmissions(given);
}

} // namespace movieconv
