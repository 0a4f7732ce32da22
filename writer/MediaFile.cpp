#include "writer/MediaFile.h"

#include "media/Limits.h"
#include "media/MediaRecords.h"
#include "writer/FileFinisher.h"

#include <algorithm>
#include <cerrno>
#include <cmath>
#include <cstdlib>
#include <cstring>
#include <utility>

namespace writer {
namespace {

/// Stretches of sound are handed on when they are this long, in parts of a second.
constexpr int kStretchesPerSecond = 20;

bool Usable(const VideoImage& image) {
    const int32_t format = image.nFormat;
    if (format != kPictureFormatPlanar420 && format != kPictureFormatPlanar420Deep)
        return false;
    const int sampleBytes = format == kPictureFormatPlanar420Deep ? 2 : 1;
    return image.pY != nullptr && image.pU != nullptr && image.pV != nullptr && image.nWidth > 0 &&
           image.nHeight > 0 && image.nWidth <= kLargestSide && image.nHeight <= kLargestSide &&
           std::abs(image.nPitchY) >= image.nWidth * sampleBytes &&
           std::abs(image.nPitchU) >= (image.nWidth + 1) / 2 * sampleBytes &&
           std::abs(image.nPitchV) >= (image.nWidth + 1) / 2 * sampleBytes;
}

/// What the host says in a record's reserved bytes about its place in the source.
std::optional<int64_t> SourceTime(const unsigned char* reserved) {
    WriterSourceTime time{};
    std::memcpy(&time, reserved, sizeof time);
    return time.nTag == kWriterSourceTimeTag ? std::optional(int64_t{time.llTime}) : std::nullopt;
}

PcmFormat FormatOf(const AudioFrame& frame) {
    return {frame.nSampleRate, frame.nChannels, frame.nBitsPerSample};
}

EncoderFlags FlagsFor(const FilePlan& plan) {
    const AVOutputFormat* format = av_guess_format(plan.container->muxer, nullptr, nullptr);
    return {format != nullptr && (format->flags & AVFMT_GLOBALHEADER) != 0, plan.bitExact};
}

/// `stream` without what the encoder itself tells.
int AddEncoder(PacketWriter& file, const AVCodecContext& encoder, MuxedStream stream) {
    const av::CodecParameters parameters = av::NewParameters();
    if (avcodec_parameters_from_context(parameters.get(), &encoder) < 0)
        throw std::bad_alloc();
    stream.parameters = parameters.get();
    stream.sampleAspect = encoder.sample_aspect_ratio;
    return file.AddStream(stream);
}

} // namespace

MediaFile::MediaFile(const std::string& target, const EncodeParam& param, const VideoFormat* video,
                     const AudioFormat* audio, std::shared_ptr<FileRecord> record, FileSystem& files)
    : plan_(MakeFilePlan(param, video, audio, record->Options(), *record->ExtraParts())),
      target_(UsableTarget(target, record->Options())),
      claim_(target_),
      record_(std::move(record)),
      files_(files),
      part_(target_, plan_, record_, files),
      stamps_(plan_.pictures ? plan_.pictures->pictureLength : kTicksPerSecond, plan_.pictures.has_value()) {
    try {
        OpenStages();
        part_.WriteHeader();
        StartPictures();
        part_.Keep();
    } catch (...) {
        throw WriterFailure(part_.Explain(std::current_exception()));
    }
}

MediaFile::~MediaFile() = default;

void MediaFile::OpenStages() {
    const EncoderFlags flags = FlagsFor(plan_);
    if (plan_.HoldsPictures()) {
        pictures_ = std::make_unique<PictureStage>(*plan_.pictures, flags);
        const AVCodecContext& encoder = pictures_->Encoder();
        const PictureClock& clock = plan_.pictures->clock;
        pictureStream_ = AddEncoder(
            part_.Streams(), encoder,
            {.unit = clock.tick,
             .rate = clock.rate,
             .runUp = int64_t{encoder.has_b_frames} * clock.ticksPerPicture,
             .carriage = &FindCarriage(*plan_.container, plan_.pictures->codec->code),
             .label = &record_->ExtraParts()->pictures,
             .light = plan_.pictures->settings.light ? &*plan_.pictures->settings.light : nullptr});
    }
    if (plan_.sound) {
        sound_ = std::make_unique<SoundStage>(*plan_.sound, flags);
        const AVCodecContext& encoder = sound_->Encoder();
        soundStream_ = AddEncoder(part_.Streams(), encoder,
                                  {.unit = {1, encoder.sample_rate},
                                   .runUp = encoder.initial_padding,
                                   .carriage = &FindCarriage(*plan_.container, plan_.sound->codec->code),
                                   .label = &record_->ExtraParts()->sound});
    }
    for (const TrackPlan& track : plan_.tracks)
        beside_.Add(track, *plan_.container, flags, record_->Sequence() == 1, part_.Streams());
    record_->Update([&](WriterStatus& status) {
        if (pictures_) {
            status.nWidth = pictures_->Encoder().width;
            status.nHeight = pictures_->Encoder().height;
        }
        if (sound_) {
            status.nSampleRate = sound_->Encoder().sample_rate;
            status.nAudioBitrate = static_cast<int32_t>(sound_->Encoder().bit_rate);
        }
    });
}

void MediaFile::StartPictures() {
    if (!pictures_)
        return;
    const auto shown = [this](int64_t count, int64_t repeats) {
        record_->Update([count, repeats](WriterStatus& status) {
            status.llPicturesWritten += count;
            status.llPicturesDropped += count == 0 ? 1 : 0;
            status.llPicturesRepeated += repeats;
        });
    };
    pictures_->Start([this](AVPacket& packet) { part_.Write(packet, pictureStream_); }, shown,
                     [this](const std::exception_ptr& error) { Fail(error); });
}

bool MediaFile::WriteVideo(const VideoImage& image) {
    if (!plan_.pictures || record_->Failed())
        return false;
    if (pictures_ && !Usable(image)) {
        refusedPictures_ = true;
        return false;
    }
    const int64_t begin = plan_.piece == kWriterPiecePictures ? record_->Options().llPieceBegin : 0;
    const int64_t time = begin + stamps_.AddPicture(image.llTime);
    const int64_t stay = plan_.pictures->StayOf(image);
    if (!firstPicture_) {
        firstPicture_ = time;
        pictureSource_ = SourceTime(image.reserved);
    }
    const bool isAhead = plan_.pictures->end && time >= *plan_.pictures->end; // of a piece, and not in it
    record_->Update([&](WriterStatus& status) {
        if (isAhead)
            return;
        ++status.llPicturesReceived;
        status.llStampsRepaired = stamps_.Repairs();
        status.dVideoReceived = static_cast<double>(time - *firstPicture_ + stay) / kTicksPerSecond;
    });
    try {
        StartSoundIfKnown();
        StartBeside();
        beside_.Reach(time + SourceBegin());
        return !pictures_ || pictures_->Push(image, time, stay);
    } catch (...) {
        Fail(std::current_exception());
        return false;
    }
}

bool MediaFile::WriteAudio(const AudioFrame& frame) {
    const PcmFormat format = FormatOf(frame);
    if (!HearsSound() || frame.nLength <= 0 || record_->Failed())
        return false;
    if (!format.Valid() || frame.pData == nullptr) {
        refusedSound_ = true;
        return false;
    }
    try {
        return AddSound(frame, format);
    } catch (...) {
        Fail(std::current_exception());
        return false;
    }
}

bool MediaFile::AddSound(const AudioFrame& frame, const PcmFormat& format) {
    if (stamps_.SoundLength() == 0)
        soundSource_ = SourceTime(frame.reserved);
    stamps_.AddSound(frame.llTime, frame.nLength, format.BytesPerSecond(), frame.nType == kMediaTypeSilence);
    record_->Update([&](WriterStatus& status) {
        status.llSamplesReceived += frame.nLength / format.BytesPerFrame();
        status.dAudioReceived = static_cast<double>(stamps_.SoundLength()) / kTicksPerSecond;
    });
    if (!pictures_ && stamps_.SoundStart()) {
        StartBeside();
        beside_.Reach(EndInSource());
    }
    if (!sound_)
        return true;
    if (waiting_.empty() || !(waiting_.back().format == format))
        waiting_.push_back({format, {}});
    std::vector<uint8_t>& data = waiting_.back().data;
    data.insert(data.end(), frame.pData, frame.pData + frame.nLength);
    StartSoundIfKnown();
    const bool longEnough = waiting_.size() > 1 || static_cast<int64_t>(data.size()) >=
                                                       format.BytesPerSecond() / kStretchesPerSecond;
    return !soundStarted_ || !longEnough || PushSound();
}

/// Once it is known where the file begins in the source.
void MediaFile::StartBeside() {
    if (beside_.Empty() || beside_.Started() || (HearsSound() && !stamps_.SoundStart()))
        return;
    beside_.Start(
        SourceBegin(), [this](AVPacket& packet, int stream) { part_.Write(packet, stream); },
        [this](const std::exception_ptr& error) { Fail(error); });
}

/// The source's time at time 0 of the file; the source's time is the file's where the host tells none. Sound
/// tells it better than a first picture, which may have come before it.
int64_t MediaFile::SourceBegin() const {
    if (soundSource_ && stamps_.SoundStart())
        return *soundSource_ - *stamps_.SoundStart();
    return pictureSource_ ? *pictureSource_ - firstPicture_.value_or(0) : 0;
}

/// Where the file ends in the source as it stands: with its sound, or without any with its pictures.
int64_t MediaFile::EndInSource() const {
    if (HearsSound() && stamps_.SoundLength() > 0)
        return SourceBegin() + stamps_.SoundStart().value_or(0) + stamps_.SoundLength();
    const double pictures = record_->Snapshot().dVideoReceived;
    return SourceBegin() + firstPicture_.value_or(0) + std::llround(pictures * kTicksPerSecond);
}

void MediaFile::StartSoundIfKnown() {
    if (!sound_ || soundStarted_ || !stamps_.SoundStart())
        return;
    soundStarted_ = true;
    const auto encoded = [this](int samples) {
        record_->Update([samples](WriterStatus& status) { status.llSamplesWritten += samples; });
    };
    sound_->Start(
        *stamps_.SoundStart(), [this](AVPacket& packet) { part_.Write(packet, soundStream_); }, encoded,
        [this](const std::exception_ptr& error) { Fail(error); });
}

bool MediaFile::PushSound() {
    std::vector<SoundBlock> blocks = std::exchange(waiting_, {});
    return std::all_of(blocks.begin(), blocks.end(),
                       [this](SoundBlock& block) { return sound_->Push(std::move(block)); });
}

/// The stages' threads end here too, also after std::bad_alloc: nothing is allocated.
void MediaFile::Fail(const std::exception_ptr& error) noexcept {
    if (part_.IsMissing())
        record_->SetTemporaryPath(""); // the folder was removed meanwhile
    part_.TellSize();
    if (record_->Fail(part_.Explain(error)))
        record_->Tell(kWriterEventFailed);
    CancelStages();
}

void MediaFile::CancelStages() {
    if (pictures_)
        pictures_->Cancel();
    if (sound_)
        sound_->Cancel();
    beside_.Cancel();
}

bool MediaFile::Close() {
    record_->BeginEnd();
    DrainStages();
    return record_->End(Conclude());
}

/// What the file has become: complete, failed or empty.
int MediaFile::Conclude() {
    if (!record_->Failed() && Empty()) {
        part_.Remove();
        record_->Update([](WriterStatus& status) { status.llBytesWritten = 0; });
        return kWriterFileEmpty;
    }
    FileFinisher finisher(part_, target_, plan_, *record_, files_);
    if (!record_->Failed()) {
        try {
            finisher.SetExtras(FinalExtras());
            CheckRefusals();
            finisher.Finish();
            return kWriterFileComplete;
        } catch (...) {
            Fail(std::current_exception());
        }
    }
    finisher.Abandon();
    return kWriterFileFailed;
}

Extras MediaFile::FinalExtras() const {
    const WriterStatus status = record_->Snapshot();
    const double end =
        std::max(static_cast<double>(firstPicture_.value_or(0)) / kTicksPerSecond + status.dVideoReceived,
                 status.dAudioReceived);
    return ExtrasWithin(*record_->ExtraParts(), SourceBegin(), end);
}

/// A stream of which nothing was fit to be taken fails the file: it would look complete without it.
void MediaFile::CheckRefusals() {
    const WriterStatus status = record_->Snapshot();
    if (refusedPictures_ && status.llPicturesReceived == 0)
        throw WriterFailure(kWriterErrorRefused,
                            "No picture could be taken: each had another format than planar "
                            "4:2:0, a missing plane, or a size or pitch that makes no sense.");
    if (refusedSound_ && status.llSamplesReceived == 0)
        throw WriterFailure(kWriterErrorRefused,
                            "No sound could be taken: each block had a format that makes no "
                            "sense, or no data.");
}

bool MediaFile::Empty() const {
    const WriterStatus status = record_->Snapshot();
    return status.llPicturesReceived == 0 && status.llSamplesReceived == 0;
}

void MediaFile::DrainStages() {
    try {
        stamps_.Finish();
        if (!Empty())
            StartBeside();
        if ((!waiting_.empty() || (plan_.sound && plan_.sound->neverEmpty)) && !record_->Failed()) {
            StartSoundIfKnown();
            PushSound();
        }
    } catch (...) {
        Fail(std::current_exception());
    }
    if (pictures_)
        pictures_->Finish();
    if (sound_)
        sound_->Finish();
    beside_.Finish(EndInSource());
    if (pictures_)
        pictures_->Join();
    if (sound_)
        sound_->Join();
    beside_.Join();
    if (plan_.soundBeside) // what came was made longer than the track, which has no silence
        record_->Update([this](WriterStatus& status) { status.dAudioReceived = beside_.Seconds(); });
}

} // namespace writer
