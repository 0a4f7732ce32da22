#include "ffmpeg/FilterGraph.h"
#include "ffmpeg/FilterLibrary.h"
#include "host/sentence/Say.h"
#include "host/source/CueDrawer.h"
#include "host/source/MediaTime.h"
#include "host/source/SourceError.h"

#include <algorithm>
#include <array>
#include <cmath>
#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <fmt/format.h>
#include <fstream>
#include <optional>
#include <set>
#include <system_error>
#include <utility>

namespace movieconv {
namespace {

constexpr int64_t kHundredth = kTicksPerSecond / 100; // the unit of the times in a script
constexpr AVRational kMicrosecond{1, 1'000'000};
constexpr int64_t kUnknownLength = 5 * kTicksPerSecond;

struct Event {
    int64_t begin; // hundredths
    int64_t end;
    std::string line; // "Layer,Style,Name,MarginL,MarginR,MarginV,Effect,Text" with the times left out
    bool moves;       // is not the same at all times
};

/// A script and its fonts in a folder that lasts until the script has been read.
class ScriptFolder {
public:
    ScriptFolder(const std::string& script, const std::vector<FontFile>& fonts) : path_(NewFolder()) {
        try {
            Write("script.ass", script.data(), script.size());
            for (std::size_t i = 0; i < fonts.size(); ++i)
                Write(std::to_string(i), fonts[i].data(), fonts[i].size());
        } catch (...) {
            Remove();
            throw;
        }
    }
    ~ScriptFolder() { Remove(); }
    ScriptFolder(const ScriptFolder&) = delete;
    ScriptFolder& operator=(const ScriptFolder&) = delete;

    const std::string& Path() const { return path_; }

private:
    static std::string NewFolder() {
        std::error_code error;
        std::string path = (std::filesystem::temp_directory_path(error) / "movieconv-XXXXXX").string();
        if (!error && mkdtemp(path.data()) == nullptr)
            error = {errno, std::generic_category()};
        if (error)
            throw ScratchError(Say("cannot make a folder for the subtitles: {}", error.message()));
        return path;
    }

    void Remove() const {
        std::error_code ignored;
        std::filesystem::remove_all(path_, ignored);
    }

    void Write(const std::string& name, const void* data, std::size_t size) const {
        std::ofstream file(path_ + "/" + name, std::ios::binary);
        file.write(static_cast<const char*>(data), static_cast<std::streamsize>(size));
        if (!file.flush())
            throw ScratchError(Say("cannot write the subtitles to \"{}\"", path_));
    }

    const std::string path_;
};

/// A value as it stands in a chain of filters: quoted once for the option and once for the chain.
std::string Quoted(const std::string& value) {
    const auto escape = [](const std::string& text, const char* special) {
        std::string escaped;
        for (const char letter : text) {
            if (std::strchr(special, letter) != nullptr)
                escaped += '\\';
            escaped += letter;
        }
        return escaped;
    };
    return escape(escape(value, "\\':"), "\\'[],;");
}

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

/// The events of a list as one script has them, in the order of their begins.
class Script {
public:
    explicit Script(const CueList& list) : decoder_(list.OpenDecoder({1, 1000})) {
        for (const CueList::Cue& cue : list.cues)
            Decode(cue);
        std::stable_sort(events_.begin(), events_.end(),
                         [](const Event& one, const Event& other) { return one.begin < other.begin; });
        LastUpToNext();
    }

    const std::vector<Event>& Events() const { return events_; }

    std::string Text() const {
        std::string text;
        if (decoder_->subtitle_header != nullptr)
            text.assign(reinterpret_cast<const char*>(decoder_->subtitle_header),
                        static_cast<std::size_t>(decoder_->subtitle_header_size));
        while (!text.empty() && text.back() == '\0')
            text.pop_back();
        text += "\n[Events]\n"
                "Format: Layer, Start, End, Style, Name, MarginL, MarginR, MarginV, Effect, Text\n";
        for (const Event& event : events_) {
            const std::size_t comma = event.line.find(',');
            text += fmt::format("Dialogue: {},{},{}{}\n", event.line.substr(0, comma),
                                ScriptTime(event.begin), ScriptTime(event.end), event.line.substr(comma));
        }
        return text;
    }

private:
    void Decode(const CueList::Cue& cue) {
        const av::Packet packet = av::CopyOf(*cue.packet);
        packet->pts = packet->dts = 0;
        AVSubtitle decoded{};
        int got = 0;
        av::CheckMemory(avcodec_decode_subtitle2(decoder_.get(), &decoded, &got, packet.get()));
        for (unsigned i = 0; got != 0 && i < decoded.num_rects; ++i)
            if (decoded.rects[i]->ass != nullptr)
                Add(cue, decoded.rects[i]->ass);
        avsubtitle_free(&decoded);
    }

    void Add(const CueList::Cue& cue, const std::string& coded) {
        const auto hundredths = [](int64_t time) { return (time + kHundredth / 2) / kHundredth; };
        const std::size_t order = coded.find(','); // of reading, which does not belong into a script
        if (order == std::string::npos || coded.find(',', order + 1) == std::string::npos || cue.end < 0)
            return;
        const std::string line = OneLine(coded.substr(order + 1));
        const int64_t begin = std::max<int64_t>(cue.begin, 0);
        events_.push_back(
            {hundredths(begin), hundredths(cue.end > begin ? cue.end : begin), line, Moves(line)});
    }

