#include "writer/PartFile.h"

#include "text/Path.h"
#include "writer/Fragments.h"
#include "writer/Muxer.h"
#include "writer/PatientFile.h"
#include "writer/PieceFile.h"
#include "writer/WriterFailure.h"
#include "writer/WriterStatus.h"

#include <algorithm>
#include <cerrno>
#include <utility>

namespace writer {

std::string UsableTarget(const std::string& target, const WriterOptions& options) {
    std::string real = ResolveTarget(target);
    const int obstacle = CheckTarget(real);
    if (obstacle == EEXIST && options.bKeepExisting != 0)
        throw WriterFailure(kWriterErrorExists, "The file exists already.", EEXIST);
    if (obstacle != 0 && obstacle != EEXIST)
        throw SystemFailure(kWriterErrorOpen, obstacle, "The name belongs to something that is not a file");
    return real;
}

PartFile::PartFile(const std::string& target, const FilePlan& plan, std::shared_ptr<FileRecord> record,
                   FileSystem& files)
    : fragmented_(plan.Fragmented()), record_(std::move(record)), files_(files) {
    int error = 0;
    std::unique_ptr<ByteFile> file = CreateBeside(files_, target, path_, error);
    if (!file)
        throw SystemFailure(kWriterErrorOpen, error, "No file can be created in the folder \"%s\"",
                            text::FolderOf(target).c_str());
    try {
        file = std::make_unique<PatientFile>(
            std::move(file), [this](int64_t waiting) { return record_->AskAboutFullDisk(waiting); });
        AvioFile::Tap tap;
        if (plan.Fragmented()) {
            room_.emplace(RoomFor(plan, *record_->ExtraParts()));
            tap = [this, made = file.get()](int64_t position, const uint8_t* data, int64_t size) {
                fragments_.Take(position, data, size);
                return room_->Close(*made);
            };
        }
        io_ = std::make_unique<AvioFile>(std::move(file), AvioFile::Mode::kWrite, std::move(tap));
        if (plan.piece != kWriterPieceNone)
            packets_ = std::make_unique<PieceWriter>(*io_, *record_);
        else
            packets_ = std::make_unique<Muxer>(
                *plan.container, *io_,
                Muxer::Form{.fragmented = plan.Fragmented(), .bitExact = plan.bitExact},
                *record_->ExtraParts());
    } catch (...) {
        files_.Remove(path_);
        throw;
    }
}

PartFile::~PartFile() {
    if (!kept_)
        files_.Remove(path_);
}

void PartFile::Keep() {
    record_->SetTemporaryPath(path_);
    kept_ = true;
}

void PartFile::WriteHeader() {
    packets_->WriteHeader(room_ ? room_->Size() : 0);
    if (io_->Flush() != 0)
        throw WriterFailure(kWriterErrorWrite, "");
    TellSize();
}

void PartFile::Write(AVPacket& packet, int stream) {
    packets_->Write(packet, stream);
    TellSize();
}

void PartFile::WriteTrailer() {
    packets_->WriteTrailer();
    const int error = io_->Flush();
    TellSize();
    if (error != 0)
        throw WriterFailure(kWriterErrorWrite, "");
}

int64_t PartFile::CutToWhole() {
    io_->Flush();
    const int64_t size = io_->Size();
    const int64_t whole = fragmented_ ? WholeFragments(*File(), size) : packets_->WholeSize(size);
    const int64_t left = whole < size && File()->Truncate(whole) >= 0 ? whole : size;
    record_->Update([left](WriterStatus& status) { status.llBytesWritten = left; });
    return left;
}

void PartFile::Remove() {
    files_.Remove(path_);
    record_->SetTemporaryPath("");
}

WriterFailure PartFile::Explain(const std::exception_ptr& error) const noexcept {
    if (const int code = io_->Error(); code != 0)
        return SystemFailure(kWriterErrorWrite, code, "Writing to \"%s\" failed after %lld bytes",
                             path_.c_str(), static_cast<long long>(io_->Size()));
    return FailureOf(error);
}

void PartFile::TellSize() {
    record_->Update([this](WriterStatus& status) { status.llBytesWritten = io_->Size(); });
}

} // namespace writer
