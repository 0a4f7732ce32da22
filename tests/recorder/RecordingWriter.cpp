#include "tests/recorder/RecordingWriter.h"

#include "media/MediaWriter.h"

#include <algorithm>
#include <cstdint>
#include <mutex>
#include <utility>

namespace {

using recorder::Line;

std::mutex g_mutex;
recorder::Recording g_recording;
recorder::Behaviour g_behaviour;

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

/// The number of a file, which is its handle.
int Number(const void* file) {
    return static_cast<int>(reinterpret_cast<intptr_t>(file));
}

/// Calls a hook with nothing locked, since it may take its time.
void Call(std::function<void()> recorder::Behaviour::*member) {
    std::unique_lock guard(g_mutex);
    const auto hook = g_behaviour.*member;
    guard.unlock();
    if (hook)
        hook();
}

/// Records a write to `file`. What the media writer returns.
template <class Record>
int Write(const void* file, std::vector<Record> recorder::Recording::*records, const Record& record,
          const std::string& line) {
    Call(&recorder::Behaviour::onWrite);
    recorder::Note(line);
    const std::lock_guard guard(g_mutex);
    (g_recording.*records).push_back(record);
    const size_t writes = g_recording.pictures.size() + g_recording.sounds.size();
    return file != nullptr && writes <= g_behaviour.takenWrites;
}

} // namespace

void recorder::Reset(Behaviour behaviour) {
    const std::lock_guard guard(g_mutex);
    g_recording = {};
    g_behaviour = std::move(behaviour);
}

void recorder::Note(std::string_view line) {
    const std::lock_guard guard(g_mutex);
    g_recording.trace.emplace_back(line);
}

recorder::Recording recorder::Recorded() {
    const std::lock_guard guard(g_mutex);
    return g_recording;
}

const FileFormatInfo* MWGetFileFormatInfos() {
    const std::lock_guard guard(g_mutex);
    return g_behaviour.formats;
}

void* MWCreateMediaFile(const wchar_t* fileName, const EncodeParam* param, const VideoFormat* video,
                        const AudioFormat* audio) {
    const std::lock_guard guard(g_mutex);
    g_recording.params.push_back(*param);
    const auto number = static_cast<intptr_t>(g_recording.params.size());
    const bool fails = g_behaviour.failingCreates.count(static_cast<int>(number)) > 0;
    std::string line = "create " + Ascii(fileName);
    line += video ? Line(" %dx%d@%g", video->nWidth, video->nHeight, video->dFrameRate) : " -";
    line += audio ? Line(" %d/%d", audio->nSampleRate, audio->nChannels) : " -";
    line += fails ? " -> null" : " -> #" + std::to_string(number);
    g_recording.trace.push_back(line);
    return fails ? nullptr : reinterpret_cast<void*>(number);
}

int MWWriteVideoFrame(void* file, const VideoImage* image) {
    return Write(file, &recorder::Recording::pictures, *image,
                 Line("picture #%d %lld", Number(file), static_cast<long long>(image->llTime)));
}

int MWWriteAudioData(void* file, const AudioFrame* frame) {
    return Write(file, &recorder::Recording::sounds, *frame,
                 Line("%s #%d %lld +%d", IsSilence(*frame) ? "silence" : "sound", Number(file),
                      static_cast<long long>(frame->llTime), frame->nLength));
}

int MWCloseMediaFile(void* file, ProgressCallback callback, void* context) {
    if (callback)
        Call(&recorder::Behaviour::onClose);
    const char* const with[] = {"", " with context", " with callback", " with callback and context"};
    recorder::Note(Line("close #%d%s", Number(file), with[(callback ? 2 : 0) + (context ? 1 : 0)]));
    const std::lock_guard guard(g_mutex);
    return file != nullptr && !g_behaviour.failingCloses;
}
