/// \file
/// Helpers for a host that plays or inspects the source's sound itself. No conversion uses them.
#ifndef MOVIECONV_ENGINE_AUDIOHELPERS_H
#define MOVIECONV_ENGINE_AUDIOHELPERS_H

#include "media/Decoders.h"

#pragma GCC visibility push(default)

/// The decoder's sound in pieces of 30 ms with their own time stamps; what is left of a block when less than
/// 50 ms remain is one piece. The result is valid until the next call; null when the decoder has no further
/// block.
///
/// The process has one cutting position, so one thread reads one decoder at a time. A null `decoder` resets
/// it, which a change of decoders needs, and gives null.
AudioFrame* get_small_frame(AudioDecoder* decoder);

/// Turns `count` sample values of `bits` (8 or 16) bits into 16-bit samples of two channels. An 8-bit value v
/// becomes v * 128. With `channels` 2 the values keep their places, otherwise each is written twice, as left
/// and right, and `destination` must hold twice the count. With 0 channels, and for other `bits` with 2
/// channels, nothing is written. Returns count * (2 / channels), in integers: the values written for one or
/// two channels, 0 for more or none.
int ConvertTo16BitsStero(short* destination, int bits, int channels, unsigned char* source, int count);

/// The decoder's description of its source. `decoder` must not be null.
AudioSourceInfo* PlayAudio(AudioDecoder* decoder);

#pragma GCC visibility pop

#endif
