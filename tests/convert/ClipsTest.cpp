// Clips begin where they are promised to, hold every picture once and lose no sound at their joints.
#include "media/FourCC.h"
#include "tests/convert/Listener.h"
#include "tests/support/Inspect.h"
#include "tests/support/TestMovies.h"

#include <gtest/gtest.h>

#include <cmath>
#include <ostream>

namespace {

using namespace movieconv;
using namespace test_movies;
using namespace inspect;

constexpr double kSeconds = 12;
constexpr double kTick = 1e-4; // stamps in a Matroska file count milliseconds
const Args kUneven{"-vf", "select='lt(mod(n,7),3)+eq(mod(n,31),5)'", "-fps_mode", "vfr"};

struct Source {
    const char* name;
    Args making;
    double length; // of a clip
    double begin = 0;
    double soundSeconds = kSeconds;
};

void PrintTo(const Source& source, std::ostream* out) {
    *out << source.name << ", clips of " << source.length;
}

class Clips : public testing::TestWithParam<Source> {};

/// The joined sound of the clips, and of the source from its begin on.
void ExpectSameSound(const std::vector<int16_t>& clips, const Seen& whole, const Source& source) {
    const std::size_t most = std::min(clips.size(), whole.sound.size());
    for (std::size_t i = 0; i < most; ++i)
        ASSERT_EQ(clips[i], whole.sound[i]) << "sample " << i << " of " << source.name;
    EXPECT_GE(clips.size() + 1, whole.sound.size());
}

TEST_P(Clips, BeginAtMultiplesOfTheirLength) {
    const Source& source = GetParam();
    const Folder folder;
    const std::string input = Make(std::string("clips-") + source.name, source.making);
    const Seen whole = LookAt(input, source.begin);
    Request request;
    request.input = input;
    request.output = folder / "clip.mkv";
    request.audioCodec = FourCC("PCM ");
    request.begin = source.begin;
    request.split = source.length;
    Listener listener;
    const Verdict verdict = Convert(request, listener);
    ASSERT_EQ(verdict.outcome, Outcome::kDone) << (verdict.failure ? verdict.failure->Text() : "");

    std::size_t picture = 0;
    std::vector<int16_t> sound;
    for (std::size_t k = 0; k < listener.closed.size(); ++k) {
        SCOPED_TRACE(listener.closed[k]);
        Movie movie(listener.closed[k], {});
        const Seen clip = TakeAll(movie);
        ASSERT_FALSE(clip.pictures.empty());
        ASSERT_LE(picture + clip.pictures.size(), whole.pictures.size());
        // The first picture at or after k times the length: this one is, and the one before is not.
        const double due = source.begin + static_cast<double>(k) * source.length;
        const double origin = whole.pictures[picture].time;
        EXPECT_GE(origin, due - kTick);
        EXPECT_TRUE(picture == 0 || whole.pictures[picture - 1].time < due - kTick / 2);
        for (const SeenPicture& seen : clip.pictures) {
            EXPECT_NEAR(seen.time, whole.pictures[picture].time - origin, 0.0011);
            EXPECT_NEAR(seen.luma, whole.pictures[picture].luma, 3) << picture;
            ++picture;
        }
        sound.insert(sound.end(), clip.sound.begin(), clip.sound.end());
    }
    EXPECT_EQ(picture, whole.pictures.size());
    EXPECT_EQ(listener.closed.size(), std::ceil((kSeconds - source.begin) / source.length - 0.01));
    if (source.soundSeconds == kSeconds) {
        ExpectSameSound(sound, whole, source);
    } else if (source.soundSeconds > 0) { // silence at its end
        EXPECT_NEAR(static_cast<double>(sound.size()) / 44100, kSeconds, 0.1);
    }
}

Args At(const std::string& rate, double soundSeconds = kSeconds) {
    return Join(CountedPictures(kSeconds, rate), Beeps(soundSeconds), NearLossless());
}

INSTANTIATE_TEST_SUITE_P(
    Rates, Clips,
    testing::Values(Source{"25.mkv", At("25"), 2}, Source{"25.mkv", At("25"), 0.7},
                    Source{"25.mkv", At("25"), 2, 3.4}, Source{"29.mkv", At("30000/1001"), 2},
                    Source{"29.mkv", At("30000/1001"), 0.5}, Source{"23.mkv", At("24000/1001"), 2},
                    Source{"uneven.mkv", Join(At("25"), kUneven), 1},
                    Source{"short-sound.mkv", At("25", 5), 2, 0, 5},
                    Source{"silent.mkv", Join(CountedPictures(kSeconds, "30000/1001"), NearLossless()), 2, 0,
                           0}));

} // namespace
