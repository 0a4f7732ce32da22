// Reports for programs: one JSON object a line, described in docs/progress-json.md.
#ifndef MOVIECONV_HOST_TERMINAL_JSONREPORTER_H
#define MOVIECONV_HOST_TERMINAL_JSONREPORTER_H

#include "host/terminal/Reporter.h"

#include <nlohmann/json_fwd.hpp>
#include <string>
#include <string_view>

namespace movieconv {

class JsonReporter final : public Reporter {
public:
    /// Of everything that is told as JSON.
    static constexpr int kVersion = 1;

    explicit JsonReporter(const StandardStreams& streams) : streams_(streams) {}

    void Started(const Start& report) override;
    void Progressed(const Progress& report) override;
    void Opened(const OpenedFile& report) override;
    void Closed(const ClosedFile& report) override;
    void LeftBehind(const NotCarried& report) override;
    void Warn(const std::string& text, const std::string& input) override;
    void Error(const std::string& text) override;
    void End(const EndReport& report) override;

private:
    void Print(std::string_view event, const std::string& fields) const;

    const StandardStreams& streams_;
    double nextAt_ = 0; // seconds of work
};

/// The same JSON, with what terminals obey written as numbers. `json` has none of it but line ends outside of
/// its strings.
std::string EscapeCommands(std::string_view json);

/// A JSON string with its quotes. Bytes that are not UTF-8 become U+FFFD.
std::string JsonString(std::string_view bytes);

/// An object of the stream with these fields, and the line's end.
std::string JsonLine(std::string_view event, const nlohmann::ordered_json& fields);

} // namespace movieconv

#endif
