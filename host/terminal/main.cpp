#include "host/convert/Conversion.h"
#include "host/convert/EncodePlan.h"
#include "host/convert/Formats.h"
#include "host/convert/OutputCheck.h"
#include "host/terminal/ControlInput.h"
#include "host/terminal/Describe.h"
#include "host/terminal/Reporter.h"
#include "host/terminal/StandardStreams.h"
#include "host/terminal/Units.h"
#include "text/Path.h"

#include <cerrno>
#include <cstdio>
#include <cstring>
#include <exception>
#include <fcntl.h>
#include <fmt/format.h>
#include <malloc.h>
#include <new>
#include <string>
#include <unistd.h>

namespace movieconv {
namespace {

void LimitHeap() {
    mallopt(M_ARENA_MAX, 1); // heaps of their own for the dozen threads cost 20 MB and save no time
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
        throw Failure(ExitCode::kCannotWrite,
                      fmt::format("cannot write to the standard output: {}", std::strerror(errno)));
    }
}

ExitCode Estimate(const Options& options, Movie& movie, const StandardStreams& streams) {
    if (movie.Info().certainty == Certainty::kGuessed && !options.length) {
        throw Failure(ExitCode::kUsage,
                      fmt::format("\"{}\" does not tell how long it is; use --length", options.input));
    }
    const double length = LengthToConvert(options, movie.Info());
    const Converter converter = MakeConverter(options, movie);
    EncodeParam param{};
    MCGetEncodeParam(converter.get(), &param);
    const int64_t needed = MCGetEstimateDiskSpaceEx(&param, length);
    const std::string folder = text::FolderOf(options.output);
    const int64_t free = FreeBytes(folder);
    PrintWhole(streams, fmt::format("needs about {} for {} of output\n", FormatBytes(needed),
                                    FormatTime(length, true)));
    if (free < 0) {
        throw Failure(ExitCode::kCannotWrite,
                      fmt::format("the output's folder \"{}\" cannot be used", folder));
    }
    PrintWhole(streams, fmt::format("{} are free in \"{}\"\n", FormatBytes(free), folder));
    return needed <= free ? ExitCode::kDone : ExitCode::kNoSpace;
}

ExitCode Perform(const Options& options, const StandardStreams& streams, ControlInput& control) {
    const SourceChoice choice{
        .pictures = !options.noVideo, .sound = !options.noAudio, .playlists = options.playlists};
    if (options.task == Task::kListFormats) {
        PrintWhole(streams, ListFormats());
        return ExitCode::kDone;
    }
    if (options.task == Task::kInfo) {
        PrintWhole(streams, Describe(Source(options.input, choice).Info()));
        return ExitCode::kDone;
    }
    ChooseFormat(options);
    if (options.task == Task::kConvert)
        CheckOutput(options);
    Movie movie(options.input, choice);
    if (options.task == Task::kEstimate)
        return Estimate(options, movie, streams);
    const std::unique_ptr<Reporter> reporter = MakeReporter(options, streams);
    return Conversion(options, movie, *reporter, control).Run();
}

int Main(int argc, char** argv) {
    const std::optional<Options> options = ParseOptions(argc, argv);
    if (!options)
        return static_cast<int>(ExitCode::kDone);
    CheckSideFiles(*options);
    ControlInput control;
    const StandardStreams streams(options->log, options->overwrite);
    try {
        return static_cast<int>(Perform(*options, streams, control));
    } catch (const PlaylistError& error) {
        throw Failure(ExitCode::kCannotRead, fmt::format("{}; see --allow-playlists", error.what()));
    } catch (const SourceError& error) {
        throw Failure(ExitCode::kCannotRead, error.what());
    }
}

} // namespace
} // namespace movieconv

int main(int argc, char** argv) {
    movieconv::LimitHeap();
    movieconv::OpenStandardDescriptors();
    try {
        return movieconv::Main(argc, argv);
    } catch (const movieconv::Failure& failure) {
        std::fprintf(stderr, "movieconv: error: %s\n", failure.what());
        return static_cast<int>(failure.Code());
    } catch (const std::bad_alloc&) {
        std::fputs("movieconv: error: there is not enough memory\n", stderr);
        return static_cast<int>(movieconv::ExitCode::kInternal);
    } catch (const std::exception& error) {
        std::fprintf(stderr, "movieconv: internal error: %s\n", error.what());
        return static_cast<int>(movieconv::ExitCode::kInternal);
    }
}
