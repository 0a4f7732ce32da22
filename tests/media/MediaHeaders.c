/* The records and the writer's functions must be usable from C, with the sizes that C++ sees. */
#include "media/EncodeParam.h"
#include "media/FourCC.h"
#include "media/MediaRecords.h"
#include "media/MediaWriter.h"
#include "media/ProgressCallback.h"

#include <stddef.h>

extern const size_t kRecordSizesInC[];

const size_t kRecordSizesInC[] = {sizeof(VideoFormat),     sizeof(AudioFormat),   sizeof(VideoSourceInfo),
                                  sizeof(AudioSourceInfo), sizeof(VideoImage),    sizeof(AudioFrame),
                                  sizeof(EncodeParam),     sizeof(FileFormatInfo)};
