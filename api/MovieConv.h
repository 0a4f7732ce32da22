/// \file
/// The interface of MovieConv, the header that a host includes.
///
/// A converter takes the pictures and the sound of one movie from the host, puts both on one timeline and has
/// the media writer make a file of them, or a series of clips, on a worker thread of its own:
///
///     MCHandle converter = MCCreateFromSources(&video, &audio);
///     MCEncodeParamForFile(L"/tmp/out.mp4", &param);
///     MCSetEncodeParam(converter, &param);
///     MCSetOutputFile(converter, L"/tmp/out.mp4");
///     MCStart(converter, 0.0, 0.0, NULL, callback, context);
///     MCWait(converter, MC_INFINITE);
///     MCGetResult(converter, &result);
///     MCDestroy(converter);
///
/// The pictures and the sound come from tables of functions (MCVideoSource, MCAudioSource) or, in C++, from
/// decoder objects that a host derives from VideoDecoder and AudioDecoder.
///
/// The events of the main queue (platform/Platform.h), the colour routines (Common/Image/ImageConvert.h),
/// helpers for sound (engine/AudioHelpers.h), the media writer (writer/WriterStatus.h) and the log sink
/// (logsink/LogSink.h) have headers of their own.
///
/// Threads. A converter belongs to the host's thread that made it. MCPause, MCResume, MCAbort, MCStop,
/// MCWait, MCEnablePreview, MCGetEncodeParam and the MCGet... queries may be called from any thread and at
/// any time between MCCreate and MCDestroy; everything else while the converter does not run. The progress
/// callback comes on the worker thread. It may call whatever does not wait for that thread: MCStop, MCWait
/// and MCDestroy are refused there, with a line in the log. To end the conversion it returns 0 or calls
/// MCAbort.
///
/// Errors. A null handle does nothing and gives 0, from MCStart and MCWait -1. So does a lack of memory. No
/// exception leaves these functions; one that comes out of a decoder or a callback ends the conversion, with
/// its file closed, and MCGetResult tells of it.
#ifndef MOVIECONV_API_MOVIECONV_H
#define MOVIECONV_API_MOVIECONV_H

#include "api/LogCallback.h"
#include "api/Version.h"
#include "engine/ProgressInfo.h"
#include "engine/Result.h"
#include "media/EncodeParam.h"
#include "media/FourCC.h"
#include "media/MediaRecords.h"
#include "media/ProgressCallback.h"
#include "media/Sources.h"
#include "platform/Window.h"

#include <wchar.h>

