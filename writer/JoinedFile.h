// One output file made of pieces: what their encoders gave, in one order, behind each other, through the same
// multiplexer and finisher as any other file.
#ifndef MOVIECONV_WRITER_JOINEDFILE_H
#define MOVIECONV_WRITER_JOINEDFILE_H

#include "media/EncodeParam.h"
#include "media/MediaRecords.h"
#include "writer/FilePlan.h"
#include "writer/FileRecord.h"
#include "writer/FileSystem.h"
#include "writer/PartFile.h"
#include "writer/PieceFile.h"
#include "writer/TargetClaim.h"

#include <cstdint>
#include <functional>
#include <memory>
#include <string>
#include <vector>

namespace writer {

class JoinedFile {
public:
    struct Parts {
        std::vector<std::string> pictures; ///< In their order, at least one.
        std::string rest;
        int64_t sourceBegin;                ///< Of the first picture, in 100 ns units.
        std::function<bool(double)> goesOn; ///< Told the share done; false ends the work.
    };

    /// Creates the temporary file beside `target`. Throws WriterFailure, and leaves nothing behind then.
    JoinedFile(const std::string& target, const EncodeParam& param, const VideoFormat* video,
               const AudioFormat* audio, std::shared_ptr<FileRecord> record, FileSystem& files, Parts parts);
    JoinedFile(const JoinedFile&) = delete;
    JoinedFile& operator=(const JoinedFile&) = delete;
    ~JoinedFile();

    /// Writes and finishes it; true when it is complete under its name.
    bool Write();

private:
    class PictureRow;
    class RestRow;

    void AddStreams();
    void Merge();
    void AddPictures(const PieceTotals& totals);
    void TakeRest(const PieceTotals& totals);

    const FilePlan plan_;
    const std::string target_;
    const TargetClaim claim_;
    const std::shared_ptr<FileRecord> record_;
    FileSystem& files_;
    const Parts parts_;
    PartFile part_;
    std::unique_ptr<PictureRow> pictures_;
    std::vector<std::unique_ptr<RestRow>> rest_; ///< One a stream.
    std::vector<AVRational> units_;              ///< Of the streams' times.
};

} // namespace writer

#endif
