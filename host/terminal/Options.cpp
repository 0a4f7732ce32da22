#include "host/terminal/Options.h"

#include "Common/Image/ImageConvert.h"
#include "host/convert/Failure.h"
#include "host/convert/Formats.h"
#include "host/presets/Notation.h"
#include "host/presets/Preset.h"
#include "host/terminal/Help.h"
#include "media/Limits.h"

#include <CLI/CLI.hpp>
#include <algorithm>
#include <cctype>
#include <charconv>
#include <cstddef>
#include <cstdio>
#include <cstdlib>
#include <fmt/format.h>
#include <map>
#include <utility>

namespace movieconv {
namespace {

constexpr std::chrono::seconds kPreviewInterval{1};

/// An option whose text `parse` turns into a value; `notation` is what the message asks for.
template <class Value, class Target>
CLI::Option* AddParsed(CLI::App& app, const std::string& names,
                       std::optional<Value> (*parse)(std::string_view), Target& target,
                       const std::string& notation, const std::string& help) {
    const auto take = [parse, &target, notation, names](const std::string& text) {
        const std::optional<Value> value = parse(text);
        if (!value)
            throw CLI::ValidationError(names, fmt::format("\"{}\" is not {}", text, notation));
        target = *value;
    };
    return app.add_option_function<std::string>(names, take, help);
}

template <class Value, class Target>
CLI::Option* AddChoice(CLI::App& app, const std::string& name, Target& target,
                       const std::map<std::string, Value>& choices, const std::string& help) {
    std::string list;
    for (const auto& [word, value] : choices)
        list += (list.empty() ? "" : "|") + word;
    const auto take = [name, &target, choices, list](const std::string& text) {
        const auto choice = choices.find(text);
        if (choice == choices.end())
            throw CLI::ValidationError(name, fmt::format("\"{}\" is not {}", text, list));
        target = choice->second;
    };
    return app.add_option_function<std::string>(name, take, help)->type_name(list);
}

std::map<std::string, Speed> SpeedChoices() {
    std::map<std::string, Speed> choices;
    int number = 0;
    for (const std::string_view name : kSpeedNames)
        choices.emplace(name, static_cast<Speed>(++number));
    return choices;
}

std::optional<uint32_t> ParseFormat(std::string_view name) {
    const FileFormatInfo* format = FindFormat(name);
    return format != nullptr ? std::optional(format->fccFormat) : std::nullopt;
}

void AddEncoding(CLI::App& app, Options& options) {
    const std::string group = "Format and codecs";
    app.add_option("--preset", options.preset,
                   "What is not told by other options, by name or from a\nJSON file (default standard)")
        ->type_name("PRESET")
        ->group(group);
    AddParsed(app, "-f,--format", ParseFormat, options.request.format,
              "a file format; see \"movieconv --list-formats\"",
              "File format, by code or extension; by default the\noutput's extension tells")
        ->type_name("NAME")
        ->group(group);
    AddParsed(app, "--video-codec", ParseCode, options.request.videoCodec,
              "a code of up to four characters; see \"movieconv --list-formats\"",
              "Four-character code of the picture codec")
        ->type_name("CODE")
        ->group(group);
    const auto takeSound = [&options](const std::string& text) {
        options.request.copySound = text == "copy";
        options.request.audioCodec = options.request.copySound ? std::nullopt : ParseCode(text);
        if (!options.request.copySound && !options.request.audioCodec)
            throw CLI::ValidationError("--audio-codec",
                                       fmt::format("\"{}\" is not copy or a code of up to four characters; "
                                                   "see \"movieconv --list-formats\"",
                                                   text));
    };
    app.add_option_function<std::string>(
           "--audio-codec", takeSound,
           "Four-character code of the sound codec, or copy to\nleave sound as it is coded")
        ->type_name("CODE")
        ->group(group);
    app.add_flag("--no-video", options.request.noVideo, "Leave the pictures out")->group(group);
    app.add_flag("--no-audio", options.request.noAudio, "Leave the sound out")->group(group);
}

CLI::Option* AddCrop(CLI::App& app, Options& options) {
    const auto take = [&options](const std::string& text) {
        options.request.detectCrop = text == "auto";
        const std::optional<Crop> crop = options.request.detectCrop ? std::optional(Crop{}) : ParseCrop(text);
        if (!crop)
            throw CLI::ValidationError("--crop",
                                       fmt::format("\"{}\" is not auto or pixels such as 140:140:0:0", text));
        options.request.crop = *crop;
    };
    return app
        .add_option_function<std::string>(
            "--crop", take, "Cut off so many pixels above, below, left and right,\nor black borders (auto)")
        ->type_name("T:B:L:R");
}

CLI::Option* AddRate(CLI::App& app, const std::string& name, std::optional<int32_t>& rate,
                     const char* example, const std::string& help) {
    return AddParsed(app, name, ParseRate, rate, fmt::format("a bit rate up to 2147M, such as {}", example),
                     help)
        ->type_name("RATE");
}

void AddPictures(CLI::App& app, Options& options) {
    const std::string group = "Pictures";
    AddParsed(app, "--size", ParseSize, options.request.size,
              fmt::format("a size from 2x2 to {0}x{0}, such as 640x360", kLargestSide),
              "Picture size; by default the source's")
        ->type_name("WxH")
        ->group(group);
    AddChoice<Fit>(app, "--fit", options.request.fit,
                   {{"borders", Fit::kBorders}, {"stretch", Fit::kStretch}},
                   "How pictures of another shape fill it: with borders\n(default) or by stretching")
        ->group(group);
    AddChoice<Deinterlace>(
        app, "--deinterlace", options.request.deinterlace,
        {{"all", Deinterlace::kAll}, {"auto", Deinterlace::kFlagged}, {"off", Deinterlace::kNone}},
        "Make pictures progressive that say they are interlaced\n(auto, the default), all or none")
        ->group(group);
    AddCrop(app, options)->group(group);
    AddChoice<Hdr>(app, "--hdr", options.request.hdr,
                   {{"auto", Hdr::kAuto}, {"keep", Hdr::kKeep}, {"sdr", Hdr::kSdr}},
                   "Keep HDR, make SDR of it, or keep it where the codec\nhas 10 bits (auto, the default)")
        ->group(group);
    AddChoice<int>(app, "--depth", options.request.depth, {{"8", 8}, {"10", 10}},
                   "Bits of a colour; by default the source's, as far as\nthe codec has them")
        ->group(group);
    AddParsed(app, "--frame-rate", ParseFrameRate, options.request.frameRate,
              fmt::format("a frame rate up to {}, such as 25 or 30000/1001", kHighestFrameRate),
              "Pictures per second; by default the source's")
        ->type_name("N")
        ->group(group);
    app.add_option("--quality", options.request.quality,
                   "Constant quality on the codec's scale, less is better;\nby default the preset's")
        ->type_name("N")
        ->group(group);
    AddParsed(app, "--max-size", ParseBytes, options.request.maxSize, "a size such as 700k, 25M or 4.7G",
              "The output's greatest size, as 25M: chooses rates, and\na smaller picture where they are low")
        ->type_name("BYTES")
        ->group(group);
    AddChoice<Speed>(app, "--speed", options.request.speed, SpeedChoices(),
                     "How long the encoder looks for a smaller file")
        ->type_name("SPEED")
        ->group(group);
    AddRate(app, "--video-rate", options.request.videoRate, "512k or 1.5M",
            "Bits per second, as 1.5M, instead of a quality")
        ->group(group);
    AddRate(app, "--video-max-rate", options.request.videoMaxRate, "512k or 1.5M",
            "Upper bit rate: the rate becomes a target")
        ->group(group);
}

void AddSound(CLI::App& app, Options& options) {
    const std::string group = "Sound";
    app.add_option("--channels", options.request.channels, "Channels; by default the source's")
        ->check(CLI::Range(1, 8).description(""))
        ->type_name("N")
        ->group(group);
    app.add_option("--sample-rate", options.request.sampleRate, "Samples per second; by default the source's")
        ->check(CLI::Range(4000, 384000).description(""))
        ->type_name("HZ")
        ->group(group);
    AddRate(app, "--audio-rate", options.request.audioRate, "128k",
            "Bits per second, as 128k; by default the preset's")
        ->group(group);
    AddRate(app, "--audio-max-rate", options.request.audioMaxRate, "128k",
            "Upper bit rate: the rate becomes a target")
        ->group(group);
}

/// "all", "none", or what stands between commas.
TrackList ParseTracks(const std::string& text) {
    if (text == "all")
        return std::nullopt;
    TrackList list(std::in_place);
    for (std::size_t at = 0; text != "none" && at <= text.size();) {
        const std::size_t end = std::min(text.find(',', at), text.size());
        if (end > at)
            list->push_back(text.substr(at, end - at));
        at = end + 1;
    }
    return list;
}

/// FILE or FILE:LANG, where a language has two or three letters and perhaps a region.
SubtitleFileWish ParseSubtitleFile(const std::string& text) {
    const std::size_t colon = text.rfind(':');
    const std::string language = colon == std::string::npos ? "" : text.substr(colon + 1);
    const std::string code = language.substr(0, language.find('-'));
    const bool isCode =
        (code.size() == 2 || code.size() == 3) &&
        std::all_of(code.begin(), code.end(), [](unsigned char letter) { return std::isalpha(letter) != 0; });
    return isCode ? SubtitleFileWish{text.substr(0, colon), language} : SubtitleFileWish{text, ""};
}

void AddCarried(CLI::App& app, Options& options) {
    const std::string group = "Tracks and texts";
    Request& request = options.request;
    const auto addList = [&](const std::string& name, TrackList& list, const std::string& help) {
        app.add_option_function<std::string>(
               name, [&list](const std::string& text) { list = ParseTracks(text); }, help)
            ->type_name("all|none|LIST")
            ->group(group);
    };
    addList("--audio-tracks", request.audioTracks,
            "Sound to convert, by numbers as --info shows them or\nby languages, between commas");
    addList("--subtitles", request.subtitles, "Subtitles to carry, likewise");
    app.add_option_function<std::vector<std::string>>(
           "--subtitle-file",
           [&request](const std::vector<std::string>& files) {
               for (const std::string& file : files)
                   request.subtitleFiles.push_back(ParseSubtitleFile(file));
           },
           "Add the subtitles of a file; may be repeated")
        ->type_name("FILE[:LANG]")
        ->allow_extra_args(false) // another value needs the option again: INPUT may follow
        ->take_all()
        ->group(group);
    app.add_option("--burn-subtitles", request.burnSubtitles,
                   "Draw subtitles into the pictures: those with a number\nas --info shows it, or a file's")
        ->type_name("N|FILE")
        ->group(group);
    app.add_option("--subtitle-charset", request.subtitleCharset,
                   "Character set of files of subtitles, if not UTF-8,\nUTF-16 or Windows-1252")
        ->type_name("NAME")
        ->group(group);
    app.add_flag("--no-chapters", request.noChapters, "Leave chapters out")->group(group);
    app.add_flag("--no-metadata", request.noMetadata, "Leave the source's texts out, such as title and date")
        ->group(group);
    app.add_option_function<std::vector<std::string>>(
           "--metadata",
           [&request](const std::vector<std::string>& texts) {
               for (const std::string& text : texts) {
                   const std::size_t equals = text.find('=');
                   if (equals == std::string::npos || equals == 0)
                       throw CLI::ValidationError("--metadata", fmt::format("\"{}\" is not KEY=VALUE", text));
                   request.metadata.push_back({text.substr(0, equals), text.substr(equals + 1)});
               }
           },
           "Write a text, as title=Holidays, or with no value\nleave one out; may be repeated")
        ->type_name("KEY=VALUE")
        ->allow_extra_args(false) // another value needs the option again: INPUT may follow
        ->take_all()
        ->group(group);
}

void AddRange(CLI::App& app, Options& options) {
    const std::string group = "What to convert";
    AddParsed(app, "--begin", ParseTime, options.request.begin, "a time such as 83.5 or 0:01:23.5",
              "Begin here; TIME is seconds or h:mm:ss.fff")
        ->type_name("TIME")
        ->group(group);
    AddParsed(app, "--length", ParseTime, options.request.length, "a time such as 83.5 or 0:01:23.5",
              "Convert so much; by default all the rest")
        ->type_name("TIME")
        ->group(group);
    AddParsed(app, "--split", ParseTime, options.request.split, "a time such as 600 or 0:10:00",
              "Write clips of this length: OUTPUT_00, OUTPUT_01, ...")
        ->type_name("TIME")
        ->group(group);
    app.add_flag("--allow-playlists", options.request.playlists,
                 "Also read playlists, which may name movies in their\nfolder and below; by default they are "
                 "refused")
        ->group(group);
}

std::optional<int> ParseJobs(std::string_view text) {
    constexpr int kMostJobs = 256;
    if (text == "auto")
        return 0;
    int number = 0;
    const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), number);
    const bool whole = error == std::errc() && end == text.data() + text.size();
    return whole && number >= 1 && number <= kMostJobs ? std::optional(number) : std::nullopt;
}

