#include "ffmpeg/FilterGraph.h"
#include "ffmpeg/FilterLibrary.h"
#include "host/sentence/Say.h"
#include "host/source/CueDrawer.h"
#include "host/source/SourceError.h"
#include "host/source/TextScript.h"

#include <algorithm>
#include <cmath>
#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <fmt/format.h>
#include <fstream>
#include <optional>
#include <system_error>
#include <utility>

namespace movieconv {
namespace {

constexpr AVRational kMicrosecond{1, 1'000'000};

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
        // Lest a part of the movie has texts in other lines than the whole.
        if (!std::exchange(placed_, true))
            for (const int64_t begin : script_.BeginsThatPlace(active_))
                Drawn(begin * kHundredth);
        const av::Frame drawn = Drawn(time);
        return drawn ? Trimmed(drawn->data[0], drawn->linesize[0], width_, height_) : Canvas{};
    }

    int64_t NextChange(int64_t time) override {
        Advance(time);
        if (AnythingMoves())
            return time;
        int64_t next = kNever;
        for (const TextEvent* event : active_)
            next = std::min(next, event->end * kHundredth);
        if (next_ < script_.Events().size())
            next = std::min(next, script_.Events()[next_].begin * kHundredth);
        return next;
    }

private:
    /// Finds out what is to be seen at `time`.
    void Advance(int64_t time) {
        const std::vector<TextEvent>& events = script_.Events();
        const int64_t now = time / kHundredth;
        const auto ended = std::remove_if(active_.begin(), active_.end(),
                                          [&](const TextEvent* event) { return event->end <= now; });
        changed_ = changed_ || ended != active_.end();
        active_.erase(ended, active_.end());
        for (; next_ < events.size() && events[next_].begin <= now; ++next_)
            if (events[next_].end > now) {
                active_.push_back(&events[next_]);
                changed_ = true;
            }
    }

    bool AnythingMoves() const {
        return std::any_of(active_.begin(), active_.end(),
                           [](const TextEvent* event) { return event->moves; });
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

    const TextScript script_;
    const int width_;
    const int height_;
    const int shownWidth_;                 // with square pixels
    std::optional<av::FilterGraph> graph_; // unless there is nothing to draw
    std::size_t next_ = 0;
    std::vector<const TextEvent*> active_;
    bool changed_ = false; // since it was asked for last
    bool placed_ = false;  // the texts that are seen from the first picture on
};

} // namespace

std::unique_ptr<CueDrawer> MakeTextDrawer(CueList list, const PictureStreamInfo& pictures,
                                          const std::vector<FontFile>& fonts) {
    return std::make_unique<TextDrawer>(list, pictures, fonts);
}

} // namespace movieconv
