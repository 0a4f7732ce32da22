// What one output file will be: the engine's parameters, the source's figures and the host's options, checked
// and completed.
#ifndef MOVIECONV_WRITER_FILEPLAN_H
#define MOVIECONV_WRITER_FILEPLAN_H

#include "media/EncodeParam.h"
#include "media/MediaRecords.h"
#include "writer/Encoders.h"
#include "writer/FormatTable.h"
#include "writer/PicturePacer.h"
#include "writer/PictureScaler.h"
#include "writer/WriterStatus.h"

#include <cstdint>
#include <optional>

namespace writer {

struct VideoPlan {
    const VideoCodec* codec;
    VideoSettings settings;
    PictureScaler::Output picture;
    AVRational sourceAspect; ///< Shape of the source's pixels.
    bool sourceFullRange;
    bool stretch;
    PictureClock clock;
    bool keepStamps;       ///< Every picture is shown once at its own time; otherwise a steady rate is made.
    int64_t pictureLength; ///< Usual length of a source picture in 100 ns units.
};

struct AudioPlan {
    const AudioCodec* codec;
    AudioSettings settings;
};

struct FilePlan {
    const Container* container;
    std::optional<VideoPlan> video;
    std::optional<AudioPlan> audio;
    bool bitExact;
};

/// Throws WriterFailure when the parameters make no sense or do not fit together. `video` and `audio` may be
/// null: the file then goes without.
FilePlan MakeFilePlan(const EncodeParam& param, const VideoFormat* video, const AudioFormat* audio,
                      const WriterOptions& options);

} // namespace writer

#endif
