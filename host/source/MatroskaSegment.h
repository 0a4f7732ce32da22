// Where the parts of a Matroska file are.
#ifndef MOVIECONV_HOST_SOURCE_MATROSKASEGMENT_H
#define MOVIECONV_HOST_SOURCE_MATROSKASEGMENT_H

#include "host/source/ContainerParts.h"

namespace movieconv {

// Names of elements that several readers look for.
constexpr uint64_t kMatroskaCluster = 0x1F43B675;
constexpr uint64_t kMatroskaInfo = 0x1549A966;
constexpr uint64_t kMatroskaTracks = 0x1654AE6B;
constexpr uint64_t kMatroskaTrack = 0xAE;

/// The segment that holds everything, and parts within its parts.
class MatroskaSegment {
public:
    explicit MatroskaSegment(const InputFile& file);

    /// Empty where there is none.
    const Part& Whole() const { return segment_; }

    /// A part of the segment: in front of the packets, or where the list of parts has it.
    Part Locate(uint64_t name);

    /// Calls `take` with those parts of `whole` that have that name.
    template <class Take>
    void ForEach(const Part& whole, uint64_t name, Take take) {
        elements_.ForEach(whole, [&](const Part& part) {
            if (part.name == name)
                take(part);
            return true;
        });
    }

    /// Calls `take` with each track that becomes a stream of FFmpeg's, in their order.
    template <class Take>
    void ForEachTrack(Take take) {
        ForEach(Locate(kMatroskaTracks), kMatroskaTrack, [&](const Part& track) {
            if (BecomesStream(track))
                take(track);
        });
    }

    Parts& Elements() { return elements_; }

private:
    bool BecomesStream(const Part& track);

    Parts elements_;
    const Part segment_;
};

} // namespace movieconv

#endif
