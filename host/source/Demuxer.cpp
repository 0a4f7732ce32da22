#include "host/source/Demuxer.h"

#include "host/sentence/Say.h"
#include "host/source/LogSilence.h"
#include "host/source/MediaTime.h"
#include "host/source/PacketTime.h"

#include <algorithm>
#include <limits>
#include <utility>

namespace movieconv {
namespace {

constexpr std::size_t kEnoughPackets = 32;
constexpr std::size_t kEnoughBytes = 1 << 20;
constexpr int kToleratedFailures = 100; // reads in a row that may fail on damaged data

} // namespace

Demuxer::Demuxer(Source& source, Failures& failures)
    : source_(source),
      failures_(failures),
      seeker_(source),
      clock_(source.Info(), source.Reader()),
      late_(source.Info().streams.size()) {
    source_.Reader().SelectBeside(clock_.Witnesses());
    if (const auto& pictures = source.Info().pictures)
        queues_.For({pictures->index});
    if (const auto& sound = source.Info().sound)
        queues_.For({sound->index}).mayBeSilent = source.Info().pictures.has_value();
}

void Demuxer::ReadBeside(const std::vector<int>& streams) {
    std::vector<int> read = clock_.Witnesses();
    read.insert(read.end(), streams.begin(), streams.end());
    source_.Reader().SelectBeside(read);
    for (const int stream : streams)
        queues_.For({stream, true});
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
    soughtWell_ = seeker_.Seek(seconds);
    if (!soughtWell_ && seeker_.HasMoved())
        failures_.Note(Say("it cannot be read from its start again"));
    return soughtWell_;
}

void Demuxer::Start() {
    if (!started_ && !stopping_) {
        thread_ = NewThread(AsSilentAsHere([this] { Run(); }));
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
    av::Packet packet = queue.Pop();
    const bool wanted =
        !queues_.Holds(kEnoughPackets / 2, kEnoughBytes / 2); // waking it for each packet costs more
    lock.unlock();
    if (wanted)
        changed_.notify_all();
    return packet;
}

av::Packet Demuxer::Take(int stream) {
    std::unique_lock lock(mutex_);
    return Take(lock, queues_.At({stream}), [] { return false; });
}

std::variant<av::Packet, int64_t> Demuxer::TakeOrSilence(int stream) {
    std::unique_lock lock(mutex_);
    Queue& queue = queues_.At({stream});
    std::optional<int64_t> silence;
    av::Packet packet = Take(lock, queue, [&] { return (silence = queues_.Silence(queue)).has_value(); });
    if (packet || !silence)
        return packet;
    queue.silentUntil = *silence;
    lock.unlock();
    changed_.notify_all(); // it may be waiting for this
    return *silence;
}

/// Reads on until `reached` holds, for the taker of a stream beside that waits for packets up to `until`.
template <class Reached>
void Demuxer::AwaitBeside(std::unique_lock<std::mutex>& lock, Queue& queue, int64_t until, Reached reached) {
    Start();
    queue.wanted = until;
    changed_.notify_all();
    WaitAndTell(
        changed_, lock, [&] { return stopping_ || ended_ || reached(); },
        L"Movie::What goes beside pictures and sound waits for the source");
    queue.wanted = INT64_MIN;
}

Demuxer::Beside Demuxer::TakeBeside(int stream, int64_t until, bool wait) {
    std::unique_lock lock(mutex_);
    Queue& queue = queues_.At({stream, true});
    if (wait && queue.packets.empty())
        AwaitBeside(lock, queue, until, [&] { return !queues_.IsAwaited(queue); });
    if (stopping_ || queue.packets.empty())
        return {nullptr, stopping_ || ended_};
    return {queue.Pop(), false};
}

av::Packet Demuxer::FirstBeside(int stream) {
    std::unique_lock lock(mutex_);
    Queue& queue = queues_.At({stream, true});
    AwaitBeside(lock, queue, std::numeric_limits<int64_t>::max(),
                [&] { return !queue.packets.empty() || queues_.IsFull(); });
    return queue.packets.empty() ? nullptr : av::CopyOf(*queue.packets.front());
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
    return queues_.EndOf(stream);
}

std::vector<LateStreams::Left> Demuxer::LeftOut() const {
    const std::lock_guard lock(mutex_);
    return late_.AllLeft();
}

std::size_t Demuxer::Bytes() const {
    const std::lock_guard lock(mutex_);
    return queues_.Bytes();
}

/// Waits until there is something to read for. False when there is nothing any more.
bool Demuxer::AwaitDemand() {
    std::unique_lock lock(mutex_);
    WaitAndTell(
        changed_, lock, [&] { return stopping_ || !queues_.Holds(kEnoughPackets, kEnoughBytes); },
        L"Movie::Reading the source waits for the decoders");
    return !stopping_;
}

void Demuxer::Run() {
    failures_.Attempt([this] {
        while (AwaitDemand() && ReadOne())
            GiveOutRepaired(false);
        GiveOutRepaired(true);
    });
    {
        const std::lock_guard lock(mutex_);
        ended_ = true;
    }
    changed_.notify_all();
}

/// Reads one packet. False at the end, or when nothing more can be read.
bool Demuxer::ReadOne() {
    av::Packet packet = av::NewPacket();
    const int result = av_read_frame(source_.Reader().Context(), packet.get());
    av::CheckMemory(result);
    if (result == AVERROR(EAGAIN) || (result == AVERROR_INVALIDDATA && ++failedReads_ < kToleratedFailures))
        return true;
    if (result < 0) {
        const std::lock_guard lock(mutex_);
        if (!stopping_)
            failures_.Note(result != AVERROR_EOF ? Sentence(av::ErrorText(result))
                                                 : source_.Reader().File().Refusal());
        return false;
    }
    failedReads_ = 0;
    if (seeker_.IsBeforeKey(*packet))
        return true;
    TakeUp(std::move(packet));
    return true;
}

/// As one of its stream, or of the one that this stream goes on with.
void Demuxer::TakeUp(av::Packet packet) {
    const AVFormatContext& context = *source_.Reader().Context();
    const int stream = packet->stream_index;
    if (queues_.IsTaken(stream))
        late_.See(context, stream);
    else if (const int replaced = late_.Replaced(context, stream);
             replaced >= 0 && AreAlike(*context.streams[replaced], *context.streams[stream]))
        packet->stream_index = replaced;
    clock_.Push(std::move(packet));
}

/// What has its final stamps; `all` when nothing more was read.
void Demuxer::GiveOutRepaired(bool all) {
    while (av::Packet packet = clock_.Pop(all))
        GiveOut(std::move(packet));
}

/// To all who take its stream.
void Demuxer::GiveOut(av::Packet packet) {
    const AVFormatContext& context = *source_.Reader().Context();
    const int stream = packet->stream_index;
    const std::optional<int64_t> end = EndOf(*packet);
    {
        const std::lock_guard lock(mutex_);
        if (end && !queues_.IsTaken(stream))
            late_.Leave(context, stream, late_.Replaced(context, stream) >= 0,
                        source_.Reader().MediaTime(StampOf(*packet), context.streams[stream]->time_base),
                        *end);
        if (!queues_.Add(std::move(packet), end))
            return;
    }
    changed_.notify_all();
}

std::optional<int64_t> Demuxer::EndOf(const AVPacket& packet) const {
    if (StampOf(packet) == AV_NOPTS_VALUE)
        return std::nullopt;
    return source_.Reader().MediaTime(EndStampOf(packet),
                                      source_.Reader().Context()->streams[packet.stream_index]->time_base);
}

} // namespace movieconv
