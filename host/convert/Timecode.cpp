#include "host/convert/Timecode.h"

#include "ffmpeg/ExactRate.h"
#include "host/convert/CodecPlan.h"
#include "host/convert/Formats.h"
#include "host/sentence/Say.h"
#include "writer/WriterStatus.h"

#include <algorithm>
#include <array>
#include <cmath>
#include <cstddef>
#include <cstdlib>
#include <fmt/format.h>
#include <utility>
#include <vector>

extern "C" {
#include <libavutil/timecode.h>
}

namespace movieconv {
namespace {

constexpr const char* kKey = "timecode";

const std::string* Find(const std::vector<Tag>& tags) {
    const auto found =
        std::find_if(tags.begin(), tags.end(), [](const Tag& tag) { return IsTimecode(tag.key); });
    return found != tags.end() ? &found->value : nullptr;
}

/// That of the source's first picture: "01:00:00:00", or "01:00:00;00" where numbers are left out.
const std::string* TimecodeOf(const SourceInfo& source) {
    if (source.pictures)
        if (const std::string* told =
                Find(source.streams[static_cast<std::size_t>(source.pictures->index)].tags))
            return told;
    if (const std::string* told = Find(source.tags))
        return told;
    for (const StreamInfo& stream : source.streams)
        if (const std::string* told = Find(stream.tags); told != nullptr && stream.kind == StreamKind::kData)
            return told;
    return nullptr;
}

/// The request's, or the source's; null when none is wanted.
const std::string* FindTimecode(const SourceInfo& source, const Request& request) {
    if (const std::string* wish = Find(request.metadata))
        return wish->empty() ? nullptr : wish;
    return request.noMetadata ? nullptr : TimecodeOf(source);
}

/// Numbers are left out where there are not quite 30 or 60 pictures a second.
bool CanDrop(double rate) {
    const AVRational exact = av::ExactRate(rate);
    return exact.den == 1001 && (exact.num == 30000 || exact.num == 60000);
}

/// Whether `text` is a timecode of pictures at that rate.
bool Parse(const std::string& text, double rate, AVTimecode& timecode) {
    constexpr double kMost = 1000;
    return rate >= 1 && rate <= kMost &&
           av_timecode_init_from_string(&timecode, av::ExactRate(rate), text.c_str(), nullptr) >= 0;
}

/// With the pictures within its second counted at another rate.
std::string AtRate(std::string text, double from, double to) {
    const std::size_t mark = text.find_last_of(":;");
    const int most = static_cast<int>(std::lround(to)) - 1;
    const int picture =
        static_cast<int>(std::atoi(text.c_str() + mark + 1) * std::round(to) / std::round(from));
    const char separator = text[mark] == ';' && CanDrop(to) ? ';' : ':';
    text.resize(mark);
    return fmt::format("{}{}{:02}", text, separator, std::clamp(picture, 0, std::max(most, 0)));
}

/// That of the first picture at or after `time`, in seconds from the start of the source, in an output with
/// `rate` pictures a second. Empty when `timecode` makes no sense.
std::string TimecodeAt(const std::string& timecode, const SourceInfo& source, double time, double rate) {
    constexpr double kRounding = 0.0006; // seconds: there are containers whose stamps count milliseconds
    const double own = source.pictures->frameRate;
    AVTimecode counted{};
    if (!Parse(timecode, own, counted))
        return {};
    const double begin = source.streams[static_cast<std::size_t>(source.pictures->index)].begin.value_or(0);
    const double pictures = std::max(std::ceil((time - begin - kRounding) * own), 0.0);
    std::array<char, AV_TIMECODE_STR_SIZE> text{};
    counted.flags |= AV_TIMECODE_FLAG_24HOURSMAX;
    av_timecode_make_string(&counted, text.data(), static_cast<int>(pictures));
    return std::abs(rate - own) < 0.001 * own ? text.data() : AtRate(text.data(), own, rate);
}

bool HasPictures(const SourceInfo& source, const Request& request) {
    return source.pictures && !request.noVideo;
}

} // namespace

bool IsTimecode(const std::string& key) {
    return SameIgnoringCase(key, kKey);
}

bool HoldsTheTimecode(const SourceInfo& source, const StreamInfo& stream) {
    const std::string* own = Find(stream.tags);
    const std::string* told = TimecodeOf(source);
    return stream.kind == StreamKind::kData && own != nullptr && told != nullptr && *own == *told;
}

std::optional<NotCarried> WhyTimecodeStays(const SourceInfo& source, const Request& request,
                                           const FileFormatInfo& format) {
    const std::string* timecode = FindTimecode(source, request);
    if (timecode == nullptr)
        return std::nullopt;
    Sentence reason;
    if (!Has(format, kWriterFormatTimecode))
        reason = Say("{} cannot hold it", ShortName(format));
    else if (!HasPictures(source, request))
        reason = Say("it belongs to the pictures");
    else if (AVTimecode counted{}; !Parse(*timecode, source.pictures->frameRate, counted))
        reason = Say("\"{}\" makes no sense", *timecode);
    else
        return std::nullopt;
    return NotCarried{kKey, std::nullopt, {}, {}, std::move(reason)};
}

void CarryTimecode(const SourceInfo& source, const Request& request, const FileFormatInfo& format,
                   uint32_t set, double time) {
    const std::string* timecode = FindTimecode(source, request);
    if (timecode == nullptr || WhyTimecodeStays(source, request, format))
        return;
    const double own = source.pictures->frameRate;
    const double rate = PlanPictures(request, format, *source.pictures).frameRate.value_or(own);
    MWSetTrackTag(set, kWriterTrackPictures, kKey,
                  TimecodeAt(*timecode, source, time, rate > 0 ? rate : own).c_str());
}

} // namespace movieconv
