// Random divisions of random sources: what is joined of pieces has the pictures, stamps, sound, cues,
// chapters and tags of an undivided conversion, exactly, and does not depend on how many pieces are made at
// once. MOVIECONV_PLANS is the number of the last one, MOVIECONV_FIRST_PLAN that of the first.
#include "host/convert/Formats.h"
#include "host/pieces/Foreman.h"
#include "host/pieces/OutputNames.h"
#include "tests/convert/Listener.h"
#include "tests/pieces/Packets.h"
#include "tests/support/Folder.h"
#include "tests/support/Program.h"

#include <gtest/gtest.h>

#include <cstdlib>
#include <fmt/format.h>
#include <random>
#include <string>
#include <vector>

namespace {

using movieconv::Foreman;
using movieconv::Outcome;
using movieconv::PieceOrder;
using movieconv::Request;
using movieconv::Verdict;
using Args = std::vector<std::string>;

class Dice {
public:
    explicit Dice(unsigned seed) : engine_(seed) {}
    int Up(int most) { return static_cast<int>(engine_() % static_cast<unsigned>(most + 1)); }
    bool Once(int in) { return Up(in - 1) == 0; }
    template <class Item>
    Item OneOf(const std::vector<Item>& items) {
        return items[static_cast<std::size_t>(Up(static_cast<int>(items.size()) - 1))];
    }

private:
    std::mt19937 engine_;
};

void Add(Args& args, const Args& more) {
    args.insert(args.end(), more.begin(), more.end());
}

/// What the ffmpeg program is told to make a source of: inputs, what is taken of them, and how.
struct Recipe {
    Args inputs;
    Args taken;
    Args ways;
    int count = 0; // of inputs

