#include "writer/JoinedFile.h"

#include "writer/FileFinisher.h"
#include "writer/WriterFailure.h"

#include <algorithm>
#include <climits>
#include <deque>
#include <exception>
#include <optional>
#include <utility>

namespace writer {
namespace {

constexpr int kNoStream = INT_MAX; // none has that number

} // namespace

/// The packets of all pictures. Each piece's encoder began anew; the decoding times are made anew over all of
/// them, as one encoder would have told them: a picture is decoded when the one that comes so many places
/// before it is shown, and evenly before the first.
class JoinedFile::PictureRow {
public:
    PictureRow(const std::vector<std::string>& pieces, int ticksPerPicture,
               std::function<void(const PieceTotals&)> told)
        : pieces_(pieces),
          ticksPerPicture_(ticksPerPicture),
          told_(std::move(told)),
          packet_(av::NewPacket()) {
        Open();
    }

    MuxedStream Description(const Container& container, const TrackLabel& label) const {
        return reader_->Stream(0, container, label);
    }

    /// The next packet, which may be taken; null at the end.
    AVPacket* Next() {
        while (!held_ && reader_) {
            if (reader_->Read(*packet_, 0)) {
                held_ = true;
                Place();
            } else {
                told_(reader_->Totals());
                Open();
            }
        }
        return held_ ? packet_.get() : nullptr;
    }
    void Taken() { held_ = false; }

    /// The share of the pieces that is behind it.
    double Share() const { return static_cast<double>(opened_) / static_cast<double>(pieces_.size() + 1); }

private:
    void Open() {
        if (opened_ == pieces_.size()) {
            reader_.reset();
            return;
        }
        const std::string& path = pieces_[opened_++];
        auto next = std::make_unique<PieceReader>(path);
        if (next->StreamCount() != 1 || (!head_.empty() && next->Head() != head_))
            throw WriterFailure(kWriterErrorRefused,
                                "\"" + path + "\" was encoded in another way than the pieces before it.");
        head_ = next->Head();
        std::vector<int64_t> shown = TimesOf(path);
        if (!shown.empty() && lastShown_ && shown.front() <= *lastShown_)
            throw WriterFailure(kWriterErrorRefused,
                                "\"" + path + "\" begins before the end of the piece before it.");
        if (!shown.empty())
            lastShown_ = shown.back();
        shown_.insert(shown_.end(), shown.begin(), shown.end());
        reader_ = std::move(next);
    }

    /// When the pictures of a piece are shown, in order.
    static std::vector<int64_t> TimesOf(const std::string& path) {
        PieceReader reader(path);
        const av::Packet packet = av::NewPacket();
        std::vector<int64_t> times;
        while (reader.Read(*packet, 0))
            times.push_back(packet->pts);
        std::sort(times.begin(), times.end());
        if (static_cast<int64_t>(times.size()) != reader.Totals().picturesWritten)
            throw WriterFailure(kWriterErrorRefused, "\"" + path + "\" does not hold all of its pictures.");
        return times;
    }

    void Place() {
        if (number_ == 0) // which is told before the first picture is shown
            delay_ = (shown_.front() - packet_->dts) / ticksPerPicture_;
        const int64_t earlier = delay_ - number_++;
        packet_->dts = shown_.front() - std::max<int64_t>(earlier, 0) * ticksPerPicture_;
        if (earlier <= 0)
            shown_.pop_front();
    }

    const std::vector<std::string>& pieces_;
    const int ticksPerPicture_;
    const std::function<void(const PieceTotals&)> told_;
    std::unique_ptr<PieceReader> reader_;
    std::size_t opened_ = 0;
    std::vector<uint8_t> head_;
    std::deque<int64_t> shown_; ///< When the pictures from the one decoded next on are shown.
    std::optional<int64_t> lastShown_;
    int64_t delay_ = 0;
    int64_t number_ = 0;
    av::Packet packet_;
    bool held_ = false;
};

/// The packets of one stream of the rest.
class JoinedFile::RestRow {
public:
    RestRow(const std::string& path, int stream) : reader_(path), stream_(stream), packet_(av::NewPacket()) {}

    MuxedStream Description(const Container& container, const TrackLabel& label) const {
        return reader_.Stream(stream_, container, label);
    }

    AVPacket* Next() {
        if (!held_ && !ended_) {
            held_ = reader_.Read(*packet_, stream_);
            ended_ = !held_;
        }
        return held_ ? packet_.get() : nullptr;
    }
    void Taken() { held_ = false; }

