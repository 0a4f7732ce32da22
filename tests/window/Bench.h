// A queue with its runner and journal, for tests.
#ifndef MOVIECONV_TESTS_WINDOW_BENCH_H
#define MOVIECONV_TESTS_WINDOW_BENCH_H

#include "host/window/model/Dispatcher.h"
#include "tests/support/Folder.h"
#include "tests/window/ScriptedRunner.h"

#include <gtest/gtest.h>

#include <algorithm>

struct Bench {
    Folder folder;
    ScriptedRunner runner;
    QStringList complaints;
    movieconv::window::Journal journal{folder / "queue", [](const QString&) {}};
    movieconv::window::Queue queue{runner, journal};
    movieconv::window::Dispatcher dispatcher{queue, runner};

    Bench() {
        QObject::connect(&queue, &movieconv::window::Queue::Complaint,
                         [this](const QString& sentence) { complaints += sentence; });
    }

    /// A file that ScriptedRunner takes for a movie.
    std::string Movie(const std::string& name, const std::string& seconds = "") const {
        WriteFile(folder / name, "movie" + seconds);
        return folder / name;
    }

    void AwaitExamined() {
        ASSERT_TRUE(Await([this] {
            return !queue.IsSearching() && std::none_of(queue.Entries().begin(), queue.Entries().end(),
                                                        [](auto& entry) { return entry.IsBeingExamined(); });
        }));
    }

    /// Adds movies and waits until they were looked at.
    void Add(const std::vector<std::string>& names) {
        std::vector<std::string> paths;
        for (const std::string& name : names)
            paths.push_back(Movie(name));
        queue.Add(paths);
        AwaitExamined();
    }

    const movieconv::window::Entry& At(int row) const { return queue.Entries().at(static_cast<size_t>(row)); }
    quint64 Id(int row) const { return At(row).id; }

    std::vector<std::string> Names() const {
        std::vector<std::string> names;
        for (const auto& entry : queue.Entries())
            names.push_back(movieconv::window::NameOf(entry.source).toStdString());
        return names;
    }
};

#endif