    void Take(const Args& input, const char* kind) {
        Add(inputs, input);
        Add(taken, {"-map", fmt::format("{}:{}", count++, kind)});
    }
};

Args Late(Dice& dice) {
    return dice.Once(4) ? Args{"-itsoffset", fmt::format("0.{}", dice.Up(9))} : Args{};
}

/// With gaps and uneven steps, reordered in every way, that may begin late.
void AddPictures(Recipe& recipe, Dice& dice, double seconds, std::string& ending) {
    const auto rate = dice.OneOf<std::string>({"24", "25", "30000/1001", "50", "12"});
    Args input = Late(dice);
    Add(input, {"-f", "lavfi", "-i", fmt::format("testsrc=s=96x64:r={}:d={}", rate, seconds)});
    recipe.Take(input, "v");
    switch (dice.Up(3)) {
    case 0:
        Add(recipe.ways, {"-vf", fmt::format("select='gt(random({}),0.4)+eq(n,0)'", dice.Up(99))});
        break;
    case 1:
        Add(recipe.ways, {"-vf", fmt::format("settb=1/90000,setpts='PTS+if(mod(N,{}),0,0.4/(({})*TB))'",
                                             2 + dice.Up(3), rate)});
        break;
    default:
        break;
    }
    Add(recipe.ways, {"-vsync", "passthrough"});
    const std::string group = std::to_string(3 + dice.Up(60));
    switch (dice.Up(3)) {
    case 0:
        Add(recipe.ways, {"-c:v", "mpeg4", "-bf", std::to_string(dice.Up(2)), "-g", group});
        break;
    case 1:
        Add(recipe.ways,
            {"-c:v", "libvpx", "-b:v", "200k", "-auto-alt-ref", "1", "-lag-in-frames", "16", "-g", group});
        ending = "mkv";
        break;
    default:
        Add(recipe.ways, {"-c:v", "libx264", "-preset", "ultrafast", "-bf", std::to_string(dice.Up(3)), "-g",
                          group, "-x264-params", fmt::format("open-gop={}:b-pyramid=normal", dice.Up(1))});
        break;
    }
}

/// None, or one or two tracks that begin and end elsewhere than the pictures.
void AddSound(Recipe& recipe, Dice& dice, double seconds, const std::string& ending) {
    if (dice.Once(4))
        return;
    for (int track = dice.Once(3) ? 2 : 1; track > 0; --track) {
        Args input = Late(dice);
        Add(input, {"-f", "lavfi", "-i",
                    fmt::format("sine=f={}:d={}:r={}", 200 * track,
                                std::max(0.2, seconds + (dice.Up(10) - 5) / 10.0),
                                dice.OneOf<int>({44100, 48000, 22050}))});
        recipe.Take(input, "a");
    }
    Add(recipe.ways, {"-c:a", ending == "ts" ? "mp2" : dice.OneOf<std::string>({"aac", "aac", "libmp3lame"}),
                      "-metadata:s:a:0", "language=" + dice.OneOf<std::string>({"deu", "eng", "und"})});
}

/// Cues of which some overlap, chapters and tags.
void AddTexts(Recipe& recipe, Dice& dice, const Folder& folder, double seconds, const std::string& ending) {
    const auto most = static_cast<int>(seconds * 1000);
    if (ending != "ts" && dice.Once(2)) {
        std::string cues;
        for (int cue = 0, at = 0; cue < 1 + dice.Up(6); at = std::min(at + dice.Up(800), most), ++cue)
            cues += fmt::format("{}\n00:00:{:02},{:03} --> 00:00:{:02},{:03}\ncue {}\n\n", cue + 1, at / 1000,
                                at % 1000, (at + 400) / 1000, (at + 400) % 1000, cue);
        WriteFile(folder / "cues.srt", cues);
        recipe.Take({"-i", folder / "cues.srt"}, "s");
        Add(recipe.ways, {"-c:s", ending == "mkv" ? "subrip" : "mov_text"});
    }
    if (ending == "ts" || !dice.Once(2))
        return;
    std::string texts = ";FFMETADATA1\ntitle=A title\n";
    for (int chapter = 0, at = 0; chapter < 1 + dice.Up(4) && at < most; ++chapter) {
        const int end = std::min(at + 1 + dice.Up(1000), most);
        texts +=
            fmt::format("[CHAPTER]\nTIMEBASE=1/1000\nSTART={}\nEND={}\ntitle=chapter {}\n", at, end, chapter);
        at = end;
    }
    WriteFile(folder / "texts", texts);
    Add(recipe.inputs, {"-i", folder / "texts"});
    Add(recipe.ways,
        {"-map_metadata", std::to_string(recipe.count), "-map_chapters", std::to_string(recipe.count)});
    ++recipe.count;
}

std::string MakeSource(Dice& dice, const Folder& folder) {
    const double seconds = 0.5 + dice.Up(30) / 10.0;
    auto ending = dice.OneOf<std::string>({"mkv", "mp4", "mov", "ts"});
    Recipe recipe;
    AddPictures(recipe, dice, seconds, ending);
    AddSound(recipe, dice, seconds, ending);
    AddTexts(recipe, dice, folder, seconds, ending);
    if (dice.Once(5))
        Add(recipe.ways, {"-output_ts_offset", std::to_string(dice.Up(20))});
    std::string path = folder / ("source." + ending);
    Args args{"ffmpeg", "-v", "error", "-nostdin", "-y"};
    for (const Args& part : {recipe.inputs, recipe.taken, recipe.ways, Args{path}})
        Add(args, part);
    const program::Result made = program::Run(args);
    EXPECT_EQ(made.code, 0) << made.err;
    return path;
}

Request MakeRequest(Dice& dice, const std::string& source) {
    Request request;
    request.input = source;
    request.output = dice.OneOf<std::string>({"mp4", "mkv", "avi", "ts", "mov"});
    const auto code = [](const char* name) { return *movieconv::ParseCode(name); };
    if (request.output == "mkv" && dice.Once(3))
        request.videoCodec = dice.OneOf<uint32_t>({code("VP80"), code("MJPG"), code("FFV1")});
    else if (dice.Once(2))
        request.videoCodec = code("H264");
    else
        request.videoCodec = code("XVID");
    request.speed = movieconv::Speed::kFastest;
    request.encoderThreads = 1;
    if (dice.Once(3))
        request.frameRate = dice.OneOf<double>({10, 25, 60, 23.976});
    if (dice.Once(5))
        request.begin = dice.Up(3) / 10.0;
    return request;
}

void CheckPlan(unsigned seed) {
    SCOPED_TRACE(fmt::format("seed {}", seed));
    Dice dice(seed);
    const Folder folder;
    Request request = MakeRequest(dice, MakeSource(dice, folder));
    const std::string ending = request.output;
    request.output = folder / ("whole." + ending);
    Listener whole;
    const Verdict undivided = Convert(request, whole);
    ASSERT_EQ(undivided.outcome, Outcome::kDone) << (undivided.failure ? undivided.failure->Text() : "");

    movieconv::Division division;
    if (dice.Once(2))
        division.pieces = 1 + dice.Up(dice.Once(3) ? 60 : 6);
    else
        division.length = 0.05 + dice.Up(20) / 10.0;
    std::string first;
    for (const int jobs : {1, 3}) {
        PieceOrder order;
        order.request = request;
        order.request->output = folder / fmt::format("joined{}.{}", jobs, ending);
        order.planPath = movieconv::PlanPathFor(order.request->output);
        order.division = division;
        order.join = true;
        order.jobs = jobs;
        Listener listener;
        Foreman foreman(order, listener, {});
        foreman.Start();
        foreman.Wait();
        const Verdict joined = *foreman.Result();
        ASSERT_EQ(joined.outcome, Outcome::kDone) << (joined.failure ? joined.failure->Text() : "");
        EXPECT_EQ(packets::Difference(order.request->output, request.output), "");
        const std::string bytes = ReadFile(order.request->output);
        EXPECT_TRUE(first.empty() || bytes == first) << "the number of jobs changed the output";
        first = bytes;
    }
}

TEST(RandomPlans, GiveWhatAnUndividedConversionGives) {
    av_log_set_level(AV_LOG_QUIET);
    const char* asked = std::getenv("MOVIECONV_PLANS");
    const unsigned plans = asked != nullptr ? static_cast<unsigned>(std::atoi(asked)) : 8;
    const char* from = std::getenv("MOVIECONV_FIRST_PLAN");
    if (from == nullptr)
        for (const unsigned seed : {152U, 178U, 649U}) // sought between key pictures; a decoder that keeps
                                                       // pictures back, an end between microseconds
            CheckPlan(seed);
    for (unsigned seed = from != nullptr ? static_cast<unsigned>(std::atoi(from)) : 1;
         seed <= plans && !testing::Test::HasFailure(); ++seed)
        CheckPlan(seed);
}

} // namespace
