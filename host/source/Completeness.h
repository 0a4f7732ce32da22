// What a container promises, and whether the file and the reading of it keep that.
#ifndef MOVIECONV_HOST_SOURCE_COMPLETENESS_H
#define MOVIECONV_HOST_SOURCE_COMPLETENESS_H

#include "ffmpeg/AvHandles.h"
#include "host/source/InputFile.h"

#include <optional>
#include <vector>

namespace movieconv {

enum class StreamKind;

/// What the container announces. Lengths that were measured or reckoned are no promise.
struct Promise {
    bool cutOff = false;            ///< The file's structure or index reaches beyond its last byte.
    std::optional<double> pictures; ///< Where the converted stream ends, in seconds of the source.
    std::optional<double> sound;
    std::optional<double> all; ///< Where the later one of them ends, if only that is told.
};

/// How far the converted streams were read, in seconds of the source; nothing for a stream that is not
/// converted or that nobody wanted to the end.
struct Reached {
    std::optional<double> pictures;
    std::optional<double> sound;
};

/// What is missing at a source's end.
struct Shortfall {
    bool cutOff = false;
    /// Of that kind, which is there, but nothing of its last part could be decoded.
    std::optional<StreamKind> undecodable;
    double announced = 0; ///< Seconds of the stream that ended early; 0 when nothing but the cut tells.
    double reached = 0;
};

/// When the last packet of each stream begins, in seconds on the container's clock, where the file's
/// structure shows that, whatever its texts and its length say: Matroska counts how long a last picture stays
/// only there. Nothing where it does not, or the file is not whole.
std::vector<std::optional<double>> LastPackets(const InputFile& file, const AVFormatContext& context);

/// Whether the container's outermost elements end behind the file's last byte, or an index entry of the
/// streams does. False for what has no size.
bool IsCutOff(const InputFile& file, AVFormatContext& context);

/// Compares; nothing when all that was promised was read. A stream may miss its announced end by a second, or
/// by a hundredth.
std::optional<Shortfall> FindShortfall(const Promise& promise, const Reached& reached);

} // namespace movieconv

#endif
