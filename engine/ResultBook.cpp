#include "engine/ResultBook.h"

#include "engine/ProgressInfo.h"
#include "text/Utf8.h"

#include <algorithm>
#include <cstring>

void ResultBook::Begin() {
    const CSingleLock guard(&lock);
    result = {};
    result.nSize = sizeof result;
    result.nCategory = MC_RESULT_RUNNING;
    result.nOutcome = -1;
    for (Count* const count :
         {&picturesSent, &picturesRefused, &samplesSent, &samplesRefused, &picturesRestamped, &largestShift})
        *count = 0;
}

void ResultBook::Fail(int category, const char* what, const char* path, int systemError) {
    const CSingleLock guard(&lock);
    FailLocked(category, what, path, systemError);
}

void ResultBook::FailLocked(int category, const char* what, const char* path, int systemError) {
    if (result.nCategory != MC_RESULT_RUNNING)
        return;
    result.nCategory = category;
    result.nSystemError = systemError;
    text::CopyText(result.szWhat, what);
    text::CopyText(result.szPath, path);
}

void ResultBook::End(unsigned outcome, bool pictures) {
    const CSingleLock guard(&lock);
    result.nOutcome = static_cast<int32_t>(outcome);
    if (outcome == kOutcomeStopped)
        FailLocked(MC_RESULT_STOPPED, "The conversion was stopped.", "", 0);
    else if (outcome == kOutcomeCancelled)
        FailLocked(MC_RESULT_CANCELLED, "The conversion was cancelled by its callback.", "", 0);
    else if (outcome == kOutcomeFailed)
        FailLocked(MC_RESULT_INTERNAL, "The conversion could not be started.", "", 0);
    else if (pictures && picturesSent == 0)
        FailLocked(MC_RESULT_SOURCE, "The source was to have pictures, but gave none.", "", 0);
    else if (picturesSent == 0 && samplesSent == 0)
        FailLocked(MC_RESULT_SOURCE, "The source gave nothing.", "", 0);
    else
        FailLocked(MC_RESULT_DONE, "", "", 0);
    result.bDone = result.nCategory == MC_RESULT_DONE ? 1 : 0;
}

bool ResultBook::Copy(MCResult* to) const {
    constexpr uint32_t kLeast = sizeof(MCResult); // of the first version that had it
    if (!to || to->nSize < kLeast)
        return false;
    const uint32_t size = std::min<uint32_t>(to->nSize, sizeof result);
    const CSingleLock guard(&lock);
    MCResult now = result;
    now.nSize = size;
    now.llPicturesSent = picturesSent;
    now.llPicturesRefused = picturesRefused;
    now.llSamplesSent = samplesSent;
    now.llSamplesRefused = samplesRefused;
    now.llPicturesRestamped = picturesRestamped;
    now.llLargestShift = largestShift;
    std::memcpy(to, &now, size);
    return true;
}
