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
    std::vector<std::string> headings; // of the options that it takes
};

const KnownTask* FindTask(const CLI::Option& option) {
    using namespace heading;
    static const std::vector<KnownTask> kTasks{
        {"--plan", {kRange, kEncoding, kPictures, kSound, kPieces, kCarried, kOutput, kReports}},
        {"--piece", {kPieces, kOutput, kReports}}, // what is converted, and to what, stands in the plan
        {"--join", {kPieces, kOutput, kReports}},
        {"--info", {kRange, kEncoding, kPictures, kCarried, kOutput, kReports}},
        {"--estimate", {kRange, kEncoding, kPictures, kSound, kMany, kPieces, kCarried, kOutput, kReports}},
        {"--list-formats", {kOutput, kReports}},
        {"--list-presets", {kOutput, kReports}},
        {"--show-preset", {kOutput, kReports}},
        {"--completion", {kOutput, kReports}},
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
        const bool isKnown = task == nullptr || option->get_positional() || FindTask(*option) != nullptr ||
                             std::count(task->headings.begin(), task->headings.end(), option->get_group());
        if (!isKnown)
            Refuse(fmt::format("{} does not go with {}", option->get_name(), task->option));
    }
}

} // namespace movieconv
