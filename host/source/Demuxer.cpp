#include "host/source/Demuxer.h"

#include "host/source/MediaTime.h"

#include <algorithm>
#include <cstdlib>
#include <new>
#include <system_error>
#include <utility>

namespace movieconv {
namespace {

constexpr std::size_t kEnoughPackets = 32;
constexpr std::size_t kEnoughBytes = 1 << 20;
constexpr int kToleratedFailures = 100;                // reads in a row that may fail on damaged data
constexpr int64_t kLargestStep = 10 * kTicksPerSecond; // between packets of one stream; more is a new clock
constexpr int64_t kLargestFall = kTicksPerSecond / 2;  // likewise, backwards
constexpr double kPreroll = 0.2;                       // codecs need a little before the first good sample
constexpr int kProbedPackets = 2000;                   // read to find the picture where decoding can begin

/// Writes what went wrong into `reason`, which stays as it is when there is no memory for it.
void Describe(const std::exception& error, std::string& reason) noexcept {
    try {
        const bool threads = dynamic_cast<const std::system_error*>(&error) != nullptr;
        reason = std::string(threads ? "no thread can be started: " : "") + error.what();
    } catch (const std::bad_alloc&) {
    }
}

} // namespace

Demuxer::Demuxer(Source& source) : source_(source) {
    if (const AVStream* pictures = source.PictureStream())
        queues_[pictures->index];
    if (const AVStream* sound = source.SoundStream())
        queues_[sound->index];
}

Demuxer::~Demuxer() {
    Stop();
    if (thread_.joinable())
        thread_.join();
}

bool Demuxer::Seek(double seconds) {
    const std::lock_guard lock(mutex_);
    if (started_ || seconds == soughtSeconds_)
        return soughtWell_ && seconds == soughtSeconds_;
    soughtSeconds_ = seconds;
    soughtWell_ = source_.IsSeekable() && (SeekBefore(seconds) || source_.Rewind());
    if (!soughtWell_ && moved_)
        readError_ = "it cannot be read from its start again";
    return soughtWell_;
}

/// Goes to a time from which `seconds` can be decoded. Containers seek by decoding order or land beside a key
/// picture, so it goes back until one lies before. False when there is none after the source's start.
bool Demuxer::SeekBefore(double seconds) {
    AVFormatContext* context = source_.Context();
    const int64_t start = context->start_time != AV_NOPTS_VALUE ? context->start_time : 0;
    double back = kPreroll;
    while (back < seconds) {
        const int64_t target = start + std::llround((seconds - back) * AV_TIME_BASE);
        const auto seek = [&] { return avformat_seek_file(context, -1, INT64_MIN, target, target, 0) >= 0; };
        if (!seek())
            return false;
        moved_ = true;
        if (KeyPictureAtOrBefore(ToMediaTime(seconds)))
            return seek();
        back = 2 * back + 1;
    }
    return false;
}

/// Whether the first key picture from here on is shown at `mediaTime` or earlier. True without a picture
/// stream.
bool Demuxer::KeyPictureAtOrBefore(int64_t mediaTime) {
    const AVStream* pictures = source_.PictureStream();
    if (pictures == nullptr)
        return true;
    const av::Packet packet = av::NewPacket();
    for (int i = 0; i < kProbedPackets && av_read_frame(source_.Context(), packet.get()) >= 0; ++i) {
        const bool isKey = packet->stream_index == pictures->index && (packet->flags & AV_PKT_FLAG_KEY) != 0;
        const int64_t stamp = packet->pts != AV_NOPTS_VALUE ? packet->pts : packet->dts;
        av_packet_unref(packet.get());
        if (isKey)
            return stamp == AV_NOPTS_VALUE || source_.MediaTime(stamp, pictures) <= mediaTime;
    }
    return false;
}

void Demuxer::Start() {
    if (!started_ && !stopping_) {
        thread_ = std::thread(&Demuxer::Run, this);
        started_ = true;
    }
}

av::Packet Demuxer::Take(int stream) {
    std::unique_lock lock(mutex_);
    Start();
    Queue& queue = queues_.at(stream);
    WaitAndTell(
        changed_, lock, [&] { return stopping_ || ended_ || !queue.packets.empty(); },
        L"Movie::A decoder waits for the source");
    if (stopping_ || queue.packets.empty())
        return nullptr;
    av::Packet packet = std::move(queue.packets.front());
    queue.packets.pop_front();
    queue.bytes -= static_cast<std::size_t>(packet->size);
    const bool wanted = !Holds(kEnoughPackets / 2, kEnoughBytes / 2); // waking it for each packet costs more
    lock.unlock();
    if (wanted)
        changed_.notify_all();
    return packet;
}

void Demuxer::Stop() {
    {
        const std::lock_guard lock(mutex_);
        stopping_ = true; // before the read is interrupted, which is no failure then
    }
    source_.Interrupt();
    changed_.notify_all();
}

void Demuxer::Fail(const std::exception_ptr& failure) noexcept {
    std::string reason = "no memory"; // short enough to need none
    try {
        std::rethrow_exception(failure);
    } catch (const std::bad_alloc&) {
    } catch (const std::exception& error) {
        Describe(error, reason);
    }
    {
        const std::lock_guard lock(mutex_);
        if (readError_.empty())
            readError_ = std::move(reason);
    }
    Stop();
}

std::string Demuxer::ReadError() const {
    const std::lock_guard lock(mutex_);
    return readError_;
}

std::optional<int64_t> Demuxer::EndOf(int stream) const {
    const std::lock_guard lock(mutex_);
    const auto found = queues_.find(stream);
    return found != queues_.end() ? found->second.end : std::nullopt;
}

int Demuxer::ClockJumps() const {
    const std::lock_guard lock(mutex_);
    return clockJumps_;
}

/// Whether no queue is empty and each has so many packets, or all together have so many bytes.
bool Demuxer::Holds(std::size_t packets, std::size_t bytes) const {
    std::size_t held = 0;
    bool allFilled = true;
    for (const auto& [stream, queue] : queues_) {
        if (queue.packets.empty())
            return false;
        held += queue.bytes;
        allFilled = allFilled && queue.packets.size() >= packets;
    }
    return allFilled || held >= bytes;
}

/// Waits until there is something to read for. False when there is nothing any more.
bool Demuxer::AwaitDemand() {
    std::unique_lock lock(mutex_);
    WaitAndTell(
        changed_, lock, [&] { return stopping_ || !Holds(kEnoughPackets, kEnoughBytes); },
        L"Movie::Reading the source waits for the decoders");
    return !stopping_;
}

void Demuxer::Run() {
    Attempt([this] {
        while (AwaitDemand() && ReadOne()) {
        }
    });
    {
        const std::lock_guard lock(mutex_);
        ended_ = true;
    }
    changed_.notify_all();
}

/// Reads one packet and queues it. False at the end, or when nothing more can be read.
bool Demuxer::ReadOne() {
    av::Packet packet = av::NewPacket();
    const int result = av_read_frame(source_.Context(), packet.get());
    av::CheckMemory(result);
    if (result == AVERROR(EAGAIN) || (result == AVERROR_INVALIDDATA && ++failedReads_ < kToleratedFailures))
        return true;
    if (result < 0) {
        const std::lock_guard lock(mutex_);
        if (result != AVERROR_EOF && !stopping_)
            readError_ = av::ErrorText(result);
        else if (!stopping_ && readError_.empty())
            readError_ = source_.Refusal();
        return false;
    }
    failedReads_ = 0;
    const auto found = queues_.find(packet->stream_index);
    if (found == queues_.end())
        return true;
    RepairClock(*packet);
    {
        const std::optional<int64_t> end = EndOf(*packet);
        const std::lock_guard lock(mutex_);
        found->second.end = std::max(found->second.end, end); // nothing is less than any
        found->second.bytes += static_cast<std::size_t>(packet->size);
        found->second.packets.push_back(std::move(packet));
    }
    changed_.notify_all();
    return true;
}

std::optional<int64_t> Demuxer::EndOf(const AVPacket& packet) const {
    const int64_t stamp = packet.pts != AV_NOPTS_VALUE ? packet.pts : packet.dts;
    if (stamp == AV_NOPTS_VALUE)
        return std::nullopt;
    return source_.MediaTime(stamp + packet.duration, source_.Context()->streams[packet.stream_index]);
}

/// Recordings joined end to end start a new clock in the middle. From there on the stamps of all streams are
/// shifted so that time goes on where it stopped.
void Demuxer::RepairClock(AVPacket& packet) {
    if ((source_.Context()->iformat->flags & AVFMT_TS_DISCONT) == 0 || packet.dts == AV_NOPTS_VALUE)
        return;
    const AVStream* stream = source_.Context()->streams[packet.stream_index];
    const AVRational mediaBase{1, kTicksPerSecond};
    const int64_t stamp = av_rescale_q(packet.dts, stream->time_base, mediaBase);
    const auto due = due_.find(packet.stream_index);
    int64_t shift = clockShift_;
    if (due != due_.end()) {
        const auto ahead = [&](int64_t candidate) { return stamp + candidate - due->second; };
        // Where the clock changes, the last packets of one stream can come after the first ones of the other.
        if (std::abs(ahead(earlierShift_)) < std::abs(ahead(shift)))
            shift = earlierShift_;
        if (ahead(shift) > kLargestStep || ahead(shift) < -kLargestFall) {
            earlierShift_ = clockShift_;
            shift = clockShift_ = due->second - stamp;
            const std::lock_guard lock(mutex_);
            ++clockJumps_;
        }
    }
    const int64_t step =
        packet.duration > 0 ? av_rescale_q(packet.duration, stream->time_base, mediaBase) : 0;
    due_[packet.stream_index] = stamp + shift + step;
    const int64_t ticks = av_rescale_q(shift, mediaBase, stream->time_base);
    packet.dts += ticks;
    if (packet.pts != AV_NOPTS_VALUE)
        packet.pts += ticks;
}

} // namespace movieconv
