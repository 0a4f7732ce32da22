/// \file
/// The media-writer library, orvex.dylib: five functions that encode and multiplex one output file.
///
/// The engine calls all of them but MWGetFileFormatInfos on its worker thread, one call at a time for a
/// handle. Records are read during the call only.
#ifndef MOVIECONV_MEDIA_MEDIAWRITER_H
#define MOVIECONV_MEDIA_MEDIAWRITER_H

#include "media/EncodeParam.h"
#include "media/MediaRecords.h"
#include "media/ProgressCallback.h"

#include <wchar.h>

#ifdef __cplusplus
extern "C" {
#endif
#pragma GCC visibility push(default)

/// The writer's file formats, ended by an entry whose code is 0. The table stays the writer's; null when it
/// has none.
const FileFormatInfo* MWGetFileFormatInfos(void);

/// Creates one output file and returns its handle, or null on failure. `video` is null when no pictures will
/// be written, `audio` when no sound will be.
void* MWCreateMediaFile(const wchar_t* fileName, const EncodeParam* param, const VideoFormat* video,
                        const AudioFormat* audio);

/// Appends one picture. A null handle is accepted and does nothing. Nonzero when the picture was taken.
int MWWriteVideoFrame(void* file, const VideoImage* image);

/// Appends one block of sound. A null handle is accepted and does nothing. Nonzero when the block was taken.
int MWWriteAudioData(void* file, const AudioFrame* frame);

/// Finishes and closes the file; the handle is gone afterwards. A null handle is accepted and does nothing.
/// `callback` and `context` may be null and are not used: WriterOptions::pfnListener is told how far it is.
/// Nonzero when the file is complete; 0 also for one that got nothing, which is removed.
int MWCloseMediaFile(void* file, ProgressCallback callback, void* context);

#pragma GCC visibility pop
#ifdef __cplusplus
}
#endif

#endif
