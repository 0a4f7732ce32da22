#include "host/convert/RoomWatch.h"

#include "host/convert/Amounts.h"
#include "host/convert/Room.h"
#include "text/Path.h"

#include <fmt/format.h>
#include <utility>

namespace movieconv {

RoomWatch::RoomWatch(std::string output, Observer& observer)
    : output_(std::move(output)), observer_(observer) {}

void RoomWatch::CheckKnown(int64_t needed) {
    Warn(needed, FormatBytes(needed));
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
    Warn(whole.least + (whole.most - whole.least) / 2 - report.bytes,
         FormatByteRange(whole.least - report.bytes, whole.most - report.bytes) + " more");
}

/// When there is less room than for so many further bytes.
void RoomWatch::Warn(int64_t further, const std::string& needed) {
    const int64_t free = FreeBytes(text::FolderOf(output_));
    if (isSmall_ || free < 0 || free >= further)
        return;
    isSmall_ = true;
    observer_.Warned({Warning::Kind::kSmallRoom, fmt::format("\"{}\" needs about {}, but only {} are free",
                                                             output_, needed, FormatBytes(free))});
}

} // namespace movieconv
