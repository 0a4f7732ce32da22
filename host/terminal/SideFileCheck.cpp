#include "host/terminal/SideFileCheck.h"

#include "host/convert/Failure.h"
#include "host/convert/OutputCheck.h"
#include "host/terminal/Preview.h"
#include "text/FileNames.h"

#include <fmt/format.h>

namespace movieconv {
namespace {

void CheckSideFile(const char* option, const std::string& path, const Request& request) {
    const char* other = AreSame(path, request.input)                         ? "the source"
                        : !request.output.empty() && IsOutput(path, request) ? "the output or a part of it"
                                                                             : nullptr;
    if (other != nullptr) {
        throw Failure(Category::kRequest,
                      fmt::format("{} \"{}\" is {}; give it another name", option, path, other));
    }
}

} // namespace

void CheckSideFiles(const Options& options) {
    if (options.log)
        CheckSideFile("--log", *options.log, options.request);
    if (options.preview) {
        CheckSideFile("--preview", *options.preview, options.request);
        CheckName(*options.preview, text::PartialSuffix(text::kMostPartials));
        CheckPreview(*options.preview, options.request.overwrite);
    }
    if (options.log && options.preview &&
        (*options.log == *options.preview || AreSame(*options.log, *options.preview)))
        throw Failure(Category::kRequest, "--log and --preview name the same file");
}

} // namespace movieconv
