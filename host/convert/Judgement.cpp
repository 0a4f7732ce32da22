#include "host/convert/Judgement.h"

#include "api/MovieConv.h"
#include "host/convert/Amounts.h"

#include <filesystem>
#include <fmt/format.h>
#include <system_error>

namespace movieconv {
namespace {

constexpr double kEarlyEnd = 1; // seconds by which a source may fall short of the length asked for

/// Whether the file is shorter than when it was opened.
bool HasShrunk(const SourceInfo& source) {
    std::error_code unknown;
    const auto bytes = std::filesystem::file_size(source.path, unknown);
    return !unknown && static_cast<int64_t>(bytes) < source.bytes;
}

/// Without a complete file, of which the writer keeps none that is empty.
std::optional<Failure> WhyNothingIsThere(const Evidence& evidence) {
    const std::string& input = evidence.request.input;
    if (evidence.userStopped && evidence.readError.empty())
        return std::nullopt;
    return Failure(Category::kSource, evidence.readError.empty()
                                          ? fmt::format("\"{}\" holds nothing to convert", input)
                                          : fmt::format("cannot read \"{}\": {}", input, evidence.readError));
}

} // namespace

std::string WhyItEndedEarly(const Movie& movie, const Request& request, double reached) {
    const std::optional<Shortfall> missing = movie.Missing();
    const bool lengthReached = request.length && *request.length - reached <= kEarlyEnd;
    if (!missing || lengthReached)
        return {};
    if (HasShrunk(movie.Info()))
        return "the file was cut meanwhile";
    if (missing->announced <= 0)
        return "it is cut off";
    return fmt::format("{}it ends at {} although it announces {}", missing->cutOff ? "it is cut off: " : "",
                       FormatTime(missing->reached, true), FormatTime(missing->announced, true));
}

std::optional<Failure> FindExcess(const Request& request, const FileLedger& files) {
    if (!request.maxSize || files.Bytes() <= *request.maxSize)
        return std::nullopt;
    return Failure(Category::kOutput, fmt::format("\"{}\" has become larger than asked for: {}",
                                                  request.output, FormatBytes(files.Bytes())));
}

std::optional<Failure> FindFailure(const Evidence& evidence) {
    if (evidence.brokenOff)
        return evidence.brokenOff;
    const Request& request = evidence.request;
    const FileLedger& files = evidence.files;
    if (files.FirstFailure())
        return files.FirstFailure();
    if (const std::optional<std::string> missing = files.FindMissing())
        return Failure(Category::kOutput, *missing);
    if (files.Complete() == 0)
        return WhyNothingIsThere(evidence);
    const std::string& reason = evidence.readError.empty() ? evidence.shortfall : evidence.readError;
    if (!reason.empty() && !evidence.userStopped) {
        const std::string reached = FormatTime(evidence.reached, true);
        return Failure(Category::kSource,
                       request.piece // of which nothing is left
                           ? fmt::format("reading \"{}\" failed after {}: {}", request.input, reached, reason)
                           : fmt::format("reading \"{}\" failed after {}: {}; what was read is converted",
                                         request.input, reached, reason));
    }
    if (const std::optional<Failure> excess = FindExcess(request, files))
        return excess;
    if (evidence.engineOutcome == kOutcomeCompleted ||
        (evidence.userStopped && evidence.engineOutcome == kOutcomeStopped))
        return std::nullopt;
    return Failure(Category::kInternal,
                   fmt::format("the conversion broke off after {}{}", FormatTime(evidence.reached, true),
                               evidence.engineOutcome == kOutcomeFailed ? ", for want of memory" : ""));
}

} // namespace movieconv
