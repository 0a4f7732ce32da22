#include "host/convert/Judgement.h"

#include "api/MovieConv.h"
#include "host/convert/Amounts.h"
#include "host/sentence/Say.h"

#include <filesystem>
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
    if (evidence.userStopped && evidence.readError.IsEmpty())
        return std::nullopt;
    return Failure(Category::kSource, evidence.readError.IsEmpty()
                                          ? Say("\"{}\" holds nothing to convert", input)
                                          : Say("cannot read \"{}\": {}", input, evidence.readError));
}

} // namespace

Sentence WhyItEndedEarly(const Movie& movie, const Request& request, double reached) {
    const bool lengthReached = request.length && *request.length - reached <= kEarlyEnd;
    const std::optional<Shortfall> missing = lengthReached ? movie.Undecoded() : movie.Missing();
    if (!missing)
        return {};
    if (HasShrunk(movie.Info()))
        return Say("the file was cut meanwhile");
    if (missing->announced <= 0)
        return missing->undecodable ? Say("none of its pictures could be decoded") : Say("it is cut off");
    const std::string end = FormatTime(missing->reached, true);
    const std::string announced = FormatTime(missing->announced, true);
    if (missing->undecodable == StreamKind::kPictures)
        return Say("none of its pictures from {} to its end at {} could be decoded", end, announced);
    if (missing->undecodable)
        return Say("none of its sound from {} to its end at {} could be decoded", end, announced);
    return missing->cutOff ? Say("it is cut off: it ends at {} although it announces {}", end, announced)
                           : Say("it ends at {} although it announces {}", end, announced);
}

std::optional<Failure> FindExcess(const Request& request, const FileLedger& files) {
    if (!request.maxSize || files.Bytes() <= *request.maxSize)
        return std::nullopt;
    return Failure(Category::kOutput, Say("\"{}\" has become larger than asked for: {}", request.output,
                                          SayAmount(FormatBytes(files.Bytes()))));
}

std::optional<Failure> FindFailure(const Evidence& evidence) {
    if (evidence.brokenOff)
        return evidence.brokenOff;
    const Request& request = evidence.request;
    const FileLedger& files = evidence.files;
    if (files.FirstFailure())
        return files.FirstFailure();
    if (const std::optional<Sentence> missing = files.FindMissing())
        return Failure(Category::kOutput, *missing);
    if (files.Complete() == 0)
        return WhyNothingIsThere(evidence);
    const Sentence& reason = evidence.readError.IsEmpty() ? evidence.shortfall : evidence.readError;
    const std::string reached = FormatTime(evidence.reached, true);
    if (!reason.IsEmpty() && !evidence.userStopped) {
        return Failure(Category::kSource,
                       request.piece // of which nothing is left
                           ? Say("reading \"{}\" failed after {}: {}", request.input, reached, reason)
                           : Say("reading \"{}\" failed after {}: {}; what was read is converted",
                                 request.input, reached, reason));
    }
    if (std::optional<Failure> excess = FindExcess(request, files))
        return excess;
    if (evidence.engineOutcome == kOutcomeCompleted ||
        (evidence.userStopped && evidence.engineOutcome == kOutcomeStopped))
        return std::nullopt;
    return Failure(Category::kInternal,
                   evidence.engineOutcome == kOutcomeFailed
                       ? Say("the conversion broke off after {}, for want of memory", reached)
                       : Say("the conversion broke off after {}", reached));
}

} // namespace movieconv
