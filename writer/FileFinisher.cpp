#include "writer/FileFinisher.h"

#include "platform/LogRoute.h"
#include "writer/Fragments.h"
#include "writer/Mp4Index.h"
#include "writer/WriterFailure.h"
#include "writer/WriterStatus.h"

#include <algorithm>
#include <cstring>
#include <exception>

namespace writer {
namespace {

/// Shares of the finishing work that precede and follow the index.
constexpr double kDrainedShare = 0.3;
constexpr double kIndexedShare = 0.9;

/// Finishing is told in steps of at least this share.
constexpr double kTellStep = 0.02;

} // namespace

void FileFinisher::Finish() {
    Progress(kDrainedShare);
    part_.Streams().SetChapters(extras_.chapters);
    part_.WriteTrailer();
    TellLengths();
    if (plan_.Fragmented())
        FinishInPlace();
    Publish();
}

void FileFinisher::TellLengths() {
    double pictures = 0;
    double sound = 0;
    int stream = 0;
    if (plan_.HoldsPictures())
        pictures = part_.Streams().Stream(stream++).seconds;
    if (plan_.sound || plan_.soundBeside)
        sound = part_.Streams().Stream(stream).seconds;
    record_.Update([&](WriterStatus& status) {
        // Pieces are held against their plan, by number.
        status.dVideoWritten = plan_.piece == kWriterPieceNone ? pictures : status.dVideoReceived;
        // Some codecs count the padding of the last frame.
        const double encoded =
            plan_.sound ? static_cast<double>(status.llSamplesWritten) / status.nSampleRate : sound;
        status.dAudioWritten = std::min(encoded, sound);
    });
}

/// The fragmented file is a whole movie too: it takes the name when there is no room or memory for the index,
/// unless something comes with the index alone.
void FileFinisher::FinishInPlace() {
    try {
        FinishFragments(part_, plan_, extras_, [this](double share) {
            Progress(kDrainedShare + (kIndexedShare - kDrainedShare) * share);
        });
        isPlain_ = true;
    } catch (const SyncFailure&) {
        throw;
    } catch (...) {
        const WriterFailure failure = FailureOf(std::current_exception());
        if (failure.Kind() == kWriterErrorFinish || NeedsIndex(extras_))
            throw;
        WriteLog(kLogWarning, "Keeping the fragmented form of \"%s\": %s", target_.c_str(), failure.what());
    }
    TellSizeOnDisk();
}

void FileFinisher::TellSizeOnDisk() {
    const int64_t size = part_.File()->Seek(0, SEEK_END);
    record_.Update([size](WriterStatus& status) { status.llBytesWritten = size; });
}

/// Syncs the file and gives it the target's name.
void FileFinisher::Publish() {
    Progress(kIndexedShare);
    if (const int64_t result = part_.File()->Sync(); result < 0)
        throw SystemFailure(kWriterErrorFinish, static_cast<int>(-result), "Syncing \"%s\" failed",
                            part_.Path().c_str());
    const bool replace = record_.Options().bKeepExisting == 0;
    if (const int error = files_.Rename(part_.Path(), target_, replace); error != 0)
        throw SystemFailure(kWriterErrorFinish, error, "Renaming \"%s\" failed", part_.Path().c_str());
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
    if (isPlain_) { // there is nothing to cut off
        TellSizeOnDisk();
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
    if (part_.CutToWhole() == 0)
        part_.Remove();
}

void FileFinisher::Progress(double share) {
    record_.Update([share](WriterStatus& status) { status.dFinished = share; });
    if (share < toldShare_ + kTellStep)
        return;
    toldShare_ = share;
    record_.Tell(kWriterEventFinishing);
}

} // namespace writer
