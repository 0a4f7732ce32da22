// Reports for programs.
#ifndef MOVIECONV_HOST_TERMINAL_JSONREPORTER_H
#define MOVIECONV_HOST_TERMINAL_JSONREPORTER_H

#include "host/terminal/Reporter.h"

#include <nlohmann/json_fwd.hpp>
#include <string>
#include <string_view>

namespace movieconv {

class JsonReporter final : public Reporter {
public:
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
    void Print(std::string_view event, const nlohmann::ordered_json& fields) const;

    const StandardStreams& streams_;
    double nextAt_ = 0; // seconds of work
};

} // namespace movieconv

#endif
