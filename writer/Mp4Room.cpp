#include "writer/Mp4Room.h"

#include "writer/WriterFailure.h"
#include "writer/WriterStatus.h"

#include <algorithm>
#include <array>
#include <cerrno>
#include <cstdio>
#include <cstring>
#include <string_view>
#include <vector>

namespace writer {
namespace {

constexpr int64_t kHeaderSize = 8;
constexpr int64_t kLongHeaderSize = 16;
constexpr int64_t kSwitched = 16; // what remains of the room: its header, and space for one of a long box

void Append(std::vector<uint8_t>& bytes, uint64_t number, int size) {
    for (int shift = 8 * (size - 1); shift >= 0; shift -= 8)
        bytes.push_back(static_cast<uint8_t>(number >> shift));
}

void AppendHeader(std::vector<uint8_t>& bytes, uint64_t size, std::string_view type, bool isLong) {
    Append(bytes, isLong ? 1 : size, 4);
    bytes.insert(bytes.end(), type.begin(), type.end());
    if (isLong)
        Append(bytes, size, 8);
}

WriterFailure Failure(int64_t result) {
    return SystemFailure(kWriterErrorWrite, static_cast<int>(-result), "Writing the index failed");
}

/// 0, or a negated errno.
int64_t WriteAt(ByteFile& file, int64_t position, const uint8_t* bytes, int64_t size) noexcept {
    if (const int64_t result = file.Seek(position, SEEK_SET); result < 0)
        return result;
    for (int64_t done = 0; done < size;) {
        const int64_t result = file.Write(bytes + done, size - done);
        if (result <= 0)
            return result < 0 ? result : -EIO;
        done += result;
    }
    return 0;
}

void WriteAt(ByteFile& file, int64_t position, const std::vector<uint8_t>& bytes) {
    if (const int64_t result = WriteAt(file, position, bytes.data(), static_cast<int64_t>(bytes.size()));
        result < 0)
        throw Failure(result);
}

void Sync(ByteFile& file) {
    if (const int64_t result = file.Sync(); result < 0)
        throw SyncFailure(static_cast<int>(-result));
}

/// A file as it will be when one byte of it has become 0.
class Switched final : public ByteFile {
public:
    Switched(ByteFile& file, int64_t byte) : file_(file), byte_(byte) {}

