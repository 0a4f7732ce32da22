// Whole conversions, call by call, against the files in traces/. The movies have 10 pictures a second and
// 1000 bytes of sound a second in blocks of 50 ms, unless a script says otherwise; every expectation was
// worked out by hand.
#include "tests/engine/ScriptedHost.h"

#include <gtest/gtest.h>

#include <fstream>
#include <iterator>
#include <ostream>
#include <string>

namespace {

struct Script {
    const char* name;
    std::function<void(ScriptedHost&)> prepare;
    double begin;
    double length;
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

/// What traces/SUITE/SCRIPT.txt says.
std::string ExpectedTrace() {
    const std::string test = testing::UnitTest::GetInstance()->current_test_info()->test_suite_name();
    const std::string suite = test.substr(0, test.find('/'));
    std::ifstream file(MOVIECONV_TRACES "/" + suite + "/" + TraceTest::GetParam().name + ".txt");
    return {std::istreambuf_iterator<char>(file), {}};
}

TEST_P(TraceTest, HappensInOrder) {
    const Script& script = GetParam();
    ScriptedHost host;
    script.prepare(host);
    EXPECT_EQ(host.Convert(script.begin, script.length), ExpectedTrace());
}

std::string ScriptName(const testing::TestParamInfo<Script>& info) {
    return info.param.name;
}

const Script kAudioVideo[] = {
    {"Plain", [](ScriptedHost& host) { Movie(host, 3, 6); }, 0.0, 0.0},

    // The first silence reaches back to the start of the last block; it is stamped on from where the sound
    // ended.
    {"SoundEndsFirst", [](ScriptedHost& host) { Movie(host, 4, 2); }, 0.0, 0.0},

    // A missing picture ends the pictures too, and counts for one picture's time once the sound has ended.
    {"SoundEndsFirstThenAPictureIsMissing",
     [](ScriptedHost& host) {
         Movie(host, 2, 1);
         host.video.announcesEnd = false;
         host.audio.endsEmpty = true;
     },
     0.0, 0.0},

    // The rest of the sound is read in one iteration; a picture handed out after the end is not written.
    {"PicturesEndFirst",
     [](ScriptedHost& host) {
         Movie(host, 1, 4);
         host.video.staysAtLast = true;
     },
     0.0, 0.0},

    {"NoPictureAtAll",
     [](ScriptedHost& host) {
         Movie(host, 0, 2);
         host.audio.stamps = {300000, 800000};
         host.video.Format().dDuration = 0.1;
     },
     0.0, 0.0},

    {"NoSoundAtAll",
     [](ScriptedHost& host) {
         Movie(host, 2, 0);
         host.audio.Format().dDuration = 0.1;
     },
     0.0, 0.0},

    // Sound that begins before the first picture keeps its distance; begin above 0 seeks, the pictures first.
    {"BeginsLater",
     [](ScriptedHost& host) {
         host.video.stamps = {2000000};
         host.audio.stamps = {1700000, 2200000};
     },
     0.2, 0.0},

    // An origin that looks like a missing one is one all the same; a gap in the source's stamps is closed up.
    {"BeginsBeforeZeroWithOddStamps",
     [](ScriptedHost& host) {
         host.video.stamps = {2000000};
         host.audio.stamps = {1999999, 9000000};
     },
     -1.0, 0.0},

    // The length ends the sound in the middle of an iteration, and the conversion at the top of the next.
    {"LengthIsReached", [](ScriptedHost& host) { Movie(host, 3, 6); }, 0.0, 0.1},

    {"TinyLengthIsNoLimit", [](ScriptedHost& host) { Movie(host, 1, 2); }, 0.0, 0.0005},

    {"CancelledByTheCallback",
     [](ScriptedHost& host) {
         Movie(host, 3, 6);
         host.cancelAt = 1;
         host.window = reinterpret_cast<OpaqueWindowPtr*>(0x1234);
     },
     0.0, 0.0},

    {"WithoutCallback",
     [](ScriptedHost& host) {
         Movie(host, 1, 1);
         host.hasCallback = false;
     },
     0.0, 0.0},

    {"CannotCreate",
     [](ScriptedHost& host) {
         Movie(host, 1, 1);
         recorder::FailCreates({1});
     },
     0.5, 0.0},

    // In a clip the sound starts again at 0 and the pictures keep their distance from it. The last boundary
    // opens a clip for what is left.
    {"Clips",
     [](ScriptedHost& host) {
         Movie(host, 4, 8);
         host.Create();
         MCSetSplitParam(host.handle, 1, 90);
     },
     0.0, 0.0},

    // The origin of the sound outlives the boundary, so the second block of a clip is off by it.
    {"ClipsKeepTheOrigin",
     [](ScriptedHost& host) {
         Movie(host, 3, 6);
         host.audio.stamps = Stamps(300000, 500000, 5);
         host.Create();
         MCSetSplitParam(host.handle, 1, 90);
     },
     0.0, 0.0},

    {"ClipsEndAtABoundary",
     [](ScriptedHost& host) {
         Movie(host, 2, 2);
         host.Create();
         MCSetSplitParam(host.handle, 1, 0);
     },
     0.0, 0.0},

    // A clip that cannot be created takes what it is given; the next iteration tries the next name.
    {"ClipCannotBeCreated",
     [](ScriptedHost& host) {
         Movie(host, 4, 8);
         recorder::FailCreates({2});
         host.Create();
         MCSetSplitParam(host.handle, 1, 140);
     },
     0.0, 0.0},

    {"ClipsFromSilence",
     [](ScriptedHost& host) {
         Movie(host, 3, 1);
         host.Create();
         MCSetSplitParam(host.handle, 1, 90);
     },
     0.0, 0.0},
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
    {"Plain", [](ScriptedHost& host) { Sound(host, 3); }, 0.0, -1.0},

    // The block that is read when the length has been reached is not written. Clips are not for sound alone.
    {"LengthIsReached",
     [](ScriptedHost& host) {
         Sound(host, 4);
         host.Create();
         MCSetSplitParam(host.handle, 1, 0);
     },
     0.6, 1.2},

    {"BeginsBeforeZeroAndEndsWithAnEmptyBlock",
     [](ScriptedHost& host) {
         Sound(host, 1);
         host.audio.endsEmpty = true;
         host.hasCallback = false;
     },
     -3.0, 0.0},

    {"CancelledByTheCallback",
     [](ScriptedHost& host) {
         Sound(host, 3);
         host.cancelAt = 1;
     },
     0.0, 0.0},

    {"CannotCreate",
     [](ScriptedHost& host) {
         Sound(host, 3);
         recorder::FailCreates({1});
     },
     0.0, 0.0},

    {"ShorterThanTheLimit",
     [](ScriptedHost& host) {
         Sound(host, 3);
         host.audio.Format().dDuration = 0.00005;
     },
     0.0, 0.0},

    {"HardlyLongerThanTheLimit",
     [](ScriptedHost& host) {
         Sound(host, 1);
         host.audio.Format().dDuration = 0.0005;
     },
     0.0, 0.0},
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
     0.0, 0.0},

