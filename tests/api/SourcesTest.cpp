// Which tables of sources are taken, and where reading begins.
#include "tests/api/TableSource.h"
#include "tests/recorder/RecordingWriter.h"

#include <gtest/gtest.h>

namespace {

TEST(SourcesTest, TablesThatMakeNoSenseAreRefusedAndNotReleased) {
    TableSource source;
    using Change = void (*)(MCVideoSource&);
    const Change changes[] = {
        [](MCVideoSource& table) { table.nSize = 8; },
        [](MCVideoSource& table) { table.pfnGetFormat = nullptr; },
        [](MCVideoSource& table) { table.pfnGetPicture = nullptr; },
        [](MCVideoSource& table) { table.pfnGetFormat = [](void*, VideoFormat*) { return 0; }; },
        [](MCVideoSource& table) { table.pfnGetFormat = [](void*, VideoFormat*) { return 1; }; },
    };
    const MCAudioSource audio = source.Audio();
    for (const Change change : changes) {
        MCVideoSource video = source.Video();
        change(video);
        EXPECT_EQ(MCCreateFromSources(&video, &audio), nullptr);
    }
    EXPECT_EQ(MCCreateFromSources(nullptr, nullptr), nullptr);
    EXPECT_EQ(source.releases, 0);
}

// From 0.5 s on, with functions that seek and without.
TEST(SourcesTest, BeginWhereAskedTo) {
    for (const bool seeks : {true, false}) {
        recorder::Reset();
        TableSource source;
        MCVideoSource video = source.Video();
        MCAudioSource audio = source.Audio();
        if (!seeks) {
            video.pfnSeek = nullptr;
            audio.pfnSeek = nullptr;
        }
        const MCHandle handle = MCCreateFromSources(&video, &audio);
        MCStart(handle, 0.5, 0.0, nullptr, nullptr, nullptr);
        MCWait(handle, MC_INFINITE);
        const recorder::Recording recording = recorder::Recorded();
        ASSERT_EQ(recording.pictures.size(), 5U);
        ASSERT_EQ(recording.sounds.size(), 10U);
        EXPECT_EQ(+recording.pictures[0].llTime, 0);
        EXPECT_EQ(+recording.pictures[4].llTime, 4000000);
        EXPECT_EQ(recording.pictures[0].nPitchU, TableSource::kWidth / 2);
        EXPECT_EQ(+recording.sounds[9].llTime, 4500000);
        EXPECT_EQ(+recording.sounds[9].nDuration, 500000);
        EXPECT_EQ(source.seeks, seeks ? 2 : 0);
        MCDestroy(handle);
    }
}

} // namespace
