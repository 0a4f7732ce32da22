#include "engine/PostMessage.h"

#include "platform/Platform.h"

#include <cstdint>

namespace {

constexpr OSType kKind = 0x6B696E64;   // 'kind'
constexpr OSType kWParam = 0x5750414D; // 'WPAM'
constexpr OSType kLParam = 0x4C50414D; // 'LPAM'
constexpr OSType kWindow = 0x48574E44; // 'HWND'
constexpr OSType kUInt32 = 0x55494E54; // 'UINT'

OSStatus SetParameter(EventRef event, EventParamName name, UInt32 value) {
    return SetEventParameter(event, name, kUInt32, sizeof value, &value);
}

} // namespace

int PostMessage(OpaqueWindowPtr* window, unsigned message, unsigned wParam, unsigned lParam) {
    EventRef event = nullptr;
    if (CreateEvent(nullptr, message, kKind, 0.0, 0, &event) != noErr)
        return 0;
    SetParameter(event, kWParam, wParam);
    SetParameter(event, kLParam, lParam);
    const auto reference = static_cast<UInt32>(reinterpret_cast<uintptr_t>(window));
    const OSStatus addressed = SetParameter(event, kWindow, reference);
    const OSStatus posted = PostEventToQueue(GetMainEventQueue(), event, kEventPriorityStandard);
    ReleaseEvent(event);
    return addressed == noErr && posted == noErr;
}