#ifdef __cplusplus
#include "media/Decoders.h"
extern "C" {
#else
typedef struct VideoDecoder VideoDecoder; // C++ classes, which C code can only hand on
typedef struct AudioDecoder AudioDecoder;
#endif

/// A converter, from MCCreate to MCDestroy.
typedef void* MCHandle;

enum {
    MC_MAX_TARGET_NAME = 512 ///< Characters of a clip name, its terminator included.
};

#define MC_INFINITE 0xFFFFFFFFu ///< For MCWait: no limit.
#define MC_WAIT_TIMEOUT 258     ///< From MCWait: the time ran out.
#define MC_CANNOT_OPEN_SOURCE 3 ///< From MCStart: the video source could not be opened.

#pragma GCC visibility push(default)

/// The version of the library that runs, as MC_MAKE_VERSION makes it.
unsigned MCGetVersion(void);

// ---- Making a converter

/// Makes a converter for one opened movie. Either decoder may be null. The decoders stay the host's and must
/// outlive the converter; what they describe becomes the default picture size, frame rate, sample rate and
/// channel count. Null when both decoders are null or there is no memory, and with a line in the log when the
/// media writer beside the engine is of another major version.
MCHandle MCCreate(VideoDecoder* video, AudioDecoder* audio);

/// The same from tables of functions, for hosts in C and in languages that call C. Either may be null. Null
/// when both are, when there is no memory, and with a line in the log when a table is not complete, a source
/// cannot be described, or the media writer does not fit.
MCHandle MCCreateFromSources(const MCVideoSource* video, const MCAudioSource* audio);

/// Stops a running conversion, waits for its end and frees the converter. Null does nothing, and neither does
/// a call inside the converter's own callback.
void MCDestroy(MCHandle converter);

// ---- Before a conversion

/// Sets the encoding parameters. What is 0 in them is completed as follows, and nothing else is:
///
/// - with a video decoder that describes its source: nWidth, nHeight and dFrameRate (a negative one too)
///   become the source's, nVideoBitrate becomes 512000;
/// - with an audio decoder that does: nSampleRate, nChannels and nBitsPerSample become the source's,
///   nAudioBitrate becomes 64000.
///
/// Codecs, picture format and file format stay 0, for which the media writer has no file: take the record of
/// MCGetEncodeParam or MCEncodeParamForFile and change that. A stream that the file format cannot carry is
/// switched off: bNoVideo or bNoAudio becomes 1. A frame rate above 200 becomes 30 when there is a video
/// decoder. Null completes the parameters that are set. Always 1.
int MCSetEncodeParam(MCHandle converter, const EncodeParam* param);

/// Fills in parameters for a file of that name: the file format by the name's extension, in capitals or not,
/// whatever else the name holds; the codecs H.264 and AAC where the format carries them, else those that it
/// lists first; bit rates of 4 Mbit/s and 160 kbit/s, which suit high definition; 4:2:0 pictures. Size, rates
/// and channels are 0, so that MCSetEncodeParam takes them from the source. A stream that the format cannot
/// carry is switched off.
///
/// 1; 0 with `param` untouched for an extension that the media writer does not know, and for null.
int MCEncodeParamForFile(const wchar_t* fileName, EncodeParam* param);

/// Copies the parameters in force to `out`, if it is not null. A stream that the last conversion did not find
/// is switched off in them. Always 1.
int MCGetEncodeParam(MCHandle converter, EncodeParam* out);

/// Sets the name of the output file. It is not checked; the media writer creates the file when the conversion
/// starts. Null stands for an empty name. Always 1.
int MCSetOutputFile(MCHandle converter, const wchar_t* path);

/// With `mode` 1, splits the output into clips of at least `value` milliseconds, in conversions that write
/// pictures; with any other, writes one file. From 2^31 on a value is taken for negative, which closes a clip
/// after every picture.
///
/// A clip is named as the output file with "_" and its number before the extension: out_00.mp4, out_01.mp4,
/// ... The numbers go on in later conversions. A name that would grow beyond MC_MAX_TARGET_NAME, or an
/// extension of 20 or more characters, ends the conversion with kOutcomeFailed.
///
/// 1, or 0 without effect while the converter runs or is paused.
int MCSetSplitParam(MCHandle converter, int mode, unsigned long value);

/// Nonzero: progress records carry the picture just written. On at first; takes effect at once, also while
/// running. Never in conversions of sound alone, nor of pictures alone into the file format "COPY". Returns
/// `enable`.
unsigned MCEnablePreview(MCHandle converter, unsigned enable);

/// Zero: the converter posts no events, for a host that goes by the callback alone and never receives any. On
/// at first; takes effect at once, also while running. Returns `enable`.
unsigned MCEnableEvents(MCHandle converter, unsigned enable);

/// Size in bytes that the whole source is going to take with the parameters in force, for at most ten hours
/// of it.
long long MCGetEstimateDiskSpace(MCHandle converter);

/// Size in bytes of `seconds` of output with `param`. 0 when `param` is null or `seconds` is below 0.00001.
long long MCGetEstimateDiskSpaceEx(const EncodeParam* param, double seconds);

/// 4294967295 for a path, 0 for null and for "". The file system is not asked.
long long MCGetDiskFreeSpace(const wchar_t* path);

// ---- A conversion

/// Starts the conversion of `length` seconds from `begin` on; a length below 0.001 means all the rest.
///
/// The news comes in two ways: `callback`, unless it is null, is called on the worker thread with `context`,
/// and events of class 5000 and kind 'kind' go to the main event queue, with `window` (which may be null) as
/// 32-bit parameter 'HWND', 0 or 100 as 'WPAM' and the progress or the outcome as 'LPAM'. Without a callback
/// there is one progress event, that of a completed conversion.
///
/// 0 when started, and without effect when the converter runs already; MC_CANNOT_OPEN_SOURCE. What goes wrong
/// later is told by the outcome; where no thread could be made, by MCGetResult alone.
int MCStart(MCHandle converter, double begin, double length, OpaqueWindowPtr* window,
            ProgressCallback callback, void* context);

/// Pauses a running conversion. Pauses nest. Returns the count of pauses after the call; a conversion that is
/// being stopped is not paused any more.
int MCPause(MCHandle converter);

/// Takes one pause back; the conversion goes on with the last one. Returns the count of pauses after the
/// call.
int MCResume(MCHandle converter);

/// Ends the conversion and waits for its end. What was written so far is closed as a file. Always 0. Inside a
/// callback or a decoder of this converter, on its worker thread, it is refused: nothing happens.
int MCStop(MCHandle converter);

/// Asks the conversion to end and does not wait. 1 when it was running or paused, else 0.
int MCAbort(MCHandle converter);

/// Waits at most `timeoutMs` milliseconds for the end of the conversion. 0 when it has ended or none was
/// started, else MC_WAIT_TIMEOUT. Refused on the converter's worker thread, with MC_WAIT_TIMEOUT at once.
int MCWait(MCHandle converter, unsigned timeoutMs);

/// Does nothing: the worker's priority is never changed. Always 0.
int MCSetThreadPriority(MCHandle converter, int priority);

// ---- What has become of it

/// Copies how the converter's last conversion stands, which MCStart began. May be called at any time, also
/// from the callback; complete once MCWait or MCStop has returned. A record of an older program is filled as
/// far as it goes.
///
/// 1; 0 for null and for a record whose nSize is less than that of version 1.1.
int MCGetResult(MCHandle converter, MCResult* result);

/// Nonzero: a conversion ends as MCAbort ends it, with kOutcomeStopped, as soon as the writer fails or does
/// not take something; MCGetResult tells why. Zero, as at first: it goes on to the end of the source. Takes
/// effect at once, also while running. Returns `enable`.
unsigned MCEnableStopOnFailure(MCHandle converter, unsigned enable);

// ---- Clips

/// The number of clips begun so far, of all conversions of this converter together.
int MCGetTargetCount(MCHandle converter);

/// Copies the name of clip `index`, from 0, to `buffer`, which must hold MC_MAX_TARGET_NAME characters. 1, or
/// 0 with `buffer` untouched when there is no such clip.
int MCGetTargetFileName(MCHandle converter, wchar_t* buffer, int index);

#pragma GCC visibility pop

#ifdef __cplusplus
} // extern "C"
#endif

#endif