void AddPieces(CLI::App& app, Options& options) {
    const std::string group = "In pieces";
    AddParsed(app, "--jobs", ParseJobs, options.jobs, "a number from 1 to 256, or auto",
              "Convert in pieces, N at once; auto: as many as pay")
        ->type_name("N")
        ->group(group);
    app.add_option("--pieces", options.division.pieces,
                   "Divide into N pieces; by default of a minute or more")
        ->check(CLI::Range(1, kMostPieces).description(""))
        ->type_name("N")
        ->group(group);
    AddParsed(app, "--piece-length", ParseTime, options.division.length, "a time such as 83.5 or 0:01:23.5",
              "Divide into pieces of this length")
        ->type_name("TIME")
        ->group(group);
    app.add_flag("--resume", options.resume, "Go on with what the same command has left earlier")
        ->group(group);
    app.add_option_function<std::string>(
           "--plan",
           [&](const std::string& name) {
               options.task = Task::kPlan;
               options.plan = name;
           },
           "Write a plan, by which pieces are made anywhere")
        ->type_name("FILE")
        ->group(group);
    app.add_option_function<int>(
           "--piece",
           [&](int number) {
               options.task = Task::kPiece;
               options.piece = number;
           },
           "Make piece K, from 0, of the plan INPUT")
        ->type_name("K")
        ->group(group);
    app.add_flag_callback(
           "--join", [&] { options.task = Task::kJoin; }, "Make the output of the pieces of the plan INPUT")
        ->group(group);
    app.add_flag("--keep-pieces", options.keepPieces, "Leave the pieces where they are once they are joined")
        ->group(group);
}

