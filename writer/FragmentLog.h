// What lies where in a fragmented file of the MP4 family, learned from its bytes while they are written, so
// that an index can be made of it without reading the file again.
#ifndef MOVIECONV_WRITER_FRAGMENTLOG_H
#define MOVIECONV_WRITER_FRAGMENTLOG_H

#include <cstdint>
#include <functional>
#include <span>
#include <vector>

namespace writer {

/// One packet in the file. Times are in the stream's unit in the file, as they stand there.
struct PlacedPacket {
    int stream;
    int64_t position;
    int64_t size;
    int64_t dts;
    int64_t pts;
    int64_t duration;
    bool key;
};

/// Calls `take` for every packet of the fragment at `position` whose head, a "moof" box, is `head`. Throws
/// WriterFailure (kWriterErrorFinish) when that makes no sense.
void ReadFragment(std::span<const uint8_t> head, int64_t position,
                  const std::function<void(const PlacedPacket&)>& take);

/// Keeps the head of every fragment: 4 to 12 bytes a packet, and some 150 a fragment.
class FragmentLog {
public:
    /// The next bytes that are written, and where. Where bytes are left out, a new box begins behind them.
    void Take(int64_t position, const uint8_t* data, int64_t size) noexcept;

    /// Calls `take` for every packet in the order of the file. Throws WriterFailure (kWriterErrorFinish) when
    /// something was missed for want of memory or makes no sense.
    void ForEach(const std::function<void(const PlacedPacket&)>& take) const;

    /// Where the last box ends, or the one that is still incomplete.
    int64_t End() const { return boxPosition_ + static_cast<int64_t>(box_.size()); }

    /// Bytes that are kept.
    int64_t Size() const { return size_; }

private:
    struct Fragment {
        int64_t position;
        std::vector<uint8_t> head;
    };

    void Collect(const uint8_t* data, int64_t size);

    std::vector<Fragment> fragments_;
    std::vector<uint8_t> box_; ///< The box being written, as far as it is wanted.
    int64_t boxPosition_ = 0;
    int64_t size_ = 0;
    bool whole_ = true;
};

} // namespace writer

#endif
