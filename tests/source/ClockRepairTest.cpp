// Jumps of a clock told from gaps, and how stamps go on behind them.
#include "host/source/ClockRepair.h"
#include "host/source/MediaTime.h"

#include <gtest/gtest.h>

#include <cstddef>
#include <utility>
#include <vector>

namespace {

using movieconv::ToMediaTime;

struct Packet {
    int stream; ///< 0 are pictures, the others sound.
    double stamp;
    double time; ///< At which it belongs.
};

struct Recording {
    const char* name;
    std::vector<Packet> packets; ///< Of a second each.
    int jumps;
};

class AClock : public testing::TestWithParam<Recording> {};

TEST_P(AClock, GoesOnBehindJumpsAndKeepsGaps) {
    movieconv::ClockRepair clock;
    std::vector<int64_t> shifts;
    const auto take = [&](bool all) {
        while (const auto shift = clock.Pop(all))
            shifts.push_back(*shift);
    };
    for (const Packet& packet : GetParam().packets) {
        clock.Push({{packet.stream, packet.stream > 0, ToMediaTime(packet.stamp), ToMediaTime(1)}});
        take(false);
    }
    take(true);
    ASSERT_EQ(shifts.size(), GetParam().packets.size());
    for (std::size_t i = 0; i < shifts.size(); ++i) {
        const Packet& packet = GetParam().packets[i];
        EXPECT_EQ(ToMediaTime(packet.stamp) + shifts[i], ToMediaTime(packet.time))
            << "stream " << packet.stream << " at " << packet.stamp;
    }
    EXPECT_EQ(clock.Jumps(), GetParam().jumps);
}

INSTANTIATE_TEST_SUITE_P(
    Of, AClock,
    testing::Values(
        Recording{"Nothing", {{0, 5, 5}, {1, 5, 5}, {0, 6, 6}, {1, 6.2, 6.2}}, 0},
        Recording{"ALaterClock", {{0, 5, 5}, {1, 5, 5}, {0, 900, 6}, {1, 900, 6}, {0, 901, 7}}, 1},
        Recording{"AnEarlierClock", {{0, 50, 50}, {1, 50, 50}, {0, 8, 51}, {1, 8, 51}, {1, 9, 52}}, 1},
        Recording{
            "TheOldClockBehindTheNewOne", {{0, 5, 5}, {1, 5, 5}, {0, 900, 6}, {1, 6, 6}, {1, 901, 7}}, 1},
        Recording{
            "TheOldClockBehindOneALittleEarlier", {{0, 50, 50}, {1, 50, 50}, {0, 48, 51}, {1, 51, 51}}, 1},
        Recording{
            "AGapOfOneStream", {{0, 5, 5}, {1, 5, 5}, {0, 12, 12}, {0, 18, 18}, {1, 19, 19}, {1, 20, 20}}, 0},
        Recording{"AGapOfOneStreamBehindAJump",
                  {{0, 5, 5}, {1, 5, 5}, {0, 900, 6}, {1, 900, 6}, {0, 906, 12}, {0, 912, 18}, {1, 914, 20}},
                  1},
        Recording{"PicturesThatComeSeldom", {{0, 5, 5}, {1, 5, 5}, {1, 11, 11}, {1, 17, 17}, {0, 17, 17}}, 0},
        Recording{"ASmallFallOfPicturesAndSoundAndAGap",
                  {{0, 5, 5}, {1, 5, 5}, {0, 5.7, 6}, {1, 6, 6}, {0, 6.7, 7}, {1, 6.7, 7}, {0, 8, 8.3}},
                  1},
        Recording{"ASmallFallOfPicturesAlone",
                  {{0, 5, 5}, {1, 5, 5}, {0, 5.7, 5.7}, {1, 6, 6}, {0, 6.7, 6.7}, {1, 7, 7}},
                  0},
        Recording{"ASmallFallOfSoundAlone",
                  {{0, 5, 5}, {1, 5, 5}, {2, 5, 5}, {1, 5.7, 5.7}, {2, 5.7, 5.7}, {0, 6, 6}, {1, 6.7, 6.7}},
                  0},
        Recording{"AloneALongStep", {{0, 5, 5}, {0, 30, 6}, {0, 31, 7}}, 1}),
    [](const auto& info) { return info.param.name; });

} // namespace
