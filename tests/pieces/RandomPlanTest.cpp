// Random divisions of random sources: what is joined of pieces has the pictures, stamps, sound and chapters
// of an undivided conversion, exactly, and does not depend on how many pieces are made at once.
// MOVIECONV_PLANS sets their number.
#include "host/convert/Formats.h"
#include "host/pieces/Foreman.h"
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

/// Pictures with gaps and uneven steps, reordered in every way, that begin late or without sound.
std::string MakeSource(Dice& dice, const Folder& folder) {
    const std::string rate = dice.OneOf<std::string>({"24", "25", "30000/1001", "50", "12"});
    const double seconds = 0.5 + dice.Up(30) / 10.0;
    Args args{"ffmpeg", "-v", "error", "-nostdin", "-y"};
    if (dice.Once(4))
        Add(args, {"-itsoffset", fmt::format("0.{}", dice.Up(9))});
    Add(args, {"-f", "lavfi", "-i", fmt::format("testsrc=s=96x64:r={}:d={}", rate, seconds)});
    const bool sound = !dice.Once(4);
    if (sound) {
        if (dice.Once(4))
            Add(args, {"-itsoffset", fmt::format("0.{}", dice.Up(9))});
        Add(args, {"-f", "lavfi", "-i",
                   fmt::format("sine=d={}:r={}", std::max(0.2, seconds + (dice.Up(10) - 5) / 10.0),
                               dice.OneOf<int>({44100, 48000, 22050}))});
    }
    switch (dice.Up(3)) {
    case 0:
        Add(args, {"-vf", fmt::format("select='gt(random({}),0.4)+eq(n,0)'", dice.Up(99))});
        break;
    case 1:
        Add(args, {"-vf", fmt::format("settb=1/90000,setpts='PTS+if(mod(N,{}),0,0.4/(({})*TB))'",
                                      2 + dice.Up(3), rate)});
        break;
    default:
        break;
    }
    Add(args, {"-vsync", "passthrough"});
    std::string ending = dice.OneOf<std::string>({"mkv", "mp4", "mov", "ts"});
    const std::string group = std::to_string(3 + dice.Up(60));
    switch (dice.Up(3)) {
    case 0:
        Add(args, {"-c:v", "mpeg4", "-bf", std::to_string(dice.Up(2)), "-g", group});
        break;
    case 1:
        Add(args,
            {"-c:v", "libvpx", "-b:v", "200k", "-auto-alt-ref", "1", "-lag-in-frames", "16", "-g", group});
        ending = "mkv";
        break;
    default:
        Add(args, {"-c:v", "libx264", "-preset", "ultrafast", "-bf", std::to_string(dice.Up(3)), "-g", group,
                   "-x264-params", fmt::format("open-gop={}:b-pyramid=normal", dice.Up(1))});
        break;
    }
    if (sound)
        Add(args, {"-c:a", ending == "ts" ? "mp2" : dice.OneOf<std::string>({"aac", "aac", "libmp3lame"})});
    if (dice.Once(5))
        Add(args, {"-output_ts_offset", std::to_string(dice.Up(20))});
    const std::string path = folder / ("source." + ending);
    args.push_back(path);
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
        EXPECT_EQ(packets::Of(order.request->output), packets::Of(request.output));
        const std::string bytes = ReadFile(order.request->output);
        EXPECT_TRUE(first.empty() || bytes == first) << "the number of jobs changed the output";
        first = bytes;
    }
}

TEST(RandomPlans, GiveThePicturesAndTheSoundOfAnUndividedConversion) {
    av_log_set_level(AV_LOG_QUIET);
    const char* asked = std::getenv("MOVIECONV_PLANS");
    const unsigned plans = asked != nullptr ? static_cast<unsigned>(std::atoi(asked)) : 8;
    const char* from = std::getenv("MOVIECONV_FIRST_PLAN");
    for (unsigned seed = from != nullptr ? static_cast<unsigned>(std::atoi(from)) : 1;
         seed <= plans && !testing::Test::HasFailure(); ++seed)
        CheckPlan(seed);
}

} // namespace
