// What one output file will be: the engine's parameters, the source's figures and the host's options, checked
// and completed.
#ifndef MOVIECONV_WRITER_FILEPLAN_H
#define MOVIECONV_WRITER_FILEPLAN_H

#include "media/EncodeParam.h"
#include "media/MediaRecords.h"
#include "writer/Extras.h"
#include "writer/FormatTable.h"
#include "writer/PictureEncoder.h"
#include "writer/PicturePacer.h"
#include "writer/PictureScaler.h"
#include "writer/SoundEncoder.h"
#include "writer/WriterStatus.h"

#include <cstdint>
#include <optional>
#include <vector>

namespace writer {

struct PicturePlan {
    const PictureCodec* codec;
    PictureSettings settings;
    PictureScaler::Settings scaling;
    bool toPalette; ///< The encoder gets at most 256 colours a picture, chosen for each.
    PictureClock clock;
    bool keepStamps;       ///< Every picture is shown once at its own time; otherwise a steady rate is made.
    int64_t pictureLength; ///< Usual length of a source picture in 100 ns units.
    double mostRate;       ///< Pictures a second that can come, by the source's rate or by the file's.
    /// Of a piece: the tick of the picture shown before it, and when the first picture of the next piece
    /// comes.
    std::optional<int64_t> tickBefore;
    std::optional<int64_t> end;

    /// How long a picture stays that none follows, in 100 ns units.
    int64_t StayOf(const VideoImage& image) const;
};

struct SoundPlan {
    const SoundCodec* codec;
    SoundSettings settings;
    bool fillsStart; ///< Sound that begins late is preceded by silence: every stream begins at 0.
    /// Where there is no sound at all, one silent sample takes its place: its packet describes the stream.
    bool neverEmpty;
};

/// A track beside the engine's.
struct TrackPlan {
    const Track* track;
    std::optional<SoundPlan> sound; ///< Of one that is encoded.
};

struct FilePlan {
    const Container* container;
    std::optional<PicturePlan> pictures;
    std::optional<SoundPlan> sound;
    bool soundBeside;              ///< The engine's sound does not go in, a track does.
    std::vector<TrackPlan> tracks; ///< Those that the container carries.
    bool bitExact;
    int piece;     ///< kWriterPiece...
    double length; ///< Seconds that the file will last, about; 0: not known.

    /// Whether the file grows in fragments and gets one index when it is finished.
    bool Fragmented() const {
        return piece == kWriterPieceNone && container->kind == ContainerKind::kFragmented;
    }

    /// Whether it holds pictures. The rest of a movie in pieces does not, but follows their stamps.
    bool HoldsPictures() const { return pictures && piece != kWriterPieceRest; }
};

/// Throws WriterFailure when the parameters make no sense or do not fit together. `video` and `audio` may be
/// null: the file then goes without. `extras` outlive the plan.
FilePlan MakeFilePlan(const EncodeParam& param, const VideoFormat* video, const AudioFormat* audio,
                      const WriterOptions& options, const Extras& extras);

} // namespace writer

#endif
