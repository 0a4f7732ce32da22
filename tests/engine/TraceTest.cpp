// Whole conversions, call by call. The movies have 10 pictures a second and 1000 bytes of sound a second in
// blocks of 50 ms, unless a script says otherwise; every expectation was worked out by hand.
#include "tests/engine/ScriptedHost.h"

#include <gtest/gtest.h>

#include <ostream>

namespace {

struct Script {
    const char* name;
    std::function<void(ScriptedHost&)> prepare;
    double begin;
    double length;
    const char* trace;
};

void PrintTo(const Script& script, std::ostream* out) {
    *out << script.name;
}

/// A movie of `pictures` pictures and `blocks` blocks, as long as the longer stream.
void Movie(ScriptedHost& host, size_t pictures, size_t blocks) {
    host.video.stamps = Stamps(0, kSecond / 10, pictures);
    host.audio.stamps = Stamps(0, kSecond / 20, blocks);
    host.video.Format().dDuration = static_cast<double>(pictures) / 10;
    host.audio.Format().dDuration = static_cast<double>(blocks) / 20;
}

class TraceTest : public testing::TestWithParam<Script> {};

TEST_P(TraceTest, HappensInOrder) {
    const Script& script = GetParam();
    ScriptedHost host;
    script.prepare(host);
    EXPECT_EQ(host.Convert(script.begin, script.length), Trimmed(script.trace));
}

std::string ScriptName(const testing::TestParamInfo<Script>& info) {
    return info.param.name;
}

const Script kAudioVideo[] = {
    {"Plain", [](ScriptedHost& host) { Movie(host, 3, 6); }, 0.0, 0.0, R"(
        create out.mp4 320x240@10 1000/1 -> #1
        image 0
        block 0
        sound #1 0 +50
        picture #1 0
        next -> 1
        image 1000000
        block 500000
        sound #1 500000 +50
        block 1000000
        sound #1 1000000 +50
        picture #1 1000000
        event progress 5000
        progress 5000 at 0.15 preview 1000000
        next -> 1
        image 2000000
        block 1500000
        sound #1 1500000 +50
        block 2000000
        sound #1 2000000 +50
        picture #1 2000000
        event progress 8333
        progress 8333 at 0.25 preview 2000000
        next -> 0
        image none
        block 2500000
        sound #1 2500000 +50
        block none
        close #1 with callback and context
        event progress 10000
        progress 10000 at 0.3
        event finished 0
        finished 0 at 0.3)"},

    // The first silence reaches back to the start of the last block; it is stamped on from where the sound
    // ended.
    {"SoundEndsFirst", [](ScriptedHost& host) { Movie(host, 4, 2); }, 0.0, 0.0, R"(
        create out.mp4 320x240@10 1000/1 -> #1
        image 0
        block 0
        sound #1 0 +50
        picture #1 0
        next -> 1
        image 1000000
        block 500000
        sound #1 500000 +50
        block none
        picture #1 1000000
        event progress 2500
        progress 2500 at 0.1 preview 1000000
        next -> 1
        image 2000000
        silence #1 1000000 +80
        silence #1 1400000 +80
        silence #1 1800000 +80
        silence #1 2200000 +60
        picture #1 2000000
        next -> 1
        image 3000000
        silence #1 2500000 +80
        silence #1 2900000 +80
        silence #1 3300000 +40
        picture #1 3000000
        event progress 8750
        progress 8750 at 0.35 preview 3000000
        next -> 0
        close #1 with callback and context
        event progress 10000
        progress 10000 at 0.35 done 0.4
        event finished 0
        finished 0 at 0.35 done 0.4)"},

    // A missing picture ends the pictures too, and counts for one picture's time once the sound has ended.
    {"SoundEndsFirstThenAPictureIsMissing",
     [](ScriptedHost& host) {
         Movie(host, 2, 1);
         host.video.announcesEnd = false;
         host.audio.endsEmpty = true;
     },
     0.0, 0.0, R"(
        create out.mp4 320x240@10 1000/1 -> #1
        image 0
        block 0
        sound #1 0 +50
        picture #1 0
        next -> 1
        image 1000000
        block none
        picture #1 1000000
        event progress 2500
        progress 2500 at 0.05 preview 1000000
        next -> 1
        image none
        close #1 with callback and context
        event progress 10000
        progress 10000 at 0.15 done 0.2
        event finished 0
        finished 0 at 0.15 done 0.2)"},

    // The rest of the sound is read in one iteration; a picture handed out after the end is not written.
    {"PicturesEndFirst",
     [](ScriptedHost& host) {
         Movie(host, 1, 4);
         host.video.staysAtLast = true;
     },
     0.0, 0.0, R"(
        create out.mp4 320x240@10 1000/1 -> #1
        image 0
        block 0
        sound #1 0 +50
        picture #1 0
        next -> 0
        image 0
        block 500000
        sound #1 500000 +50
        block 1000000
        sound #1 1000000 +50
        block 1500000
        sound #1 1500000 +50
        block none
        close #1 with callback and context
        event progress 10000
        progress 10000 at 0.2
        event finished 0
        finished 0 at 0.2)"},

    {"NoPictureAtAll",
     [](ScriptedHost& host) {
         Movie(host, 0, 2);
         host.audio.stamps = {300000, 800000};
         host.video.Format().dDuration = 0.1;
     },
     0.0, 0.0, R"(
        create out.mp4 320x240@10 1000/1 -> #1
        image none
        block 300000
        sound #1 300000 +50
        block 800000
        sound #1 800000 +50
        block none
        close #1 with callback and context
        event progress 10000
        progress 10000 at 0.1
        event finished 0
        finished 0 at 0.1)"},

    {"NoSoundAtAll",
     [](ScriptedHost& host) {
         Movie(host, 2, 0);
         host.audio.Format().dDuration = 0.1;
     },
     0.0, 0.0, R"(
        create out.mp4 320x240@10 1000/1 -> #1
        image 0
        block none
        picture #1 0
        next -> 1
        image 1000000
        silence #1 -1 +80
        silence #1 399999 +80
        silence #1 799999 +40
        picture #1 1000000
        event progress 5000
        progress 5000 at 0.1 preview 1000000
        next -> 0
        close #1 with callback and context
        event progress 10000
        progress 10000 at 0.1 done 0.2
        event finished 0
        finished 0 at 0.1 done 0.2)"},

    // Sound that begins before the first picture keeps its distance; begin above 0 seeks, the pictures first.
    {"BeginsLater",
     [](ScriptedHost& host) {
         host.video.stamps = {2000000};
         host.audio.stamps = {1700000, 2200000};
     },
     0.2, 0.0, R"(
        create out.mp4 320x240@10 1000/1 -> #1
        seek video 0.2 1
        seek audio 0.2
        image 2000000
        block 1700000
        sound #1 -300000 +50
        block 2200000
        sound #1 200000 +50
        picture #1 0
        next -> 0
        image none
        block none
        close #1 with callback and context
        event progress 10000
        progress 10000 at 0.1 done 0.8
        event finished 0
        finished 0 at 0.1 done 0.8)"},

    // An origin that looks like a missing one is one all the same; a gap in the source's stamps is closed up.
    {"BeginsBeforeZeroWithOddStamps",
     [](ScriptedHost& host) {
         host.video.stamps = {2000000};
         host.audio.stamps = {1999999, 9000000};
     },
     -1.0, 0.0, R"(
        create out.mp4 320x240@10 1000/1 -> #1
        image 2000000
        block 1999999
        sound #1 -1 +50
        block 9000000
        sound #1 499999 +50
        picture #1 -6500001
        next -> 0
        image none
        block none
        close #1 with callback and context
        event progress 10000
        progress 10000 at 0.1 done 2
        event finished 0
        finished 0 at 0.1 done 2)"},

    // The length ends the sound in the middle of an iteration, and the conversion at the top of the next.
    {"LengthIsReached", [](ScriptedHost& host) { Movie(host, 3, 6); }, 0.0, 0.1, R"(
        create out.mp4 320x240@10 1000/1 -> #1
        image 0
        block 0
        sound #1 0 +50
        picture #1 0
        event progress 5000
        progress 5000 at 0.05 preview 0
        next -> 1
        image 1000000
        block 500000
        sound #1 500000 +50
        picture #1 1000000
        event progress 10000
        progress 10000 at 0.1 preview 1000000
        next -> 1
        close #1 with callback and context
        event progress 10000
        progress 10000 at 0.1
        event finished 0
        finished 0 at 0.1)"},

    {"TinyLengthIsNoLimit", [](ScriptedHost& host) { Movie(host, 1, 2); }, 0.0, 0.0005, R"(
        create out.mp4 320x240@10 1000/1 -> #1
        image 0
        block 0
        sound #1 0 +50
        picture #1 0
        event progress 5000
        progress 5000 at 0.05 preview 0
        next -> 0
        image none
        block 500000
        sound #1 500000 +50
        block none
        close #1 with callback and context
        event progress 10000
        progress 10000 at 0.1
        event finished 0
        finished 0 at 0.1)"},

    {"CancelledByTheCallback",
     [](ScriptedHost& host) {
         Movie(host, 3, 6);
         host.cancelAt = 1;
         host.window = reinterpret_cast<OpaqueWindowPtr*>(0x1234);
     },
     0.0, 0.0, R"(
        create out.mp4 320x240@10 1000/1 -> #1
        image 0
        block 0
        sound #1 0 +50
        picture #1 0
        next -> 1
        image 1000000
        block 500000
        sound #1 500000 +50
        block 1000000
        sound #1 1000000 +50
        picture #1 1000000
        event progress 5000 for window 4660
        progress 5000 at 0.15 preview 1000000
        close #1 with callback and context
        event finished 2 for window 4660
        finished 2 at 0.15 done 0.3)"},

    {"WithoutCallback",
     [](ScriptedHost& host) {
         Movie(host, 1, 1);
         host.hasCallback = false;
     },
     0.0, 0.0, R"(
        create out.mp4 320x240@10 1000/1 -> #1
        image 0
        block 0
        sound #1 0 +50
        picture #1 0
        next -> 0
        image none
        block none
        close #1 with context
        event progress 10000
        event finished 0)"},

    {"CannotCreate",
     [](ScriptedHost& host) {
         Movie(host, 1, 1);
         recorder::FailCreates({1});
     },
     0.5, 0.0, R"(
        create out.mp4 320x240@10 1000/1 -> null
        event finished 3
        finished 3 without record)"},

    // In a clip the sound starts again at 0 and the pictures keep their distance from it. The last boundary
    // opens a clip for what is left.
    {"Clips",
     [](ScriptedHost& host) {
         Movie(host, 4, 8);
         host.Create();
         MCSetSplitParam(host.handle, 1, 90);
     },
     0.0, 0.0, R"(
        create out_00.mp4 320x240@10 1000/1 -> #1
        image 0
        block 0
        sound #1 0 +50
        picture #1 0
        next -> 1
        image 1000000
        block 500000
        sound #1 500000 +50
        block 1000000
        sound #1 1000000 +50
        picture #1 1000000
        event progress 3750
        progress 3750 at 0.15 preview 1000000
        next -> 1
        close #1
        create out_01.mp4 320x240@10 1000/1 -> #2
        image 2000000
        block 1500000
        sound #2 0 +50
        block 2000000
        sound #2 500000 +50
        picture #2 500000
        next -> 1
        close #2
        create out_02.mp4 320x240@10 1000/1 -> #3
        image 3000000
        block 2500000
        sound #3 0 +50
        block 3000000
        sound #3 500000 +50
        picture #3 500000
        event progress 8750
        progress 8750 at 0.35 preview 3000000
        next -> 0
        close #3
        create out_03.mp4 320x240@10 1000/1 -> #4
        image none
        block 3500000
        sound #4 0 +50
        block none
        close #4 with callback and context
        event progress 10000
        progress 10000 at 0.4
        event finished 0
        finished 0 at 0.4)"},

    // The origin of the sound outlives the boundary, so the second block of a clip is off by it.
    {"ClipsKeepTheOrigin",
     [](ScriptedHost& host) {
         Movie(host, 3, 6);
         host.audio.stamps = Stamps(300000, 500000, 5);
         host.Create();
         MCSetSplitParam(host.handle, 1, 90);
     },
     0.0, 0.0, R"(
        create out_00.mp4 320x240@10 1000/1 -> #1
        image 0
        block 300000
        sound #1 300000 +50
        picture #1 0
        next -> 1
        image 1000000
        block 800000
        sound #1 800000 +50
        block 1300000
        sound #1 1300000 +50
        picture #1 1000000
        event progress 5000
        progress 5000 at 0.15 preview 1000000
        next -> 1
        close #1
        create out_01.mp4 320x240@10 1000/1 -> #2
        image 2000000
        block 1800000
        sound #2 0 +50
        block 2300000
        sound #2 800000 +50
        picture #2 500000
        event progress 8333
        progress 8333 at 0.25 preview 2000000
        next -> 0
        close #2
        create out_02.mp4 320x240@10 1000/1 -> #3
        image none
        block none
        close #3 with callback and context
        event progress 10000
        progress 10000 at 0.25 done 0.3
        event finished 0
        finished 0 at 0.25 done 0.3)"},

    {"ClipsEndAtABoundary",
     [](ScriptedHost& host) {
         Movie(host, 2, 2);
         host.Create();
         MCSetSplitParam(host.handle, 1, 0);
     },
     0.0, 0.0, R"(
        create out_00.mp4 320x240@10 1000/1 -> #1
        image 0
        block 0
        sound #1 0 +50
        picture #1 0
        next -> 1
        close #1
        create out_01.mp4 320x240@10 1000/1 -> #2
        image 1000000
        block 500000
        sound #2 0 +50
        block none
        picture #2 500000
        event progress 5000
        progress 5000 at 0.1 preview 1000000
        next -> 0
        close #2
        close #0 with callback and context
        event progress 10000
        progress 10000 at 0.1 done 0.2
        event finished 0
        finished 0 at 0.1 done 0.2)"},

    // A clip that cannot be created takes what it is given; the next iteration tries the next name.
    {"ClipCannotBeCreated",
     [](ScriptedHost& host) {
         Movie(host, 4, 8);
         recorder::FailCreates({2});
         host.Create();
         MCSetSplitParam(host.handle, 1, 140);
     },
     0.0, 0.0, R"(
        create out_00.mp4 320x240@10 1000/1 -> #1
        image 0
        block 0
        sound #1 0 +50
        picture #1 0
        next -> 1
        image 1000000
        block 500000
        sound #1 500000 +50
        block 1000000
        sound #1 1000000 +50
        picture #1 1000000
        event progress 3750
        progress 3750 at 0.15 preview 1000000
        next -> 1
        close #1
        create out_01.mp4 320x240@10 1000/1 -> null
        image 2000000
        block 1500000
        sound #0 0 +50
        block 2000000
        sound #0 500000 +50
        picture #0 500000
        next -> 1
        create out_02.mp4 320x240@10 1000/1 -> #3
        image 3000000
        block 2500000
        sound #3 1000000 +50
        block 3000000
        sound #3 1500000 +50
        picture #3 1500000
        event progress 8750
        progress 8750 at 0.35 preview 3000000
        next -> 0
        close #3
        create out_03.mp4 320x240@10 1000/1 -> #4
        image none
        block 3500000
        sound #4 0 +50
        block none
        close #4 with callback and context
        event progress 10000
        progress 10000 at 0.4
        event finished 0
        finished 0 at 0.4)"},

    {"ClipsFromSilence",
     [](ScriptedHost& host) {
         Movie(host, 3, 1);
         host.Create();
         MCSetSplitParam(host.handle, 1, 90);
     },
     0.0, 0.0, R"(
        create out_00.mp4 320x240@10 1000/1 -> #1
        image 0
        block 0
        sound #1 0 +50
        picture #1 0
        next -> 1
        image 1000000
        block none
        picture #1 1000000
        event progress 1666
        progress 1666 at 0.05 preview 1000000
        next -> 1
        image 2000000
        silence #1 500000 +80
        silence #1 900000 +80
        silence #1 1300000 +80
        silence #1 1700000 +80
        silence #1 2100000 +80
        picture #1 2000000
        event progress 8333
        progress 8333 at 0.25 preview 2000000
        next -> 0
        close #1
        close #0 with callback and context
        event progress 10000
        progress 10000 at 0.25 done 0.3
        event finished 0
        finished 0 at 0.25 done 0.3)"},
};
INSTANTIATE_TEST_SUITE_P(AudioVideo, TraceTest, testing::ValuesIn(kAudioVideo), ScriptName);

/// Sound alone, in blocks of 600 ms, so that the second one brings more than 1000 samples.
void Sound(ScriptedHost& host, size_t blocks) {
    host.hasVideo = false;
    host.audio.blockLength = 600;
    host.audio.stamps = Stamps(77, 6000000, blocks);
    host.audio.Format().dDuration = 0.6 * static_cast<double>(blocks);
}

const Script kAudio[] = {
    {"Plain", [](ScriptedHost& host) { Sound(host, 3); }, 0.0, -1.0, R"(
        create out.mp4 - 1000/1 -> #1
        seek audio 0
        block 77
        sound #1 77 +600
        block 6000077
        sound #1 6000077 +600
        event progress 6666
        progress 6666 at 1.2
        block 12000077
        sound #1 12000077 +600
        block none
        close #1 with callback and context
        event progress 10000
        progress 10000 at 1.8 done -1
        event finished 0
        finished 0 at 1.8 done -1)"},

    // The block that is read when the length has been reached is not written. Clips are not for sound alone.
    {"LengthIsReached",
     [](ScriptedHost& host) {
         Sound(host, 4);
         host.Create();
         MCSetSplitParam(host.handle, 1, 0);
     },
     0.6, 1.2, R"(
        create out.mp4 - 1000/1 -> #1
        seek audio 0.6
        block 77
        sound #1 77 +600
        block 6000077
        sound #1 6000077 +600
        event progress 10000
        progress 10000 at 1.2
        block 12000077
        close #1 with callback and context
        event progress 10000
        progress 10000 at 1.2
        event finished 0
        finished 0 at 1.2)"},

    {"BeginsBeforeZeroAndEndsWithAnEmptyBlock",
     [](ScriptedHost& host) {
         Sound(host, 1);
         host.audio.endsEmpty = true;
         host.hasCallback = false;
     },
     -3.0, 0.0, R"(
        create out.mp4 - 1000/1 -> #1
        seek audio 0
        block 77
        sound #1 77 +600
        block none
        close #1 with context
        event progress 10000
        event finished 0)"},

    {"CancelledByTheCallback",
     [](ScriptedHost& host) {
         Sound(host, 3);
         host.cancelAt = 1;
     },
     0.0, 0.0, R"(
        create out.mp4 - 1000/1 -> #1
        seek audio 0
        block 77
        sound #1 77 +600
        block 6000077
        sound #1 6000077 +600
        event progress 6666
        progress 6666 at 1.2
        close #1 with callback and context
        event finished 2
        finished 2 at 1.2 done 0)"},

    {"CannotCreate",
     [](ScriptedHost& host) {
         Sound(host, 3);
         recorder::FailCreates({1});
     },
     0.0, 0.0, R"(
        create out.mp4 - 1000/1 -> null
        event finished 3
        finished 3 without record)"},

    {"ShorterThanTheLimit",
     [](ScriptedHost& host) {
         Sound(host, 3);
         host.audio.Format().dDuration = 0.00005;
     },
     0.0, 0.0, R"(
        event finished 3
        finished 3 without record)"},

    {"HardlyLongerThanTheLimit",
     [](ScriptedHost& host) {
         Sound(host, 1);
         host.audio.Format().dDuration = 0.0005;
     },
     0.0, 0.0, R"(
        create out.mp4 - 1000/1 -> #1
        seek audio 0
        block 77
        sound #1 77 +600
        block none
        close #1 with callback and context
        event progress 10000
        progress 10000 at 0.6 done 0
        event finished 0
        finished 0 at 0.6 done 0)"},
};
INSTANTIATE_TEST_SUITE_P(Audio, TraceTest, testing::ValuesIn(kAudio), ScriptName);

/// Pictures alone.
void Pictures(ScriptedHost& host, std::vector<int64_t> stamps) {
    host.hasAudio = false;
    host.video.Format().dDuration = static_cast<double>(stamps.size()) / 10;
    host.video.stamps = std::move(stamps);
}

const Script kVideo[] = {
    // At most one notification in 80 ms. The position counts from the first stamp.
    {"Plain",
     [](ScriptedHost& host) {
         Pictures(host, Stamps(50000000, 1000000, 4));
         host.video.stepMs = 40;
     },
     0.0, 0.0, R"(
        create out.mp4 320x240@10 - -> #1
        image 50000000
        picture #1 50000000
        next -> 1
        image 51000000
        picture #1 51000000
        next -> 1
        image 52000000
        picture #1 52000000
        event progress 5000
        progress 5000 at 0.2 preview 52000000
        next -> 1
        image 53000000
        picture #1 53000000
        next -> 0
        close #1 with callback and context
        event progress 10000
        progress 10000 at 0.3 done 0.4
        event finished 0
        finished 0 at 0.3 done 0.4)"},

    // A picture without a stamp leaves the position alone; a missing picture ends the conversion.
    {"PicturesWithoutStamps",
     [](ScriptedHost& host) {
         Pictures(host, {-1, 50000000, -1, 52000000, -1});
         host.video.stepMs = 80;
         host.video.announcesEnd = false;
         host.Create();
         MCEnablePreview(host.handle, 0);
     },
     0.0, 0.0, R"(
        create out.mp4 320x240@10 - -> #1
        image -1
        picture #1 -1
        next -> 1
        image 50000000
        picture #1 50000000
        event progress 0
        progress 0 at 0
        next -> 1
        image -1
        picture #1 -1
        event progress 0
        progress 0 at 0
        next -> 1
        image 52000000
        picture #1 52000000
        event progress 4000
        progress 4000 at 0.2
        next -> 1
        image -1
        picture #1 -1
        event progress 4000
        progress 4000 at 0.2
        next -> 1
        image none
        close #1 with callback and context
        event progress 10000
        progress 10000 at 0.2 done 0.5
        event finished 0
        finished 0 at 0.2 done 0.5)"},

    {"LengthIsReached", [](ScriptedHost& host) { Pictures(host, Stamps(0, 1000000, 4)); }, 0.1, 0.1, R"(
        create out.mp4 320x240@10 - -> #1
        seek video 0.1 1
        image 0
        picture #1 0
        next -> 1
        image 1000000
        picture #1 1000000
        next -> 1
        image 2000000
        close #1 with callback and context
        event progress 10000
        progress 10000 at 0.1
        event finished 0
        finished 0 at 0.1)"},

    // A decoder that gives every picture its own record: a clip begins one picture after 0.
    {"ClipsAfterTheRecordOfThePictureWritten",
     [](ScriptedHost& host) {
         Pictures(host, Stamps(500000, 1000000, 5));
         host.Create();
         MCSetSplitParam(host.handle, 1, 100);
     },
     -0.5, 0.0, R"(
        create out_00.mp4 320x240@10 - -> #1
        image 500000
        picture #1 500000
        next -> 1
        image 1500000
        picture #1 1500000
        next -> 1
        close #1
        image 2500000
        create out_01.mp4 320x240@10 - -> #2
        picture #2 1000000
        next -> 1
        close #2
        image 3500000
        create out_02.mp4 320x240@10 - -> #3
        picture #3 1000000
        next -> 1
        image 4500000
        picture #3 2000000
        next -> 0
        close #3 with callback and context
        event progress 10000
        progress 10000 at 0.4 done 1
        event finished 0
        finished 0 at 0.4 done 1)"},

    // A decoder that reuses one record: the clip base is read from it after DecodeNext, and a clip begins at
    // 0.
    {"ClipsAfterTheRecordOfTheNextPicture",
     [](ScriptedHost& host) {
         Pictures(host, Stamps(500000, 1000000, 4));
         host.video.overwrites = true;
         recorder::FailCreates({3});
         host.Create();
         MCSetSplitParam(host.handle, 1, 0);
     },
     0.0, 0.0, R"(
        create out_00.mp4 320x240@10 - -> #1
        image 500000
        picture #1 500000
        next -> 1
        close #1
        image 1500000
        create out_01.mp4 320x240@10 - -> #2
        picture #2 0
        next -> 1
        close #2
        image 2500000
        create out_02.mp4 320x240@10 - -> null
        picture #0 0
        next -> 1
        close #0
        image 3500000
        create out_03.mp4 320x240@10 - -> #4
        picture #4 0
        next -> 0
        close #4 with callback and context
        event progress 10000
        progress 10000 at 0.3 done 0.4
        event finished 0
        finished 0 at 0.3 done 0.4)"},

    // The end found at a boundary closes a file that is not there.
    {"ClipsEndAtABoundary",
     [](ScriptedHost& host) {
         Pictures(host, {0});
         host.video.announcesEnd = false;
         host.Create();
         MCSetSplitParam(host.handle, 1, 0x80000000UL); // negative, so every picture fills a clip
     },
     0.0, 0.0, R"(
        create out_00.mp4 320x240@10 - -> #1
        image 0
        picture #1 0
        next -> 1
        close #1
        image none
        close #0 with callback and context
        event progress 10000
        progress 10000 at 0 done 0.1
        event finished 0
        finished 0 at 0 done 0.1)"},

    {"CancelledByTheCallback",
     [](ScriptedHost& host) {
         Pictures(host, Stamps(0, 1000000, 3));
         host.video.stepMs = 80;
         host.cancelAt = 1;
     },
     0.0, 0.0, R"(
        create out.mp4 320x240@10 - -> #1
        image 0
        picture #1 0
        next -> 1
        image 1000000
        picture #1 1000000
        event progress 3333
        progress 3333 at 0.1 preview 1000000
        close #1 with callback and context
        event finished 2
        finished 2 at 0.1 done 0.3)"},

    {"NoPreviewOfCopies",
     [](ScriptedHost& host) {
         Pictures(host, Stamps(0, 1000000, 2));
         host.video.stepMs = 100;
         host.Create();
         EncodeParam param;
         MCGetEncodeParam(host.handle, &param);
         param.fccFileFormat = FourCC("COPY");
         MCSetEncodeParam(host.handle, &param);
     },
     0.0, 0.0, R"(
        create out.mp4 320x240@10 - -> #1
        image 0
        picture #1 0
        next -> 1
        image 1000000
        picture #1 1000000
        event progress 5000
        progress 5000 at 0.1
        next -> 0
        close #1 with callback and context
        event progress 10000
        progress 10000 at 0.1 done 0.2
        event finished 0
        finished 0 at 0.1 done 0.2)"},

    {"CannotCreate",
     [](ScriptedHost& host) {
         Pictures(host, {0});
         recorder::FailCreates({1});
         host.hasCallback = false;
     },
     0.0, 0.0, R"(
        create out.mp4 320x240@10 - -> null
        event finished 3)"},
};
INSTANTIATE_TEST_SUITE_P(Video, TraceTest, testing::ValuesIn(kVideo), ScriptName);

} // namespace
