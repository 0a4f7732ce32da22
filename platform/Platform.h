/// \file
/// The event-queue and bundle functions that the engine expects of its platform, and what a host needs to
/// receive the events. They have their usual names, signatures and error codes. Every function may be called
/// from any thread.
///
/// Ownership follows the usual rule: what a function with Create or Copy in its name gives out, or what was
/// retained, is the caller's to release; what a function with Get in its name gives out is borrowed.
#ifndef MOVIECONV_PLATFORM_PLATFORM_H
#define MOVIECONV_PLATFORM_PLATFORM_H

#include "platform/Window.h"

#include <stdint.h>

#ifdef __cplusplus
extern "C" {
#endif

typedef unsigned char Boolean; ///< 0 or 1.
typedef uint32_t UInt32;       ///< 32 bits.
typedef int16_t SInt16;        ///< 16 bits with a sign.
typedef int32_t OSStatus;      ///< noErr, or what went wrong.
typedef uint32_t OSType; ///< Four characters, the first in the highest byte, as a literal of 'abcd' has them.
typedef unsigned long ByteCount; ///< A size in bytes.
typedef unsigned long ItemCount; ///< A number of things.

typedef struct OpaqueEventRef* EventRef;           ///< A counted reference to an event.
typedef struct OpaqueEventQueueRef* EventQueueRef; ///< A queue of events.
typedef double EventTime;                          ///< Seconds since the system started; 0 stands for now.
typedef double EventTimeout;                       ///< Seconds.
typedef UInt32 EventAttributes;                    ///< Not used.
typedef OSType EventParamName;                     ///< Which parameter of an event.
typedef OSType EventParamType;                     ///< What its bytes are.
typedef SInt16 EventPriority;                      ///< kEventPriority...

/// One kind of events.
typedef struct EventTypeSpec {
    OSType eventClass; ///< The class.
    UInt32 eventKind;  ///< The kind within the class.
} EventTypeSpec;

typedef const void* CFTypeRef;                          ///< Any of the references below.
typedef const struct OpaqueCFAllocator* CFAllocatorRef; ///< Not used; null.
typedef struct OpaqueCFBundle* CFBundleRef;             ///< A program with what belongs to it.
typedef const struct OpaqueCFURL* CFURLRef;             ///< A place.
typedef const struct OpaqueCFString* CFStringRef;       ///< A text.
typedef long CFIndex;                                   ///< A count or size.
typedef UInt32 CFStringEncoding;                        ///< How a text is kept in bytes.

enum {
    noErr = 0,
    paramErr = -50,                    ///< A null or meaningless argument.
    memFullErr = -108,                 ///< No memory for it.
    errAECoercionFail = -1700,         ///< The parameter is there, but of another type.
    eventAlreadyPostedErr = -9860,     ///< The event lies in the queue already.
    eventQueueFullErr = -9861,         ///< Nobody receives the events: 16384 of them wait.
    eventParameterNotFoundErr = -9870, ///< The event has no parameter of that name.
    eventLoopTimedOutErr = -9875       ///< No matching event came in time.
};

enum { kEventPriorityLow = 0, kEventPriorityStandard = 1, kEventPriorityHigh = 2 };

enum {
    typeWildCard = 0x2A2A2A2A ///< '****': any type will do.
};

#define kEventDurationNoWait 0.0                             ///< An EventTimeout: do not wait.
#define kEventDurationForever (-1.0)                         ///< An EventTimeout: wait without limit.
#define kCFStringEncodingUTF8 ((CFStringEncoding)0x08000100) ///< UTF-8, the only encoding.

#pragma GCC visibility push(default)

/// Makes an event with one reference. `allocator`, `when` and `attributes` are accepted and not used.
/// noErr, paramErr (`outEvent` null) or memFullErr.
OSStatus CreateEvent(CFAllocatorRef allocator, OSType eventClass, UInt32 eventKind, EventTime when,
                     EventAttributes attributes, EventRef* outEvent);

/// One more reference; returns `event`. Null is accepted.
EventRef RetainEvent(EventRef event);

/// Gives one reference back; the last one frees the event. Null is accepted.
void ReleaseEvent(EventRef event);

/// The event's class, or 0 for null.
OSType GetEventClass(EventRef event);

/// The event's kind, or 0 for null.
UInt32 GetEventKind(EventRef event);

/// Copies `size` bytes into the event under `name`, in place of an earlier parameter of that name. Parameters
/// are set before the event is posted: an event has no lock of its own. noErr, paramErr or memFullErr.
OSStatus SetEventParameter(EventRef event, EventParamName name, EventParamType type, ByteCount size,
                           const void* data);

/// Copies the parameter `name` to `outData`, at most `bufferSize` bytes of it. `desiredType` is its type or
/// typeWildCard. `outActualType`, `outActualSize` (the whole size in bytes) and `outData` may be null.
/// noErr, paramErr, eventParameterNotFoundErr or errAECoercionFail.
OSStatus GetEventParameter(EventRef event, EventParamName name, EventParamType desiredType,
                           EventParamType* outActualType, ByteCount bufferSize, ByteCount* outActualSize,
                           void* outData);

/// The queue that the host's main thread receives from. It lives as long as the process.
EventQueueRef GetMainEventQueue(void);

/// Puts an event into the queue, which keeps a reference of its own. Higher priorities are received first;
/// within one priority the order of posting holds. Needs no memory. noErr, paramErr, eventAlreadyPostedErr or
/// eventQueueFullErr.
OSStatus PostEventToQueue(EventQueueRef queue, EventRef event, EventPriority priority);

/// Waits up to `timeout` seconds (negative: for ever) for an event of the main queue that is one of
/// `numTypes` types in `list`, or for any event when `numTypes` is 0. With `pullEvent` the event leaves the
/// queue and its reference is the caller's; without, it stays and `outEvent` is borrowed. noErr, paramErr or
/// eventLoopTimedOutErr.
OSStatus ReceiveNextEvent(ItemCount numTypes, const EventTypeSpec* list, EventTimeout timeout,
                          Boolean pullEvent, EventRef* outEvent);

/// The running program's bundle: X.app when the program lies in X.app/Contents/MacOS, else the program's
/// directory. Borrowed; null when the system does not tell where the program lies.
CFBundleRef CFBundleGetMainBundle(void);

/// The bundle's URL, "file://localhost/.../" with bytes that a path may not hold percent-encoded. The
/// caller's; null for a null bundle or without memory.
CFURLRef CFBundleCopyBundleURL(CFBundleRef bundle);

/// The URL's text, borrowed from it; null for null.
CFStringRef CFURLGetString(CFURLRef url);

/// Copies the text with its terminator. 0, and an empty `buffer` where there is any, when it does not fit
/// into `bufferSize` bytes or the encoding is not kCFStringEncodingUTF8; else 1.
Boolean CFStringGetCString(CFStringRef string, char* buffer, CFIndex bufferSize, CFStringEncoding encoding);

/// Gives one reference back. Null is accepted, and so is a borrowed bundle, which stays.
void CFRelease(CFTypeRef object);

#pragma GCC visibility pop

#ifdef __cplusplus
}
#endif

#endif
