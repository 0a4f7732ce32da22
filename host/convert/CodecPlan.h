// How pictures and sound are to be coded: the request, what it prefers, and what format and source allow.
#ifndef MOVIECONV_HOST_CONVERT_CODECPLAN_H
#define MOVIECONV_HOST_CONVERT_CODECPLAN_H

#include "host/convert/Request.h"
#include "host/source/Source.h"
#include "media/EncodeParam.h"

#include <cstdint>
#include <optional>

namespace movieconv {

/// What has no value is left to the engine and the encoder.
struct PictureCoding {
    uint32_t codec = 0;
    std::optional<Size> size;
    std::optional<double> frameRate;
    bool steadyRate = false;       ///< It was asked for, so that even a source of that rate is brought to it.
    std::optional<double> quality; ///< Instead of a rate.
    std::optional<int32_t> rate;   ///< Bits per second.
    std::optional<int32_t> maxRate;
    std::optional<Speed> speed;
    std::optional<Profile> profile;
    int depth = 8; ///< Bits of a component.
    bool keepsHdr = false;
};

struct SoundCoding {
    uint32_t codec = 0;
    std::optional<int32_t> channels;
    std::optional<int32_t> sampleRate;
    std::optional<int32_t> rate; ///< Bits per second.
    std::optional<int32_t> maxRate;
};

/// The codec for files of `format`, whose codes are the media writer's; 0 where it carries no such track.
/// Throws Failure when the format cannot carry what is asked for, or nothing of what is preferred.
uint32_t PictureCodecFor(const Request& request, const FileFormatInfo& format);
uint32_t SoundCodecFor(const Request& request, const FileFormatInfo& format);

/// Most bits that a component can have in the output's pictures, 8 or 10.
int MostDepth(const Request& request, const FileFormatInfo& format);

/// Whether the size of the pictures, if there are any, follows from bit rates.
bool HasRates(const Request& request, const FileFormatInfo& format, const SourceInfo& source);

/// Throws Failure as well when the codec has no such quality or depth.
PictureCoding PlanPictures(const Request& request, const FileFormatInfo& format,
                           const PictureStreamInfo& source);
SoundCoding PlanSound(const Request& request, const FileFormatInfo& format, const SoundStreamInfo& source);

} // namespace movieconv

#endif
