#include "writer/BesideStage.h"

#include "media/MediaRecords.h"
#include "writer/CueTracks.h"
#include "writer/SoundPackets.h"
#include "writer/SoundStage.h"
#include "writer/WriterFailure.h"

#include <algorithm>
#include <utility>

namespace writer {
namespace {

constexpr size_t kMostSteps = 8;
constexpr int64_t kStep = kTicksPerSecond / 10;

/// Sound that is encoded as the engine's is.
class EncodedSound final : public TrackStage {
public:
    EncodedSound(const TrackPlan& plan, const Container& container, EncoderFlags flags)
        : plan_(plan),
          carriage_(FindCarriage(container, plan.sound->codec->code)),
          stage_(*plan.sound, flags),
          parameters_(av::NewParameters()) {
        av::CheckMemory(avcodec_parameters_from_context(parameters_.get(), &stage_.Encoder()));
    }

    MuxedStream Stream() const override {
        const AVCodecContext& encoder = stage_.Encoder();
        return {.parameters = parameters_.get(),
                .unit = {1, encoder.sample_rate},
                .runUp = encoder.initial_padding,
                .carriage = &carriage_,
                .label = &plan_.track->label};
    }

    void Start(PacketTaker take, StageFailure failed) override {
        take_ = std::move(take);
        failed_ = std::move(failed);
    }

    bool Take(const WriterTrackItem& item, int64_t time) override {
        const AudioFrame& frame = *item.pSound;
        const PcmFormat format{frame.nSampleRate, frame.nChannels, frame.nBitsPerSample};
        if (!format.Valid() || frame.pData == nullptr || frame.nLength <= 0)
            return true;
        int64_t skipped = 0; // bytes before the file's begin
        if (!started_) {
            const int64_t early = av_rescale(-time, format.rate, kTicksPerSecond);
            skipped = early > kRounding ? early * format.BytesPerFrame() : 0;
            if (skipped >= frame.nLength)
                return true;
            Begin(early < -kRounding ? time : 0);
        }
        return stage_.Push({format, {frame.pData + skipped, frame.pData + frame.nLength}});
    }

    void Finish() override {
        if (!started_ && plan_.sound->neverEmpty)
            Begin(0);
        stage_.Finish();
    }
    void Cancel() override { stage_.Cancel(); }
    void Join() override { stage_.Join(); }

private:
    static constexpr int64_t kRounding = 2; // samples by which a track may miss the begin of its file

    void Begin(int64_t time) {
        started_ = true;
        stage_.Start(
            time, take_, [](int) {}, failed_);
    }

    const TrackPlan& plan_;
    const Carriage& carriage_;
    SoundStage stage_;
    av::CodecParameters parameters_;
    PacketTaker take_;
    StageFailure failed_;
    bool started_ = false;
};

/// Makes what the plan says, for the container. Throws WriterFailure.
std::unique_ptr<TrackStage> MakeTrackStage(const TrackPlan& plan, const Container& container,
                                           EncoderFlags flags, bool isFirst) {
    if (plan.sound)
        return std::make_unique<EncodedSound>(plan, container, flags);
    if (IsSound(*plan.track))
        return MakeSoundPackets(*plan.track, container, isFirst);
    return MakeCueTrack(*plan.track, container);
}

} // namespace

BesideStage::BesideStage()
    : thread_(kMostSteps, 0,
              {L"MediaWriter::The conversion waits for further tracks",
               L"MediaWriter::Further tracks wait for the conversion"}) {}

BesideStage::~BesideStage() {
    Cancel();
    Join();
}

void BesideStage::Add(const TrackPlan& plan, const Container& container, EncoderFlags flags, bool isFirst,
                      PacketWriter& file) {
    std::unique_ptr<TrackStage> stage = MakeTrackStage(plan, container, flags, isFirst);
    const int stream = file.AddStream(stage->Stream());
    tracks_.push_back({&plan, stream, std::move(stage)});
}

void BesideStage::Start(int64_t begin, const std::function<void(AVPacket& packet, int stream)>& write,
                        const StageFailure& failed) {
    begin_ = begin;
    for (Entry& track : tracks_)
        track.stage->Start([write, stream = track.stream](AVPacket& packet) { write(packet, stream); },
                           failed);
    thread_.Start([this] { Run(); }, failed);
}

void BesideStage::Reach(int64_t sourceTime) {
    if (!Started() || sourceTime < reached_ + kStep)
        return;
    reached_ = sourceTime;
    thread_.Queue().Push({sourceTime, false});
}

void BesideStage::Finish(int64_t sourceTime) {
    if (Started())
        thread_.Queue().Push({sourceTime, true});
    thread_.Finish();
}

void BesideStage::Cancel() {
    thread_.Cancel();
    for (Entry& track : tracks_)
        track.stage->Cancel();
}

void BesideStage::Join() {
    thread_.Join();
    for (Entry& track : tracks_)
        track.stage->Join();
}

void BesideStage::Run() {
    while (const std::optional<Step> step = thread_.Queue().Pop())
        for (Entry& track : tracks_)
            Read(track, *step);
    for (Entry& track : tracks_)
        track.stage->Finish();
}

void BesideStage::Read(Entry& track, const Step& step) {
    const auto next = [&](WriterTrackItem& item) {
        return track.plan->track->next(track.plan->track->context, step.time, step.closing ? 1 : 0, &item) !=
               0;
    };
    WriterTrackItem item{};
    while (!thread_.Cancelled() && next(item)) {
        if (track.plan->sound ? item.pSound == nullptr : item.pPacket == nullptr)
            throw WriterFailure(kWriterErrorArgument, "The reader of a further track gave nothing.");
        if (!track.stage->Take(item, item.llTime - *begin_))
            return;
    }
    if (!step.closing)
        track.stage->Reach(std::min(step.time, item.llTime) - *begin_);
}

} // namespace writer