void AddMany(CLI::App& app, Options& options) {
    const std::string group = "Many movies";
    app.add_option(
           "--into", options.into,
           "Convert every INPUT, files and folders of them, into\nthis folder; what is there already is left")
        ->type_name("FOLDER")
        ->group(group);
    app.add_option("--names", options.names, "Their outputs' names (default {name}.{ext})")
        ->type_name("PATTERN")
        ->group(group);
}

void AddOutput(CLI::App& app, Options& options) {
    const std::string group = "Output";
    app.add_flag("-y,--overwrite", options.request.overwrite,
                 "Replace an existing output; by default it is refused")
        ->group(group);
    AddChoice<OnFull>(app, "--on-full", options.request.onFull,
                      {{"stop", OnFull::kStop}, {"wait", OnFull::kWait}},
                      "On a full disk: stop (default), or wait until there is\nroom again")
        ->group(group);
    app.add_flag_callback(
           "--keep-partial", [&] { options.request.keepPartial = true; },
           "After a failure keep the unfinished file, which\nplays (default)")
        ->group(group);
    app.add_flag_callback(
           "--no-keep-partial", [&] { options.request.keepPartial = false; },
           "After a failure remove the unfinished file")
        ->group(group);
    app.add_option("--preview", options.preview, "Keep this PNG file showing the picture just written")
        ->type_name("FILE")
        ->group(group);
}

