#include "host/convert/HostEvents.h"

#include "platform/Platform.h"

namespace movieconv {
namespace {

constexpr OSType Code(const char (&text)[5]) {
    return static_cast<OSType>(text[0]) << 24 | static_cast<OSType>(text[1]) << 16 |
           static_cast<OSType>(text[2]) << 8 | static_cast<OSType>(text[3]);
}

constexpr OSType kHostClass = Code("mcvh");
constexpr OSType kEngineClass = 5000;
constexpr EventParamName kEngineKind = Code("WPAM");

/// Nothing for events that nobody waits for. The engine's finished event is one of them: it is missing when
/// there was nothing to convert, so the program goes by the callback.
std::optional<EventKind> KindOf(EventRef event) {
    if (GetEventClass(event) == kHostClass)
        return static_cast<EventKind>(GetEventKind(event));
    uint32_t engineKind = 0;
    GetEventParameter(event, kEngineKind, Code("UINT"), nullptr, sizeof engineKind, nullptr, &engineKind);
    if (GetEventClass(event) == kEngineClass && engineKind == 0)
        return EventKind::kProgress;
    return std::nullopt;
}

} // namespace

void PostHostEvent(EventKind kind) {
    EventRef event = nullptr;
    if (CreateEvent(nullptr, kHostClass, static_cast<UInt32>(kind), 0, 0, &event) == noErr) {
        PostEventToQueue(GetMainEventQueue(), event, kEventPriorityStandard);
        ReleaseEvent(event);
    }
}

std::optional<EventKind> ReceiveHostEvent(double seconds) {
    EventRef event = nullptr;
    while (ReceiveNextEvent(0, nullptr, seconds, 1, &event) == noErr) {
        const std::optional<EventKind> kind = KindOf(event);
        ReleaseEvent(event);
        if (kind)
            return kind;
    }
    return std::nullopt;
}

} // namespace movieconv
