#include "host/presets/Notation.h"

#include <gtest/gtest.h>

namespace {

using namespace movieconv;

TEST(Notation, ReadTimes) {
    EXPECT_EQ(ParseTime("83.5"), 83.5);
    EXPECT_EQ(ParseTime("1:23.5"), 83.5);
    EXPECT_EQ(ParseTime("1:00:00"), 3600);
    EXPECT_EQ(ParseTime("90:00"), 5400);
    for (const char* text :
         {"", "-1", "1:60", "1:2:3:4", "1:-2", ":5", "1:", "5s", "nan", "1e3", "1.5:00", "1:75:00"}) {
        EXPECT_EQ(ParseTime(text), std::nullopt) << text;
    }
}

TEST(Notation, ReadRatesSizesAndFrameRates) {
    EXPECT_EQ(ParseRate("512000"), 512000);
    EXPECT_EQ(ParseRate("1.5M"), 1'500'000);
    EXPECT_EQ(ParseRate("128k"), 128'000);
    for (const char* text : {"0", "-5k", "k", "5000M", "12q"})
        EXPECT_EQ(ParseRate(text), std::nullopt) << text;
    EXPECT_EQ(ParseSize("640x360")->height, 360);
    for (const char* text : {"640", "x360", "640x", "1x1", "640x360x2", "99999x2", "-4x4"})
        EXPECT_FALSE(ParseSize(text)) << text;
    EXPECT_EQ(ParseCrop("140:138:0:2")->bottom, 138);
    EXPECT_EQ(ParseCrop("140:138:0:2")->right, 2);
    for (const char* text :
         {"", "1:2:3", "1:2:3:", "1:2:3:4:", "1:2:3:4:5", "-1:2:3:4", "1:a:3:4", "1:2:3:99999"})
        EXPECT_FALSE(ParseCrop(text)) << text;
    EXPECT_DOUBLE_EQ(*ParseFrameRate("30000/1001"), 30000.0 / 1001);
    for (const char* text : {"0", "25/0", "1000", "0.0001", "1/60", "/5", "a"})
        EXPECT_EQ(ParseFrameRate(text), std::nullopt) << text;
}

} // namespace