void AddReports(CLI::App& app, Options& options) {
    const std::string group = "Reports";
    AddChoice<ProgressStyle>(
        app, "--progress", options.progress,
        {{"bar", ProgressStyle::kBar}, {"json", ProgressStyle::kJson}, {"none", ProgressStyle::kNone}},
        "A live line, or plain lines without a terminal (bar,\nthe default); one JSON object a line; or the "
        "end only")
        ->group(group);
    app.add_flag("-q,--quiet", options.quiet, "Print nothing but errors")->group(group);
    app.add_option("--log", options.log, "Append the engine's log to this file")
        ->type_name("FILE")
        ->group(group);
    const auto task = [&](const std::string& name, Task chosen, const std::string& help) {
        return app
            .add_flag_callback(
                name, [&options, chosen] { options.task = chosen; }, help)
            ->group("Instead of converting");
    };
    task("--info", Task::kInfo, "Tell what INPUT is");
    task("--estimate", Task::kEstimate, "Tell how much room the output needs and what there is");
    task("--list-formats", Task::kListFormats, "List file formats and codecs");
    task("--list-presets", Task::kListPresets, "List presets; with --quiet their names");
    app.add_option_function<std::string>(
           "--show-preset",
           [&](const std::string& name) {
               options.task = Task::kShowPreset;
               options.preset = name;
           },
           "Print a preset with all that its parents say")
        ->type_name("PRESET")
        ->group("Instead of converting");
    AddChoice<Shell>(app, "--completion", options.completion,
                     {{"bash", Shell::kBash}, {"zsh", Shell::kZsh}, {"fish", Shell::kFish}},
                     "Print a script by which that shell completes these\noptions")
        ->group("Instead of converting");
}

