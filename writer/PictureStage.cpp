#include "writer/PictureStage.h"

extern "C" {
#include <libavutil/imgutils.h>
}

#include <algorithm>
#include <optional>
#include <utility>

namespace writer {
namespace {

constexpr size_t kMostPictures = 1; // they are large

av::Frame CopyPicture(FramePool& pool, const VideoImage& image) {
    const bool deep = image.nFormat == kPictureFormatPlanar420Deep;
    av::Frame frame = pool.Get(deep ? AV_PIX_FMT_YUV420P10 : AV_PIX_FMT_YUV420P, image.nWidth, image.nHeight);
    const int sampleBytes = deep ? 2 : 1;
    const int chromaBytes = (image.nWidth + 1) / 2 * sampleBytes;
    const int chromaHeight = (image.nHeight + 1) / 2;
    av_image_copy_plane(frame->data[0], frame->linesize[0], image.pY, image.nPitchY,
                        image.nWidth * sampleBytes, image.nHeight);
    av_image_copy_plane(frame->data[1], frame->linesize[1], image.pU, image.nPitchU, chromaBytes,
                        chromaHeight);
    av_image_copy_plane(frame->data[2], frame->linesize[2], image.pV, image.nPitchV, chromaBytes,
                        chromaHeight);
    return frame;
}

} // namespace

PictureStage::PictureStage(const PicturePlan& plan, EncoderFlags flags)
    : plan_(plan),
      encoder_(*plan.codec, plan.settings, flags, plan.clock.ticksPerPicture,
               plan.end && plan.codec->looksAhead.at(static_cast<std::size_t>(plan.settings.speed)) > 0),
      pacer_(plan.clock, plan.keepStamps),
      scaler_(plan.scaling),
      thread_(kMostPictures, 0,
              {L"MediaWriter::The conversion waits for the picture encoder",
               L"MediaWriter::The picture encoder waits for the conversion"}) {
    if (plan.tickBefore)
        pacer_.ContinueAfter(*plan.tickBefore);
}

void PictureStage::Start(PacketTaker take, Shown shown, StageFailure failed) {
    take_ = std::move(take);
    shown_ = std::move(shown);
    thread_.Start([this] { Run(); }, std::move(failed));
}

bool PictureStage::Push(const VideoImage& image, int64_t time, int64_t stay) {
    if (!thread_.Queue().WaitForRoom())
        return false;
    return thread_.Queue().Push({CopyPicture(pool_, image), time, stay});
}

void PictureStage::Run() {
    av::Frame open; // the picture whose showing is still open
    int64_t end = 0;
    while (std::optional<Picture> picture = thread_.Queue().Pop()) {
        int64_t time = picture->time;
        const bool cuts = !isCut_ && plan_.end && time >= *plan_.end;
        if (cuts)
            time = *plan_.end;
        if (cuts && pacer_.AnswersAtOnce())
            Cut();
        end = time + picture->stay;
        const PicturePacer::Showing showing = pacer_.Add(time);
        // At once where possible: most of the picture is still in the processor's cache then.
        if (pacer_.AnswersAtOnce())
            Show(std::move(picture->frame), showing, StayInTicks(showing, time, end));
        else
            Show(std::exchange(open, std::move(picture->frame)), showing, plan_.clock.ticksPerPicture);
        if (cuts && !pacer_.AnswersAtOnce()) // what was shown now is the picture before
            Cut();
    }
    if (!isCut_)
        Show(std::move(open), pacer_.Finish(plan_.end.value_or(end), plan_.end.has_value()),
             plan_.clock.ticksPerPicture);
    RepeatAtEnd();
    encoder_.Finish(take_);
}

void PictureStage::Cut() {
    encoder_.CutHere(take_);
    isCut_ = true;
}

/// How long a picture that keeps its stamp stays if it is the last one; of a piece as if others came behind
/// it.
int64_t PictureStage::StayInTicks(const PicturePacer::Showing& showing, int64_t time, int64_t end) const {
    if (!plan_.end)
        return pacer_.Stay(showing.tick, time, end - time);
    return std::min<int64_t>(pacer_.Stay(showing.tick, time, *plan_.end - time), plan_.clock.ticksPerPicture);
}

/// Does nothing without a picture.
void PictureStage::Show(av::Frame picture, const PicturePacer::Showing& showing, int64_t stay) {
    if (!picture)
        return;
    const int64_t repeated = showing.count > 0 ? RepeatUntil(showing.tick) : 0;
    if (!isCut_)
        shown_(repeated + showing.count, std::max<int64_t>(0, repeated + showing.count - 1));
    if (showing.count == 0)
        return;
    picture = scaler_.Convert(std::move(picture));
    if (plan_.toPalette)
        picture = palette_.Convert(std::move(picture));
    for (int64_t i = 0; i < showing.count; ++i)
        encoder_.Encode(*picture, showing.tick + i * plan_.clock.ticksPerPicture, stay, take_);
    lastTick_ = showing.tick + (showing.count - 1) * plan_.clock.ticksPerPicture;
    lastStay_ = stay;
    last_ = plan_.codec->longest > 0 || StaysLong(stay) ? std::move(picture) : nullptr;
}

/// Shows the last picture again for as long as the file cannot say; returns how often.
int64_t PictureStage::RepeatUntil(int64_t tick) {
    const int64_t longest = av_rescale_q(plan_.codec->longest, {1, 1}, plan_.clock.tick);
    int64_t count = 0;
    for (; longest > 0 && last_ && tick - lastTick_ > longest; ++count)
        encoder_.Encode(*last_, lastTick_ += longest, longest, take_);
    return count;
}

bool PictureStage::StaysLong(int64_t stay) const {
    const int64_t usual = plan_.clock.ticksPerPicture;
    return stay - usual > (usual == 1 ? 0 : av_rescale_q(1, {1, 1}, plan_.clock.tick));
}

/// Most files tell nowhere how long their last picture stays, or where few look: one that stays for long
/// comes once more.
void PictureStage::RepeatAtEnd() {
    if (!last_ || plan_.codec->longest > 0 || !StaysLong(lastStay_))
        return;
    const int64_t usual = plan_.clock.ticksPerPicture;
    encoder_.Encode(*last_, lastTick_ + lastStay_ - usual, usual, take_);
    shown_(1, 1);
}

} // namespace writer
