#include "host/source/TextScript.h"
#include "ffmpeg/AvHandles.h"

#include <algorithm>
#include <array>
#include <fmt/format.h>

namespace movieconv {
namespace {

constexpr int64_t kUnknownLength = 5 * kTicksPerSecond;

std::string ScriptTime(int64_t hundredths) {
    const auto seconds = hundredths / 100;
    return fmt::format("{}:{:02}:{:02}.{:02}", seconds / 3600, seconds / 60 % 60, seconds % 60,
                       hundredths % 100);
}

/// A line of text on its own must not end the event.
std::string OneLine(std::string text) {
    text.erase(std::remove(text.begin(), text.end(), '\r'), text.end());
    for (std::size_t at = 0; (at = text.find('\n', at)) != std::string::npos;)
        text.replace(at, 1, "\\N");
    return text;
}

bool Moves(const std::string& line) {
    constexpr std::array kMarks{"\\t(", "\\move", "\\fad", "\\k", "\\K", "Banner;", "Scroll "};
    return std::any_of(kMarks.begin(), kMarks.end(),
                       [&line](const char* mark) { return line.find(mark) != std::string::npos; });
}

/// The script's part before its events, which the decoder made of the track's.
std::string HeaderOf(const AVCodecContext& decoder) {
    std::string header;
    if (decoder.subtitle_header != nullptr)
        header.assign(reinterpret_cast<const char*>(decoder.subtitle_header),
                      static_cast<std::size_t>(decoder.subtitle_header_size));
    while (!header.empty() && header.back() == '\0')
        header.pop_back();
    return header;
}

} // namespace

TextScript::TextScript(const CueList& list) {
    const av::CodecContext decoder = list.OpenDecoder({1, 1000});
    for (const CueList::Cue& cue : list.cues)
        Decode(decoder.get(), cue);
    header_ = HeaderOf(*decoder);
    std::stable_sort(events_.begin(), events_.end(),
                     [](const TextEvent& one, const TextEvent& other) { return one.begin < other.begin; });
    LastUpToNext();
}

std::set<int64_t> TextScript::BeginsThatPlace(std::vector<const TextEvent*> seen) const {
    std::set<int64_t> begins;
    while (!seen.empty()) {
        const int64_t begin = seen.back()->begin;
        seen.pop_back();
        if (!begins.insert(begin).second)
            continue;
        for (const TextEvent& other : events_) {
            if (other.begin >= begin)
                break;
            if (other.end > begin)
                seen.push_back(&other);
        }
    }
    return begins;
}

std::string TextScript::Text() const {
    std::string text = header_ +
                       "\n[Events]\n"
                       "Format: Layer, Start, End, Style, Name, MarginL, MarginR, MarginV, Effect, Text\n";
    for (const TextEvent& event : events_) {
        const std::size_t comma = event.line.find(',');
        text += fmt::format("Dialogue: {},{},{}{}\n", event.line.substr(0, comma), ScriptTime(event.begin),
                            ScriptTime(event.end), event.line.substr(comma));
    }
    return text;
}

void TextScript::Decode(AVCodecContext* decoder, const CueList::Cue& cue) {
    const av::Packet packet = av::CopyOf(*cue.packet);
    packet->pts = packet->dts = 0;
    AVSubtitle decoded{};
    int got = 0;
    av::CheckMemory(avcodec_decode_subtitle2(decoder, &decoded, &got, packet.get()));
    for (unsigned i = 0; got != 0 && i < decoded.num_rects; ++i)
        if (decoded.rects[i]->ass != nullptr)
            Add(cue, decoded.rects[i]->ass);
    avsubtitle_free(&decoded);
}

void TextScript::Add(const CueList::Cue& cue, const std::string& coded) {
    const auto hundredths = [](int64_t time) { return (time + kHundredth / 2) / kHundredth; };
    const std::size_t order = coded.find(','); // of reading, which does not belong into a script
    if (order == std::string::npos || coded.find(',', order + 1) == std::string::npos || cue.end < 0)
        return;
    const std::string line = OneLine(coded.substr(order + 1));
    const int64_t begin = std::max<int64_t>(cue.begin, 0);
    events_.push_back({hundredths(begin), hundredths(cue.end > begin ? cue.end : begin), line, Moves(line)});
}

void TextScript::LastUpToNext() {
    for (std::size_t i = 0; i < events_.size(); ++i) {
        if (events_[i].end > events_[i].begin)
            continue;
        const auto next =
            std::find_if(events_.begin() + static_cast<std::ptrdiff_t>(i), events_.end(),
                         [&](const TextEvent& other) { return other.begin > events_[i].begin; });
        const int64_t latest = events_[i].begin + kUnknownLength / kHundredth;
        events_[i].end = next != events_.end() ? std::min(next->begin, latest) : latest;
    }
}

} // namespace movieconv
