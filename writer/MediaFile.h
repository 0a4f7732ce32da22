// One output file from its creation to its real name.
//
//     engine's worker                    encoding threads                 file
//     WriteVideo ─ copy ─ 1 picture ──> PictureStage ─┐
//                                                     ├─> Muxer (one lock) ─> NAME.part ─ Close ─> NAME
//     WriteAudio ─ copy ─ 1 s of sound ─> SoundStage ─┘
//     how far it is ────────────────────> BesideStage: further tracks, likewise
//
// The data goes to a temporary file beside the target that can be played up to wherever it ends. Closing
// encodes what is left, gives files of the MP4 family one index (a copy without encoding), syncs, and
// renames. Whatever fails before that leaves the target as it was and the temporary file playable. The first
// failure stays: the stages are cancelled, so that nobody waits for them, and nothing more is taken.
#ifndef MOVIECONV_WRITER_MEDIAFILE_H
#define MOVIECONV_WRITER_MEDIAFILE_H

#include "media/EncodeParam.h"
#include "media/MediaRecords.h"
#include "writer/BesideStage.h"
#include "writer/FilePlan.h"
#include "writer/FileRecord.h"
#include "writer/FileSystem.h"
#include "writer/Muxer.h"
#include "writer/PartFile.h"
#include "writer/PictureStage.h"
#include "writer/SoundStage.h"
#include "writer/StampNormaliser.h"
#include "writer/TargetClaim.h"

#include <cstdint>
#include <exception>
#include <memory>
#include <optional>
#include <string>
#include <vector>

namespace writer {

/// All functions are called on one thread, the engine's worker.
class MediaFile {
public:
    /// Creates the temporary file beside `target`. Throws WriterFailure, and leaves nothing behind then.
    MediaFile(const std::string& target, const EncodeParam& param, const VideoFormat* video,
              const AudioFormat* audio, std::shared_ptr<FileRecord> record, FileSystem& files);
    MediaFile(const MediaFile&) = delete;
    MediaFile& operator=(const MediaFile&) = delete;
    ~MediaFile();

    /// False when the record makes no sense, the file has no such stream, or it has failed.
    bool WriteVideo(const VideoImage& image);
    bool WriteAudio(const AudioFrame& frame);

    /// Finishes the file; true when it is complete under its real name. One that received nothing is no movie
    /// and leaves nothing behind. Nothing may be called afterwards.
    bool Close();

    const std::shared_ptr<FileRecord>& Record() const { return record_; }

private:
    void OpenStages();
    void StartPictures();
    void StartSoundIfKnown();
    bool AddSound(const AudioFrame& frame, const PcmFormat& format);
    bool PushSound();
    void Fail(const std::exception_ptr& error) noexcept;
    void CancelStages();
    void DrainStages();
    int Conclude();
    bool Empty() const;
    bool HearsSound() const { return sound_ || plan_.soundBeside; }
    void StartBeside();
    int64_t SourceBegin() const;
    int64_t EndInSource() const;
    Extras FinalExtras() const;
    void CheckRefusals();

    const FilePlan plan_;
    const std::string target_;
    const TargetClaim claim_;
    const std::shared_ptr<FileRecord> record_;
    FileSystem& files_;
    PartFile part_;
    int pictureStream_ = -1;
    int soundStream_ = -1;
    StampNormaliser stamps_;
    /// Sound whose place is not known yet, or too short a stretch to hand on.
    std::vector<SoundBlock> waiting_;
    bool soundStarted_ = false;
    bool refusedPictures_ = false; ///< Some made no sense.
    bool refusedSound_ = false;
    std::optional<int64_t> firstPicture_;  ///< Its time in the file.
    std::optional<int64_t> pictureSource_; ///< Where it stood in the source,
    std::optional<int64_t> soundSource_;   ///< and where the first sound did.
    std::unique_ptr<PictureStage> pictures_;
    std::unique_ptr<SoundStage> sound_;
    BesideStage beside_;
};

} // namespace writer

#endif
