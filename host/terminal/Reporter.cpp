#include "host/terminal/Reporter.h"

#include "host/terminal/JsonReporter.h"
#include "host/terminal/TextReporter.h"

#include <cstdlib>
#include <string_view>

namespace movieconv {
namespace {

bool WantsColour() {
    const char* forbidden = std::getenv("NO_COLOR");
    const char* terminal = std::getenv("TERM");
    return (forbidden == nullptr || *forbidden == '\0') && terminal != nullptr &&
           std::string_view(terminal) != "dumb";
}

} // namespace

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
