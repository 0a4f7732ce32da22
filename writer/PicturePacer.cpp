#include "writer/PicturePacer.h"

#include "media/MediaRecords.h"

extern "C" {
#include <libavutil/mathematics.h>
}

#include <algorithm>
#include <cstdlib>

namespace writer {
namespace {

constexpr AVRational kUnit{1, kTicksPerSecond};

/// Sources whose stamps are rounded to milliseconds still mean a steady rate.
constexpr int64_t kGridTolerance = 2 * kTicksPerSecond / 1000;

} // namespace

PictureClock MakePictureClock(AVRational rate, bool wholePictures) {
    int factor = 1;
    if (wholePictures) {
        // Pictures that come seldom need not come steadily, as those of a slide show.
        constexpr double kFewest = 10;
        while (av_q2d(rate) * factor < kFewest)
            factor *= 2;
        return {rate, {rate.den, rate.num * factor}, factor};
    }
    // As fine as the usual clocks of files: a hundred microseconds or better.
    constexpr int kFinest = 10000;
    while (rate.num * factor < kFinest)
        factor *= 2;
    return {rate, {1, rate.num * factor}, rate.den * factor};
}

PicturePacer::PicturePacer(const PictureClock& clock, bool keepStamps)
    : clock_(clock), keepStamps_(keepStamps) {}

void PicturePacer::ContinueAfter(int64_t tick) {
    origin_ = 0;
    lastTick_ = tick;
}

PicturePacer::Showing PicturePacer::Add(int64_t time) {
    if (!origin_)
        origin_ = time;
    if (keepStamps_) {
        const std::optional<int64_t> tick = TickOf(time);
        if (!tick)
            return {};
        lastTick_ = tick;
        return {*tick, 1};
    }
    const int64_t index = GridIndex(time);
    const Showing showing = ShowUntil(index);
    pending_ = std::max(index, lastTick_.value_or(index - 1) + 1);
    return showing;
}

int64_t PicturePacer::Stay(int64_t tick, int64_t time, int64_t length) const {
    return PlaceBehind(tick, time + length) - tick;
}

PicturePacer::Showing PicturePacer::Finish(int64_t end, bool more) {
    // A file too short for the grid still shows a picture; otherwise one whose place is the end would only
    // make the file longer.
    const int64_t atLeast = lastTick_ || more ? 0 : pending_.value_or(0) + 1;
    return ShowUntil(std::max(GridIndex(end), atLeast));
}

/// Shows the pending picture from its place on the grid up to the place before `index`.
PicturePacer::Showing PicturePacer::ShowUntil(int64_t index) {
    if (!pending_ || index <= *pending_)
        return {};
    lastTick_ = index - 1;
    return {*pending_ * clock_.ticksPerPicture, index - *pending_};
}

int64_t PicturePacer::GridIndex(int64_t time) const {
    return av_rescale_q(time, kUnit, av_inv_q(clock_.rate));
}

int64_t PicturePacer::PictureLength() const {
    return av_rescale_q(1, av_inv_q(clock_.rate), kUnit);
}

/// On the steady grid if it is near.
int64_t PicturePacer::PlaceOf(int64_t time) const {
    const int64_t steps = GridIndex(time - *origin_);
    const int64_t onGrid = *origin_ + av_rescale_q(steps, av_inv_q(clock_.rate), kUnit);
    const int64_t tolerance = std::min(kGridTolerance, PictureLength() / 8);
    return std::abs(time - onGrid) <= tolerance
               ? av_rescale_q(*origin_, kUnit, clock_.tick) + steps * clock_.ticksPerPicture
               : av_rescale_q(time, kUnit, clock_.tick);
}

/// Where the grid's place is taken, as by a picture that a cut shortened, times are kept as they are.
int64_t PicturePacer::PlaceBehind(int64_t tick, int64_t time) const {
    const int64_t place = PlaceOf(time);
    return std::max(tick + 1, place > tick ? place : av_rescale_q(time, kUnit, clock_.tick));
}

/// Nothing for a picture that is left out: where pictures tell the time, those that come faster than the rate
/// would make it fall behind the sound.
std::optional<int64_t> PicturePacer::TickOf(int64_t time) const {
    const int64_t place = PlaceOf(time);
    const int64_t tick = lastTick_ ? PlaceBehind(*lastTick_, time) : place;
    const bool isLate = tick > place && av_rescale_q(tick, clock_.tick, kUnit) - time >= PictureLength();
    return clock_.ticksPerPicture == 1 && isLate ? std::nullopt : std::optional(tick);
}

} // namespace writer