bool NeedsOutput(Task task) {
    return task == Task::kConvert || task == Task::kEstimate || task == Task::kPlan;
}

bool NeedsInput(Task task) {
    return NeedsOutput(task) || task == Task::kInfo || task == Task::kPiece || task == Task::kJoin;
}

void RequirePieces(const Options& options) {
    const bool byPlan = options.task == Task::kPiece || options.task == Task::kJoin;
    if (byPlan && !options.request.output.empty())
        throw Failure(Category::kRequest, "--piece and --join take the plan alone: it names the output");
    const bool divides = options.task == Task::kPlan || (options.task == Task::kConvert && options.jobs);
    if ((options.division.pieces || options.division.length) && !divides)
        throw Failure(Category::kRequest, "--pieces and --piece-length go with --jobs or --plan");
    if (options.division.pieces && options.division.length)
        throw Failure(Category::kRequest, "--pieces and --piece-length exclude each other");
    if (options.jobs && options.task != Task::kConvert)
        throw Failure(Category::kRequest,
                      "--jobs goes with a conversion, not with --plan, --piece or --join");
    if (options.resume && !options.jobs && !options.request.split)
        throw Failure(Category::kRequest, "--resume goes with --jobs or --split");
    if (options.jobs && options.preview)
        throw Failure(Category::kRequest, "--jobs converts many places at once and so excludes --preview");
}

void RequireMany(const Options& options) {
    if (!options.into && (!options.further.empty() || options.names))
        throw Failure(Category::kRequest, "more than INPUT and OUTPUT, and --names, go with --into");
    if (options.into && (options.task != Task::kConvert || options.preview || options.resume ||
                         options.request.split || options.division.pieces || options.division.length))
        throw Failure(Category::kRequest,
                      "--into converts many movies: it excludes --split, --preview, --resume, "
                      "--pieces, --piece-length and what is done instead of converting");
}

