// A media writer and an event queue that do nothing, in place of the real ones.
#include "media/MediaWriter.h"
#include "platform/Platform.h"

void* MWCreateMediaFile(const wchar_t*, const EncodeParam*, const VideoFormat*, const AudioFormat*) {
    static int file;
    return &file;
}
int MWWriteVideoFrame(void*, const VideoImage*) {
    return 1;
}
int MWWriteAudioData(void*, const AudioFrame*) {
    return 1;
}
int MWCloseMediaFile(void*, ProgressCallback, void*) {
    return 1;
}

OSStatus CreateEvent(CFAllocatorRef, OSType, UInt32, EventTime, EventAttributes, EventRef*) {
    return noErr;
}
OSStatus SetEventParameter(EventRef, EventParamName, EventParamType, ByteCount, const void*) {
    return noErr;
}
OSStatus PostEventToQueue(EventQueueRef, EventRef, EventPriority) {
    return noErr;
}
void ReleaseEvent(EventRef) {}
