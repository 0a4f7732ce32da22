#include "host/terminal/Options.h"

#include "Common/Image/ImageConvert.h"
#include "host/convert/Failure.h"
#include "host/presets/Preset.h"
#include "host/terminal/ExitCode.h"
#include "host/terminal/Help.h"
#include "host/terminal/OptionChecks.h"
#include "host/terminal/OptionTable.h"
#include "host/terminal/TaskChecks.h"

#include <CLI/CLI.hpp>
#include <algorithm>
#include <cerrno>
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <fmt/format.h>
#include <iostream>
#include <string>
#include <utility>
#include <vector>

namespace movieconv {
namespace {

constexpr std::chrono::seconds kPreviewInterval{1};

/// Whether options say what the sound is to become.
bool ChangesSound(const Request& request) {
    return request.audioCodec || request.channels || request.sampleRate || request.audioRate ||
           request.audioMaxRate || request.maxSize;
}

/// What the preset says, where the other options do not say otherwise.
void ApplyPreset(Options& options) {
    try {
        Preset preset = LoadPreset(options.preset);
        Request& request = options.request;
        request.noVideo = request.noVideo || (preset.preferences.noVideo && !request.videoCodec);
        request.noAudio =
            request.noAudio || (preset.preferences.noAudio && !request.audioCodec && !request.copySound);
        request.copySound = request.copySound || (preset.preferences.copySound && !ChangesSound(request));
        request.preferences = std::move(preset.preferences);
        options.complaints = std::move(preset.complaints);
    } catch (const PresetError& error) {
        throw FailureOf(error);
    }
}

/// The version, and what a report of a fault should say of the processor.
std::string Version() {
    const std::string level = ImageConvertLevel();
    std::string text = fmt::format("movieconv " MOVIECONV_VERSION "\ncolour routines: {}", level);
    const char* const wanted = std::getenv("MOVIECONV_COLOUR_LEVEL");
    if (wanted != nullptr && level != wanted)
        text += fmt::format(" (MOVIECONV_COLOUR_LEVEL is \"{}\", which is not to be had here)", wanted);
    return text;
}

/// The parser takes "[a, b]" for a list where several names may stand; as "./[a, b]" it is the same file.
std::vector<std::string> NotTornApart(std::vector<std::string> arguments) {
    bool isText = false;
    for (std::string& argument : arguments) {
        if (!isText && argument.size() > 1 && argument.front() == '[' && argument.back() == ']')
            argument.insert(0, "./");
        isText = argument == "--metadata";
    }
    return arguments;
}

/// With --into, OUTPUT is a movie, too.
void TakeInputs(Options& options) {
    for (std::string* name : {&options.request.output, &options.request.input})
        if (!name->empty())
            options.inputs.insert(options.inputs.begin(), std::exchange(*name, {}));
}

void RequirePrinted() {
    if (!std::cout.flush() || std::fflush(stdout) != 0 || std::ferror(stdout) != 0)
        throw Failure(Category::kOutput,
                      fmt::format("cannot write to the standard output: {}", std::strerror(errno)));
}

} // namespace

std::optional<Options> ParseOptions(int argc, char** argv) {
    Options options;
    CLI::App app{"Converts a movie to another format, picture size or codec, as one file or as\nclips.",
                 "movieconv"};
    app.formatter(MakeHelpFormatter());
    app.footer("A name that begins with a dash goes behind \"--\". While converting, space or p\n"
               "pauses and resumes, q or Ctrl-C stops and keeps what is done as a playable file.\n"
               "movieconv(1) tells more, with the presets and the exit codes.");
    app.set_help_flag("-h,--help", "Print help on the usual options")->group(heading::kInsteadOfConverting);
    app.set_help_all_flag("--help-all", "Print help on all options")->group(heading::kInsteadOfConverting);
    app.set_version_flag("--version", Version, "Print the version and the colour routines' level")
        ->group(heading::kInsteadOfConverting);
    AddOptions(app, options);
    try {
        std::vector<std::string> arguments = NotTornApart({argv + std::min(argc, 1), argv + argc});
        std::reverse(arguments.begin(), arguments.end()); // as the parser takes them
        app.parse(std::move(arguments));
    } catch (const CLI::Success& asked) {
        app.exit(asked);
        RequirePrinted();
        return std::nullopt;
    } catch (const CLI::ParseError& error) {
        throw Failure(Category::kRequest, fmt::format("{}; try \"movieconv --help\"", error.what()));
    }
    CheckTask(app);
    if (options.completion) {
        std::fputs(CompletionScript(*options.completion, OptionEntries(app)).c_str(), stdout);
        RequirePrinted();
        return std::nullopt;
    }
    if (options.request.input == "-")
        options.request.input = kStandardInput;
    if (options.into)
        TakeInputs(options);
    CheckOptions(options);
    if (NeedsOutput(options.task))
        ApplyPreset(options);
    if (options.preview)
        options.request.preview = kPreviewInterval;
    return options;
}

} // namespace movieconv
