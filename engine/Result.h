/// \file
/// What has become of a conversion, by the word of engine and media writer together. The outcome that the
/// callback and the events tell is the engine's alone: it is kOutcomeCompleted when the source has been read
/// to its end, whatever the writer made of it.
#ifndef MOVIECONV_ENGINE_RESULT_H
#define MOVIECONV_ENGINE_RESULT_H

#include <stdint.h>

#ifdef __cplusplus
#include <cstddef>
#endif

/// How a conversion stands or what was wrong with it.
enum {
    MC_RESULT_DONE = 0,         ///< Every file is complete and holds all that was sent to it.
    MC_RESULT_NONE = 1,         ///< No conversion was started yet.
    MC_RESULT_RUNNING = 2,      ///< It goes on, or is paused, and nothing was wrong so far.
    MC_RESULT_STOPPED = 3,      ///< Ended by MCStop, MCAbort or MCDestroy.
    MC_RESULT_CANCELLED = 4,    ///< Ended by the callback's 0.
    MC_RESULT_SOURCE = 5,       ///< A source cannot be described, reported an error, threw, or gave nothing.
    MC_RESULT_CALLBACK = 6,     ///< The callback threw.
    MC_RESULT_REFUSED = 7,      ///< The media writer did not take pictures or sound as they were.
    MC_RESULT_PARAMETERS = 8,   ///< The parameters or the output's name make no sense.
    MC_RESULT_FORMAT = 9,       ///< There is no such file format, or it cannot carry the codec.
    MC_RESULT_EXISTS = 10,      ///< The output exists and is not to be replaced, or is being written already.
    MC_RESULT_CANNOT_OPEN = 11, ///< The output could not be created.
    MC_RESULT_NO_SPACE = 12,    ///< The disk or the quota is full.
    MC_RESULT_WRITE = 13,       ///< Writing or finishing a file failed.
    MC_RESULT_ENCODE = 14,      ///< An encoder or the multiplexer failed.
    MC_RESULT_INTERNAL = 15     ///< Out of memory or threads, or a fault of the library.
};

enum {
    MC_TEXT_SIZE = 512, ///< Bytes of MCResult::szWhat.
    MC_PATH_SIZE = 4096 ///< Bytes of MCResult::szPath.
};

#pragma pack(push, 4)

/// One conversion. Sound counts in sample frames, one for all channels together; times count 100 ns.
typedef struct MCResult {
    uint32_t nSize; ///< Size of this record in bytes; the caller fills it in before the call.
    /// Nonzero: the engine came to its end and the writer finished every file with all that it was sent.
    int32_t bDone;
    int32_t nCategory;      ///< MC_RESULT_...: the first thing that was wrong.
    int32_t nOutcome;       ///< kOutcome... as the callback was told; -1 before the end.
    int32_t nSystemError;   ///< errno of the call that failed; 0 when the fault is not the system's.
    int32_t nFilesCreated;  ///< Files begun.
    int32_t nFilesComplete; ///< Files that are complete, on the disk, under their names.
    int32_t nReserved;      ///< 0.

    int64_t llPicturesSent;    ///< Pictures that the engine handed to the writer.
    int64_t llPicturesRefused; ///< Of these, what the writer did not take.
    int64_t llPicturesWritten; ///< Pictures in the files, those repeated for a higher rate counted.
    int64_t llSamplesSent;     ///< Sound that the engine handed to the writer, its own silence counted.
    int64_t llSamplesRefused;  ///< Of this, what the writer did not take.
    int64_t llSamplesWritten;  ///< Sound in the files, at their sample rate.

    /// Pictures that were given another time than the source's, because sound is the clock: their distance
    /// from the beginning differs by more than 10 ms. Gaps between the stamps of sound blocks shorten the
    /// movie, blocks of another rate than the source's description stretch or shorten it.
    int64_t llPicturesRestamped;
    int64_t llLargestShift; ///< The largest of these differences; positive when pictures were moved later.

    char szWhat[MC_TEXT_SIZE]; ///< What was wrong, a sentence for users in UTF-8; empty when nothing was.
    char szPath[MC_PATH_SIZE]; ///< The file that this is about, in UTF-8; empty when it is about none.
} MCResult;

#pragma pack(pop)

#ifdef __cplusplus
static_assert(sizeof(MCResult) == 96 + MC_TEXT_SIZE + MC_PATH_SIZE && offsetof(MCResult, bDone) == 4);
static_assert(offsetof(MCResult, nCategory) == 8 && offsetof(MCResult, nOutcome) == 12);
static_assert(offsetof(MCResult, nSystemError) == 16 && offsetof(MCResult, nFilesCreated) == 20);
static_assert(offsetof(MCResult, nFilesComplete) == 24 && offsetof(MCResult, nReserved) == 28);
static_assert(offsetof(MCResult, llPicturesSent) == 32 && offsetof(MCResult, llPicturesRefused) == 40);
static_assert(offsetof(MCResult, llPicturesWritten) == 48 && offsetof(MCResult, llSamplesSent) == 56);
static_assert(offsetof(MCResult, llSamplesRefused) == 64 && offsetof(MCResult, llSamplesWritten) == 72);
static_assert(offsetof(MCResult, llPicturesRestamped) == 80 && offsetof(MCResult, llLargestShift) == 88);
static_assert(offsetof(MCResult, szWhat) == 96 && offsetof(MCResult, szPath) == 96 + MC_TEXT_SIZE);
#endif

#endif
