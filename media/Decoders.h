/// \file
/// What the engine asks of the host's decoders. A host derives from these classes and implements the pure
/// operations; the reserved ones only keep the positions in the virtual table, which are part of the
/// contract.
///
/// Ownership: the host owns its decoders and keeps them alive until MCDestroy. Every pointer that an
/// operation returns points into the decoder's own memory and must stay valid until the next call on the same
/// decoder; the record that GetCurrentImage returned is read once more after DecodeNext, when the output is
/// split. The engine never writes through these pointers.
///
/// Threads: GetVideoInfo and GetAudioInfo are called on the host's thread and on the engine's worker,
/// possibly at the same time; everything else is called on the worker only. Seek comes at most once, before
/// the first picture or block.
#ifndef MOVIECONV_MEDIA_DECODERS_H
#define MOVIECONV_MEDIA_DECODERS_H

#include "media/MediaRecords.h"

/// Pictures of one opened movie.
class VideoDecoder {
public:
    VideoDecoder(const VideoDecoder&) = delete;
    VideoDecoder& operator=(const VideoDecoder&) = delete;

    virtual void Reserved0() {} ///< Never called.
    virtual void Reserved1() {} ///< Never called.
    virtual void Reserved2() {} ///< Never called.
    virtual void Reserved3() {} ///< Never called.
    virtual void Reserved4() {} ///< Never called.

    /// The source's description; null when the source could not be opened.
    virtual VideoSourceInfo* GetVideoInfo() = 0;

    /// Moves to the picture shown at `seconds` from the start of the source. `mode` is always 1. The engine
    /// ignores the result; by custom it is the position reached, in seconds.
    virtual double Seek(double seconds, int mode) = 0;

    virtual void Reserved7() {} ///< Never called.

    /// The picture at the current position; null when there is none.
    virtual VideoImage* GetCurrentImage() = 0;

    /// Moves on by one picture; `mode` is always 1. At least 1 when a further picture is ready, less at the
    /// end.
    virtual int DecodeNext(int mode) = 0;

protected:
    VideoDecoder() = default;
    ~VideoDecoder() = default;
};

/// Sound of one opened movie.
class AudioDecoder {
public:
    AudioDecoder(const AudioDecoder&) = delete;
    AudioDecoder& operator=(const AudioDecoder&) = delete;

    virtual void Reserved0() {} ///< Never called.
    virtual void Reserved1() {} ///< Never called.
    virtual void Reserved2() {} ///< Never called.
    virtual void Reserved3() {} ///< Never called.

    /// Moves to `seconds` from the start of the source. The engine ignores the result.
    virtual double Seek(double seconds) = 0;

    /// The next block of sound; null, or a block with nLength 0, when the sound has ended.
    virtual AudioFrame* GetNextFrame() = 0;

    virtual void Reserved6() {} ///< Never called.

    /// The source's description; null when there is none.
    virtual AudioSourceInfo* GetAudioInfo() = 0;

protected:
    AudioDecoder() = default;
    ~AudioDecoder() = default;
};

#endif
