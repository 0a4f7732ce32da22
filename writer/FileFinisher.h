// How an output that everything was written to gets its final form and its name, and what becomes of one that
// failed.
#ifndef MOVIECONV_WRITER_FILEFINISHER_H
#define MOVIECONV_WRITER_FILEFINISHER_H

#include "writer/FilePlan.h"
#include "writer/FileRecord.h"
#include "writer/FileSystem.h"
#include "writer/PartFile.h"

#include <string>
#include <utility>

namespace writer {

/// Whatever fails leaves the target as it was and the temporary file playable. Its parameters outlive it.
class FileFinisher {
public:
    FileFinisher(PartFile& part, const std::string& target, const FilePlan& plan, FileRecord& record,
                 FileSystem& files)
        : part_(part), target_(target), plan_(plan), record_(record), files_(files) {}

    /// What the file carries, chapters on its own timeline.
    void SetExtras(Extras extras) { extras_ = std::move(extras); }

    /// Writes the end, gives files of the MP4 family one index, syncs, and renames. Throws WriterFailure.
    void Finish();

    /// Leaves the temporary file of one that failed in a form that players take, or removes it.
    void Abandon();

private:
    void FinishInPlace();
    void Publish();
    void TellLengths();
    void TellSizeOnDisk();
    void Progress(double share);

    PartFile& part_;
    const std::string& target_;
    const FilePlan& plan_;
    FileRecord& record_;
    FileSystem& files_;
    Extras extras_;
    double toldShare_ = 0;
    bool isPlain_ = false; // has the form of a finished file of the MP4 family
};

} // namespace writer

#endif
