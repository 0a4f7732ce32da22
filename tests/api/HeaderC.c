// The interface as a C program uses it.
#include "api/MovieConv.h"

static unsigned Callback(void* context, unsigned kind, unsigned value, uintptr_t info) {
    const ProgressInfo* progress = (const ProgressInfo*)info;
    *(double*)context = kind == 1 && value == kOutcomeCompleted && progress ? progress->dPosition : 0.0;
    return 1;
}

int main(void) {
    EncodeParam param = {0};
    double position = 0.0;
    wchar_t name[MC_MAX_TARGET_NAME];
    param.nAudioBitrate = 128000;
    if (MCGetEstimateDiskSpaceEx(&param, 10.0) != 160000 || MCGetDiskFreeSpace(L"/") != 4294967295LL)
        return 1;
    if (MCCreate(NULL, NULL) || MCStart(NULL, 0.0, 0.0, NULL, Callback, &position) != -1)
        return 2;
    return MCGetTargetFileName(NULL, name, 0);
}
