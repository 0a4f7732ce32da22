// The five functions of the media writer and the functions of its status header: no exception leaves them.
#include "media/MediaWriter.h"

#include "api/Version.h"
#include "text/Utf8.h"
#include "writer/FormatTable.h"
#include "writer/MediaFile.h"
#include "writer/StatusBoard.h"
#include "writer/WriterStatus.h"

#include <exception>
#include <memory>
#include <string>

namespace {

using writer::FileRecord;
using writer::MediaFile;
using writer::StatusBoard;
using writer::WriterFailure;

/// The result of `call`; `otherwise` when it throws.
template <typename Result, typename Call>
Result Guarded(Result otherwise, Call call) noexcept {
    try {
        return call();
    } catch (...) {
        return otherwise;
    }
}

void Refuse(FileRecord& record, const WriterFailure& failure) {
    record.Fail(failure);
    record.Update([](WriterStatus& status) { status.nState = kWriterFileFailed; });
    record.Tell(kWriterEventRefused);
}

MediaFile* Create(const wchar_t* fileName, const EncodeParam* param, const VideoFormat* video,
                  const AudioFormat* audio) {
    std::shared_ptr<FileRecord> record;
    try {
        const std::string target = fileName == nullptr ? std::string() : text::ToUtf8(fileName);
        record = StatusBoard::Instance().Open(target);
        if (target.empty() || param == nullptr)
            throw WriterFailure(kWriterErrorArgument, "There is no file name, or there are no parameters.");
        auto file = std::make_unique<MediaFile>(target, *param, video, audio, record, writer::SystemFiles());
        record->Tell(kWriterEventOpened);
        return file.release();
    } catch (...) {
        const WriterFailure failure = writer::FailureOf(std::current_exception());
        FileRecord unlisted(0, "",
                            StatusBoard::Instance().Options()); // where there is no memory for a record
        Refuse(record ? *record : unlisted, failure);
        return nullptr;
    }
}

int CopyStatus(const std::shared_ptr<const FileRecord>& record, WriterStatus* status) {
    if (!record || status == nullptr)
        return 0;
    *status = record->Snapshot();
    return 1;
}

} // namespace

const FileFormatInfo* MWGetFileFormatInfos(void) {
    return Guarded<const FileFormatInfo*>(nullptr, [] { return writer::FileFormatInfos(); });
}

void* MWCreateMediaFile(const wchar_t* fileName, const EncodeParam* param, const VideoFormat* video,
                        const AudioFormat* audio) {
    return Guarded<void*>(nullptr, [&] { return Create(fileName, param, video, audio); });
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
    return Guarded(0, [&] { return owned && owned->Close() ? 1 : 0; });
}

void MWSetWriterOptions(const WriterOptions* options) {
    StatusBoard::Instance().SetOptions(options != nullptr ? *options : WriterOptions{});
}

uint32_t MWFindCodec(uint32_t format, uint32_t code, int forSound) {
    const writer::Container* container = writer::FindContainer(format);
    if (container == nullptr)
        return 0;
    if (forSound != 0) {
        const writer::AudioCodec* codec = writer::FindAudioCodec(*container, code);
        return codec != nullptr && writer::FindEncoder(*codec, 16) != nullptr ? codec->code : 0;
    }
    const writer::VideoCodec* codec = writer::FindVideoCodec(*container, code);
    return codec != nullptr && writer::FindEncoder(*codec) != nullptr ? codec->code : 0;
}

int MWGetFileCount(void) {
    return StatusBoard::Instance().Count();
}

int MWGetFileStatus(int sequence, WriterStatus* status) {
    return Guarded(0, [&] { return CopyStatus(StatusBoard::Instance().Find(sequence), status); });
}

int MWGetLastFailure(WriterStatus* status) {
    return Guarded(0, [&] { return CopyStatus(StatusBoard::Instance().LastFailure(), status); });
}

unsigned MWGetVersion(void) {
    return MC_VERSION;
}