    // A picture without a stamp leaves the position alone; a missing picture ends the conversion.
    {"PicturesWithoutStamps",
     [](ScriptedHost& host) {
         Pictures(host, {-1, 50000000, -1, 52000000, -1});
         host.video.stepMs = 80;
         host.video.announcesEnd = false;
         host.Create();
         MCEnablePreview(host.handle, 0);
     },
     0.0, 0.0},

    {"LengthIsReached", [](ScriptedHost& host) { Pictures(host, Stamps(0, 1000000, 4)); }, 0.1, 0.1},

    // A decoder that gives every picture its own record: a clip begins one picture after 0.
    {"ClipsAfterTheRecordOfThePictureWritten",
     [](ScriptedHost& host) {
         Pictures(host, Stamps(500000, 1000000, 5));
         host.Create();
         MCSetSplitParam(host.handle, 1, 100);
     },
     -0.5, 0.0},

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
     0.0, 0.0},

    // The end found at a boundary closes a file that is not there.
    {"ClipsEndAtABoundary",
     [](ScriptedHost& host) {
         Pictures(host, {0});
         host.video.announcesEnd = false;
         host.Create();
         MCSetSplitParam(host.handle, 1, 0x80000000UL); // negative, so every picture fills a clip
     },
     0.0, 0.0},

    {"CancelledByTheCallback",
     [](ScriptedHost& host) {
         Pictures(host, Stamps(0, 1000000, 3));
         host.video.stepMs = 80;
         host.cancelAt = 1;
     },
     0.0, 0.0},

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
     0.0, 0.0},

    {"CannotCreate",
     [](ScriptedHost& host) {
         Pictures(host, {0});
         recorder::FailCreates({1});
         host.hasCallback = false;
     },
     0.0, 0.0},
};
INSTANTIATE_TEST_SUITE_P(Video, TraceTest, testing::ValuesIn(kVideo), ScriptName);

} // namespace
