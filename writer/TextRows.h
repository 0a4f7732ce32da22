// The texts of a fragmented file of the MP4 family as a plain one has to have them: a sample at every moment.
#ifndef MOVIECONV_WRITER_TEXTROWS_H
#define MOVIECONV_WRITER_TEXTROWS_H

#include "ffmpeg/AvHandles.h"
#include "writer/FragmentLog.h"

#include <cstdint>
#include <map>
#include <vector>

namespace writer {

/// Whether a packet only says that no text is shown, as the multiplexer writes some itself.
bool IsEmptyText(const AVPacket& packet, AVCodecID codec);

/// While the file grows, its multiplexer ends each text with an empty sample, late, and some lie where the
/// next text begins. All times are in the unit of the texts, which is one for all of their streams.
class TextRows {
public:
    void Add(const PlacedPacket& sample);

    /// Texts that were added to a stream, empty ones not counted.
    int64_t Texts(int stream) const;

    /// The rows from `begin` to `end`, merged by time. Where nothing is shown for long, an empty sample comes
    /// several times.
    std::vector<PlacedPacket> Make(int64_t begin, int64_t end) const;

private:
    std::map<int, std::vector<PlacedPacket>> rows_;
};

} // namespace writer

#endif