    void LastUpToNext() {
        for (std::size_t i = 0; i < events_.size(); ++i) {
            if (events_[i].end > events_[i].begin)
                continue;
            const auto next =
                std::find_if(events_.begin() + static_cast<std::ptrdiff_t>(i), events_.end(),
                             [&](const Event& other) { return other.begin > events_[i].begin; });
            const int64_t latest = events_[i].begin + kUnknownLength / kHundredth;
            events_[i].end = next != events_.end() ? std::min(next->begin, latest) : latest;
        }
    }

    av::CodecContext decoder_;
    std::vector<Event> events_;
};

class TextDrawer final : public CueDrawer {
public:
    TextDrawer(const CueList& list, const PictureStreamInfo& pictures, const std::vector<FontFile>& fonts)
        : script_(list),
          width_(pictures.width),
          height_(pictures.height),
          shownWidth_(std::max(2, static_cast<int>(std::lround(width_ * PixelShape(pictures))))) {
        if (!script_.Events().empty())
            Drawing([&] { Start(fonts); });
    }

    bool Changes(int64_t time) override {
        Advance(time);
        return std::exchange(changed_, false) || AnythingMoves();
    }

    Canvas Draw(int64_t time) override {
        if (active_.empty())
            return {};
        if (!std::exchange(placed_, true))
            for (const int64_t begin : BeginsThatPlace())
                Drawn(begin * kHundredth);
        const av::Frame drawn = Drawn(time);
        return drawn ? Trimmed(drawn->data[0], drawn->linesize[0], width_, height_) : Canvas{};
    }

    int64_t NextChange(int64_t time) override {
        Advance(time);
        if (AnythingMoves())
            return time;
        int64_t next = kNever;
        for (const Event* event : active_)
            next = std::min(next, event->end * kHundredth);
        if (next_ < script_.Events().size())
            next = std::min(next, script_.Events()[next_].begin * kHundredth);
        return next;
    }

private:
    /// Finds out what is to be seen at `time`.
    void Advance(int64_t time) {
        const std::vector<Event>& events = script_.Events();
        const int64_t now = time / kHundredth;
        const auto ended = std::remove_if(active_.begin(), active_.end(),
                                          [&](const Event* event) { return event->end <= now; });
        changed_ = changed_ || ended != active_.end();
        active_.erase(ended, active_.end());
        for (; next_ < events.size() && events[next_].begin <= now; ++next_)
            if (events[next_].end > now) {
                active_.push_back(&events[next_]);
                changed_ = true;
            }
    }

    /// When the texts began that are seen now, and those on which their places depend (hundredths, rising):
    /// libass stacks a text upon what is seen as it appears and leaves it there. Drawn at these times, a
    /// conversion that begins amid texts has them where one from the movie's begin has them.
    std::set<int64_t> BeginsThatPlace() const {
        std::set<int64_t> begins;
        std::vector<const Event*> open = active_;
        while (!open.empty()) {
            const int64_t begin = open.back()->begin;
            open.pop_back();
            if (!begins.insert(begin).second)
                continue;
            for (const Event& other : script_.Events()) {
                if (other.begin >= begin)
                    break;
                if (other.end > begin)
                    open.push_back(&other);
            }
        }
        return begins;
    }

    bool AnythingMoves() const {
        return std::any_of(active_.begin(), active_.end(), [](const Event* event) { return event->moves; });
    }

    /// Does `work` with the graph, whose errors are the source's.
    template <class Work>
    static void Drawing(Work work) {
        try {
            work();
        } catch (const av::FilterError& error) {
            throw SourceError(Say("the subtitles cannot be drawn: {}", WordsOf(error)));
        }
    }

    av::Frame Drawn(int64_t time) {
        const av::Frame canvas = NewCanvas();
        // The middle of the millisecond, lest rounding changes it.
        canvas->pts = time / (kTicksPerSecond / 1000) * 1000 + 500;
        av::Frame drawn;
        Drawing([&] {
            graph_->Push(*canvas);
            drawn = graph_->Take();
        });
        return drawn;
    }

    av::Frame NewCanvas() const {
        av::Frame picture = av::NewFrame();
        picture->format = AV_PIX_FMT_RGBA;
        picture->width = width_;
        picture->height = height_;
        if (av_frame_get_buffer(picture.get(), 0) < 0)
            throw std::bad_alloc();
        std::memset(picture->data[0], 0,
                    static_cast<std::size_t>(picture->linesize[0]) * static_cast<std::size_t>(height_));
        return picture;
    }

    void Start(const std::vector<FontFile>& fonts) {
        const ScriptFolder folder(script_.Text(), fonts);
        graph_.emplace(*NewCanvas(),
                       fmt::format("ass=filename={0}/script.ass:fontsdir={0}:alpha=1:original_size={1}x{2}",
                                   Quoted(folder.Path()), shownWidth_, height_),
                       1, kMicrosecond);
    }

    const Script script_;
    const int width_;
    const int height_;
    const int shownWidth_;                 // with square pixels
    std::optional<av::FilterGraph> graph_; // unless there is nothing to draw
    std::size_t next_ = 0;
    std::vector<const Event*> active_;
    bool changed_ = false; // since it was asked for last
    bool placed_ = false;  // the texts that are seen from the first picture on
};

} // namespace

std::unique_ptr<CueDrawer> MakeTextDrawer(CueList list, const PictureStreamInfo& pictures,
                                          const std::vector<FontFile>& fonts) {
    return std::make_unique<TextDrawer>(list, pictures, fonts);
}

} // namespace movieconv
