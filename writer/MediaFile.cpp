#include "writer/MediaFile.h"

#include "media/MediaRecords.h"
#include "text/Path.h"
#include "writer/Fragments.h"

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <utility>

namespace writer {
namespace {

constexpr int kPlanar420 = kPictureFormatPlanar420;

/// Stretches of sound are handed on when they are this long, in parts of a second.
constexpr int kStretchesPerSecond = 20;

/// Shares of the finishing work that precede and follow the copy of the data.
constexpr double kDrainedShare = 0.3;
constexpr double kCopiedShare = 0.9;

/// Finishing is told in steps of at least this share.
constexpr double kTellStep = 0.02;

bool Usable(const VideoImage& image) {
    return image.nFormat == kPlanar420 && image.pY != nullptr && image.pU != nullptr && image.pV != nullptr &&
           image.nWidth > 0 && image.nHeight > 0 && image.nWidth <= 32768 && image.nHeight <= 32768 &&
           std::abs(image.nPitchY) >= image.nWidth && std::abs(image.nPitchU) >= (image.nWidth + 1) / 2 &&
           std::abs(image.nPitchV) >= (image.nWidth + 1) / 2;
}

PcmFormat FormatOf(const AudioFrame& frame) {
    return {frame.nSampleRate, frame.nChannels, frame.nBitsPerSample};
}

bool IsFragmented(const FilePlan& plan) {
    return plan.container->kind == ContainerKind::kFragmented;
}

/// Whether the file cannot be finished without a packet of sound, which describes the codec.
bool NeedsSound(const FilePlan& plan) {
    return IsFragmented(plan) && plan.audio && plan.audio->codec->id == AV_CODEC_ID_AC3;
}

EncoderFlags FlagsFor(const FilePlan& plan) {
    const AVOutputFormat* format = av_guess_format(plan.container->muxer, nullptr, nullptr);
    return {format != nullptr && (format->flags & AVFMT_GLOBALHEADER) != 0, plan.bitExact};
}

int AddEncoder(Muxer& muxer, const AVCodecContext& context, AVRational unit, AVRational rate, int64_t runUp) {
    const av::CodecParameters parameters(avcodec_parameters_alloc());
    if (!parameters || avcodec_parameters_from_context(parameters.get(), &context) < 0)
        throw std::bad_alloc();
    return muxer.AddStream({parameters.get(), unit, rate, context.sample_aspect_ratio, runUp});
}

} // namespace

MediaFile::MediaFile(const std::string& target, const EncodeParam& param, const VideoFormat* video,
                     const AudioFormat* audio, std::shared_ptr<FileRecord> record, FileSystem& files)
    : plan_(MakeFilePlan(param, video, audio, record->Options())),
      target_(ResolveTarget(target)),
      record_(std::move(record)),
      files_(files),
      stamps_(plan_.video ? plan_.video->pictureLength : kTicksPerSecond, plan_.video.has_value()) {
    const int obstacle = CheckTarget(target_);
    if (obstacle == EEXIST && record_->Options().bKeepExisting != 0)
        throw WriterFailure(kWriterErrorExists, "The file exists already.", EEXIST);
    if (obstacle != 0 && obstacle != EEXIST)
        throw SystemFailure(kWriterErrorOpen, obstacle, "The name belongs to something that is not a file");
    try {
        OpenPart();
        OpenStages();
        StartPictures();
    } catch (...) {
        if (!partPath_.empty())
            files_.Remove(partPath_);
        throw WriterFailure(Explain(std::current_exception()));
    }
    record_->SetTemporaryPath(partPath_);
}

MediaFile::~MediaFile() = default;

void MediaFile::OpenPart() {
    int error = 0;
    std::string path;
    std::unique_ptr<ByteFile> file = CreateBeside(files_, target_, ".part", path, error);
    if (!file)
        throw SystemFailure(kWriterErrorOpen, error, "No file can be created in the folder \"%s\"",
                            text::FolderOf(target_).c_str());
    partPath_ = std::move(path);
    part_ = std::make_unique<AvioFile>(std::move(file), AvioFile::Mode::kWrite,
                                       [this] { return record_->AskAboutFullDisk(); });
}

void MediaFile::OpenStages() {
    const EncoderFlags flags = FlagsFor(plan_);
    muxer_ = std::make_unique<Muxer>(*plan_.container, *part_, IsFragmented(plan_), plan_.bitExact);
    if (plan_.video) {
        pictures_ = std::make_unique<PictureStage>(*plan_.video, flags);
        const AVCodecContext& encoder = pictures_->Encoder();
        const PictureClock& clock = plan_.video->clock;
        pictureStream_ = AddEncoder(*muxer_, encoder, clock.tick, clock.rate,
                                    int64_t{encoder.has_b_frames} * clock.ticksPerPicture);
    }
    if (plan_.audio) {
        const bool fillsStart = plan_.container->kind == ContainerKind::kSteadyRate;
        sound_ = std::make_unique<SoundStage>(*plan_.audio, flags, fillsStart, NeedsSound(plan_));
        const AVCodecContext& encoder = sound_->Encoder();
        soundStream_ =
            AddEncoder(*muxer_, encoder, {1, encoder.sample_rate}, {0, 1}, encoder.initial_padding);
    }
    muxer_->WriteHeader();
    if (part_->Flush() != 0)
        throw WriterFailure(kWriterErrorWrite, "");
    record_->Update([&](WriterStatus& status) {
        status.llBytesWritten = part_->Size();
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
    const auto shown = [this](int64_t count) {
        record_->Update([count](WriterStatus& status) {
            status.llPicturesWritten += count;
            status.llPicturesDropped += count == 0 ? 1 : 0;
            status.llPicturesRepeated += std::max<int64_t>(0, count - 1);
        });
    };
    pictures_->Start([this](AVPacket& packet) { Write(packet, pictureStream_); }, shown,
                     [this](const std::exception_ptr& error) { Fail(error); });
}

bool MediaFile::WriteVideo(const VideoImage& image) {
    if (!pictures_ || !Usable(image) || record_->Failed())
        return false;
    const int64_t time = stamps_.AddPicture(image.llTime);
    firstPicture_ = firstPicture_.value_or(time);
    record_->Update([&](WriterStatus& status) {
        ++status.llPicturesReceived;
        status.llStampsRepaired = stamps_.Repairs();
        status.dVideoReceived =
            static_cast<double>(time - *firstPicture_ + plan_.video->pictureLength) / kTicksPerSecond;
    });
    try {
        StartSoundIfKnown();
        return pictures_->Push(image, time);
    } catch (...) {
        Fail(std::current_exception());
        return false;
    }
}

bool MediaFile::WriteAudio(const AudioFrame& frame) {
    const PcmFormat format = FormatOf(frame);
    if (!sound_ || !format.Valid() || frame.pData == nullptr || frame.nLength <= 0 || record_->Failed())
        return false;
    try {
        return AddSound(frame, format);
    } catch (...) {
        Fail(std::current_exception());
        return false;
    }
}

bool MediaFile::AddSound(const AudioFrame& frame, const PcmFormat& format) {
    stamps_.AddSound(frame.llTime, frame.nLength, format.BytesPerSecond(), frame.nType == kMediaTypeSilence);
    record_->Update([&](WriterStatus& status) {
        status.llSamplesReceived += frame.nLength / format.BytesPerFrame();
        status.dAudioReceived = static_cast<double>(stamps_.SoundLength()) / kTicksPerSecond;
    });
    if (waiting_.empty() || !(waiting_.back().format == format))
        waiting_.push_back({format, {}});
    std::vector<uint8_t>& data = waiting_.back().data;
    data.insert(data.end(), frame.pData, frame.pData + frame.nLength);
    StartSoundIfKnown();
    const bool longEnough = waiting_.size() > 1 || static_cast<int64_t>(data.size()) >=
                                                       format.BytesPerSecond() / kStretchesPerSecond;
    return !soundStarted_ || !longEnough || PushSound();
}

void MediaFile::StartSoundIfKnown() {
    if (!sound_ || soundStarted_ || !stamps_.SoundStart())
        return;
    soundStarted_ = true;
    const auto encoded = [this](int samples) {
        record_->Update([samples](WriterStatus& status) { status.llSamplesWritten += samples; });
    };
    sound_->Start(
        *stamps_.SoundStart(), [this](AVPacket& packet) { Write(packet, soundStream_); }, encoded,
        [this](const std::exception_ptr& error) { Fail(error); });
}

bool MediaFile::PushSound() {
    std::vector<SoundBlock> blocks = std::exchange(waiting_, {});
    return std::all_of(blocks.begin(), blocks.end(),
                       [this](SoundBlock& block) { return sound_->Push(std::move(block)); });
}

void MediaFile::Write(AVPacket& packet, int stream) {
    muxer_->Write(packet, stream);
    record_->Update([this](WriterStatus& status) { status.llBytesWritten = part_->Size(); });
}

/// The failure in the terms of the status header. A failed file explains more than what the multiplexer made
/// of it.
WriterFailure MediaFile::Explain(const std::exception_ptr& error) const noexcept {
    if (const int code = part_ ? part_->Error() : 0; code != 0)
        return SystemFailure(kWriterErrorWrite, code, "Writing to \"%s\" failed after %lld bytes",
                             partPath_.c_str(), static_cast<long long>(part_->Size()));
    return FailureOf(error);
}

/// The stages' threads end here too, where there is no memory: nothing is allocated.
void MediaFile::Fail(const std::exception_ptr& error) noexcept {
    if (files_.IsMissing(partPath_))
        record_->SetTemporaryPath(""); // the folder was removed meanwhile
    if (record_->Fail(Explain(error)))
        record_->Tell(kWriterEventFailed);
    CancelStages();
}

void MediaFile::CancelStages() {
    if (pictures_)
        pictures_->Cancel();
    if (sound_)
        sound_->Cancel();
}

bool MediaFile::Close() {
    record_->Update([](WriterStatus& status) { status.nState = kWriterFileFinishing; });
    record_->Tell(kWriterEventFinishing);
    DrainStages();
    const int state = Conclude();
    record_->Update([state](WriterStatus& status) {
        status.nState = state;
        status.dFinished = state == kWriterFileComplete ? 1.0 : status.dFinished;
    });
    record_->Tell(kWriterEventClosed);
    return state == kWriterFileComplete;
}

/// What the file has become: complete, failed or empty.
int MediaFile::Conclude() {
    if (!record_->Failed() && Empty()) {
        RemovePart();
        record_->Update([](WriterStatus& status) { status.llBytesWritten = 0; });
        return kWriterFileEmpty;
    }
    if (!record_->Failed()) {
        try {
            FinishPart();
            return kWriterFileComplete;
        } catch (...) {
            Fail(std::current_exception());
        }
    }
    CloseFailed();
    return kWriterFileFailed;
}

bool MediaFile::Empty() const {
    const WriterStatus status = record_->Snapshot();
    return status.llPicturesReceived == 0 && status.llSamplesReceived == 0;
}

void MediaFile::DrainStages() {
    try {
        stamps_.Finish();
        if ((!waiting_.empty() || NeedsSound(plan_)) && !record_->Failed()) {
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
    if (pictures_)
        pictures_->Join();
    if (sound_)
        sound_->Join();
}

void MediaFile::FinishPart() {
    Progress(kDrainedShare);
    muxer_->WriteTrailer();
    if (part_->Flush() != 0)
        throw WriterFailure(kWriterErrorWrite, "");
    const double pictures = pictureStream_ < 0 ? 0.0 : muxer_->Stream(pictureStream_).seconds;
    const double sound = soundStream_ < 0 ? 0.0 : muxer_->Stream(soundStream_).seconds;
    record_->Update([&](WriterStatus& status) {
        status.llBytesWritten = part_->Size();
        status.dVideoWritten = pictures;
        // Some codecs count the padding of the last frame.
        const double encoded =
            sound_ ? static_cast<double>(status.llSamplesWritten) / status.nSampleRate : 0.0;
        status.dAudioWritten = std::min(encoded, sound);
    });
    if (!IsFragmented(plan_)) {
        Publish(partPath_, *part_->File());
        return;
    }
    JoinPart();
}

/// Gives the data its final form in a second file. The fragmented one is a whole movie too: it takes the name
/// when there is no room for both.
void MediaFile::JoinPart() {
    int error = 0;
    std::string path;
    std::unique_ptr<ByteFile> file = CreateBeside(files_, target_, ".joined.part", path, error);
    if (file) {
        try {
            JoinInto(path, std::move(file));
            files_.Remove(partPath_);
            return;
        } catch (...) {
            files_.Remove(path);
            const WriterFailure failure = FailureOf(std::current_exception());
            if (failure.Kind() == kWriterErrorFinish)
                throw;
            WriteLog("Keeping the fragmented form of \"%s\": %s", target_.c_str(), failure.what());
        }
    }
    Publish(partPath_, *part_->File());
}

void MediaFile::JoinInto(const std::string& path, const std::shared_ptr<ByteFile>& file) {
    AvioFile out(file, AvioFile::Mode::kWrite);
    JoinFragments(part_->File(), *muxer_, *plan_.container, out, plan_.bitExact,
                  [this](double share) { Progress(kDrainedShare + (kCopiedShare - kDrainedShare) * share); });
    if (const int error = out.Flush(); error != 0)
        throw SystemFailure(kWriterErrorWrite, error, "Writing to \"%s\" failed", path.c_str());
    CheckIndex(file, *muxer_);
    Publish(path, *file);
    record_->Update([&out](WriterStatus& status) { status.llBytesWritten = out.Size(); });
}

/// Syncs the file and gives it the target's name.
void MediaFile::Publish(const std::string& path, ByteFile& file) {
    Progress(kCopiedShare);
    if (const int64_t result = file.Sync(); result < 0)
        throw SystemFailure(kWriterErrorFinish, static_cast<int>(-result), "Syncing \"%s\" failed",
                            path.c_str());
    const bool replace = record_->Options().bKeepExisting == 0;
    if (const int error = files_.Rename(path, target_, replace); error != 0)
        throw SystemFailure(kWriterErrorFinish, error, "Renaming \"%s\" failed", path.c_str());
    record_->SetTemporaryPath("");
    if (const int error = files_.SyncFolder(target_); error != 0)
        WriteLog("Syncing the folder of \"%s\" failed: %s.", target_.c_str(), std::strerror(error));
}

void MediaFile::RemovePart() {
    files_.Remove(partPath_);
    record_->SetTemporaryPath("");
}

/// Leaves the temporary file in a form that players take, or removes it.
void MediaFile::CloseFailed() {
    if (record_->Options().bRemovePartial != 0) {
        RemovePart();
        return;
    }
    // Asked for an end without what describes the sound, the multiplexer refuses, and leaks.
    const bool describable = !NeedsSound(plan_) || muxer_->Stream(soundStream_).packets > 0;
    if (part_->Error() == 0 && !muxer_->Empty() && describable) {
        try {
            muxer_->WriteTrailer();
            part_->Flush();
        } catch (...) {
            WriteLog("The end of \"%s\" is missing: %s", partPath_.c_str(),
                     FailureOf(std::current_exception()).what());
        }
    }
    const int64_t size = IsFragmented(plan_) ? CutToWholeFragments(*part_->File()) : part_->Size();
    record_->Update([size](WriterStatus& status) { status.llBytesWritten = std::max<int64_t>(0, size); });
}

void MediaFile::Progress(double share) {
    record_->Update([share](WriterStatus& status) { status.dFinished = share; });
    if (share < toldShare_ + kTellStep)
        return;
    toldShare_ = share;
    record_->Tell(kWriterEventFinishing);
}

} // namespace writer
