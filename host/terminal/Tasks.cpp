#include "host/terminal/Tasks.h"

#include "host/convert/Amounts.h"
#include "host/convert/Failure.h"
#include "host/convert/OutputCheck.h"
#include "host/convert/Room.h"
#include "host/convert/Sources.h"
#include "host/pieces/PlanText.h"
#include "host/pieces/Planner.h"
#include "host/presets/Preset.h"
#include "host/terminal/Describe.h"
#include "host/terminal/ExitCode.h"
#include "host/terminal/JsonLine.h"
#include "host/terminal/Listings.h"
#include "text/Printable.h"

#include <cerrno>
#include <cstring>
#include <filesystem>
#include <fmt/format.h>
#include <string>
#include <system_error>
#include <utility>

namespace movieconv {
namespace {

/// For what was asked for as a text.
void PrintWhole(const StandardStreams& streams, const std::string& text) {
    if (!streams.Print(text)) {
        throw Failure(Category::kOutput,
                      fmt::format("cannot write to the standard output: {}", std::strerror(errno)));
    }
}

std::string TellNeeded(const Room& room) {
    return room.needed < 0
               ? fmt::format(
                     "how much {} of output need is unknown: what is seen and heard decides, not a rate;\n"
                     "the conversion tells it after its first ten seconds\n",
                     FormatTime(room.length, true))
               : fmt::format("needs about {} for {} of output\n", FormatBytes(room.needed),
                             FormatTime(room.length, true));
}

ExitCode Estimate(const Options& options, const StandardStreams& streams) {
    const Room room = EstimateRoom(options.request);
    const bool asJson = options.progress == ProgressStyle::kJson;
    PrintWhole(streams, asJson ? EstimateAsJson(room) : TellNeeded(room));
    if (room.free < 0) {
        throw Failure(Category::kOutput,
                      fmt::format("the output's folder \"{}\" cannot be used", room.folder));
    }
    if (!asJson)
        PrintWhole(streams, fmt::format("{} are free in \"{}\"\n", FormatBytes(room.free),
                                        text::Printable(room.folder)));
    return room.needed <= room.free ? ExitCode::kDone : ExitCode::kNoSpace;
}

/// The plan of that name, of the same conversion; nothing when there is none. Throws Failure when it is of
/// another one.
std::optional<Plan> PlanThere(const std::string& path, const Plan& begun) {
    std::error_code unknown;
    if (!exists(std::filesystem::symlink_status(path, unknown))) // a link that leads nowhere is there, too
        return std::nullopt;
    const auto refuse = [&](const std::string& why) {
        return Failure(Category::kOutput, fmt::format("\"{}\" exists{}", path, why), Reason::kExists);
    };
    std::optional<Plan> there;
    try {
        there = ReadPlan(path);
    } catch (const Failure&) {
        throw refuse(", and is no whole plan");
    }
    if (const std::string difference = Difference(*there, begun); !difference.empty())
        throw refuse(" and is of another conversion: " + difference);
    return there;
}

/// Another one can be made at the same time: so it is looked for again where the name is taken by then.
Plan MakeOrFindPlan(const Request& request, const Division& division, const std::string& path) {
    const Plan begun = BeginPlan(request, division);
    for (;;) {
        if (const std::optional<Plan> there = request.overwrite ? std::nullopt : PlanThere(path, begun))
            return *there;
        std::optional<Plan> made = MakePlan(begun, [] { return false; });
        if (WritePlan(path, *made, request.overwrite))
            return *made;
    }
}

ExitCode WriteNewPlan(const Options& options, const StandardStreams& streams) {
    const std::string& path = *options.plan;
    if (options.request.input == kStandardInput)
        throw Failure(Category::kRequest,
                      Sentence("whoever makes the pieces cannot read this standard input"));
    CheckOutput(options.request); // before all is made that cannot be joined
    const Plan plan = MakeOrFindPlan(options.request, options.division, path);
    if (options.quiet)
        return ExitCode::kDone;
    for (const Sentence& complaint : options.complaints)
        streams.PrintError(fmt::format("movieconv: warning: {}", complaint.Text()));
    if (const std::string cost = TellBitRate(plan); !cost.empty())
        streams.PrintError(fmt::format("movieconv: warning: {}", cost));
    PrintWhole(streams,
               options.progress == ProgressStyle::kJson
                   ? PlanAsJson(path, plan.Pieces())
                   : fmt::format("{}: pieces 0 to {}, the last one is the sound and whatever else is "
                                 "carried\n",
                                 text::Printable(path), plan.Pieces() - 1));
    return ExitCode::kDone;
}

/// Its text; what is odd about it goes to standard error.
std::string ShowPreset(const std::string& name, const StandardStreams& streams) {
    try {
        const Preset preset = LoadPreset(name);
        for (const Sentence& complaint : preset.complaints)
            streams.PrintError(fmt::format("movieconv: warning: {}", complaint.Text()));
        return EscapeCommands(preset.text);
    } catch (const PresetError& error) {
        throw FailureOf(error);
    }
}

} // namespace

std::optional<ExitCode> DoWithoutConverting(const Options& options, const StandardStreams& streams) {
    switch (options.task) {
    case Task::kListFormats:
        PrintWhole(streams, options.progress == ProgressStyle::kJson ? FormatsJson() : FormatsText());
        return ExitCode::kDone;
    case Task::kListPresets:
        PrintWhole(streams, options.progress == ProgressStyle::kJson ? PresetsJson()
                            : options.quiet                          ? PresetNames()
                                                                     : PresetsText());
        return ExitCode::kDone;
    case Task::kShowPreset:
        PrintWhole(streams, ShowPreset(options.preset, streams) + "\n");
        return ExitCode::kDone;
    case Task::kInfo: {
        const SourceInfo source = LookAtSource(options.request);
        PrintWhole(streams,
                   options.progress == ProgressStyle::kJson ? DescribeAsJson(source) : Describe(source));
        return ExitCode::kDone;
    }
    case Task::kEstimate:
        return Estimate(options, streams);
    case Task::kPlan:
        return WriteNewPlan(options, streams);
    case Task::kConvert:
    case Task::kPiece:
    case Task::kJoin:
        break;
    }
    return std::nullopt;
}

} // namespace movieconv