    /// Once its packets have ended.
    const PieceTotals& Totals() const { return reader_.Totals(); }

private:
    PieceReader reader_;
    const int stream_;
    av::Packet packet_;
    bool held_ = false;
    bool ended_ = false;
};

JoinedFile::JoinedFile(const std::string& target, const EncodeParam& param, const VideoFormat* video,
                       const AudioFormat* audio, std::shared_ptr<FileRecord> record, FileSystem& files,
                       Parts parts)
    : plan_(MakeFilePlan(param, video, audio, record->Options(), *record->ExtraParts())),
      target_(UsableTarget(target, record->Options())),
      claim_(target_),
      record_(std::move(record)),
      files_(files),
      parts_(std::move(parts)),
      part_(target_, plan_, record_, files) {
    try {
        AddStreams();
        part_.WriteHeader();
        part_.Keep();
    } catch (...) {
        throw WriterFailure(part_.Explain(std::current_exception()));
    }
}

JoinedFile::~JoinedFile() = default;

void JoinedFile::AddStreams() {
    if (!plan_.pictures)
        throw WriterFailure(kWriterErrorArgument, "Pieces are made of pictures.");
    pictures_ = std::make_unique<PictureRow>(parts_.pictures, plan_.pictures->clock.ticksPerPicture,
                                             [this](const PieceTotals& totals) { AddPictures(totals); });
    const auto add = [this](const MuxedStream& stream) {
        part_.Streams().AddStream(stream);
        units_.push_back(stream.unit);
    };
    const Extras& extras = *record_->ExtraParts();
    MuxedStream shown = pictures_->Description(*plan_.container, extras.pictures);
    shown.light = plan_.pictures->settings.light ? &*plan_.pictures->settings.light : nullptr;
    add(shown);
    record_->Update([&](WriterStatus& status) {
        status.nWidth = shown.parameters->width;
        status.nHeight = shown.parameters->height;
    });
    std::vector<const TrackLabel*> labels;
    if (plan_.sound)
        labels.push_back(&extras.sound);
    for (const TrackPlan& track : plan_.tracks)
        labels.push_back(&track.track->label);
    const int streams = PieceReader(parts_.rest).StreamCount();
    if (streams != static_cast<int>(labels.size()))
        throw WriterFailure(kWriterErrorRefused, "\"" + parts_.rest + "\" has other tracks than the file.");
    for (int stream = 0; stream < streams; ++stream) {
        rest_.push_back(std::make_unique<RestRow>(parts_.rest, stream));
        add(rest_.back()->Description(*plan_.container, *labels[static_cast<std::size_t>(stream)]));
    }
}

bool JoinedFile::Write() {
    FileFinisher finisher(part_, target_, plan_, *record_, files_);
    int state = kWriterFileFailed;
    try {
        Merge();
        record_->BeginEnd();
        const WriterStatus status = record_->Snapshot();
        finisher.SetExtras(ExtrasWithin(*record_->ExtraParts(), parts_.sourceBegin,
                                        std::max(status.dVideoReceived, status.dAudioReceived)));
        finisher.Finish();
        state = kWriterFileComplete;
    } catch (...) {
        part_.TellSize();
        if (record_->Fail(part_.Explain(std::current_exception())))
            record_->Tell(kWriterEventFailed);
        finisher.Abandon();
    }
    return record_->End(state);
}

/// Always the packet that is decoded first, of equal ones that of the stream which comes first: so the file
/// does not depend on which thread was ahead when the pieces were made.
void JoinedFile::Merge() {
    const auto earlier = [this](const AVPacket& one, int stream, const AVPacket& other, int otherStream) {
        return av_compare_ts(one.dts, units_[static_cast<std::size_t>(stream)], other.dts,
                             units_[static_cast<std::size_t>(otherStream)]) < 0;
    };
    for (;;) {
        AVPacket* first = pictures_->Next();
        int stream = 0;
        for (std::size_t i = 0; i < rest_.size(); ++i) {
            AVPacket* packet = rest_[i]->Next();
            if (packet != nullptr &&
                (first == nullptr || earlier(*packet, static_cast<int>(i) + 1, *first, stream))) {
                first = packet;
                stream = static_cast<int>(i) + 1;
            }
        }
        if (first == nullptr)
            break;
        part_.Write(*first, stream);
        if (stream > 0)
            rest_[static_cast<std::size_t>(stream) - 1]->Taken();
        else
            pictures_->Taken();
        if (parts_.goesOn && !parts_.goesOn(pictures_->Share()))
            throw WriterFailure(kWriterErrorRefused, "The joining was ended.");
    }
    RestRow rest(parts_.rest, kNoStream);
    rest.Next();
    TakeRest(rest.Totals());
}

void JoinedFile::AddPictures(const PieceTotals& totals) {
    record_->Update([&](WriterStatus& status) {
        status.llPicturesReceived += totals.picturesReceived;
        status.llPicturesWritten += totals.picturesWritten;
    });
}

/// The rest has seen the stamps of all pictures, and so tells how long they are.
void JoinedFile::TakeRest(const PieceTotals& totals) {
    record_->Update([&](WriterStatus& status) {
        status.llSamplesReceived = totals.samplesReceived;
        status.llSamplesWritten = totals.samplesWritten;
        status.dVideoReceived = static_cast<double>(totals.videoReceived) / kTotalsPerSecond;
        status.dAudioReceived = static_cast<double>(totals.audioReceived) / kTotalsPerSecond;
        status.nSampleRate = static_cast<int32_t>(totals.sampleRate);
        status.nAudioBitrate = static_cast<int32_t>(totals.audioBitrate);
    });
}

} // namespace writer
