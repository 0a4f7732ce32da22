// The figures of a decoder's source.
#ifndef MOVIECONV_ENGINE_SOURCEFORMAT_H
#define MOVIECONV_ENGINE_SOURCEFORMAT_H

#include "media/Decoders.h"

/// The format of what `decoder` decodes; null without a decoder or when it cannot describe its source.
inline const VideoFormat* SourceFormat(VideoDecoder* decoder) {
    const VideoSourceInfo* info = decoder ? decoder->GetVideoInfo() : nullptr;
    return info ? &info->format : nullptr;
}

inline const AudioFormat* SourceFormat(AudioDecoder* decoder) {
    const AudioSourceInfo* info = decoder ? decoder->GetAudioInfo() : nullptr;
    return info ? &info->format : nullptr;
}

/// Length of the source in seconds; 0 when it cannot be described.
template <class Decoder>
double SourceDuration(Decoder* decoder) {
    const auto* format = SourceFormat(decoder);
    return format ? format->dDuration : 0.0;
}

#endif
