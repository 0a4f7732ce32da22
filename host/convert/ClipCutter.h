// Cuts a movie into clips at exact times: clip k begins at the first picture at or after k times the clips'
// length.
//
// Each clip is a conversion of the engine of its own, for which the movie seems to end where the next clip
// begins. So no clip depends on where the one before was cut, and the error never grows.
#ifndef MOVIECONV_HOST_CONVERT_CLIPCUTTER_H
#define MOVIECONV_HOST_CONVERT_CLIPCUTTER_H

#include "host/source/Movie.h"
#include "media/Decoders.h"

#include <cstdint>
#include <optional>
#include <vector>

namespace movieconv {

/// The engine's worker calls the decoders; everything else is for the thread that drives the engine, while
/// the engine does not run.
class ClipCutter {
public:
    /// Without a clip length the movie is handed on as it is. Times are in seconds; `begin` is where the
    /// engine is going to start.
    ClipCutter(Movie& movie, double begin, std::optional<double> clipLength);
    ClipCutter(const ClipCutter&) = delete;
    ClipCutter& operator=(const ClipCutter&) = delete;

    /// Null where the movie has no such stream.
    VideoDecoder* Pictures() { return clipLength_ ? &cutPictures_ : movie_.Pictures(); }
    AudioDecoder* Sound() { return clipLength_ && movie_.Sound() != nullptr ? &cutSound_ : movie_.Sound(); }

    /// The first clip to be made is the one that begins with the picture of that stamp. Before the first
    /// picture is taken.
    void BeginAt(int64_t base);

    /// Goes on to the next clip, whose stamps begin at 0. False when there is none: every picture was handed
    /// out, or the clip was not taken to its end.
    bool Next();

    /// Seconds from the begin of the first clip to that of this one.
    double Offset() const;

    /// Where this clip begins in the source, in media time.
    int64_t Begin() const { return first_ ? begin_ : base_; }

private:
    class CutPictures final : public VideoDecoder {
    public:
        explicit CutPictures(ClipCutter& owner) : owner_(owner) {}
        VideoSourceInfo* GetVideoInfo() override;
        double Seek(double seconds, int mode) override;
        VideoImage* GetCurrentImage() override;
        int DecodeNext(int mode) override;

    private:
        ClipCutter& owner_;
        VideoImage image_{};
    };

    class CutSound final : public AudioDecoder {
    public:
        explicit CutSound(ClipCutter& owner) : owner_(owner) {}
        AudioSourceInfo* GetAudioInfo() override;
        double Seek(double seconds) override;
        AudioFrame* GetNextFrame() override;

    private:
        ClipCutter& owner_;
        AudioFrame block_{};
    };

    void Begin(int64_t base);
    int64_t SoundEnd();
    bool TakeSound();
    bool MakeSilence();
    int64_t Samples(int64_t duration) const;
    int64_t Duration(int64_t samples) const;

    Movie& movie_;
    const std::optional<int64_t> clipLength_; // times are in media time
    const int64_t begin_;
    int64_t base_ = 0; // of this clip's stamps
    int64_t end_ = 0;  // the next clip begins at the first picture from here on
    bool first_ = true;
    int64_t pictureEnd_ = 0; // of the last picture handed out
    bool picturesDone_ = false;

    AudioFrame left_{}; // sound taken from the movie and not yet handed out
    int64_t soundTime_; // where it begins
    bool soundEnded_ = false;
    std::vector<unsigned char> silence_;

    CutPictures cutPictures_{*this};
    CutSound cutSound_{*this};
};

} // namespace movieconv

#endif
