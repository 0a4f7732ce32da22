// A source with its decoders: everything of the movie that one conversion needs.
#ifndef MOVIECONV_HOST_SOURCE_MOVIE_H
#define MOVIECONV_HOST_SOURCE_MOVIE_H

#include "host/source/BesideTracks.h"
#include "host/source/Demuxer.h"
#include "host/source/Failures.h"
#include "host/source/PictureDecoder.h"
#include "host/source/PictureStamps.h"
#include "host/source/SoundDecoder.h"
#include "host/source/Source.h"
#include "host/source/SubtitleBurner.h"

#include <memory>
#include <optional>
#include <string>
#include <vector>

namespace movieconv {

class Movie {
public:
    /// Opens the movie and its decoders. `interruption` ends this, too. Throws SourceError.
    Movie(const std::string& path, const SourceChoice& choice,
          std::shared_ptr<Interruption> interruption = std::make_shared<Interruption>());

    const SourceInfo& Info() const { return source_.Info(); }

    /// Whether its pictures are handed out as HDR.
    bool KeepsHdr() const { return choice_.keepHdr && pictures_ && IsHdr(*Info().pictures); }

    /// The content of a cover or an attachment; empty for other streams. Only before the conversion.
    std::vector<uint8_t> StoredFile(int stream) const { return source_.StoredFile(stream); }

    /// Null when the movie has no such stream or it was not asked for.
    VideoDecoder* Pictures() { return stamps_ ? static_cast<VideoDecoder*>(stamps_.get()) : pictures_.get(); }
    AudioDecoder* Sound() { return sound_.get(); }

    /// The picture handed out last, null without one. Once the conversion has ended.
    const VideoImage* LastPicture() const { return pictures_ ? pictures_->Last() : nullptr; }

    /// PictureDecoder::TimeOfNext; nothing without pictures.
    std::optional<int64_t> TimeOfNextPicture() { return pictures_ ? pictures_->TimeOfNext() : std::nullopt; }

    /// Leaves out the pictures from that time on, where the engine would write one more; EndAt the sound,
    /// too, of which it would write the rest of a block. Only before the conversion.
    void EndPicturesAt(double seconds);
    void EndAt(double seconds);

    /// The streams that go into the output beside Pictures() and Sound().
    BesideTracks& Beside() { return beside_; }

    /// Source::ParametersOf. Only before the conversion.
    av::CodecParameters ParametersOf(int stream) const { return source_.ParametersOf(stream); }

    /// Ends both streams at once, so that nobody waits for a slow source. Any thread.
    void Stop();

    /// Seconds of sound handed out since the begin time; 0 without sound. Any thread.
    double SoundSeconds() const { return sound_ ? sound_->SecondsDelivered() : 0; }

    /// Why reading ended before the end of the source; empty when it did not. Any thread.
    Sentence ReadError() const { return failures_.First(); }

    /// What the source promises and does not hold, of the streams that were taken to their end; nothing when
    /// it holds all. Once both streams ended.
    std::optional<Shortfall> Missing() const;

    /// Of Missing what was read but could not be decoded, up to where it was to end.
    std::optional<Shortfall> Undecoded() const;

    /// Pieces of picture data that were skipped. Once the pictures ended.
    int64_t DamagedPictures() const { return pictures_ ? pictures_->Damaged() : 0; }

    /// Where only stamps are read: whether the current picture's was put right, and how many pictures had
    /// none, once they ended.
    bool StampIsRepaired() const { return stamps_ && stamps_->IsRepaired(); }
    int64_t UnstampedPictures() const { return stamps_ ? stamps_->Unstamped() : 0; }

    /// When the first of the subtitles that are drawn began that is still shown at `time`, in media time.
    int64_t DrawnSince(int64_t time) const { return burner_ ? burner_->ShownSince(time) : time; }

    /// Times that the source's clock jumped and was put right. Once the pictures ended.
    int ClockJumps() const { return demuxer_.ClockJumps(); }

    /// What its pictures do not have any more as they are handed out, a sentence each. Once they ended.
    std::vector<Sentence> Losses() const;

    /// What was wrong with the movie and has been put right or skipped, a sentence each. Once both streams
    /// ended.
    std::vector<Sentence> Complaints() const;

private:
    Promise ShownByStructure() const;
    std::optional<Shortfall> LateShortfall(const Reached& ends) const;

    const SourceChoice choice_;
    Source source_;
    std::unique_ptr<SubtitleBurner> burner_; // where subtitles are to be seen in the pictures
    Failures failures_;
    Demuxer demuxer_;
    std::unique_ptr<PictureDecoder> pictures_;
    std::unique_ptr<PictureStamps> stamps_; // instead of pictures_
    std::unique_ptr<SoundDecoder> sound_;
    BesideTracks beside_;
    std::optional<double> end_; // of the pictures that are wanted, in seconds
};

} // namespace movieconv

#endif
