#include "host/terminal/JsonReporter.h"

#include "text/Printable.h"
#include "text/Utf8.h"

#include <cmath>
#include <fmt/format.h>
#include <nlohmann/json.hpp>

namespace movieconv {
namespace {

constexpr double kReportInterval = 0.25;

std::string Number(std::optional<double> value) {
    return value && std::isfinite(*value) ? fmt::format("{:.3f}", *value) : "null";
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

/// The field that tells which of many movies it is; none where there is but one.
std::string InputField(const std::string& input) {
    return input.empty() ? "" : fmt::format(",\"input\":{}", JsonString(input));
}

} // namespace

std::string EscapeCommands(std::string_view json) {
    std::string escaped;
    for (const wchar_t character : text::FromUtf8(json)) {
        if (character >= 0x7F && text::IsCommand(character))
            escaped += fmt::format("\\u{:04x}", static_cast<unsigned>(character));
        else
            escaped += text::ToUtf8({&character, 1});
    }
    return escaped;
}

std::string JsonString(std::string_view bytes) {
    std::wstring wide = text::FromUtf8(bytes);
    for (wchar_t& character : wide)
        if (character >= 0xDC80 && character <= 0xDCFF)
            character = 0xFFFD;
    std::string quoted = "\"";
    for (const char c : text::ToUtf8(wide)) {
        if (c == '"' || c == '\\') {
            quoted += '\\';
            quoted += c;
        } else if (static_cast<unsigned char>(c) < 0x20) {
            quoted += fmt::format("\\u{:04x}", static_cast<unsigned>(c));
        } else {
            quoted += c;
        }
    }
    return EscapeCommands(quoted + '"');
}

std::string JsonLine(std::string_view event, const nlohmann::ordered_json& fields) {
    using Json = nlohmann::ordered_json;
    Json object{{"v", JsonReporter::kVersion}, {"event", event}};
    object.update(fields);
    return EscapeCommands(object.dump(-1, ' ', false, Json::error_handler_t::replace)) + "\n";
}

void JsonReporter::Print(std::string_view event, const std::string& fields) const {
    streams_.Report(fmt::format("{{\"v\":{},\"event\":\"{}\"{}{}}}\n", kVersion, event,
                                fields.empty() ? "" : ",", fields));
}

void JsonReporter::Started(const Start& report) {
    Print("start", fmt::format("\"input\":{},\"output\":{},\"length_s\":{}", JsonString(report.input),
                               JsonString(report.output),
                               Number(report.lengthIsKnown ? std::optional(report.length) : std::nullopt)));
}

void JsonReporter::Progressed(const Progress& report) {
    if (!report.phaseChanged && report.worked < nextAt_)
        return;
    nextAt_ = report.worked + kReportInterval;
    const std::string expected =
        report.expected ? fmt::format("[{},{}]", report.expected->least, report.expected->most) : "null";
    Print("progress",
          fmt::format("\"phase\":\"{}\",\"percent\":{},\"position_s\":{},\"speed\":{},\"left_s\":{},"
                      "\"worked_s\":{},\"bytes\":{},\"expected_bytes\":{},\"finished\":{},\"clip\":{}",
                      PhaseName(report.phase), Number(report.percent), Number(report.position),
                      Number(report.speed), Number(report.left), Number(report.worked), report.bytes,
                      expected, Number(report.finished), report.clip));
}

void JsonReporter::Opened(const OpenedFile& report) {
    Print("clip_opened", fmt::format("\"number\":{},\"path\":{}{}", report.number, JsonString(report.path),
                                     InputField(report.input)));
}

void JsonReporter::Closed(const ClosedFile& report) {
    Print("clip_closed", fmt::format("\"number\":{},\"path\":{},\"video_s\":{},\"audio_s\":{},\"bytes\":{}{}",
                                     report.number, JsonString(report.path), Number(report.videoSeconds),
                                     Number(report.audioSeconds), report.bytes, InputField(report.input)));
}

void JsonReporter::LeftBehind(const NotCarried& report) {
    Print("not_carried",
          fmt::format("\"kind\":{},\"number\":{},\"codec\":{},\"language\":{},\"reason\":{}{}",
                      JsonString(report.kind), report.number ? std::to_string(*report.number) : "null",
                      JsonString(report.codec), JsonString(report.language), JsonString(report.reason),
                      InputField(report.input)));
}

void JsonReporter::Warn(const std::string& text, const std::string& input) {
    Print("warning", fmt::format("\"text\":{}{}", JsonString(text), InputField(input)));
}

void JsonReporter::Error(const std::string& text) {
    Print("error", fmt::format("\"text\":{}", JsonString(text)));
    streams_.PrintError(fmt::format("movieconv: error: {}", text));
}

void JsonReporter::End(const EndReport& report) {
    Print("end",
          fmt::format("\"outcome\":\"{}\",\"exit_code\":{},\"position_s\":{},\"worked_s\":{},\"bytes\":{},"
                      "\"files\":{}",
                      report.outcome, static_cast<int>(report.code), Number(report.position),
                      Number(report.worked), report.bytes, report.files));
}

} // namespace movieconv
