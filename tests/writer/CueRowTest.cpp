// Cues that overlap become a row, and the row of a growing file that of a plain one.
#include "writer/CueRow.h"
#include "writer/TextRows.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cstdint>
#include <string>
#include <vector>

namespace {

using writer::CueRow;
using writer::PlacedPacket;
using writer::TextRows;

struct Cue {
    int64_t begin, end;
    const char* text;
};

std::string RowOf(const std::vector<Cue>& cues, int64_t reached) {
    std::string row;
    CueRow made([&](int64_t begin, int64_t end, const std::vector<std::string>& texts) {
        row += std::to_string(begin) + "-" + std::to_string(end) + ":";
        for (const std::string& text : texts)
            row += text;
        row += " ";
    });
    for (const Cue& cue : cues)
        made.Add(cue.begin, cue.end, cue.text);
    made.Reach(reached);
    row += "| ";
    made.Finish();
    return row;
}

TEST(CueRow, ShowsOneStretchAfterTheOther) {
    const struct {
        std::vector<Cue> cues;
        int64_t reached;
        const char* row;
    } cases[] = {
        {{}, 100, "| "},
        {{{1, 4, "a"}}, 4, "1-4:a | "},
        {{{1, 4, "a"}}, 3, "| 1-4:a "},
        {{{1, 4, "a"}, {6, 8, "b"}}, 7, "1-4:a | 6-8:b "},
        {{{1, 4, "a"}, {4, 8, "b"}}, 0, "1-4:a | 4-8:b "},
        {{{1, 4, "a"}, {2, 3, "b"}}, 9, "1-2:a 2-3:ab 3-4:a | "},
        {{{1, 4, "a"}, {1, 4, "b"}}, 9, "1-4:ab | "},
        {{{1, 9, "a"}, {2, 4, "b"}, {3, 6, "c"}}, 5, "1-2:a 2-3:ab 3-4:abc | 4-6:ac 6-9:a "},
        // Out of order, and without a length.
        {{{5, 7, "a"}, {1, 3, "b"}, {4, 8, "c"}, {9, 9, "d"}}, 9, "5-7:ac 7-8:c | "},
    };
    for (const auto& test : cases)
        EXPECT_EQ(RowOf(test.cues, test.reached), test.row);
}

TEST(TextRows, CoverEveryMomentOnce) {
    constexpr int64_t kHour = int64_t{3600} * 192000;
    TextRows rows;
    const auto add = [&](int stream, int64_t dts, int64_t size) {
        rows.Add({stream, 1000 + dts, size, dts, dts, 0, true});
    };
    add(1, 0, 2);
    add(1, 30, 9);
    add(1, 40, 2); // where the next text begins
    add(1, 40, 7);
    add(1, 60, 2);
    add(2, 0, 2);
    EXPECT_EQ(rows.Texts(1), 2);
    EXPECT_EQ(rows.Texts(2), 0);
    std::string made;
    for (const PlacedPacket& sample : rows.Make(10, 100))
        made += std::to_string(sample.stream) + "@" + std::to_string(sample.dts) + "+" +
                std::to_string(sample.duration) + "=" + std::to_string(sample.size) + " ";
    EXPECT_EQ(made, "1@10+20=2 2@10+90=2 1@30+10=9 1@40+20=7 1@60+40=2 ");

    int64_t end = 0;
    for (const PlacedPacket& sample : rows.Make(0, 9 * kHour)) {
        EXPECT_LE(sample.duration, INT32_MAX);
        end = std::max(end, sample.dts + sample.duration);
    }
    EXPECT_EQ(end, 9 * kHour);
}

} // namespace
