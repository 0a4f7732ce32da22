#include "tests/recorder/RecordingWriter.h"

#include "media/MediaWriter.h"

#include <algorithm>
#include <cstdio>
#include <mutex>
#include <utility>

namespace {

struct State {
    std::vector<std::string> trace;
    std::vector<AudioFrame> sounds;
    std::vector<VideoImage> pictures;
    std::vector<EncodeParam> params;
    std::set<int> failing;
    const FileFormatInfo* formats = nullptr;
    std::function<void()> onWrite;
    std::function<void()> onClose;
};

std::mutex g_mutex;
State g_state;

template <class Value>
Value Get(Value State::*member) {
    const std::lock_guard guard(g_mutex);
    return g_state.*member;
}

template <class Value>
void Set(Value State::*member, Value value) {
    const std::lock_guard guard(g_mutex);
    g_state.*member = std::move(value);
}

/// Whether a block is the engine's silence. Of a long one only the first 64 KiB are looked at.
bool IsSilence(const AudioFrame& frame) {
    return frame.nType == kMediaTypeSilence &&
           std::all_of(frame.pData, frame.pData + std::clamp(frame.nLength, 0, 1 << 16),
                       [](unsigned char byte) { return byte == 0; });
}

/// The text with "?" for everything but ASCII.
std::string Ascii(const wchar_t* text) {
    std::string ascii;
    for (; *text; ++text)
        ascii += *text > 0 && *text < 0x80 ? static_cast<char>(*text) : '?';
    return ascii;
}

template <class... Values>
std::string Format(const char* format, Values... values) {
    char text[256];
    snprintf(text, sizeof text, format, values...);
    return text;
}

// A handle is the address of one of these, so that a file is known by its number.
struct File {
    int number;
};

int Number(const void* file) {
    return file ? static_cast<const File*>(file)->number : 0;
}

/// Calls a hook with nothing locked, since it may take its time.
void Call(std::function<void()> State::*member) {
    if (const auto hook = Get(member))
        hook();
}

} // namespace

namespace recorder {

void Reset() {
    const std::lock_guard guard(g_mutex);
    g_state = State();
}

void Note(std::string_view line) {
    const std::lock_guard guard(g_mutex);
    g_state.trace.emplace_back(line);
}

std::vector<std::string> Trace() {
    return Get(&State::trace);
}

std::vector<AudioFrame> Sounds() {
    return Get(&State::sounds);
}

std::vector<VideoImage> Pictures() {
    return Get(&State::pictures);
}

std::vector<EncodeParam> Params() {
    return Get(&State::params);
}

void FailCreates(std::set<int> numbers) {
    Set(&State::failing, std::move(numbers));
}

void SetFormatTable(const FileFormatInfo* table) {
    Set(&State::formats, table);
}

void OnWrite(std::function<void()> hook) {
    Set(&State::onWrite, std::move(hook));
}

void OnClose(std::function<void()> hook) {
    Set(&State::onClose, std::move(hook));
}

} // namespace recorder

const FileFormatInfo* MWGetFileFormatInfos() {
    return Get(&State::formats);
}

void* MWCreateMediaFile(const wchar_t* fileName, const EncodeParam* param, const VideoFormat* video,
                        const AudioFormat* audio) {
    const std::lock_guard guard(g_mutex);
    g_state.params.push_back(*param);
    const int number = static_cast<int>(g_state.params.size());
    std::string line = "create " + Ascii(fileName);
    line += video ? Format(" %dx%d@%g", video->nWidth, video->nHeight, video->dFrameRate) : " -";
    line += audio ? Format(" %d/%d", audio->nSampleRate, audio->nChannels) : " -";
    const bool fails = g_state.failing.count(number) > 0;
    g_state.trace.push_back(line + (fails ? " -> null" : Format(" -> #%d", number)));
    return fails ? nullptr : new File{number};
}

int MWWriteVideoFrame(void* file, const VideoImage* image) {
    Call(&State::onWrite);
    const std::lock_guard guard(g_mutex);
    g_state.pictures.push_back(*image);
    g_state.trace.push_back(Format("picture #%d %lld", Number(file), static_cast<long long>(image->llTime)));
    return file != nullptr;
}

int MWWriteAudioData(void* file, const AudioFrame* frame) {
    Call(&State::onWrite);
    const std::lock_guard guard(g_mutex);
    g_state.sounds.push_back(*frame);
    g_state.trace.push_back(Format("%s #%d %lld +%d", IsSilence(*frame) ? "silence" : "sound", Number(file),
                                   static_cast<long long>(frame->llTime), frame->nLength));
    return file != nullptr;
}

int MWCloseMediaFile(void* file, ProgressCallback callback, void* context) {
    if (callback)
        Call(&State::onClose);
    std::string line = Format("close #%d", Number(file));
    if (callback)
        line += context ? " with callback and context" : " with callback";
    else if (context)
        line += " with context";
    recorder::Note(line);
    delete static_cast<File*>(file);
    return file != nullptr;
}
