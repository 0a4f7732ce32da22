#include "platform/Platform.h"

#include <algorithm>
#include <array>
#include <atomic>
#include <chrono>
#include <condition_variable>
#include <cstddef>
#include <exception>
#include <mutex>
#include <new>
#include <utility>
#include <vector>

struct OpaqueEventRef {
    struct Parameter {
        EventParamName name;
        EventParamType type;
        std::vector<std::byte> data;
    };

    OpaqueEventRef(OSType theClass, UInt32 theKind) : eventClass(theClass), eventKind(theKind) {}

    auto Find(EventParamName name) {
        return std::find_if(parameters.begin(), parameters.end(),
                            [name](const Parameter& p) { return p.name == name; });
    }

    const OSType eventClass;
    const UInt32 eventKind;
    std::atomic<long> references{1};
    std::vector<Parameter> parameters;
    // Guarded by the queue's mutex.
    bool queued = false;
    EventRef next = nullptr;
};

namespace {

bool Matches(const OpaqueEventRef& event, ItemCount numTypes, const EventTypeSpec* list) {
    return numTypes == 0 || std::any_of(list, list + numTypes, [&event](const EventTypeSpec& type) {
               return type.eventClass == event.eventClass && type.eventKind == event.eventKind;
           });
}

} // namespace

/// The events themselves are the queue's links: an event that could be made can be posted, without memory.
struct OpaqueEventQueueRef {
    OSStatus Post(EventRef event, EventPriority priority) {
        {
            const std::lock_guard lock(mutex);
            if (event->queued)
                return eventAlreadyPostedErr;
            if (size == kCapacity)
                return eventQueueFullErr;
            Line& line = lines[static_cast<std::size_t>(kEventPriorityHigh - priority)];
            event->next = nullptr;
            *line.end = event;
            line.end = &event->next;
            event->queued = true;
            ++size;
            RetainEvent(event);
        }
        arrived.notify_all(); // receivers may wait for different types
        return noErr;
    }

    EventRef Receive(ItemCount numTypes, const EventTypeSpec* list, EventTimeout timeout, bool pull) {
        EventRef event = nullptr;
        const auto taken = [&] { return (event = Take(numTypes, list, pull)) != nullptr; };
        std::unique_lock lock(mutex);
        if (timeout < 0 || timeout > kLongestTimeout)
            arrived.wait(lock, taken);
        else
            arrived.wait_for(lock, std::chrono::duration<double>(timeout), taken);
        return event;
    }

private:
    static constexpr std::size_t kCapacity = 16384; // a host that never receives must not fill the memory
    static constexpr EventTimeout kLongestTimeout = 1e8; // seconds; what is longer may overflow the clock

    EventRef Take(ItemCount numTypes, const EventTypeSpec* list, bool pull) {
        for (Line& line : lines) {
            EventRef* link = &line.first;
            while (*link && !Matches(**link, numTypes, list))
                link = &(*link)->next;
            const EventRef event = *link;
            if (event && pull) {
                *link = event->next;
                if (line.end == &event->next)
                    line.end = link;
                event->queued = false;
                --size;
            }
            if (event)
                return event;
        }
        return nullptr;
    }

    struct Line {
        EventRef first = nullptr;
        EventRef* end = &first; // where the next one is linked
    };

    std::mutex mutex;
    std::condition_variable arrived;
    std::array<Line, kEventPriorityHigh + 1> lines; // by priority, the highest first
    std::size_t size = 0;
};

OSStatus CreateEvent(CFAllocatorRef /*allocator*/, OSType eventClass, UInt32 eventKind, EventTime /*when*/,
                     EventAttributes /*attributes*/, EventRef* outEvent) {
    if (!outEvent)
        return paramErr;
    *outEvent = new (std::nothrow) OpaqueEventRef(eventClass, eventKind);
    return *outEvent ? noErr : memFullErr;
}

EventRef RetainEvent(EventRef event) {
    if (event)
        event->references.fetch_add(1, std::memory_order_relaxed);
    return event;
}

void ReleaseEvent(EventRef event) {
    if (event && event->references.fetch_sub(1, std::memory_order_acq_rel) == 1)
        delete event;
}

OSType GetEventClass(EventRef event) {
    return event ? event->eventClass : 0;
}

UInt32 GetEventKind(EventRef event) {
    return event ? event->eventKind : 0;
}

OSStatus SetEventParameter(EventRef event, EventParamName name, EventParamType type, ByteCount size,
                           const void* data) {
    if (!event || (!data && size > 0))
        return paramErr;
    try {
        OpaqueEventRef::Parameter parameter{name, type, std::vector<std::byte>(size)};
        std::copy_n(static_cast<const std::byte*>(data), size, parameter.data.begin());
        const auto found = event->Find(name);
        if (found != event->parameters.end())
            *found = std::move(parameter);
        else
            event->parameters.push_back(std::move(parameter));
        return noErr;
    } catch (const std::exception&) { // no memory, or no vector of that size
        return memFullErr;
    }
}

OSStatus GetEventParameter(EventRef event, EventParamName name, EventParamType desiredType,
                           EventParamType* outActualType, ByteCount bufferSize, ByteCount* outActualSize,
                           void* outData) {
    if (!event)
        return paramErr;
    const auto found = event->Find(name);
    if (found == event->parameters.end())
        return eventParameterNotFoundErr;
    if (desiredType != typeWildCard && desiredType != found->type)
        return errAECoercionFail;
    if (outActualType)
        *outActualType = found->type;
    if (outActualSize)
        *outActualSize = found->data.size();
    if (outData)
        std::copy_n(found->data.begin(), std::min<std::size_t>(bufferSize, found->data.size()),
                    static_cast<std::byte*>(outData));
    return noErr;
}

EventQueueRef GetMainEventQueue() {
    // Never destroyed: workers may post while the process ends. Never missing: it needs no memory.
    alignas(OpaqueEventQueueRef) static std::byte place[sizeof(OpaqueEventQueueRef)];
    static auto* const queue = new (place) OpaqueEventQueueRef;
    return queue;
}

OSStatus PostEventToQueue(EventQueueRef queue, EventRef event, EventPriority priority) {
    if (!queue || !event || priority < kEventPriorityLow || priority > kEventPriorityHigh)
        return paramErr;
    return queue->Post(event, priority);
}

OSStatus ReceiveNextEvent(ItemCount numTypes, const EventTypeSpec* list, EventTimeout timeout,
                          Boolean pullEvent, EventRef* outEvent) {
    if (!outEvent || (numTypes > 0 && !list))
        return paramErr;
    *outEvent = GetMainEventQueue()->Receive(numTypes, list, timeout, pullEvent != 0);
    return *outEvent ? noErr : eventLoopTimedOutErr;
}