void RequireSense(const Options& options) {
    RequireMany(options);
    if (NeedsInput(options.task) && options.request.input.empty())
        throw Failure(Category::kRequest, "INPUT is missing; try \"movieconv --help\"");
    if (NeedsOutput(options.task) && !options.into && options.request.output.empty())
        throw Failure(Category::kRequest, "OUTPUT is missing; try \"movieconv --help\"");
    RequirePieces(options);
    const TrackList& sound = options.request.audioTracks;
    if (options.request.noVideo && (options.request.noAudio || (sound && sound->empty())))
        throw Failure(Category::kRequest, "--no-video and --no-audio together leave nothing to convert");
    if (options.request.maxSize && (options.request.quality || options.request.videoRate ||
                                    options.request.audioRate || options.request.split))
        throw Failure(Category::kRequest, "--max-size chooses the rates of one file: it excludes --quality, "
                                          "--video-rate, --audio-rate and --split");
    if (options.request.copySound &&
        (options.request.channels || options.request.sampleRate || options.request.audioRate ||
         options.request.audioMaxRate || options.request.maxSize))
        throw Failure(Category::kRequest,
                      "--audio-codec copy leaves sound as it is: it excludes --channels, --sample-rate, "
                      "--audio-rate, --audio-max-rate and --max-size");
    if (options.request.quality && options.request.videoRate)
        throw Failure(Category::kRequest, "--quality and --video-rate exclude each other");
    if (options.request.length && *options.request.length < 0.001)
        throw Failure(Category::kRequest, "--length must be at least 0.001 seconds");
    if (options.request.split && (*options.request.split < 0.1 || *options.request.split > 2'000'000))
        throw Failure(Category::kRequest, "--split takes from 0.1 to 2000000 seconds");
}

/// What the preset says, where the other options do not say otherwise.
void ApplyPreset(Options& options) {
    try {
        Preset preset = LoadPreset(options.preset);
        Request& request = options.request;
        request.noVideo = request.noVideo || (preset.preferences.noVideo && !request.videoCodec);
        request.noAudio =
            request.noAudio || (preset.preferences.noAudio && !request.audioCodec && !request.copySound);
        request.preferences = std::move(preset.preferences);
        options.complaints = std::move(preset.complaints);
    } catch (const PresetError& error) {
        throw Failure(Category::kRequest, error.what());
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

} // namespace

std::optional<Options> ParseOptions(int argc, char** argv) {
    Options options;
    CLI::App app{"Converts a movie to another format, picture size or codec, as one file or as\nclips.",
                 "movieconv"};
    app.formatter(MakeHelpFormatter());
    app.footer("A name that begins with a dash goes behind \"--\". While converting, space or p\n"
               "pauses and resumes, q or Ctrl-C stops and keeps what is done as a playable file.\n"
               "movieconv(1) tells more, with the presets and the exit codes.");
    app.set_help_flag("-h,--help", "Print help on the usual options")->group("Instead of converting");
    app.set_help_all_flag("--help-all", "Print help on all options")->group("Instead of converting");
    app.set_version_flag("--version", Version, "Print the version and the colour routines' level")
        ->group("Instead of converting");
    app.add_option("INPUT", options.request.input, "The movie to convert, any that FFmpeg can read")
        ->type_name("");
    app.add_option("OUTPUT", options.request.output, "The file to make")->type_name("");
    app.add_option("FURTHER", options.further)->type_name("")->group("");
    AddRange(app, options);
    AddEncoding(app, options);
    AddPictures(app, options);
    AddSound(app, options);
    AddMany(app, options);
    AddPieces(app, options);
    AddCarried(app, options);
    AddOutput(app, options);
    AddReports(app, options);
    try {
        app.parse(argc, argv);
    } catch (const CLI::Success& asked) {
        app.exit(asked);
        return std::nullopt;
    } catch (const CLI::ParseError& error) {
        throw Failure(Category::kRequest, fmt::format("{}; try \"movieconv --help\"", error.what()));
    }
    if (options.completion) {
        std::fputs(CompletionScript(*options.completion, OptionEntries(app)).c_str(), stdout);
        return std::nullopt;
    }
    if (options.request.input == "-")
        options.request.input = "/dev/stdin";
    RequireSense(options);
    if (NeedsOutput(options.task))
        ApplyPreset(options);
    if (options.preview)
        options.request.preview = kPreviewInterval;
    return options;
}

} // namespace movieconv
