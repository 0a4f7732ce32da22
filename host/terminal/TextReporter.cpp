#include "host/terminal/TextReporter.h"

#include "host/convert/Amounts.h"
#include "host/source/Languages.h"

#include <algorithm>
#include <array>
#include <cmath>
#include <fmt/format.h>
#include <string_view>
#include <utility>

namespace movieconv {
namespace {

constexpr int kLineSeconds = 5;
constexpr int kBarColumns = 20;
constexpr std::string_view kEraseLine = "\r\x1b[K";

std::string Left(const Progress& report) {
    switch (report.phase) {
    case Phase::kPaused:
        return "paused";
    case Phase::kWaitingForRoom:
        return "disk full, waiting";
    case Phase::kFinishing:
        return fmt::format("finishing {:.0f}%", std::floor(report.finished * 100));
    case Phase::kConverting:
        break;
    }
    return report.left ? "left " + FormatTime(std::ceil(*report.left)) : "left -:--:--";
}

/// Whole cells of a bar for `percent`, in characters that every terminal has.
std::string Bar(double percent) {
    const int filled = std::clamp(static_cast<int>(percent / 100 * kBarColumns), 0, kBarColumns);
    const std::string arrow = std::string(static_cast<std::size_t>(std::max(filled - 1, 0)), '=') + '>';
    return fmt::format("[{:<{}}] ", arrow, kBarColumns);
}

/// "PGS" for FFmpeg's "hdmv_pgs_subtitle".
std::string_view NameForUsers(std::string_view codec) {
    static constexpr std::pair<std::string_view, std::string_view> kNames[] = {{"hdmv_pgs_subtitle", "PGS"},
                                                                               {"dvd_subtitle", "DVD"},
                                                                               {"dvb_subtitle", "DVB"},
                                                                               {"dvb_teletext", "teletext"},
                                                                               {"eia_608", "EIA-608"},
                                                                               {"xsub", "DivX"},
                                                                               {"subrip", "SRT"},
                                                                               {"ass", "ASS"},
                                                                               {"webvtt", "WebVTT"}};
    for (const auto& [name, shown] : kNames)
        if (name == codec)
            return shown;
    return codec;
}

/// What to put before a text about one of many movies, unless it names it.
std::string Whose(const std::string& input, const std::string& text) {
    return input.empty() || text.find(input) != std::string::npos ? "" : fmt::format("\"{}\": ", input);
}

} // namespace

std::string ProgressText(const Progress& report, int columns) {
    // Tenths are cut, never rounded up: what is not done is not shown as done.
    const std::string percent = report.percent
                                    ? fmt::format("{:5.1f}%", std::floor(*report.percent * 10) / 10)
                                    : std::string("   ?  ");
    const std::string position = report.percent
                                     ? FormatTime(report.position) + " / " + FormatTime(report.length)
                                     : FormatTime(report.position);
    const std::string speed = report.speed ? fmt::format("{:5.2f}x", *report.speed) : std::string("     -");
    const std::string expected = report.expected
                                     ? " of " + FormatByteRange(report.expected->least, report.expected->most)
                                     : std::string();
    std::string line = percent;
    const std::string clip = report.clip > 0 ? fmt::format("  clip {}", report.clip) : std::string();
    for (const std::string& part : {"  " + position, "  " + speed, "  " + Left(report),
                                    "  " + FormatBytes(report.bytes), expected, clip})
        if (line.size() + part.size() < static_cast<std::size_t>(columns))
            line += part;
    return line;
}

void QuietReporter::Warned(const Warning& news) {
    if (news.kind == Warning::Kind::kFailed)
        Error(Explain(news));
    else
        Reporter::Warned(news);
}

void QuietReporter::Error(const std::string& text) {
    streams_.PrintError(fmt::format("movieconv: error: {}", text));
}

void SparseReporter::Warn(const std::string& text, const std::string& input) {
    Streams().PrintError(fmt::format("movieconv: warning: {}{}", Whose(input, text), text));
}

void SparseReporter::LeftBehind(const NotCarried& report) {
    const std::string number = report.number ? fmt::format(" {}", *report.number) : std::string();
    std::string details(NameForUsers(report.codec));
    if (!report.language.empty())
        details += (details.empty() ? "" : ", ") + LanguageName(report.language);
    if (!details.empty())
        details = " (" + details + ")";
    LeaveLine();
    Streams().PrintError(fmt::format("movieconv: not carried: {}{}{}{}: {}", Whose(report.input, {}),
                                     report.kind, number, details, report.reason.Text()));
}

void SparseReporter::End(const EndReport& report) {
    if (!report.summary.empty())
        Streams().ReportLine(report.summary);
}

void LineReporter::Started(const Start& report) {
    const std::string length = report.lengthIsKnown ? FormatTime(report.length, true) : "length unknown";
    Streams().ReportLine(fmt::format("{} -> {} ({})", report.input, report.output, length));
}

void LineReporter::Progressed(const Progress& report) {
    // Between clips the phase changes back and forth, which the line of the clip tells well enough.
    const bool worthALine = report.phaseChanged && report.phase != Phase::kConverting &&
                            (report.phase != Phase::kFinishing || report.clip == 0);
    if (!worthALine && report.worked < nextAt_)
        return;
    nextAt_ = report.worked + kLineSeconds;
    constexpr int kAnyWidth = 1000;
    Streams().ReportLine(ProgressText(report, kAnyWidth));
}

void LineReporter::Closed(const ClosedFile& report) {
    Streams().ReportLine(fmt::format("wrote {} ({}, {})", report.path,
                                     FormatTime(std::max(report.videoSeconds, report.audioSeconds), true),
                                     FormatBytes(report.bytes)));
}

void BarReporter::Progressed(const Progress& report) {
    const int columns = Streams().Columns();
    std::string line = ProgressText(report, columns);
    if (report.percent && line.size() + kBarColumns + 3 < static_cast<std::size_t>(columns))
        line = Bar(*report.percent) + line;
    const bool quietPhase = report.phase == Phase::kPaused || report.phase == Phase::kWaitingForRoom;
    const std::string colour = !colour_ ? "" : quietPhase ? "\x1b[33m" : "\x1b[32m";
    Streams().Report(fmt::format("{}{}{}{}", kEraseLine, colour, line, colour_ ? "\x1b[0m" : ""));
    drawn_ = true;
}

void BarReporter::Closed(const ClosedFile& report) {
    EraseLine();
    LineReporter::Closed(report);
}

void BarReporter::Warn(const std::string& text, const std::string& input) {
    EraseLine();
    LineReporter::Warn(text, input);
}

void BarReporter::Error(const std::string& text) {
    EraseLine();
    LineReporter::Error(text);
}

void BarReporter::End(const EndReport& report) {
    EraseLine();
    LineReporter::End(report);
}

void BarReporter::LeaveLine() {
    if (drawn_) {
        Streams().Report("\n");
        drawn_ = false;
    }
}

void BarReporter::EraseLine() {
    if (drawn_) {
        Streams().Report(kEraseLine);
        drawn_ = false;
    }
}

} // namespace movieconv
