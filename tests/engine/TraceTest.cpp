// Whole conversions, call by call, against the files in traces/. A file holds settings, a line each with the
// words below, then an empty line and what must happen, with the log lines if there are any. The movies have
// 10 pictures a second and 1000 bytes of sound a second in blocks of 50 ms, unless the settings say
// otherwise; every expectation was worked out by hand.
#include "tests/engine/ScriptedHost.h"
#include "tests/support/Folder.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <filesystem>
#include <iterator>
#include <map>
#include <sstream>
#include <string>

namespace {

struct Script {
    ScriptedHost host;
    double begin = 0.0;
    double length = 0.0;
};

using Setting = std::function<void(std::istream& words)>;

template <class Value>
Value Next(std::istream& words) {
    Value value{};
    words >> value;
    return value;
}

template <class Value>
Setting Into(Value& value) {
    return [&value](std::istream& words) { words >> value; };
}

Setting Into(std::vector<int64_t>& values) {
    using Words = std::istream_iterator<int64_t>;
    return [&values](std::istream& words) { values = std::vector<int64_t>(Words(words), Words()); };
}

/// Sets a field of the parameters.
Setting Into(ScriptedHost& host, int32_t EncodeParam::*field) {
    return [&host, field](std::istream& words) {
        host.Change([&](EncodeParam& param) { words >> param.*field; });
    };
}

void SetFileFormat(ScriptedHost& host, const std::string& code) {
    host.Change([&](EncodeParam& param) {
        param.fccFileFormat = FourCC(code.at(0), code.at(1), code.at(2), code.at(3));
    });
}

/// What a line can set, in the order of the lines: the converter is created by those at the end.
std::map<std::string, Setting> Settings(Script& script) {
    ScriptedHost& host = script.host;
    return {
        {"movie",
         [&](std::istream& words) {
             const auto pictures = Next<size_t>(words);
             host.SetMovie(pictures, Next<size_t>(words));
         }},
        {"picture-stamps", Into(host.video.stamps)},
        {"block-stamps", Into(host.audio.stamps)},
        {"block-bytes", Into(host.audio.blockLength)},
        {"video-seconds", [&](std::istream& words) { host.video.Format().dDuration = Next<double>(words); }},
        {"audio-seconds", [&](std::istream& words) { host.audio.Format().dDuration = Next<double>(words); }},
        {"audio-byte-rate", Into(host.audio.Format().nBytesPerSecond)},
        {"picture-takes-ms", Into(host.video.stepMs)},
        {"has-video", Into(host.hasVideo)},
        {"has-audio", Into(host.hasAudio)},
        {"has-callback", Into(host.hasCallback)},
        {"video-descriptions", Into(host.video.descriptions)},
        {"video-stays-at-last", Into(host.video.staysAtLast)},
        {"video-announces-end", Into(host.video.announcesEnd)},
        {"video-reuses-its-record", Into(host.video.overwrites)},
        {"audio-ends-empty", Into(host.audio.endsEmpty)},
        {"begin", Into(script.begin)},
        {"length", Into(script.length)},
        {"window", [&](std::istream&) { host.window = reinterpret_cast<OpaqueWindowPtr*>(0x1234); }},
        {"cancel-at-call", Into(host.cancelAt)},
        {"abort-at-call", Into(host.abortAt)},
        {"failing-create",
         [](std::istream& words) { recorder::Reset({.failingCreates = {Next<int>(words)}}); }},
        {"split-ms", [&](std::istream& words) { host.Split(Next<unsigned long>(words)); }},
        {"video-bitrate", Into(host, &EncodeParam::nVideoBitrate)},
        {"output-sample-rate", Into(host, &EncodeParam::nSampleRate)},
        {"output-channels", Into(host, &EncodeParam::nChannels)},
        {"file-format", [&](std::istream& words) { SetFileFormat(host, Next<std::string>(words)); }},
        {"name",
         [&](std::istream& words) {
             const auto name = Next<std::string>(words);
             host.Create();
             MCSetOutputFile(host.handle,
                             name.empty() ? nullptr : std::wstring(name.begin(), name.end()).c_str());
         }},
        {"preview",
         [&](std::istream& words) {
             host.Create();
             MCEnablePreview(host.handle, Next<unsigned>(words));
         }},
        {"convert-once-before", [&](std::istream&) { host.Convert(); }},
    };
}

/// The files, as FOLDER/NAME.txt.
std::vector<std::string> Traces() {
    std::vector<std::string> traces;
    for (const auto& entry : std::filesystem::recursive_directory_iterator(MOVIECONV_TRACES))
        if (entry.is_regular_file())
            traces.push_back(entry.path().lexically_relative(MOVIECONV_TRACES).string());
    std::sort(traces.begin(), traces.end());
    return traces;
}

class TraceTest : public testing::TestWithParam<std::string> {};

TEST_P(TraceTest, HappensInOrder) {
    std::istringstream file(ReadFile(MOVIECONV_TRACES "/" + GetParam()));
    Script script;
    const std::map<std::string, Setting> settings = Settings(script);
    for (std::string line; std::getline(file, line) && !line.empty();) {
        std::istringstream words(line);
        const auto name = Next<std::string>(words);
        if (name != "#")
            settings.at(name)(words);
    }
    const std::string expected{std::istreambuf_iterator<char>(file), {}};
    const std::string trace = script.host.Convert(script.begin, script.length);
    EXPECT_EQ(expected.rfind("log ", 0) == 0 ? Trace(Part::kWhole) : trace, expected);
}

INSTANTIATE_TEST_SUITE_P(Traces, TraceTest, testing::ValuesIn(Traces()), [](const auto& info) {
    const std::filesystem::path path = info.param;
    return path.parent_path().string() + "_" + path.stem().string();
});

} // namespace
