#include "host/source/Demuxer.h"

#include "host/source/MediaTime.h"
#include "host/source/PacketTime.h"
#include "host/source/StreamChoice.h"

#include <algorithm>
#include <limits>
#include <new>
#include <string_view>
#include <utility>

namespace movieconv {
namespace {

constexpr std::size_t kEnoughPackets = 32;
constexpr std::size_t kEnoughBytes = 1 << 20;
constexpr std::size_t kMostBytes = 32 << 20; // while sound stays away
constexpr int64_t kLatest =
    10 * kTicksPerSecond;               // by which sound may come later in the file than its pictures
constexpr int kToleratedFailures = 100; // reads in a row that may fail on damaged data
constexpr double kPreroll = 0.2;        // codecs need a little before the first good sample
constexpr int kProbedPackets = 2000;    // read to find the picture where decoding can begin

/// Whether the clock of such a source may start anew.
bool MayJump(const AVFormatContext& context) {
    return (context.iformat->flags & AVFMT_TS_DISCONT) != 0;
}

/// All pictures and sound on the clock of what is converted, where that may jump: whatever is converted of
/// them, the same jumps are found.
std::vector<int> WitnessesIn(const SourceInfo& info, const AVFormatContext& context) {
    std::vector<int> witnesses;
    const int converted = info.pictures ? info.pictures->index : info.sound->index;
    const std::vector<int>& programs = info.streams[static_cast<std::size_t>(converted)].programs;
    for (const StreamInfo& stream : info.streams)
        if (MayJump(context) && BelongsTo(programs, stream) &&
            (stream.kind == StreamKind::kPictures || stream.kind == StreamKind::kSound))
            witnesses.push_back(stream.index);
    return witnesses;
}

} // namespace

Demuxer::Demuxer(Source& source, Failures& failures)
    : source_(source),
      failures_(failures),
      witnesses_(WitnessesIn(source.Info(), *source.Reader().Context())) {
    source_.Reader().SelectBeside(witnesses_);
    if (const auto& pictures = source.Info().pictures)
        queues_[{pictures->index}];
    if (const auto& sound = source.Info().sound)
        queues_[{sound->index}].mayBeSilent = source.Info().pictures.has_value();
}

void Demuxer::ReadBeside(const std::vector<int>& streams) {
    std::vector<int> read = witnesses_;
    read.insert(read.end(), streams.begin(), streams.end());
    source_.Reader().SelectBeside(read);
    for (const int stream : streams)
        queues_[{stream, true}];
}

Demuxer::~Demuxer() {
    Stop();
    if (thread_.joinable())
        thread_.join();
}

bool Demuxer::Seek(double seconds) {
    const std::lock_guard lock(mutex_);
    if (staysAtStart_ || source_.Info().clockRestarts)
        return false;
    if (started_ || stopping_ || seconds == soughtSeconds_)
        return soughtWell_ && seconds == soughtSeconds_;
    soughtSeconds_ = seconds;
    soughtWell_ = source_.Reader().IsSeekable() && (SeekBefore(seconds) || source_.Reader().Rewind());
    if (!soughtWell_ && moved_)
        failures_.Note("it cannot be read from its start again");
    return soughtWell_;
}

/// Whether FFmpeg gives other stamps where it seeks than where it reads on.
bool Demuxer::SeeksAstray() const {
    const std::string_view container = source_.Reader().Context()->iformat->name;
    if (container != "ogg" || source_.SoundStream() == nullptr)
        return container == "ogg";
    const AVCodecID sound = source_.SoundStream()->codecpar->codec_id;
    return source_.PictureStream() != nullptr || (sound != AV_CODEC_ID_VORBIS && sound != AV_CODEC_ID_OPUS);
}

/// Goes to a time from which `seconds` can be decoded. Containers seek by decoding order or land beside a key
/// picture, so it goes back until one lies before. False when there is none after the source's start.
bool Demuxer::SeekBefore(double seconds) {
    AVFormatContext* context = source_.Reader().Context();
    const int64_t start = context->start_time != AV_NOPTS_VALUE ? context->start_time : 0;
    double back = kPreroll;
    while (back < seconds && !SeeksAstray()) {
        const int64_t target = start + std::llround((seconds - back) * AV_TIME_BASE);
        const auto seek = [&] { return avformat_seek_file(context, -1, INT64_MIN, target, target, 0) >= 0; };
        if (!seek())
            return false;
        moved_ = true;
        if (KeyPictureAtOrBefore(ToMediaTime(seconds))) {
            awaitsKey_ = source_.PictureStream() != nullptr;
            return seek();
        }
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
    for (int i = 0; i < kProbedPackets && av_read_frame(source_.Reader().Context(), packet.get()) >= 0; ++i) {
        const bool isKey = packet->stream_index == pictures->index && (packet->flags & AV_PKT_FLAG_KEY) != 0;
        const int64_t stamp = StampOf(*packet);
        av_packet_unref(packet.get());
        if (isKey)
            return stamp == AV_NOPTS_VALUE ||
                   source_.Reader().MediaTime(stamp, pictures->time_base) <= mediaTime;
    }
    return false;
}

void Demuxer::Start() {
    if (!started_ && !stopping_) {
        thread_ = NewThread([this] { Run(); });
        started_ = true;
    }
}

/// Waits until the stream's queue holds a packet, or the reading has ended, or `known` holds.
template <class Known>
av::Packet Demuxer::Take(std::unique_lock<std::mutex>& lock, Queue& queue, Known known) {
    Start();
    WaitAndTell(
        changed_, lock, [&] { return stopping_ || ended_ || !queue.packets.empty() || known(); },
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

av::Packet Demuxer::Take(int stream) {
    std::unique_lock lock(mutex_);
    return Take(lock, queues_.at({stream}), [] { return false; });
}

std::variant<av::Packet, int64_t> Demuxer::TakeOrSilence(int stream) {
    std::unique_lock lock(mutex_);
    Queue& queue = queues_.at({stream});
    std::optional<int64_t> silence;
    av::Packet packet = Take(lock, queue, [&] { return (silence = Silence(queue)).has_value(); });
    if (packet || !silence)
        return packet;
    queue.silentUntil = *silence;
    lock.unlock();
    changed_.notify_all(); // it may be waiting for this
    return *silence;
}

/// Up to where an empty queue's stream is known to be silent; nothing unless that is news.
std::optional<int64_t> Demuxer::Silence(const Queue& queue) const {
    if (!queue.mayBeSilent || !queue.packets.empty() || Held() < kMostBytes)
        return std::nullopt;
    const int64_t silentUntil = Reached() - kLatest;
    const bool isNews = silentUntil > std::max(queue.silentUntil, queue.end.value_or(INT64_MIN));
    return isNews ? std::optional(silentUntil) : std::nullopt;
}

/// How far the pictures and the sound that are converted have been read.
int64_t Demuxer::Reached() const {
    int64_t reached = INT64_MIN + kLatest;
    for (const auto& [taker, queue] : queues_)
        if (!taker.beside)
            reached = std::max(reached, queue.end.value_or(reached));
    return reached;
}

/// Whether the taker of a stream that is read beside the others has to wait for more to be read.
bool Demuxer::IsAwaited(const Queue& queue) const {
    return queue.packets.empty() && queue.end.value_or(INT64_MIN) < queue.wanted &&
           Reached() - kLatest < queue.wanted && Held() < kMostBytes;
}

Demuxer::Beside Demuxer::TakeBeside(int stream, int64_t until, bool wait) {
    std::unique_lock lock(mutex_);
    Queue& queue = queues_.at({stream, true});
    if (wait && queue.packets.empty()) {
        Start();
        queue.wanted = until;
        changed_.notify_all();
        WaitAndTell(
            changed_, lock, [&] { return stopping_ || ended_ || !IsAwaited(queue); },
            L"Movie::What goes beside pictures and sound waits for the source");
        queue.wanted = INT64_MIN;
    }
    if (stopping_ || queue.packets.empty())
        return {nullptr, stopping_ || ended_};
    av::Packet packet = std::move(queue.packets.front());
    queue.packets.pop_front();
    queue.bytes -= static_cast<std::size_t>(packet->size);
    return {std::move(packet), false};
}

av::Packet Demuxer::FirstBeside(int stream) {
    std::unique_lock lock(mutex_);
    Queue& queue = queues_.at({stream, true});
    Start();
    queue.wanted = std::numeric_limits<int64_t>::max();
    changed_.notify_all();
    WaitAndTell(
        changed_, lock, [&] { return stopping_ || ended_ || !queue.packets.empty() || Held() >= kMostBytes; },
        L"Movie::What goes beside pictures and sound waits for the source");
    queue.wanted = INT64_MIN;
    if (queue.packets.empty())
        return nullptr;
    av::Packet packet(av_packet_clone(queue.packets.front().get()));
    if (!packet)
        throw std::bad_alloc();
    return packet;
}

void Demuxer::Stop() {
    {
        const std::lock_guard lock(mutex_);
        stopping_ = true; // before the read is interrupted, which is no failure then
    }
    source_.Reader().Interrupt();
    changed_.notify_all();
}

std::optional<int64_t> Demuxer::EndOf(int stream) const {
    const std::lock_guard lock(mutex_);
    const auto found = queues_.find({stream});
    return found != queues_.end() ? found->second.end : std::nullopt;
}

int Demuxer::ClockJumps() const {
    const std::lock_guard lock(mutex_);
    return clock_.Jumps();
}

std::size_t Demuxer::Held() const {
    std::size_t held = 0;
    for (const auto& [taker, queue] : queues_)
        held += queue.bytes;
    return held;
}

std::size_t Demuxer::Bytes() const {
    const std::lock_guard lock(mutex_);
    return Held();
}

/// Whether each queue has so many packets, or all together have so many bytes, and nobody waits for a packet.
bool Demuxer::Holds(std::size_t packets, std::size_t bytes) const {
    bool allFilled = true;
    std::size_t held = 0;
    for (const auto& [taker, queue] : queues_) {
        if (taker.beside ? IsAwaited(queue) : queue.packets.empty() && !Silence(queue))
            return false;
        allFilled = allFilled && (taker.beside || queue.packets.size() >= packets);
        held += taker.beside ? 0 : queue.bytes;
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
    failures_.Attempt([this] {
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
    const int result = av_read_frame(source_.Reader().Context(), packet.get());
    av::CheckMemory(result);
    if (result == AVERROR(EAGAIN) || (result == AVERROR_INVALIDDATA && ++failedReads_ < kToleratedFailures))
        return true;
    if (result < 0) {
        const std::lock_guard lock(mutex_);
        if (!stopping_)
            failures_.Note(result != AVERROR_EOF ? av::ErrorText(result) : source_.Reader().File().Refusal());
        return false;
    }
    failedReads_ = 0;
    const auto taken = queues_.find({packet->stream_index});
    const auto beside = queues_.find({packet->stream_index, true});
    if (awaitsKey_ && packet->stream_index == source_.Info().pictures->index) {
        // Some containers land between key pictures, whatever is asked for. Decoders take the stamps of
        // pictures that build on missing ones for faulty, and those of all that follow, too.
        awaitsKey_ = (packet->flags & AV_PKT_FLAG_KEY) == 0;
        if (awaitsKey_)
            return true;
    }
    RepairClock(*packet);
    if (taken == queues_.end() && beside == queues_.end())
        return true;
    av::Packet copy(taken != queues_.end() && beside != queues_.end() ? av_packet_clone(packet.get())
                                                                      : nullptr);
    if (taken != queues_.end() && beside != queues_.end() && !copy)
        throw std::bad_alloc();
    {
        const std::optional<int64_t> end = EndOf(*packet);
        const std::lock_guard lock(mutex_);
        if (copy)
            Enqueue(beside->second, std::move(copy), end);
        Enqueue((taken != queues_.end() ? taken : beside)->second, std::move(packet), end);
    }
    changed_.notify_all();
    return true;
}

void Demuxer::Enqueue(Queue& queue, av::Packet packet, std::optional<int64_t> end) {
    queue.end = std::max(queue.end, end); // nothing is less than any
    queue.bytes += static_cast<std::size_t>(packet->size);
    queue.packets.push_back(std::move(packet));
}

std::optional<int64_t> Demuxer::EndOf(const AVPacket& packet) const {
    if (StampOf(packet) == AV_NOPTS_VALUE)
        return std::nullopt;
    return source_.Reader().MediaTime(EndStampOf(packet),
                                      source_.Reader().Context()->streams[packet.stream_index]->time_base);
}

void Demuxer::RepairClock(AVPacket& packet) {
    if (!MayJump(*source_.Reader().Context()) || packet.dts == AV_NOPTS_VALUE)
        return;
    const AVStream* stream = source_.Reader().Context()->streams[packet.stream_index];
    const AVRational mediaBase{1, kTicksPerSecond};
    constexpr int64_t kLongest = 3600 * kTicksPerSecond; // damaged data can tell anything
    const int64_t length =
        std::clamp<int64_t>(av_rescale_q(packet.duration, stream->time_base, mediaBase), 0, kLongest);
    const int64_t stamp = source_.Reader().MediaTime(packet.dts, stream->time_base);
    int64_t shift = 0;
    {
        const std::lock_guard lock(mutex_);
        shift = stream->codecpar->codec_type == AVMEDIA_TYPE_SUBTITLE
                    ? clock_.Shift()
                    : clock_.ShiftFor(packet.stream_index, stamp, length);
    }
    const int64_t ticks = av_rescale_q(shift, mediaBase, stream->time_base);
    packet.dts += ticks;
    if (packet.pts != AV_NOPTS_VALUE)
        packet.pts += ticks;
}

} // namespace movieconv
