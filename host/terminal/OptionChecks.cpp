#include "host/terminal/OptionChecks.h"

#include "host/convert/Failure.h"
#include "host/source/BurnWish.h"

#include <initializer_list>

namespace movieconv {
namespace {

struct Rule {
    bool broken;
    const char* message;
};

void Require(std::initializer_list<Rule> rules) {
    for (const Rule& rule : rules)
        if (rule.broken)
            throw Failure(Category::kRequest, Sentence(rule.message));
}

bool NeedsInput(Task task) {
    return NeedsOutput(task) || task == Task::kInfo || task == Task::kPiece || task == Task::kJoin;
}

void CheckPlaces(const Options& options) {
    const bool other = options.task != Task::kConvert || options.preview || options.resume ||
                       options.request.split || options.division.pieces || options.division.length;
    Require({
        {!options.into && (!options.inputs.empty() || options.names),
         "more than INPUT and OUTPUT, and --names, go with --into"},
        {options.into && other, "--into converts many movies: it excludes --split, --preview, --resume, "
                                "--pieces, --piece-length and "
                                "what is done instead of converting"},
        {options.into ? options.inputs.empty() : NeedsInput(options.task) && options.request.input.empty(),
         "INPUT is missing; try \"movieconv --help\""},
        {NeedsOutput(options.task) && !options.into && options.request.output.empty(),
         "OUTPUT is missing; try \"movieconv --help\""},
    });
}

void CheckPieces(const Options& options) {
    const Division& division = options.division;
    const bool byPlan = options.task == Task::kPiece || options.task == Task::kJoin;
    const bool divides = options.task == Task::kPlan || (options.task == Task::kConvert && options.jobs);
    Require({
        {byPlan && !options.request.output.empty(),
         "--piece and --join take the plan alone: it names the output"},
        {(division.pieces || division.length) && !divides,
         "--pieces and --piece-length go with --jobs or --plan"},
        {division.pieces && division.length, "--pieces and --piece-length exclude each other"},
        {options.jobs && options.task != Task::kConvert,
         "--jobs goes with a conversion, not with --plan, --piece, --join or --estimate"},
        {options.request.split && divides, "--split makes clips, which --jobs and --plan do not"},
        {options.resume && !options.jobs && !options.request.split, "--resume goes with --jobs or --split"},
        {options.keepPieces && ((!options.jobs && options.task != Task::kJoin) || options.into),
         "--keep-pieces goes with --jobs or --join, not with --into"},
        {options.preview && options.task != Task::kConvert, "--preview goes with a conversion"},
        {options.jobs && options.preview, "--jobs converts many places at once and so excludes --preview"},
    });
}

void CheckRequest(const Request& request) {
    const bool silent = request.noAudio || (request.audioTracks && request.audioTracks->empty());
    const bool rated = request.quality || request.videoRate || request.audioRate;
    const bool changesSound =
        request.channels || request.sampleRate || request.audioRate || request.audioMaxRate;
    BurnWish burnt;
    burnt.what = request.burnSubtitles;
    const bool readsText =
        !request.subtitleFiles.empty() || (!request.burnSubtitles.empty() && !NamesStream(burnt));
    Require({
        {request.noVideo && silent, "--no-video and --no-audio together leave nothing to convert"},
        {request.videoRate && request.videoMaxRate && *request.videoMaxRate < *request.videoRate,
         "--video-max-rate must be at least --video-rate"},
        {request.audioRate && request.audioMaxRate && *request.audioMaxRate < *request.audioRate,
         "--audio-max-rate must be at least --audio-rate"},
        {!request.subtitleCharset.empty() && !readsText,
         "--subtitle-charset goes with --subtitle-file, or with a file for --burn-subtitles"},
        {request.maxSize && (rated || request.split),
         "--max-size chooses the rates of one file: it excludes --quality, --video-rate, --audio-rate and "
         "--split"},
        {request.copySound && (changesSound || request.maxSize),
         "--audio-codec copy leaves sound as it is: it excludes --channels, --sample-rate, --audio-rate, "
         "--audio-max-rate and --max-size"},
        {request.quality && request.videoRate, "--quality and --video-rate exclude each other"},
        {request.length && *request.length < 0.001, "--length must be at least 0.001 seconds"},
        {request.split && (*request.split < 0.1 || *request.split > 2'000'000),
         "--split takes from 0.1 to 2000000 seconds"},
    });
}

} // namespace

bool NeedsOutput(Task task) {
    return task == Task::kConvert || task == Task::kEstimate || task == Task::kPlan;
}

void CheckOptions(const Options& options) {
    CheckPlaces(options);
    CheckPieces(options);
    CheckRequest(options.request);
}

} // namespace movieconv
