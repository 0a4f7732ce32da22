#include "host/terminal/OptionTable.h"

#include "host/convert/Formats.h"
#include "host/presets/Notation.h"
#include "host/terminal/OptionGroup.h"
#include "host/terminal/OptionValues.h"
#include "media/Limits.h"

#include <cstdint>
#include <fmt/format.h>
#include <optional>
#include <string>

namespace movieconv {
namespace {

constexpr const char* kTime = "a time such as 83.5 or 0:01:23.5";
constexpr const char* kCode = "a code of up to four characters; see \"movieconv --list-formats\"";

void AddRate(OptionGroup& group, const std::string& name, std::optional<int32_t>& rate,
             const std::string& example, const std::string& help) {
    group.Parsed(name, "RATE", ParseRate, rate, "a bit rate up to 2147M, such as " + example, help);
}

void AddRange(CLI::App& app, Options& options) {
    OptionGroup group(app, heading::kRange);
    Request& request = options.request;
    group.Parsed("--begin", "TIME", ParseTime, request.begin, kTime,
                 "Begin here; TIME is seconds or h:mm:ss.fff");
    group.Parsed("--length", "TIME", ParseTime, request.length, kTime,
                 "Convert this much; by default to the end");
    group.Parsed("--split", "TIME", ParseTime, request.split, "a time such as 600 or 0:10:00",
                 "Write clips of this length: OUTPUT_00, OUTPUT_01, ...");
    group.Flag("--allow-playlists", request.playlists,
               "Also read playlists, which may name movies in their\nfolder and below; by default they are "
               "refused");
}

void AddEncoding(CLI::App& app, Options& options) {
    OptionGroup group(app, heading::kEncoding);
    Request& request = options.request;
    group.Value(
        "--preset", "PRESET", options.preset,
        "Settings for all that other options leave open, by name\nor from a JSON file (default standard)");
    group.Parsed("-f,--format", "NAME", ParseFormat, request.format,
                 "a file format; see \"movieconv --list-formats\"",
                 "File format, by code or extension; by default the\noutput's extension tells");
    group.Parsed("--video-codec", "CODE", ParseCode, request.videoCodec, kCode,
                 "Four-character code of the picture codec");
    group.Read(
        "--audio-codec", "CODE",
        [&request](const std::string& text) { return ReadSoundCodec(text, request); },
        std::string("copy or ") + kCode,
        "Four-character code of the sound codec, or copy to\nleave sound as it is coded");
    group.Flag("--no-video", request.noVideo, "Leave the pictures out");
    group.Flag("--no-audio", request.noAudio, "Leave the sound out");
}

void AddPictures(CLI::App& app, Options& options) {
    OptionGroup group(app, heading::kPictures);
    Request& request = options.request;
    group.Parsed("--size", "WxH", ParseSize, request.size,
                 fmt::format("a size from 2x2 to {0}x{0}, such as 640x360", kLargestSide),
                 "Picture size; by default the source's");
    group.Choice<Fit>("--fit", request.fit, {{"borders", Fit::kBorders}, {"stretch", Fit::kStretch}},
                      "How pictures of another shape fill it: with borders\n(default) or by stretching");
    group.Choice<Deinterlace>(
        "--deinterlace", request.deinterlace,
        {{"all", Deinterlace::kAll}, {"auto", Deinterlace::kFlagged}, {"off", Deinterlace::kNone}},
        "Deinterlace pictures that are marked as interlaced\n(auto, the default), all or none");
    group.Read(
        "--crop", "T:B:L:R", [&request](const std::string& text) { return ReadCrop(text, request); },
        "auto or pixels such as 140:140:0:0",
        "Cut off so many pixels above, below, left and right,\nor black borders (auto)");
    group.Choice<Hdr>(
        "--hdr", request.hdr, {{"auto", Hdr::kAuto}, {"keep", Hdr::kKeep}, {"sdr", Hdr::kSdr}},
        "Keep HDR, make SDR of it, or keep it where the codec\nhas 10 bits (auto, the default)");
    group.Choice<int>("--depth", request.depth, {{"8", 8}, {"10", 10}},
                      "Bits per sample; by default the source's, as far as\nthe codec has them");
    group.Parsed("--frame-rate", "N", ParseFrameRate, request.frameRate,
                 fmt::format("a frame rate from {} to {}, such as 25 or 30000/1001", kLowestFrameRate,
                             kHighestFrameRate),
                 "Pictures per second, steadily; by default the source's times");
    group.Parsed("--quality", "N", ParseNumber, request.quality, "a number such as 23 or 23.5",
                 "Constant quality on the codec's scale, lower is better;\nby default the preset's");
    group.Parsed(
        "--max-size", "BYTES", ParseBytes, request.maxSize, "a size such as 700k, 25M or 4.7G",
        "Largest size of the output, as 25M: chooses rates, and\na smaller picture where they are low");
    group.Choice<Speed>("--speed", request.speed, SpeedChoices(),
                        "How long the encoder looks for a smaller file", "SPEED");
    AddRate(group, "--video-rate", request.videoRate, "512k or 1.5M",
            "Bits per second, as 1.5M, instead of a quality");
    AddRate(group, "--video-max-rate", request.videoMaxRate, "512k or 1.5M",
            "Upper bit rate: the rate becomes a target");
}

void AddSound(CLI::App& app, Options& options) {
    OptionGroup group(app, heading::kSound);
    Request& request = options.request;
    group.Number("--channels", "N", 1, 8, request.channels, "Channels; by default the source's");
    group.Number("--sample-rate", "HZ", 4000, 384000, request.sampleRate,
                 "Samples per second; by default the source's");
    AddRate(group, "--audio-rate", request.audioRate, "128k",
            "Bits per second, as 128k; by default the preset's");
    AddRate(group, "--audio-max-rate", request.audioMaxRate, "128k",
            "Upper bit rate: the rate becomes a target");
}

void AddMany(CLI::App& app, Options& options) {
    OptionGroup group(app, heading::kMany);
    group.Value("--into", "FOLDER", options.into,
                "Convert every INPUT, files and folders of them, into\nthis folder; what is there already is "
                "left");
    group.Value("--names", "PATTERN", options.names, "Their outputs' names (default {name}.{ext})");
}

void AddPieces(CLI::App& app, Options& options) {
    OptionGroup group(app, heading::kPieces);
    group.Parsed("--jobs", "N", ParseJobs, options.jobs,
                 fmt::format("a number from 1 to {}, or auto", kMostJobs),
                 "Convert in pieces, N at once; auto: as many as help");
    group.Number("--pieces", "N", 1, kMostPieces, options.division.pieces,
                 "Divide into N pieces; by default of a minute or more");
    group.Parsed("--piece-length", "TIME", ParseTime, options.division.length, kTime,
                 "Divide into pieces of this length");
    group.Flag("--resume", options.resume, "Resume an earlier run of the same command");
    group.Taken<std::string>(
        "--plan", "FILE",
        [&options](const std::string& name) {
            options.task = Task::kPlan;
            options.plan = name;
        },
        "Write a plan, by which pieces are made anywhere");
    group.Number(
        "--piece", "K", 0, kMostPieces,
        [&options](int number) {
            options.task = Task::kPiece;
            options.piece = number;
        },
        "Make piece K, from 0, of the plan INPUT");
    group.Action(
        "--join", [&options] { options.task = Task::kJoin; },
        "Make the output of the pieces of the plan INPUT");
    group.Flag("--keep-pieces", options.keepPieces, "Leave the pieces where they are once they are joined");
}

void AddTracks(OptionGroup& group, const std::string& name, TrackList& list, const std::string& help) {
    group.Taken<std::string>(
        name, "all|none|LIST", [&list](const std::string& text) { list = ParseTracks(text); }, help);
}

void AddCarried(CLI::App& app, Options& options) {
    OptionGroup group(app, heading::kCarried);
    Request& request = options.request;
    AddTracks(group, "--audio-tracks", request.audioTracks,
              "Sound to convert, by numbers as --info shows them or\nby languages, between commas");
    AddTracks(group, "--subtitles", request.subtitles, "Subtitles to carry, likewise");
    group.Each(
        "--subtitle-file", "FILE[:LANG]",
        [&request](const std::string& text) {
            request.subtitleFiles.push_back(ParseSubtitleFile(text));
            return true;
        },
        "a file", "Add the subtitles of a file; may be repeated");
    group.Value("--burn-subtitles", "N|FILE", request.burnSubtitles,
                "Draw subtitles into the pictures: those with a number\nas --info shows it, or a file's");
    group.Value("--subtitle-charset", "NAME", request.subtitleCharset,
                "Character set of files of subtitles, if not UTF-8,\nUTF-16 or Windows-1252");
    group.Flag("--no-chapters", request.noChapters, "Leave chapters out");
    group.Flag("--no-metadata", request.noMetadata, "Leave the source's texts out, such as title and date");
    group.Each(
        "--metadata", "KEY=VALUE",
        [&request](const std::string& text) { return ReadMetadata(text, request); }, "KEY=VALUE",
        "Write a text, as title=Holidays, or with no value\nleave one out; may be repeated");
}

void AddOutput(CLI::App& app, Options& options) {
    OptionGroup group(app, heading::kOutput);
    Request& request = options.request;
    group.Flag("-y,--overwrite", request.overwrite, "Replace an existing output; by default it is refused");
    group.Choice<OnFull>("--on-full", request.onFull, {{"stop", OnFull::kStop}, {"wait", OnFull::kWait}},
                         "On a full disk: stop (default), or wait until there is\nroom again");
    group.Action(
        "--keep-partial", [&request] { request.keepPartial = true; },
        "After a failure keep the unfinished file, which\nplays (default)");
    group.Action(
        "--no-keep-partial", [&request] { request.keepPartial = false; },
        "After a failure remove the unfinished file");
    group.Value("--preview", "FILE", options.preview, "Keep this PNG file showing the picture just written");
}

void AddReports(CLI::App& app, Options& options) {
    OptionGroup group(app, heading::kReports);
    group.Choice<ProgressStyle>(
        "--progress", options.progress,
        {{"bar", ProgressStyle::kBar}, {"json", ProgressStyle::kJson}, {"none", ProgressStyle::kNone}},
        "A live line, or plain lines without a terminal (bar,\nthe default); one JSON object a line; or the "
        "end only");
    group.Flag("-q,--quiet", options.quiet, "Print nothing but errors");
    group.Value("--log", "FILE", options.log, "Append the engine's log to this file");
}

void AddTasks(CLI::App& app, Options& options) {
    OptionGroup group(app, heading::kInsteadOfConverting);
    const auto add = [&](const std::string& name, Task task, const std::string& help) {
        group.Action(
            name, [&options, task] { options.task = task; }, help);
    };
    add("--info", Task::kInfo, "Tell what INPUT is");
    add("--estimate", Task::kEstimate, "Tell how much room the output needs and what there is");
    add("--list-formats", Task::kListFormats, "List file formats and codecs");
    add("--list-presets", Task::kListPresets, "List presets; with --quiet their names");
    group.Taken<std::string>(
        "--show-preset", "PRESET",
        [&options](const std::string& name) {
            options.task = Task::kShowPreset;
            options.preset = name;
        },
        "Print a preset with all that its parents say");
    group.Choice<Shell>("--completion", options.completion,
                        {{"bash", Shell::kBash}, {"zsh", Shell::kZsh}, {"fish", Shell::kFish}},
                        "Print a script by which that shell completes these\noptions");
}

} // namespace

void AddOptions(CLI::App& app, Options& options) {
    app.add_option("INPUT", options.request.input, "The movie to convert, any that FFmpeg can read")
        ->type_name("");
    app.add_option("OUTPUT", options.request.output, "The file to make")->type_name("");
    app.add_option("FURTHER", options.inputs)->type_name("")->group("");
    AddRange(app, options);
    AddEncoding(app, options);
    AddPictures(app, options);
    AddSound(app, options);
    AddMany(app, options);
    AddPieces(app, options);
    AddCarried(app, options);
    AddOutput(app, options);
    AddReports(app, options);
    AddTasks(app, options);
}

} // namespace movieconv
