#include "host/terminal/Reporter.h"

#include "host/convert/Amounts.h"
#include "host/terminal/JsonReporter.h"
#include "host/terminal/TextReporter.h"

#include <cstdlib>
#include <fmt/format.h>
#include <string_view>

namespace movieconv {
namespace {

bool WantsColour() {
    const char* forbidden = std::getenv("NO_COLOR");
    const char* terminal = std::getenv("TERM");
    return (forbidden == nullptr || *forbidden == '\0') && terminal != nullptr &&
           std::string_view(terminal) != "dumb";
}

/// " (1.25x)"; empty where this run has converted nothing, as when it only joined pieces.
std::string SpeedOf(const Verdict& verdict) {
    const double converted = verdict.position - verdict.earlier;
    return converted > 0 && verdict.worked > 0 ? fmt::format(" ({:.2f}x)", converted / verdict.worked) : "";
}

} // namespace

void Reporter::Ended(const Verdict& verdict) {
    EndReport end{};
    end.code = CodeOf(verdict);
    end.position = verdict.position;
    end.worked = verdict.worked;
    end.bytes = verdict.bytes;
    end.files = verdict.files;
    if (verdict.failure) {
        end.outcome = "failed";
        Error(Explain(*verdict.failure));
    } else {
        const bool done = verdict.outcome == Outcome::kDone;
        end.outcome = done ? "done" : "stopped";
        end.summary = fmt::format("{}: {} converted in {}{}, {} in {}", done ? "100% done" : "stopped",
                                  FormatTime(end.position, true), FormatTime(end.worked, true),
                                  SpeedOf(verdict), FormatBytes(end.bytes),
                                  end.files == 1 ? "one file" : fmt::format("{} files", end.files));
    }
    End(end);
}

std::unique_ptr<Reporter> MakeReporter(const Options& options, const StandardStreams& streams) {
    if (options.progress == ProgressStyle::kJson)
        return std::make_unique<JsonReporter>(streams);
    if (options.quiet)
        return std::make_unique<QuietReporter>(streams);
    if (options.progress == ProgressStyle::kNone)
        return std::make_unique<SparseReporter>(streams);
    if (streams.OutputIsTerminal())
        return std::make_unique<BarReporter>(streams, WantsColour());
    return std::make_unique<LineReporter>(streams);
}

} // namespace movieconv
