#include "host/HostEvents.h"

#include "platform/Platform.h"

namespace host {
namespace {

constexpr OSType Code(const char (&text)[5]) {
    return static_cast<OSType>(text[0]) << 24 | static_cast<OSType>(text[1]) << 16 |
           static_cast<OSType>(text[2]) << 8 | static_cast<OSType>(text[3]);
}

constexpr OSType kHostClass = Code("mcvh");
constexpr OSType kEngineClass = 5000;
constexpr EventParamName kValueName = Code("valu");
constexpr EventParamType kValueType = Code("UINT");
constexpr EventParamName kEngineKind = Code("WPAM");
constexpr EventParamName kEngineValue = Code("LPAM");

uint32_t Parameter(EventRef event, EventParamName name) {
    uint32_t value = 0;
    GetEventParameter(event, name, kValueType, nullptr, sizeof value, nullptr, &value);
    return value;
}

/// Fills in `out`; false for events that nobody waits for. The engine's finished event is one of them: it is
/// missing when there was nothing to convert, so the program goes by the callback.
bool Translate(EventRef event, Event& out) {
    if (GetEventClass(event) == kHostClass) {
        out = {static_cast<EventKind>(GetEventKind(event)), Parameter(event, kValueName)};
        return true;
    }
    if (GetEventClass(event) == kEngineClass && Parameter(event, kEngineKind) == 0) {
        out = {EventKind::kProgress, Parameter(event, kEngineValue)};
        return true;
    }
    return false;
}

} // namespace

void PostHostEvent(EventKind kind, uint32_t value) {
    EventRef event = nullptr;
    if (CreateEvent(nullptr, kHostClass, static_cast<UInt32>(kind), 0, 0, &event) == noErr) {
        SetEventParameter(event, kValueName, kValueType, sizeof value, &value);
        PostEventToQueue(GetMainEventQueue(), event, kEventPriorityStandard);
        ReleaseEvent(event);
    }
}

bool ReceiveHostEvent(double seconds, Event& event) {
    EventRef received = nullptr;
    while (ReceiveNextEvent(0, nullptr, seconds, 1, &received) == noErr) {
        const bool known = Translate(received, event);
        ReleaseEvent(received);
        if (known)
            return true;
    }
    return false;
}

} // namespace host
