#include "host/convert/Engine.h"

#include "engine/PostMessage.h"
#include "host/convert/EncodePlan.h"
#include "host/convert/Failure.h"
#include "text/Utf8.h"

#include <cmath>
#include <mutex>

namespace movieconv {
namespace {

constexpr OSType Code(const char (&text)[5]) {
    return static_cast<OSType>(text[0]) << 24 | static_cast<OSType>(text[1]) << 16 |
           static_cast<OSType>(text[2]) << 8 | static_cast<OSType>(text[3]);
}

bool IsOurs(EventRef event) {
    uint32_t window = 0;
    GetEventParameter(event, Code("HWND"), Code("UINT"), nullptr, sizeof window, nullptr, &window);
    return window == static_cast<uint32_t>(reinterpret_cast<uintptr_t>(EngineWindow()));
}

} // namespace

Engine MakeEngine(const Request& request, Movie& movie, uint32_t writerSet) {
    const FileFormatInfo& format = ChooseFormat(request);
    Engine engine(MCCreate(movie.Pictures(), movie.Sound()));
    EncodeParam defaults{};
    if (!engine || MCGetEncodeParam(engine.get(), &defaults) == 0)
        throw Failure(Category::kInternal, "no memory for the converter");
    EncodeParam param = PlanEncoding(defaults, format, request, movie.Info());
    param.nReserved[kWriterSetWord] = writerSet;
    MCSetEncodeParam(engine.get(), &param);
    MCSetOutputFile(engine.get(), text::FromUtf8(request.output).c_str());
    if (request.split && param.bNoVideo != 0)
        throw Failure(Category::kRequest, "a split needs pictures: sound alone is written as one file");
    if (request.split)
        MCSetSplitParam(engine.get(), 1, static_cast<unsigned long>(std::lround(*request.split * 1000)));
    return engine;
}

OpaqueWindowPtr* EngineWindow() {
    static char window;
    return reinterpret_cast<OpaqueWindowPtr*>(&window);
}

void DiscardEngineEvents() {
    static std::mutex oneAtATime;
    const std::lock_guard lock(oneAtATime);
    const EventTypeSpec kind{kProgressMessage, Code("kind")};
    EventRef event = nullptr;
    // One that belongs to somebody else's converter stays in front, and ours behind it wait for its owner.
    while (ReceiveNextEvent(1, &kind, kEventDurationNoWait, 0, &event) == noErr && IsOurs(event) &&
           ReceiveNextEvent(1, &kind, kEventDurationNoWait, 1, &event) == noErr) {
        if (!IsOurs(event)) // its owner took ours in between
            PostEventToQueue(GetMainEventQueue(), event, kEventPriorityStandard);
        ReleaseEvent(event);
    }
}

} // namespace movieconv
