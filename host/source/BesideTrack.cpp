#include "host/source/BesideTrack.h"

#include "host/source/PacketTime.h"
#include "host/source/SoundBlock.h"

#include <algorithm>
#include <iterator>
#include <utility>

namespace movieconv {
namespace {

constexpr int kSilenceBlocksPerSecond = 10;
constexpr int64_t kLongest =
    24 * 60 * 60; // seconds that a packet lasts; some multiplexers write 2^32 ms for "open"

} // namespace

bool BesideTrack::Next(int64_t until, bool closing, Item& item) {
    if (closing) {
        const int64_t fileEnd = bounds_.fileEnd;
        const bool endsHere = bounds_.ends || bounds_.stopped;
        until = fileEnd != BesideBounds::kOpen || !endsHere ? fileEnd : until;
    }
    bool found = false;
    item.time = until;
    failures_.Attempt([&] { found = Find(until, closing, item); });
    return found;
}

BesideSound::BesideSound(const PacketReader& reader, const AVStream& stream, const SoundStreamInfo& sound,
                         Demuxer& demuxer, const BesideBounds& bounds, Failures& failures)
    : BesideTrack(bounds, failures),
      demuxer_(demuxer),
      stream_(stream.index),
      decoder_(reader, stream, sound,
               {[this](PcmDecoder::Chunk chunk) {
                    const auto samples = static_cast<int64_t>(chunk.size()) / decoder_.FrameBytes();
                    stretches_.push_back({std::move(chunk), samples});
                    return true;
                },
                [this](int64_t samples) {
                    stretches_.push_back({{}, samples});
                    return true;
                }}) {}

bool BesideSound::Find(int64_t until, bool closing, Item& item) {
    if (!std::exchange(begun_, true))
        decoder_.Begin(bounds_.begin);
    if (used_ == current_.samples && !ReadMore(until, closing))
        return false;
    const AudioFormat& format = decoder_.Format();
    int64_t samples = current_.samples - used_;
    if (until != BesideBounds::kOpen) {
        const int64_t end = SamplesIn(until - bounds_.begin, format.nSampleRate);
        samples = std::min(samples, end - position_);
    }
    if (samples <= 0)
        return false;
    HandOut(samples, item);
    return true;
}

/// Decodes until there is something to hand out. False when there is nothing to decode, before `until` at
/// least.
bool BesideSound::ReadMore(int64_t until, bool closing) {
    while (stretches_.empty() && !drained_) {
        const Demuxer::Beside taken = demuxer_.TakeBeside(stream_, until, closing);
        if (taken.packet || taken.ended) {
            drained_ = !decoder_.Decode(taken.packet.get());
        } else {
            if (closing && until != BesideBounds::kOpen)
                decoder_.FillTo(until);
            break;
        }
    }
    if (stretches_.empty())
        return false;
    current_ = std::move(stretches_.front());
    stretches_.pop_front();
    used_ = 0;
    return true;
}

void BesideSound::HandOut(int64_t samples, Item& item) {
    const AudioFormat& format = decoder_.Format();
    const bool isSilence = current_.sound.empty();
    if (isSilence)
        samples = std::min<int64_t>(samples, format.nSampleRate / kSilenceBlocksPerSecond + 1);
    const auto bytes = static_cast<std::size_t>(samples * decoder_.FrameBytes());
    if (isSilence)
        silence_.resize(std::max(silence_.size(), bytes));
    block_ = BlockOf(format, kMediaTypeSound);
    block_.pData = isSilence ? silence_.data() : current_.sound.data() + used_ * decoder_.FrameBytes();
    block_.nLength = block_.nBufferSize = static_cast<int32_t>(bytes);
    block_.llTime = bounds_.begin + TimeOfSamples(position_, format.nSampleRate);
    block_.nDuration = static_cast<int32_t>(TimeOfSamples(samples, format.nSampleRate));
    item = {&block_, nullptr, block_.llTime, block_.nDuration};
    position_ += samples;
    used_ += samples;
}

BesidePackets::BesidePackets(Take take, Clock clock, AVRational timeBase, const BesideBounds& bounds,
                             Failures& failures)
    : BesideTrack(bounds, failures),
      take_(std::move(take)),
      clock_(std::move(clock)),
      timeBase_(timeBase),
      fileBegin_(bounds.begin) {}

void BesidePackets::Precede(std::vector<av::Packet> packets) {
    for (av::Packet& packet : packets)
        Hold(std::move(packet));
}

bool BesidePackets::Find(int64_t until, bool closing, Item& item) {
    KeepDivided();
    while (pending_.empty() || pending_.back().begin < until) {
        Demuxer::Beside taken = take_(until, closing);
        if (!taken.packet)
            break;
        Hold(std::move(taken.packet));
    }
    // Of those that last up to the next one, the last one counts where a file begins.
    while (pending_.size() > 1 && !pending_[0].Ends() && pending_[1].begin <= fileBegin_)
        pending_.pop_front();
    const bool any = !pending_.empty() && pending_.front().begin < until;
    // Where a file ends that it does not fit into is known when it is closed.
    if (any && (closing || !(bounds_.isCut || bounds_.ends) || pending_.front().end <= until)) {
        current_ = std::move(pending_.front());
        pending_.pop_front();
        divides_ = closing && current_.end > until;
        item = {nullptr, current_.packet.get(), current_.begin,
                current_.Ends() ? (divides_ ? until : current_.end) - current_.begin : 0};
        return true;
    }
    item.time = any ? pending_.front().begin : until;
    if (closing)
        BeginFile(until);
    return false;
}

/// The next file begins with what the end of the last one divided.
void BesidePackets::BeginFile(int64_t begin) {
    fileBegin_ = begin;
    pending_.insert(pending_.begin(), std::make_move_iterator(divided_.begin()),
                    std::make_move_iterator(divided_.end()));
    divided_.clear();
}

/// Keeps what was handed out last if the next file needs it too.
void BesidePackets::KeepDivided() {
    if (!current_.packet)
        return;
    const auto lasting =
        std::find_if(divided_.begin(), divided_.end(), [](const Held& held) { return !held.Ends(); });
    if (!current_.Ends() && lasting != divided_.end())
        *lasting = std::move(current_);
    else if (divides_ || !current_.Ends())
        divided_.push_back(std::move(current_));
    current_ = {};
}

void BesidePackets::Hold(av::Packet packet) {
    Held held{std::move(packet), latest_, latest_};
    const int64_t stamp = StampOf(*held.packet);
    if (stamp != AV_NOPTS_VALUE) {
        held.begin = clock_(stamp, timeBase_);
        const bool isLasting = av_rescale_q(held.packet->duration, timeBase_, {1, 1}) >= kLongest;
        const int64_t duration = isLasting ? 0 : std::max<int64_t>(held.packet->duration, 0);
        held.end = clock_(av_sat_add64(stamp, duration), timeBase_); // stamps are whatever the file says
    }
    latest_ = std::max(latest_, held.begin);
    if (held.Ends() && held.end <= fileBegin_)
        return;
    const bool mayBeKnown = held.begin < bounds_.begin; // it was read with the earlier cues, and here again
    const bool isKnown =
        mayBeKnown && std::any_of(pending_.begin(), pending_.end(), [&](const Held& other) {
            return other.begin == held.begin && other.end == held.end &&
                   other.packet->size == held.packet->size &&
                   std::equal(held.packet->data, held.packet->data + held.packet->size, other.packet->data);
        });
    if (isKnown)
        return;
    const auto later = std::upper_bound(pending_.begin(), pending_.end(), held.begin,
                                        [](int64_t time, const Held& other) { return time < other.begin; });
    pending_.insert(later, std::move(held));
}

} // namespace movieconv
