#include "writer/FragmentLog.h"

#include "ffmpeg/Mp4Box.h"
#include "writer/BigEndian.h"
#include "writer/WriterFailure.h"
#include "writer/WriterStatus.h"

#include <algorithm>
#include <new>
#include <utility>

namespace writer {
namespace {

constexpr size_t kBoxHeader = 8; // size and type

[[noreturn]] void ThrowSenseless() {
    throw WriterFailure(kWriterErrorFinish, "The temporary file does not hold all that was written.");
}

/// Takes big-endian numbers from a stretch of bytes.
class BoxReader {
public:
    explicit BoxReader(std::span<const uint8_t> bytes) : bytes_(bytes) {}

    bool Empty() const { return bytes_.empty(); }

    std::span<const uint8_t> Take(size_t count) {
        if (count > bytes_.size())
            ThrowSenseless();
        const auto taken = bytes_.first(count);
        bytes_ = bytes_.subspan(count);
        return taken;
    }
    uint64_t Number(size_t size) { return BigEndian(Take(size).data(), size); }
    uint32_t U32() { return static_cast<uint32_t>(Number(4)); }

    /// The content of the next box, whose type is stored.
    BoxReader Box(uint32_t& type) {
        const auto head = av::ReadBoxHead(bytes_.data(), bytes_.size());
        if (!head || head->size == av::BoxHead::kOpen)
            ThrowSenseless();
        type = head->type;
        return BoxReader(Take(static_cast<size_t>(head->size)).subspan(static_cast<size_t>(head->headSize)));
    }

private:
    std::span<const uint8_t> bytes_;
};

constexpr uint32_t kNotKey = 0x10000; // in the flags of a sample

/// What the parts of one track's fragment say, in their order.
class TrackRuns {
public:
    TrackRuns(int64_t base, const std::function<void(const PlacedPacket&)>& take)
        : next_(base), base_(base), take_(take) {}

    void Take(uint32_t type, BoxReader content) {
        if (type == av::BoxType("tfhd"))
            TakeHeader(content);
        else if (type == av::BoxType("tfdt"))
            dts_ = static_cast<int64_t>(content.U32() >> 24 == 1 ? content.Number(8) : content.U32());
        else if (type == av::BoxType("trun"))
            TakeRun(content);
    }

private:
    void TakeHeader(BoxReader content) {
        const uint32_t flags = content.U32();
        stream_ = static_cast<int>(content.U32()) - 1;
        if ((flags & 0x1) != 0)
            base_ = next_ = static_cast<int64_t>(content.Number(8));
        if ((flags & 0x2) != 0)
            content.U32(); // the description, of which there is one
        duration_ = (flags & 0x8) != 0 ? content.U32() : 0;
        size_ = (flags & 0x10) != 0 ? content.U32() : 0;
        flags_ = (flags & 0x20) != 0 ? content.U32() : 0;
    }

    void TakeRun(BoxReader content) {
        const uint32_t flags = content.U32();
        const uint32_t count = content.U32();
        if ((flags & 0x1) != 0)
            next_ = base_ + static_cast<int32_t>(content.U32());
        const uint32_t firstFlags = (flags & 0x4) != 0 ? content.U32() : flags_;
        for (uint32_t i = 0; i < count; ++i) {
            const int64_t duration = (flags & 0x100) != 0 ? content.U32() : duration_;
            const int64_t size = (flags & 0x200) != 0 ? content.U32() : size_;
            const uint32_t sample = (flags & 0x400) != 0 ? content.U32() : i == 0 ? firstFlags : flags_;
            const int64_t shift = (flags & 0x800) != 0 ? static_cast<int32_t>(content.U32()) : 0;
            take_({stream_, next_, size, dts_, dts_ + shift, duration, (sample & kNotKey) == 0});
            next_ += size;
            dts_ += duration;
        }
    }

    int64_t next_;
    int64_t base_;
    const std::function<void(const PlacedPacket&)>& take_;
    int stream_ = -1;
    int64_t dts_ = 0;
    uint32_t duration_ = 0;
    uint32_t size_ = 0;
    uint32_t flags_ = 0;
};

} // namespace

void ReadFragment(std::span<const uint8_t> head, int64_t position,
                  const std::function<void(const PlacedPacket&)>& take) {
    uint32_t type = 0;
    BoxReader parts = BoxReader(head).Box(type);
    while (!parts.Empty()) {
        BoxReader part = parts.Box(type);
        if (type != av::BoxType("traf"))
            continue;
        TrackRuns track(position, take);
        while (!part.Empty()) {
            const BoxReader content = part.Box(type);
            track.Take(type, content);
        }
    }
}

void FragmentLog::Take(int64_t position, const uint8_t* data, int64_t size) noexcept {
    try {
        if (box_.empty() && position > boxPosition_)
            boxPosition_ = position;
        while (whole_ && size > 0) {
            const int64_t unwanted = boxPosition_ + static_cast<int64_t>(box_.size()) - position;
            if (unwanted < 0)
                whole_ = false;
            if (unwanted < 0 || unwanted >= size)
                return;
            const auto have = static_cast<int64_t>(box_.size());
            const int64_t end = have < static_cast<int64_t>(kBoxHeader) ? static_cast<int64_t>(kBoxHeader)
                                                                        : BoxReader(box_).U32();
            const int64_t count = std::min(size - unwanted, end - have);
            Collect(data + unwanted, count);
            data += unwanted + count;
            position += unwanted + count;
            size -= unwanted + count;
        }
    } catch (...) {
        whole_ = false;
    }
}

/// More of the box, of which nothing but a fragment's head is kept.
void FragmentLog::Collect(const uint8_t* data, int64_t size) {
    box_.insert(box_.end(), data, data + size);
    if (box_.size() < kBoxHeader)
        return;
    BoxReader header(box_);
    const uint32_t whole = header.U32();
    const uint32_t type = header.U32();
    if (whole < kBoxHeader)
        ThrowSenseless();
    if (type == av::BoxType("moof") && box_.size() < whole) {
        box_.reserve(whole);
        return;
    }
    if (type == av::BoxType("moof")) {
        size_ += static_cast<int64_t>(sizeof(Fragment) + box_.size());
        fragments_.push_back({boxPosition_, std::exchange(box_, {})});
    }
    box_.clear();
    boxPosition_ += whole;
}

void FragmentLog::ForEach(const std::function<void(const PlacedPacket&)>& take) const {
    if (!whole_ || !box_.empty())
        ThrowSenseless();
    for (const Fragment& fragment : fragments_)
        ReadFragment(fragment.head, fragment.position, take);
}

} // namespace writer
