// The five functions of the media writer, and those of its status header for sets and their files: no
// exception leaves them.
#include "media/MediaWriter.h"

#include "api/Version.h"
#include "ffmpeg/Loudspeakers.h"
#include "text/Utf8.h"
#include "writer/FilePlan.h"
#include "writer/FormatTable.h"
#include "writer/Guarded.h"
#include "writer/JoinedFile.h"
#include "writer/MediaFile.h"
#include "writer/OptionSets.h"
#include "writer/SoundEncoder.h"
#include "writer/WriterStatus.h"

#include <exception>
#include <memory>
#include <string>

namespace {

using writer::Extras;
using writer::FileRecord;
using writer::Guarded;
using writer::JoinedFile;
using writer::MediaFile;
using writer::OptionSet;
using writer::OptionSets;
using writer::WriterFailure;

/// The file that this thread created or closed last.
thread_local std::shared_ptr<const FileRecord> t_record;

void Refuse(FileRecord& record, const WriterFailure& failure) {
    record.Fail(failure);
    record.Update([](WriterStatus& status) { status.nState = kWriterFileFailed; });
    record.Tell(kWriterEventRefused);
}

/// A file of the set that `param` names, made by `make`, which gets its target and its record. Null, and
/// told, when it cannot be made.
template <class File, class Make>
std::unique_ptr<File> Create(const wchar_t* fileName, const EncodeParam* param, Make make) {
    std::shared_ptr<OptionSet> set = OptionSets::Instance().Named(param);
    const bool known = set != nullptr;
    if (!known) // the refusal has to be told somewhere
        set = OptionSets::Instance().Find(kWriterDefaultSet);
    std::shared_ptr<FileRecord> record;
    try {
        const std::string target = fileName == nullptr ? std::string() : text::ToUtf8(fileName);
        t_record.reset();
        record = set->Open(target);
        t_record = record;
        if (target.empty() || param == nullptr)
            throw WriterFailure(kWriterErrorArgument, "There is no file name, or there are no parameters.");
        if (!known)
            throw WriterFailure(kWriterErrorArgument, "The parameters name options that are not registered.");
        std::unique_ptr<File> file = make(target, record);
        record->Tell(kWriterEventOpened);
        return file;
    } catch (...) {
        const WriterFailure failure = writer::FailureOf(std::current_exception());
        FileRecord unlisted = set->Unlisted(); // where there is no memory for a record
        Refuse(record ? *record : unlisted, failure);
        return nullptr;
    }
}

/// Throws WriterFailure when the record makes no sense.
JoinedFile::Parts PartsOf(const WriterJoin* join) {
    constexpr int kLeastPieces = 2; // one with pictures, and the rest
    if (join == nullptr || join->nSize < sizeof *join || join->nPieces < kLeastPieces ||
        join->pszPieces == nullptr)
        throw WriterFailure(kWriterErrorArgument, "There are no pieces to join.");
    JoinedFile::Parts parts;
    parts.pictures.assign(join->pszPieces, join->pszPieces + join->nPieces - 1);
    parts.rest = join->pszPieces[join->nPieces - 1];
    parts.sourceBegin = join->llSourceBegin;
    if (join->pfnGoesOn != nullptr)
        parts.goesOn = [join](double share) { return join->pfnGoesOn(join->pContext, share) != 0; };
    return parts;
}

int CopyStatus(const std::shared_ptr<const FileRecord>& record, WriterStatus* status) {
    return record && writer::CopyStatus(record->Snapshot(), status) ? 1 : 0;
}

/// What `call` gives of the set; 0 when there is none of that number.
template <typename Call>
int WithSet(uint32_t number, Call call) noexcept {
    return Guarded(0, [&] {
        const std::shared_ptr<OptionSet> set = OptionSets::Instance().Find(number);
        return set ? call(*set) : 0;
    });
}

} // namespace

const FileFormatInfo* MWGetFileFormatInfos(void) {
    return Guarded<const FileFormatInfo*>(nullptr, [] { return writer::FileFormatInfos(); });
}

void* MWCreateMediaFile(const wchar_t* fileName, const EncodeParam* param, const VideoFormat* video,
                        const AudioFormat* audio) {
    return Guarded<void*>(nullptr, [&]() -> void* {
        const auto make = [&](const std::string& target, const std::shared_ptr<FileRecord>& record) {
            return std::make_unique<MediaFile>(target, *param, video, audio, record, writer::SystemFiles());
        };
        return Create<MediaFile>(fileName, param, make).release();
    });
}

