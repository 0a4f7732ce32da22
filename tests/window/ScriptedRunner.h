// A runner whose movies and conversions are what the test says.
#ifndef MOVIECONV_TESTS_WINDOW_SCRIPTEDRUNNER_H
#define MOVIECONV_TESTS_WINDOW_SCRIPTEDRUNNER_H

#include "host/window/model/Queue.h"
#include "host/window/model/Runner.h"
#include "tests/support/Gate.h"

#include <QTest>

#include <algorithm>
#include <functional>
#include <map>
#include <mutex>

/// Handles the window's events until `condition` holds. False after fifteen minutes, since conversions give
/// way to whatever else is running.
inline bool Await(const std::function<bool()>& condition) {
    return QTest::qWaitFor(condition, 900'000);
}

/// Likewise until the queue has so many movies, all of them looked at.
inline bool AwaitExamined(const movieconv::window::Queue& queue, size_t count) {
    return Await([&] {
        const auto& entries = queue.Entries();
        return entries.size() == count && std::none_of(entries.begin(), entries.end(), [](const auto& entry) {
                   return entry.IsBeingExamined();
               });
    });
}

class ScriptedRunner : public movieconv::window::Runner {
public:
    /// A conversion that the test plays. Its news come from the test's thread.
    struct Script {
        movieconv::window::Order order;
        std::shared_ptr<movieconv::window::RunListener> listener;
        bool paused = false;
        bool stopped = false;
        bool shown = false;
        bool gone = false; ///< The run was destroyed.

        void Figure(double position, double length, double speed = 2);
        void Phase(movieconv::window::Phase phase);
        void End(movieconv::window::Ending ending, const QString& sentence = {});
    };

    movieconv::window::Abilities Can() override { return {true, true, true, true}; }
    std::vector<movieconv::window::PresetFacts> Presets() override;
    movieconv::window::PresetFacts LoadPreset(const std::string& path) override;
    QStringList SavePreset(const std::string& path, const movieconv::window::Wishes& wishes) override;
    std::string PresetFolder() override { return {}; }
    std::vector<movieconv::window::FormatFacts> Formats() override;
    std::unique_ptr<movieconv::window::Run>
    Start(const movieconv::window::Order& order,
          std::shared_ptr<movieconv::window::RunListener> listener) override;
    /// A file whose text begins with "movie" is one; a number behind it tells its seconds.
    movieconv::window::MovieFacts Look(const std::string& path) override;
    std::string FileInTheWay(const movieconv::window::Order& order) override;
    movieconv::window::Findings Check(const movieconv::window::Order& order) override;
    QImage PictureAt(const std::string& path, double seconds, int width) override;

    /// In the order in which they began.
    std::vector<std::shared_ptr<Script>> scripts;
    /// Stops as the real ones do: the end comes by itself.
    bool endsWhenStopped = true;
    std::map<std::string, movieconv::window::Wishes> saved; ///< Presets by path.
    QStringList unkept;                                     ///< What they cannot hold.
    Gate looking;                                           ///< Looks at movies pass it.
    std::atomic<int> looks = 0;
    std::atomic<int> subtitles = 1; ///< How many of them a movie has.
};

#endif
