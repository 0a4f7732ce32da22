#include "host/convert/RoomWatch.h"

#include "host/convert/Amounts.h"
#include "host/convert/Room.h"
#include "host/sentence/Say.h"
#include "text/Path.h"

#include <utility>

namespace movieconv {
namespace {

Sentence Amount(int64_t bytes) {
    return SayAmount(FormatBytes(bytes));
}

} // namespace

RoomWatch::RoomWatch(std::string output, Observer& observer)
    : output_(std::move(output)), observer_(observer) {}

void RoomWatch::CheckKnown(int64_t needed) {
    Warn(needed, [&](const Sentence& free) {
        return Say("\"{}\" needs about {}, but only {} are free", output_, Amount(needed), free);
    });
}

void RoomWatch::Forecast() {
    forecast_.emplace();
}

void RoomWatch::Add(double position, int64_t bytes) {
    if (forecast_)
        forecast_->Add(position, bytes);
}

std::optional<ByteRange> RoomWatch::Expected(double length) const {
    return forecast_ ? forecast_->Total(length) : std::nullopt;
}

void RoomWatch::Check(const Progress& report) {
    if (!report.expected || isSmall_ || report.phase != Phase::kConverting)
        return;
    const ByteRange& whole = *report.expected;
    Warn(whole.least + (whole.most - whole.least) / 2 - report.bytes, [&](const Sentence& free) {
        return Say("\"{}\" needs about {} to {} more, but only {} are free", output_,
                   Amount(whole.least - report.bytes), Amount(whole.most - report.bytes), free);
    });
}

/// Tells when there is less room than for so many further bytes.
template <class Tell>
void RoomWatch::Warn(int64_t further, Tell tell) {
    const int64_t free = FreeBytes(text::FolderOf(output_));
    if (isSmall_ || free < 0 || free >= further)
        return;
    isSmall_ = true;
    observer_.Warned({Warning::Kind::kSmallRoom, tell(Amount(free))});
}

} // namespace movieconv