    int64_t Write(const uint8_t* /*data*/, int64_t /*size*/) override { return -EBADF; }
    int64_t Read(uint8_t* data, int64_t size) override {
        const int64_t position = file_.Seek(0, SEEK_CUR);
        const int64_t count = position < 0 ? position : file_.Read(data, size);
        if (byte_ >= position && byte_ < position + count)
            data[byte_ - position] = 0;
        return count;
    }
    int64_t Seek(int64_t offset, int whence) override { return file_.Seek(offset, whence); }
    int64_t Truncate(int64_t /*size*/) override { return -EBADF; }
    int64_t Sync() override { return 0; }

private:
    ByteFile& file_;
    const int64_t byte_;
};

// What the index takes at most, in bytes.
constexpr double kFixed = 4096;
constexpr double kPerPicture = 14;       // size, shift and a run of equal lengths
constexpr double kPerUnevenPicture = 22; // and lengths of their own
constexpr double kPerPacket = 5;         // of sound
constexpr double kPerSecond = 60;        // chunks of both, key pictures
constexpr double kPerCue = 30;           // of subtitles, and one a second is many

double SoundBytesPerSecond(int sampleRate) {
    constexpr double kSamplesPerPacket = 960; // the least of the usual ones
    return kPerPacket * sampleRate / kSamplesPerPacket;
}

double TrackBytesPerSecond(const TrackPlan& track) {
    const int rate = track.sound             ? track.sound->settings.sampleRate
                     : IsSound(*track.track) ? track.track->parameters->sample_rate
                                             : 0;
    return rate > 0 ? SoundBytesPerSecond(rate) + kPerSecond / 2 : kPerCue;
}

int64_t IndexSize(const FilePlan& plan) {
    constexpr double kUnknown = 60; // seconds
    constexpr double kMost = 1e9;
    double perSecond = kPerSecond;
    if (plan.pictures)
        perSecond += (plan.pictures->keepStamps ? kPerUnevenPicture : kPerPicture) * plan.pictures->mostRate;
    if (plan.sound)
        perSecond += SoundBytesPerSecond(plan.sound->settings.sampleRate);
    for (const TrackPlan& track : plan.tracks)
        perSecond += TrackBytesPerSecond(track);
    const double size = (plan.length > 0 ? plan.length : kUnknown) * perSecond;
    return static_cast<int64_t>(kFixed + (size < kMost ? size : kMost));
}

} // namespace

int64_t RoomFor(const FilePlan& plan, const Extras& extras) {
    // One byte of four counts up, so that it alone has to become 0.
    const int64_t wanted = IndexSize(plan) + Mp4Index::MostOf(extras) + kLongHeaderSize + kHeaderSize;
    for (const int shift : {8, 16, 24}) {
        const int64_t steps = (wanted >> shift) + 1;
        // The multiplexer takes a signed size.
        if (steps <= (shift == 24 ? 127 : 255))
            return kSwitched + (steps << shift);
    }
    return kSwitched + (int64_t{255} << 16);
}

int Mp4Room::Close(ByteFile& file) noexcept {
    if (Closed())
        return 0;
    const int64_t position = file.Seek(0, SEEK_CUR);
    for (const int64_t at : {int64_t{0}, size_}) {
        // The first box, of some 30 bytes, and a header.
        std::array<uint8_t, 64 + kHeaderSize> start{};
        file.Seek(at, SEEK_SET);
        const int64_t count = file.Read(start.data(), 64);
        const int64_t end = start[3];
        if (count < kHeaderSize || count < end || end < kHeaderSize || std::memcmp(&start[4], "ftyp", 4) != 0)
            continue;
        uint8_t* header = &start[static_cast<size_t>(end)];
        for (int shift = 24; shift >= 0; shift -= 8)
            *header++ = static_cast<uint8_t>(size_ >> shift);
        std::copy_n("free", 4, header);
        if (const int64_t result = WriteAt(file, 0, start.data(), end + kHeaderSize); result < 0)
            return static_cast<int>(-result);
        begin_ = end;
        break;
    }
    const int64_t result = file.Seek(position, SEEK_SET);
    return result < 0 ? static_cast<int>(-result) : 0;
}

void Mp4Room::Finish(ByteFile& file, const std::function<Mp4Index::Result(int64_t place)>& index,
                     int64_t textSize, const std::function<void(ByteFile&)>& check) const {
    const int64_t end = file.Seek(0, SEEK_END);
    if (end < 0)
        throw Failure(end);
    const int64_t texts = begin_ + size_ - textSize;
    if (texts < begin_ + kSwitched + kLongHeaderSize || !FinishInFront(file, index(texts), texts, end)) {
        try {
            FinishBehind(file, index(end + kHeaderSize), end);
            Switch(file, check);
        } catch (...) {
            file.Truncate(end);
            throw;
        }
        return;
    }
    Switch(file, check);
}

/// Whether the index fits.
bool Mp4Room::FinishInFront(ByteFile& file, const Mp4Index::Result& index, int64_t texts, int64_t end) const {
    const int64_t behind = begin_ + kSwitched + static_cast<int64_t>(index.moov.size());
    const int64_t rest = texts - kLongHeaderSize - behind;
    if (rest < 0 || static_cast<int64_t>(index.texts.size()) > begin_ + size_ - texts)
        return false;
    // A rest that is too short for a box is data, of which nobody knows.
    const int64_t data = rest < kHeaderSize ? behind : texts - kLongHeaderSize;
    std::vector<uint8_t> front = index.moov;
    if (rest >= kHeaderSize)
        AppendHeader(front, static_cast<uint64_t>(rest), "free", false);
    WriteAt(file, begin_ + kSwitched, front);
    std::vector<uint8_t> header;
    AppendHeader(header, static_cast<uint64_t>(end - data), "mdat", true);
    WriteAt(file, data, header);
    if (!index.texts.empty())
        WriteAt(file, texts, index.texts);
    return true;
}

void Mp4Room::FinishBehind(ByteFile& file, const Mp4Index::Result& index, int64_t end) const {
    std::vector<uint8_t> tail;
    AppendHeader(tail, static_cast<uint64_t>(kHeaderSize) + index.texts.size() + index.moov.size(), "free",
                 false);
    tail.insert(tail.end(), index.texts.begin(), index.texts.end());
    const int64_t data = begin_ + kSwitched;
    std::vector<uint8_t> header;
    AppendHeader(header, static_cast<uint64_t>(end + static_cast<int64_t>(tail.size()) - data), "mdat", true);
    tail.insert(tail.end(), index.moov.begin(), index.moov.end());
    WriteAt(file, end, tail);
    WriteAt(file, data, header);
}

void Mp4Room::Switch(ByteFile& file, const std::function<void(ByteFile&)>& check) const {
    int byte = 0;
    while (byte < 3 && (size_ >> (24 - 8 * byte) & 0xFF) == 0)
        ++byte;
    Switched plain(file, begin_ + byte);
    check(plain);
    Sync(file);
    WriteAt(file, begin_ + byte, {0});
}

} // namespace writer
