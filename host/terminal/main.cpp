#include "host/convert/Amounts.h"
#include "host/convert/OutputCheck.h"
#include "host/convert/Room.h"
#include "host/convert/Sources.h"
#include "host/pieces/Plan.h"
#include "host/presets/Preset.h"
#include "host/terminal/ControlInput.h"
#include "host/terminal/Describe.h"
#include "host/terminal/JsonReporter.h"
#include "host/terminal/Listings.h"
#include "host/terminal/MainLoop.h"
#include "host/terminal/Options.h"
#include "host/terminal/Session.h"
#include "host/terminal/SideFileCheck.h"
#include "host/terminal/StandardStreams.h"
#include "text/Printable.h"

#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <exception>
#include <fcntl.h>
#include <filesystem>
#include <fmt/format.h>
#include <malloc.h>
#include <new>
#include <string>
#include <unistd.h>

namespace movieconv {
namespace {

constexpr char kNoMemory[] = "movieconv: error: there is not enough memory\n";

/// A lack of memory also comes where no exception may pass, since destructors of libraries allocate. What is
/// being written stays as after a kill.
void TellLackOfMemoryWhereNothingMayThrow() {
    static const std::terminate_handler usual = std::get_terminate();
    std::set_terminate([] {
        try {
            if (const std::exception_ptr error = std::current_exception())
                std::rethrow_exception(error);
        } catch (const std::bad_alloc&) {
            if (write(STDERR_FILENO, kNoMemory, sizeof kNoMemory - 1) >= 0)
                _exit(static_cast<int>(ExitCode::kInternal));
        } catch (...) { // as usual
        }
        usual();
    });
}

void LimitHeap() {
    mallopt(M_ARENA_MAX, 1); // heaps of their own for the dozen threads cost 20 MB and save no time
}

/// The AV1 encoder writes to standard error by itself, and takes this as its only way to be told not to.
void SilenceEncoders() {
    constexpr int kUnlessSet = 0;
    setenv("SVT_LOG", "0", kUnlessSet);
}

/// Descriptors that the caller closed would be given to files and be written to as standard streams.
void OpenStandardDescriptors() {
    int descriptor = open("/dev/null", O_RDWR);
    while (descriptor >= 0 && descriptor <= STDERR_FILENO)
        descriptor = open("/dev/null", O_RDWR);
    close(descriptor);
}

/// For what was asked for as a text.
void PrintWhole(const StandardStreams& streams, const std::string& text) {
    if (!streams.Print(text)) {
        throw Failure(Category::kOutput,
                      fmt::format("cannot write to the standard output: {}", std::strerror(errno)));
    }
}

std::string TellNeeded(const Room& room) {
    return room.needed < 0
               ? fmt::format("how much {} of output need is unknown: the quality decides, not a rate;\n"
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

ExitCode WriteNewPlan(const Options& options, const StandardStreams& streams) {
    const std::string& path = *options.plan;
    if (options.request.input == kStandardInput)
        throw Failure(Category::kRequest, "whoever makes the pieces cannot read this standard input");
    CheckOutput(options.request); // before all is made that cannot be joined
    Plan begun = BeginPlan(options.request, options.division);
    std::optional<Plan> plan = options.request.overwrite ? std::nullopt : PlanThere(path, begun);
    if (!plan) {
        plan = MakePlan(std::move(begun), [] { return false; });
        WritePlan(path, *plan);
    }
    if (options.quiet)
        return ExitCode::kDone;
    for (const std::string& complaint : options.complaints)
        streams.PrintError(fmt::format("movieconv: warning: {}", complaint));
    if (const std::string cost = TellBitRate(*plan); !cost.empty())
        streams.PrintError(fmt::format("movieconv: warning: {}", cost));
    PrintWhole(streams,
               options.progress == ProgressStyle::kJson
                   ? PlanAsJson(path, plan->Pieces())
                   : fmt::format("{}: pieces 0 to {}, the last one is the sound and whatever else is "
                                 "carried\n",
                                 text::Printable(path), plan->Pieces() - 1));
    return ExitCode::kDone;
}

/// Its text; what is odd about it goes to standard error.
std::string ShowPreset(const std::string& name, const StandardStreams& streams) {
    try {
        const Preset preset = LoadPreset(name);
        for (const std::string& complaint : preset.complaints)
            streams.PrintError(fmt::format("movieconv: warning: {}", complaint));
        return EscapeCommands(preset.text);
    } catch (const PresetError& error) {
        throw Failure(Category::kRequest, error.what());
    }
}

ExitCode Perform(const Options& options, const StandardStreams& streams, MainLoop& loop,
                 ControlInput& control) {
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
    return Session(options, streams, loop, control).Run();
}

int Main(int argc, char** argv) {
    const std::optional<Options> options = ParseOptions(argc, argv);
    if (!options)
        return static_cast<int>(ExitCode::kDone);
    CheckSideFiles(*options);
    MainLoop loop;
    ControlInput control(loop);
    const StandardStreams streams(options->log, options->request.overwrite);
    return static_cast<int>(Perform(*options, streams, loop, control));
}

void Tell(const Failure& failure) {
    try {
        std::fprintf(stderr, "movieconv: error: %s\n", text::Printable(Explain(failure)).c_str());
    } catch (const std::bad_alloc&) {
        std::fputs(kNoMemory, stderr);
    }
}

} // namespace
} // namespace movieconv

int main(int argc, char** argv) {
    movieconv::TellLackOfMemoryWhereNothingMayThrow();
    movieconv::LimitHeap();
    movieconv::SilenceEncoders();
    movieconv::OpenStandardDescriptors();
    try {
        return movieconv::Main(argc, argv);
    } catch (const movieconv::Failure& failure) {
        movieconv::Tell(failure);
        return static_cast<int>(movieconv::CodeOf(failure.Kind()));
    } catch (const std::bad_alloc&) {
        std::fputs(movieconv::kNoMemory, stderr);
        return static_cast<int>(movieconv::ExitCode::kInternal);
    } catch (const std::exception& error) {
        std::fprintf(stderr, "movieconv: internal error: %s\n", error.what());
        return static_cast<int>(movieconv::ExitCode::kInternal);
    }
}
