#include "host/terminal/JsonLine.h"
#include "host/terminal/TextReporter.h"

#include <gtest/gtest.h>

#include <nlohmann/json.hpp>
#include <string>

namespace {

using namespace movieconv;

TEST(ProgressText, FitsTheTerminalAndNeverRoundsUp) {
    Progress report;
    report.percent = 42.99;
    report.position = 61;
    report.length = 3600;
    report.speed = 3.5;
    report.left = 59.2;
    report.bytes = 1'234'567;
    const std::string text = ProgressText(report, 1000);
    EXPECT_EQ(text, " 42.9%  0:01:01 / 1:00:00   3.50x  left 0:01:00  1.2 MB");
    report.expected = {30'000'000, 45'600'000};
    EXPECT_EQ(ProgressText(report, 1000), text + " of 30.0 MB to 45.6 MB");
    for (int columns = 10; columns < 80; ++columns)
        EXPECT_LT(ProgressText(report, columns).size(), static_cast<std::size_t>(columns));
    report.percent.reset();
    EXPECT_EQ(ProgressText(report, 1000).find('%'), std::string::npos);
    report.phase = Phase::kWaitingForRoom;
    EXPECT_NE(ProgressText(report, 1000).find("disk full, waiting"), std::string::npos);
}

TEST(JsonLine, EscapesWhatJsonAndTerminalsDoNotTake) {
    const struct {
        const char* text;
        const char* escaped;
    } cases[] = {
        {"a\"b\\c\n\x01", R"(a\"b\\c\n\u0001)"},
        {"ф\xff", "ф\xEF\xBF\xBD"},
        {"\x7f\xC2\x9b\xE2\x80\xAE", R"(\u007f\u009b\u202e)"}, // NOLINT(misc-misleading-bidirectional)
    };
    for (const auto& [text, escaped] : cases)
        EXPECT_EQ(JsonLine("warning", {{"text", text}}),
                  std::string(R"({"v":1,"event":"warning","text":")") + escaped + "\"}\n");
    EXPECT_EQ(EscapeCommands("{\n \"ф\": \"\xC2\x9b\"}"), "{\n \"ф\": \"\\u009b\"}");
}

} // namespace
