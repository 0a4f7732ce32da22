#include "tests/recorder/RecordingWriter.h"

#include "media/MediaWriter.h"

#include <condition_variable>
#include <cstdio>
#include <mutex>

namespace {

struct State {
    std::vector<std::string> trace;
    std::vector<recorder::Written<AudioFrame>> sounds;
    std::vector<recorder::Written<VideoImage>> pictures;
    std::vector<EncodeParam> params;
    std::set<int> failing;
    const FileFormatInfo* formats = nullptr;
    std::function<void()> onClose;
    bool digesting = true;
    bool blocking = false;
    bool blocked = false;
};

std::mutex g_mutex;
std::condition_variable g_changed;
State g_state;

constexpr uint32_t kDigestStart = 2166136261;

uint32_t AddToDigest(uint32_t digest, const unsigned char* data, size_t length) {
    for (size_t i = 0; i < length; ++i)
        digest = (digest ^ data[i]) * 16777619; // FNV-1a
    return digest;
}

uint32_t AddPlane(uint32_t digest, const unsigned char* plane, int32_t pitch, int32_t width, int32_t height) {
    for (int32_t y = 0; plane && y < height; ++y)
        digest = AddToDigest(digest, plane + static_cast<ptrdiff_t>(y) * pitch, static_cast<size_t>(width));
    return digest;
}

uint32_t DigestOf(const AudioFrame& frame) {
    return recorder::Digest(frame.pData,
                            frame.pData && frame.nLength > 0 ? static_cast<size_t>(frame.nLength) : 0);
}

uint32_t DigestOf(const VideoImage& image) {
    const int32_t halfWidth = image.nWidth / 2 + image.nWidth % 2;
    const int32_t halfHeight = image.nHeight / 2 + image.nHeight % 2;
    uint32_t digest = AddPlane(kDigestStart, image.pY, image.nPitchY, image.nWidth, image.nHeight);
    digest = AddPlane(digest, image.pU, image.nPitchU, halfWidth, halfHeight);
    return AddPlane(digest, image.pV, image.nPitchV, halfWidth, halfHeight);
}

/// The text with everything but ASCII as \u{CODE}.
std::string Ascii(const wchar_t* text) {
    std::string bytes;
    for (; *text; ++text) {
        char character[16];
        const bool ascii = *text > 0 && *text < 0x80;
        snprintf(character, sizeof character, ascii ? "%c" : "\\u{%X}", static_cast<unsigned>(*text));
        bytes += character;
    }
    return bytes;
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

void WaitWhileBlocking(std::unique_lock<std::mutex>& guard) {
    if (!g_state.blocking)
        return;
    g_state.blocked = true;
    g_changed.notify_all();
    g_changed.wait(guard, [] { return !g_state.blocking; });
    g_state.blocked = false;
}

} // namespace

namespace recorder {

uint32_t Digest(const unsigned char* data, size_t length) {
    return AddToDigest(kDigestStart, data, length);
}

void Reset() {
    const std::lock_guard guard(g_mutex);
    g_state = State();
    g_changed.notify_all();
}

void Note(std::string_view line) {
    const std::lock_guard guard(g_mutex);
    g_state.trace.emplace_back(line);
}

std::vector<std::string> Trace() {
    const std::lock_guard guard(g_mutex);
    return g_state.trace;
}

std::vector<Written<AudioFrame>> Sounds() {
    const std::lock_guard guard(g_mutex);
    return g_state.sounds;
}

std::vector<Written<VideoImage>> Pictures() {
    const std::lock_guard guard(g_mutex);
    return g_state.pictures;
}

std::vector<EncodeParam> Params() {
    const std::lock_guard guard(g_mutex);
    return g_state.params;
}

void SkipDigests() {
    const std::lock_guard guard(g_mutex);
    g_state.digesting = false;
}

void FailCreates(std::set<int> numbers) {
    const std::lock_guard guard(g_mutex);
    g_state.failing = std::move(numbers);
}

void SetFormatTable(const FileFormatInfo* table) {
    const std::lock_guard guard(g_mutex);
    g_state.formats = table;
}

void OnClose(std::function<void()> hook) {
    const std::lock_guard guard(g_mutex);
    g_state.onClose = std::move(hook);
}

void Block() {
    const std::lock_guard guard(g_mutex);
    g_state.blocking = true;
}

void Unblock() {
    const std::lock_guard guard(g_mutex);
    g_state.blocking = false;
    g_changed.notify_all();
}

void WaitUntilBlocked() {
    std::unique_lock guard(g_mutex);
    g_changed.wait(guard, [] { return g_state.blocked; });
}

} // namespace recorder

const FileFormatInfo* MWGetFileFormatInfos() {
    const std::lock_guard guard(g_mutex);
    return g_state.formats;
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
    std::unique_lock guard(g_mutex);
    WaitWhileBlocking(guard);
    g_state.pictures.push_back({Number(file), *image, g_state.digesting ? DigestOf(*image) : 0});
    g_state.trace.push_back(Format("picture #%d %lld", Number(file), static_cast<long long>(image->llTime)));
    return file != nullptr;
}

int MWWriteAudioData(void* file, const AudioFrame* frame) {
    std::unique_lock guard(g_mutex);
    WaitWhileBlocking(guard);
    g_state.sounds.push_back({Number(file), *frame, g_state.digesting ? DigestOf(*frame) : 0});
    g_state.trace.push_back(Format("%s #%d %lld +%d", frame->nType == kMediaTypeSilence ? "silence" : "sound",
                                   Number(file), static_cast<long long>(frame->llTime), frame->nLength));
    return file != nullptr;
}

int MWCloseMediaFile(void* file, ProgressCallback callback, void* context) {
    std::function<void()> hook;
    {
        const std::lock_guard guard(g_mutex);
        if (callback)
            hook = g_state.onClose;
    }
    if (hook)
        hook();
    std::string line = Format("close #%d", Number(file));
    if (callback)
        line += context ? " with callback and context" : " with callback";
    else if (context)
        line += " with context";
    recorder::Note(line);
    delete static_cast<File*>(file);
    return file != nullptr;
}
