// The interface as a C program uses it.
#include "api/MovieConv.h"
#include "media/MediaWriter.h"
#include "platform/Platform.h"

static unsigned Callback(void* context, unsigned kind, unsigned value, uintptr_t info) {
    const ProgressInfo* progress = (const ProgressInfo*)info;
    *(double*)context = kind == 1 && value == kOutcomeCompleted && progress ? progress->dPosition : 0.0;
    return 1;
}

// The sizes that the headers promise to C++.
static int SizesDiffer(void) {
    const size_t widened = sizeof(void*) - 4;
    return sizeof(VideoFormat) != 24 || sizeof(AudioFormat) != 24 || sizeof(VideoImage) != 76 + 3 * widened ||
           sizeof(AudioFrame) != 76 + widened || sizeof(EncodeParam) != 104 || sizeof(FileFormatInfo) != 828;
}

int main(void) {
    double position = 0.0;
    ReleaseEvent(NULL);
    return SizesDiffer() || MCStart(NULL, 0.0, 0.0, NULL, Callback, &position) != -1;
}