int MWWriteVideoFrame(void* file, const VideoImage* image) {
    return Guarded(0, [&] {
        return file != nullptr && image != nullptr && static_cast<MediaFile*>(file)->WriteVideo(*image) ? 1
                                                                                                        : 0;
    });
}

int MWWriteAudioData(void* file, const AudioFrame* frame) {
    return Guarded(0, [&] {
        return file != nullptr && frame != nullptr && static_cast<MediaFile*>(file)->WriteAudio(*frame) ? 1
                                                                                                        : 0;
    });
}

int MWCloseMediaFile(void* file, ProgressCallback /*callback*/, void* /*context*/) {
    const std::unique_ptr<MediaFile> owned(static_cast<MediaFile*>(file));
    if (owned)
        t_record = owned->Record();
    return Guarded(0, [&] { return owned && owned->Close() ? 1 : 0; });
}

uint32_t MWRegisterOptions(const WriterOptions* options) {
    return Guarded<uint32_t>(0, [&] {
        const auto known = writer::ReadOptions(options);
        return known ? OptionSets::Instance().Register(*known) : 0;
    });
}

int MWSetOptions(uint32_t set, const WriterOptions* options) {
    return WithSet(set, [&](OptionSet& found) {
        const auto known = writer::ReadOptions(options);
        if (known)
            found.SetOptions(*known);
        return known ? 1 : 0;
    });
}

int MWUnregisterOptions(uint32_t set) {
    return Guarded(0, [&] { return OptionSets::Instance().Unregister(set) ? 1 : 0; });
}

int MWGetFileCount(uint32_t set) {
    return WithSet(set, [](OptionSet& found) { return found.Count(); });
}

int MWGetFileStatus(uint32_t set, int sequence, WriterStatus* status) {
    return WithSet(set, [&](OptionSet& found) { return CopyStatus(found.Find(sequence), status); });
}

int MWGetLastFailure(uint32_t set, WriterStatus* status) {
    return WithSet(set, [&](OptionSet& found) { return CopyStatus(found.LastFailure(), status); });
}

int MWGetThreadFileStatus(WriterStatus* status) {
    return Guarded(0, [&] { return CopyStatus(t_record, status); });
}

int MWPlanTicks(const EncodeParam* param, const VideoFormat* video, const int64_t* times, int64_t count,
                int64_t* ticks) {
    return Guarded(0, [&] {
        if (param == nullptr || video == nullptr || times == nullptr || ticks == nullptr)
            return 0;
        const std::shared_ptr<OptionSet> set = OptionSets::Instance().Named(param);
        if (!set)
            return 0;
        const writer::FilePlan plan = writer::MakeFilePlan(*param, video, nullptr, set->Options(), Extras{});
        if (!plan.pictures)
            return 0;
        writer::PicturePacer pacer(plan.pictures->clock, plan.pictures->keepStamps);
        for (int64_t i = 0; i < count; ++i) {
            if (!pacer.AnswersAtOnce()) // this picture shows the one before until here
                pacer.Add(times[i]);
            ticks[i] = pacer.LastTick().value_or(kWriterNoTick);
            if (pacer.AnswersAtOnce())
                pacer.Add(times[i]);
        }
        return 1;
    });
}

int MWPlanSound(const EncodeParam* param, const AudioFormat* audio, WriterSound* sound) {
    return Guarded(0, [&] {
        if (param == nullptr || audio == nullptr || sound == nullptr || sound->nSize < sizeof *sound)
            return 0;
        WriterOptions options{};
        options.nChannelMask = sound->nChannelMask;
        const writer::FilePlan plan = writer::MakeFilePlan(*param, nullptr, audio, options, Extras{});
        const writer::SoundEncoder encoder(*plan.sound->codec, plan.sound->settings, {});
        sound->nSampleRate = encoder.Context().sample_rate;
        sound->nChannels = encoder.Context().ch_layout.nb_channels;
        sound->nChannelMask = av::SpeakersOf(encoder.Context().ch_layout);
        return 1;
    });
}

int MWJoinPieces(const wchar_t* fileName, const EncodeParam* param, const VideoFormat* video,
                 const AudioFormat* audio, const WriterJoin* join) {
    return Guarded(0, [&] {
        const auto make = [&](const std::string& target, const std::shared_ptr<FileRecord>& record) {
            return std::make_unique<JoinedFile>(target, *param, video, audio, record, writer::SystemFiles(),
                                                PartsOf(join));
        };
        const std::unique_ptr<JoinedFile> file = Create<JoinedFile>(fileName, param, make);
        return file && file->Write() ? 1 : 0;
    });
}

unsigned MWGetVersion(void) {
    return MC_VERSION;
}
