#include "tests/engine/ScriptedHost.h"

#include <atomic>
#include <cmath>

#include <sys/times.h>

namespace {

using recorder::Line;
using recorder::Note;

std::atomic<uint32_t> g_ticks{0}; // what the engine reads as its clock, 10 ms each

UInt32 Parameter(EventRef event, EventParamName name) {
    UInt32 value = 0xDEADBEEF;
    GetEventParameter(event, name, 0x55494E54, nullptr, sizeof value, nullptr, &value);
    return value;
}

/// A record without what is as usual.
std::string Describe(const ProgressInfo* info) {
    if (!info)
        return " without record";
    std::string text = Line(" at %g", info->dPosition);
    if (std::abs(info->dDoneLength - info->dPosition) > 1e-9)
        text += Line(" done %g", info->dDoneLength);
    if (info->dSpeed != 0.0)
        text += Line(" speed %g", info->dSpeed);
    if (info->nPercent != info->nProgress / 100)
        text += Line(" percent %d", info->nPercent);
    if (info->pPreviewImage)
        text += " preview " + std::to_string(info->pPreviewImage->llTime);
    return text;
}

/// Stamps of `count` records from 0 on, `step` apart.
std::vector<int64_t> Stamps(int64_t step, size_t count) {
    std::vector<int64_t> stamps(count);
    for (size_t i = 0; i < count; ++i)
        stamps[i] = step * static_cast<int64_t>(i);
    return stamps;
}

} // namespace

void AdvanceClock(uint32_t ms) {
    g_ticks += ms / 10;
}

// These two take the place of the system's and the platform's, in the engine too.

extern "C" __attribute__((visibility("default"))) clock_t times(struct tms*) noexcept {
    return g_ticks;
}

OSStatus PostEventToQueue(EventQueueRef queue, EventRef event, EventPriority priority) {
    const bool usual = queue == GetMainEventQueue() && GetEventClass(event) == 5000 &&
                       GetEventKind(event) == 0x6B696E64 && priority == kEventPriorityStandard;
    const UInt32 wParam = Parameter(event, 0x5750414D);
    const UInt32 window = Parameter(event, 0x48574E44);
    std::string line = wParam == 0 ? "event progress" : wParam == 100 ? "event finished" : "event ?";
    line += " " + std::to_string(static_cast<int32_t>(Parameter(event, 0x4C50414D)));
    if (window != 0)
        line += " for window " + std::to_string(window);
    Note(usual ? line : line + " unusual");
    return noErr;
}

double ScriptedVideo::Seek(double seconds, int mode) {
    Note(Line("seek video %g %d", seconds, mode));
    return seconds;
}

VideoImage ScriptedVideo::Image(size_t index) const {
    VideoImage image{};
    image.nType = kMediaTypePicture;
    image.llTime2 = stamps[index] + 7;
    image.llTime = stamps[index];
    image.nDuration = static_cast<int32_t>(index);
    return image;
}

VideoImage* ScriptedVideo::Load() {
    images.resize(stamps.size());
    VideoImage& image = images[overwrites ? 0 : position];
    image = Image(position);
    return &image;
}

VideoImage* ScriptedVideo::GetCurrentImage() {
    const bool none = position >= stamps.size();
    Note("image " + (none ? "none" : std::to_string(stamps[position])));
    return none ? nullptr : Load();
}

int ScriptedVideo::DecodeNext(int mode) {
    const bool atEnd = position + 1 >= stamps.size();
    if (!atEnd || !staysAtLast)
        ++position;
    if (overwrites && !atEnd)
        Load();
    AdvanceClock(stepMs);
    const int result = atEnd && announcesEnd ? 0 : mode;
    Note(Line("next -> %d", result));
    return result;
}

double ScriptedAudio::Seek(double seconds) {
    Note(Line("seek audio %g", seconds));
    return seconds;
}

AudioFrame ScriptedAudio::Block(size_t index) const {
    static unsigned char samples[1 << 16]; // more than any test's blocks
    const int64_t time = stamps[index];
    const int32_t rate = info.format.nSampleRate;
    unsigned char* const data = samples + index % 256;
    const auto number = static_cast<int32_t>(index);
    return {42, rate, 0, 0, data, blockLength, blockLength + 1, {200}, time + 3, time, number};
}

AudioFrame* ScriptedAudio::GetNextFrame() {
    AdvanceClock(stepMs);
    if (position >= stamps.size()) {
        Note("block none");
        block = {};
        return endsEmpty ? &block : nullptr;
    }
    block = Block(position++);
    Note("block " + std::to_string(block.llTime));
    return &block;
}

ScriptedHost::ScriptedHost() {
    recorder::Reset();
    g_ticks = 0xFFFFFF00 / 10; // so that every longer test crosses the wrap
}

void ScriptedHost::SetMovie(size_t pictures, size_t blocks) {
    video.stamps = Stamps(kSecond / 10, pictures);
    audio.stamps = Stamps(kSecond / 20, blocks);
    video.Format().dDuration = static_cast<double>(pictures) / 10;
    audio.Format().dDuration = static_cast<double>(blocks) / 20;
}

void ScriptedHost::Create() {
    if (handle)
        return;
    handle = MCCreate(hasVideo ? &video : nullptr, hasAudio ? &audio : nullptr);
    MCSetOutputFile(handle, L"out.mp4");
}

void ScriptedHost::Change(const std::function<void(EncodeParam&)>& change) {
    Create();
    EncodeParam param;
    MCGetEncodeParam(handle, &param);
    change(param);
    MCSetEncodeParam(handle, &param);
}

void ScriptedHost::Split(unsigned long milliseconds) {
    Create();
    MCSetSplitParam(handle, 1, milliseconds);
}

int ScriptedHost::Start(double begin, double length) {
    Create();
    return MCStart(handle, begin, length, window, hasCallback ? Callback : nullptr, this);
}

std::string ScriptedHost::Convert(double begin, double length) {
    if (const int result = Start(begin, length); result != 0)
        Note(Line("start -> %d", result));
    MCWait(handle, MC_INFINITE);
    return Trace(Part::kWithoutLog);
}

unsigned ScriptedHost::Callback(void* context, unsigned kind, unsigned value, uintptr_t pointer) {
    auto& host = *static_cast<ScriptedHost*>(context);
    const auto* info = reinterpret_cast<const ProgressInfo*>(pointer);
    if (info && kind == 0)
        host.records.push_back(*info);
    const std::string name = kind == 1 ? "finished " : "progress ";
    const bool usual = kind == 1 || !info || info->nProgress == static_cast<int>(value);
    Note(name + std::to_string(static_cast<int>(value)) + Describe(info) + (usual ? "" : " unusual"));
    if (host.onCallback)
        host.onCallback(kind, info);
    if (host.records.size() == host.abortAt)
        MCAbort(host.handle);
    return kind == 0 && host.records.size() == host.cancelAt ? 0 : 1;
}

std::string Trace(Part part) {
    std::string lines;
    for (const std::string& line : recorder::Recorded().trace)
        if (part == Part::kWhole || (part == Part::kLog) == (line.rfind("log ", 0) == 0))
            lines += line + "\n";
    return lines;
}
