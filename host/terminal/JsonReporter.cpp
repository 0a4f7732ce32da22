#include "host/terminal/JsonReporter.h"

#include "host/terminal/JsonLine.h"

#include <cmath>
#include <nlohmann/json.hpp>
#include <utility>

namespace movieconv {
namespace {

using Json = nlohmann::ordered_json;

constexpr double kReportInterval = 0.25;

/// To thousandths.
Json Rounded(std::optional<double> value) {
    return value && std::isfinite(*value) ? Json(std::round(*value * 1000) / 1000) : Json(nullptr);
}

std::string_view PhaseName(Phase phase) {
    switch (phase) {
    case Phase::kConverting:
        return "converting";
    case Phase::kPaused:
        return "paused";
    case Phase::kFinishing:
        return "finishing";
    case Phase::kWaitingForRoom:
        return "waiting_for_room";
    }
    return "converting";
}

/// With what tells which of many movies it is about; where there is but one, nothing does.
Json About(const std::string& input, Json fields) {
    if (!input.empty())
        fields["input"] = input;
    return fields;
}

} // namespace

void JsonReporter::Print(std::string_view event, const Json& fields) const {
    streams_.Report(JsonLine(event, fields));
}

void JsonReporter::Started(const Start& report) {
    Print("start", {{"input", report.input},
                    {"output", report.output},
                    {"length_s", report.lengthIsKnown ? Rounded(report.length) : Json(nullptr)}});
}

void JsonReporter::Progressed(const Progress& report) {
    if (!report.phaseChanged && report.worked < nextAt_)
        return;
    nextAt_ = report.worked + kReportInterval;
    const Json expected =
        report.expected ? Json::array({report.expected->least, report.expected->most}) : Json(nullptr);
    Print("progress", {{"phase", PhaseName(report.phase)},
                       {"percent", Rounded(report.percent)},
                       {"position_s", Rounded(report.position)},
                       {"speed", Rounded(report.speed)},
                       {"left_s", Rounded(report.left)},
                       {"worked_s", Rounded(report.worked)},
                       {"bytes", report.bytes},
                       {"expected_bytes", expected},
                       {"finished", Rounded(report.finished)},
                       {"clip", report.clip}});
}

void JsonReporter::Opened(const OpenedFile& report) {
    Print("clip_opened", About(report.input, {{"number", report.number}, {"path", report.path}}));
}

void JsonReporter::Closed(const ClosedFile& report) {
    Print("clip_closed", About(report.input, {{"number", report.number},
                                              {"path", report.path},
                                              {"video_s", Rounded(report.videoSeconds)},
                                              {"audio_s", Rounded(report.audioSeconds)},
                                              {"bytes", report.bytes}}));
}

void JsonReporter::LeftBehind(const NotCarried& report) {
    Print("not_carried",
          About(report.input, {{"kind", report.kind},
                               {"number", report.number ? Json(*report.number) : Json(nullptr)},
                               {"codec", report.codec},
                               {"language", report.language},
                               {"reason", report.reason.Text()}}));
}

void JsonReporter::Warn(const std::string& text, const std::string& input) {
    Print("warning", About(input, {{"text", text}}));
}

void JsonReporter::Error(const std::string& text) {
    Print("error", {{"text", text}});
    streams_.PrintError("movieconv: error: " + text);
}

void JsonReporter::End(const EndReport& report) {
    Print("end", {{"outcome", report.outcome},
                  {"exit_code", static_cast<int>(report.code)},
                  {"position_s", Rounded(report.position)},
                  {"worked_s", Rounded(report.worked)},
                  {"bytes", report.bytes},
                  {"files", report.files}});
}

} // namespace movieconv
