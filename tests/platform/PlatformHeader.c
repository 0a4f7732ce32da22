/* The header must compile as C, and the functions must be found under their C names. */
#include "platform/Platform.h"

OSStatus PostFromC(OSType eventClass, UInt32 eventKind);

OSStatus PostFromC(OSType eventClass, UInt32 eventKind) {
    EventRef event;
    OSStatus status = CreateEvent(0, eventClass, eventKind, 0.0, 0, &event);
    if (status == noErr) {
        status = PostEventToQueue(GetMainEventQueue(), event, kEventPriorityStandard);
        ReleaseEvent(event);
    }
    return status;
}
