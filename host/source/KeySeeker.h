// Goes to a key picture from which a movie can be decoded from a wanted time on.
#ifndef MOVIECONV_HOST_SOURCE_KEYSEEKER_H
#define MOVIECONV_HOST_SOURCE_KEYSEEKER_H

#include "host/source/Source.h"

#include <cstdint>

namespace movieconv {

/// One thread at a time.
class KeySeeker {
public:
    explicit KeySeeker(Source& source) : source_(source) {}

    /// Goes so far back that everything from `seconds` on can be decoded, to the source's start if need be.
    /// False when that cannot be done: the source is then where it was unless HasMoved.
    bool Seek(double seconds);

    /// Away from the source's start.
    bool HasMoved() const { return moved_; }

    /// Whether a packet that was read after Seek is a picture from before the key picture. Some containers
    /// land between key pictures, whatever is asked for. Decoders take the stamps of pictures that build on
    /// missing ones for faulty, and those of all that follow, too.
    bool IsBeforeKey(const AVPacket& packet);

private:
    bool SeeksAstray() const;
    bool SeekBefore(double seconds);
    bool KeyPictureAtOrBefore(int64_t mediaTime);

    Source& source_;
    bool moved_ = false;
    bool awaitsKey_ = false;
};

} // namespace movieconv

#endif
