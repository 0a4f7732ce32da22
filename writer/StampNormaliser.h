// Puts the pictures and the sound of one file on one timeline that begins near 0.
//
// The stamps that reach the writer cannot be multiplexed as they come. At the start of a later clip pictures
// can still carry the timeline of the clip before; the stamps of the sound jump by its initial offset after a
// clip's first block; once the sound has ended, pictures of later clips run ahead of the silence by the
// length of the clips before. What can be trusted is the distance of a picture from the block of real sound
// written last before it in the same file, and the number of samples. So the sound's time is the sample
// count, pictures are placed by that distance, and pictures that have no such block keep their steps.
#ifndef MOVIECONV_WRITER_STAMPNORMALISER_H
#define MOVIECONV_WRITER_STAMPNORMALISER_H

#include <cstdint>
#include <optional>

namespace writer {

/// All times are in 100 ns units. Calls come in the order in which pictures and blocks arrive. Not
/// thread-safe.
class StampNormaliser {
public:
    /// `pictureLength` is the source's usual distance between two pictures, above 0. A file without pictures
    /// begins with its sound.
    StampNormaliser(int64_t pictureLength, bool hasPictures);

    /// A block of sound of `bytes` bytes at `bytesPerSecond` (above 0) stamped `stamp`; `silence` when it was
    /// made up to fill the time after the real sound.
    void AddSound(int64_t stamp, int64_t bytes, int64_t bytesPerSecond, bool silence);

    /// A picture stamped `stamp`. Returns its time in the file: at least 0, later than that of every picture
    /// before.
    int64_t AddPicture(int64_t stamp);

    /// Nothing more will come; decides where the sound begins if that is still open.
    void Finish();

    /// Time in the file of the first sample, at least 0. Open until a picture has come after sound, or ten
    /// seconds of sound without a picture; once set it stays.
    std::optional<int64_t> SoundStart() const { return soundStart_; }

    /// Length of the sound so far.
    int64_t SoundLength() const;

    /// Pictures whose stamp was not on the timeline of the sound and was put right.
    int64_t Repairs() const { return repairs_; }

private:
    /// The last block of real sound: its stamp, and where it begins by the count of samples.
    struct Reference {
        int64_t stamp;
        int64_t position;
    };
    struct Picture {
        int64_t stamp;
        int64_t time;
    };

    int64_t PlaceFirst(int64_t stamp);
    int64_t PlaceNext(int64_t stamp, const Picture& before);
    int64_t Continue(int64_t stamp, const Picture& before) const;

    const int64_t pictureLength_;
    int64_t segmentStart_ = 0; ///< Length of the sound before the last change of its byte rate.
    int64_t segmentBytes_ = 0;
    int64_t bytesPerSecond_ = 1;
    std::optional<Reference> reference_;
    std::optional<int64_t> soundStart_;
    std::optional<Picture> last_;
    int64_t lengthAtLast_ = 0; ///< Of the sound, at the last picture.
    int64_t repairs_ = 0;
};

} // namespace writer

#endif
