#include "writer/FileFinisher.h"

#include "platform/LogRoute.h"
#include "writer/AvioFile.h"
#include "writer/Fragments.h"
#include "writer/WriterFailure.h"
#include "writer/WriterStatus.h"

#include <algorithm>
#include <cstring>
#include <exception>
#include <utility>

namespace writer {
namespace {

/// Shares of the finishing work that precede and follow the copy of the data.
constexpr double kDrainedShare = 0.3;
constexpr double kCopiedShare = 0.9;

/// Finishing is told in steps of at least this share.
constexpr double kTellStep = 0.02;

} // namespace

void FileFinisher::Finish() {
    Progress(kDrainedShare);
    part_.Streams().SetChapters(extras_.chapters);
    part_.WriteTrailer();
    TellLengths();
    if (plan_.Fragmented())
        FinishFragments();
    else
        Publish(part_.Path(), *part_.File());
}

void FileFinisher::TellLengths() {
    double pictures = 0;
    double sound = 0;
    int stream = 0;
    if (plan_.pictures)
        pictures = part_.Streams().Stream(stream++).seconds;
    if (plan_.sound)
        sound = part_.Streams().Stream(stream).seconds;
    record_.Update([&](WriterStatus& status) {
        status.dVideoWritten = pictures;
        // Some codecs count the padding of the last frame.
        const double encoded =
            plan_.sound ? static_cast<double>(status.llSamplesWritten) / status.nSampleRate : 0.0;
        status.dAudioWritten = std::min(encoded, sound);
    });
}

/// Gives the data its final form in a second file. The fragmented one is a whole movie too: it takes the name
/// when there is no room for both.
void FileFinisher::FinishFragments() {
    int error = 0;
    std::string path;
    std::unique_ptr<ByteFile> file = CreateBeside(files_, target_, ".joined.part", path, error);
    if (file) {
        try {
            JoinInto(path, std::move(file));
            files_.Remove(part_.Path());
            return;
        } catch (...) {
            files_.Remove(path);
            const WriterFailure failure = FailureOf(std::current_exception());
            if (failure.Kind() == kWriterErrorFinish)
                throw;
            WriteLog(kLogWarning, "Keeping the fragmented form of \"%s\": %s", target_.c_str(),
                     failure.what());
        }
    }
    Publish(part_.Path(), *part_.File());
}

void FileFinisher::JoinInto(const std::string& path, const std::shared_ptr<ByteFile>& file) {
    AvioFile out(file, AvioFile::Mode::kWrite);
    JoinFragments(part_.File(), part_.Streams(), *plan_.container, out, plan_.bitExact, extras_,
                  [this](double share) { Progress(kDrainedShare + (kCopiedShare - kDrainedShare) * share); });
    if (const int error = out.Flush(); error != 0)
        throw SystemFailure(kWriterErrorWrite, error, "Writing to \"%s\" failed", path.c_str());
    CheckIndex(file, part_.Streams());
    Publish(path, *file);
    record_.Update([&out](WriterStatus& status) { status.llBytesWritten = out.Size(); });
}

/// Syncs the file and gives it the target's name.
void FileFinisher::Publish(const std::string& path, ByteFile& file) {
    Progress(kCopiedShare);
    if (const int64_t result = file.Sync(); result < 0)
        throw SystemFailure(kWriterErrorFinish, static_cast<int>(-result), "Syncing \"%s\" failed",
                            path.c_str());
    const bool replace = record_.Options().bKeepExisting == 0;
    if (const int error = files_.Rename(path, target_, replace); error != 0)
        throw SystemFailure(kWriterErrorFinish, error, "Renaming \"%s\" failed", path.c_str());
    record_.SetTemporaryPath("");
    if (const int error = files_.SyncFolder(target_); error != 0)
        WriteLog(kLogWarning, "Syncing the folder of \"%s\" failed: %s.", target_.c_str(),
                 std::strerror(error));
}

void FileFinisher::Abandon() {
    if (record_.Options().bRemovePartial != 0) {
        part_.Remove();
        return;
    }
    // Asked for an end without what describes a stream, the multiplexer refuses, and leaks.
    if (!part_.Broken() && !part_.Streams().Empty() && part_.Streams().Describable()) {
        try {
            part_.WriteTrailer();
        } catch (...) {
            WriteLog(kLogWarning, "The end of \"%s\" is missing: %s", part_.Path().c_str(),
                     FailureOf(std::current_exception()).what());
        }
    }
    part_.CutToWhole();
}

void FileFinisher::Progress(double share) {
    record_.Update([share](WriterStatus& status) { status.dFinished = share; });
    if (share < toldShare_ + kTellStep)
        return;
    toldShare_ = share;
    record_.Tell(kWriterEventFinishing);
}

} // namespace writer
