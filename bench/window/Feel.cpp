// How the window feels. bench_window MOVIE [COPIES [PICTURES]] converts COPIES (8) of the movie at once in a
// window and tells how long it took until the window was there, the longest tasks on the window's thread, the
// time that all conversions took, and the memory. PICTURES 0 minimises the window. bench_window --many MOVIE
// [COUNT] tells the longest tasks while COUNT (500) movies are added, looked through, edited, moved and
// removed.
#include "host/window/App.h"
#include "host/window/runner/ConvertRunner.h"
#include "host/window/widgets/QueueView.h"

#include <QApplication>
#include <QElapsedTimer>
#include <QTemporaryDir>
#include <QTimer>

#include <algorithm>
#include <cstdio>
#include <ctime>
#include <filesystem>
#include <fstream>
#include <functional>
#include <sstream>
#include <string>
#include <unistd.h>
#include <vector>

namespace {

using namespace movieconv::window;

double ThreadSeconds() {
    timespec now{};
    clock_gettime(CLOCK_THREAD_CPUTIME_ID, &now);
    return static_cast<double>(now.tv_sec) + static_cast<double>(now.tv_nsec) / 1e9;
}

/// Measures each task of the event loop: whatever is handled between two waits for events.
class Watched : public QApplication {
public:
    using QApplication::QApplication;

    bool notify(QObject* receiver, QEvent* event) override {
        if (depth_++ > 0) {
            const bool handled = QApplication::notify(receiver, event);
            --depth_;
            return handled;
        }
        QElapsedTimer wall;
        wall.start();
        const double begin = ThreadSeconds();
        const bool handled = QApplication::notify(receiver, event);
        if (watching) {
            tasks_.push_back((ThreadSeconds() - begin) * 1e3);
            longestWall_ = std::max(longestWall_, static_cast<double>(wall.nsecsElapsed()) / 1e6);
        }
        --depth_;
        return handled;
    }

    /// Of what was measured since the last time.
    void Print(const char* what) {
        std::sort(tasks_.rbegin(), tasks_.rend());
        std::printf("%s: %zu tasks on the window's thread; the longest, in ms of its own time:", what,
                    tasks_.size());
        for (size_t i = 0; i < std::min<size_t>(5, tasks_.size()); ++i)
            std::printf(" %.2f", tasks_[i]);
        std::printf("; by the clock, waits for a processor included: %.2f\n", longestWall_);
        tasks_.clear();
        longestWall_ = 0;
    }

    bool watching = false;

private:
    int depth_ = 0;
    std::vector<double> tasks_; // milliseconds of the thread's own time
    double longestWall_ = 0;
};

std::string MemoryOf(const char* what) {
    std::ifstream status("/proc/self/status");
    for (std::string line; std::getline(status, line);)
        if (line.rfind(what, 0) == 0)
            return line.substr(line.find_first_of("0123456789"));
    return {};
}

/// Since the process began, the loading of its libraries included; the system counts in hundredths.
double SecondsSinceStart() {
    std::ifstream stat("/proc/self/stat");
    std::string text;
    std::getline(stat, text);
    std::istringstream fields(text.substr(text.rfind(')') + 1)); // behind the name, which is the second
    constexpr int kStartTime = 22;
    std::string field;
    for (int number = 2; number < kStartTime; ++number)
        fields >> field;
    timespec now{};
    clock_gettime(CLOCK_BOOTTIME, &now);
    return static_cast<double>(now.tv_sec) + static_cast<double>(now.tv_nsec) / 1e9 -
           std::stod(field) / static_cast<double>(sysconf(_SC_CLK_TCK));
}

/// An empty window.
struct Bench {
    const QTemporaryDir folder;
    Settings settings{folder.filePath(QStringLiteral("settings"))};
    ConvertRunner runner;
    App app{runner, settings, folder.filePath(QStringLiteral("queue")).toStdString()};

    Bench() {
        app.TheQueue().SetNaming({QStringLiteral("{name}"), folder.path().toStdString()});
        app.Begin({});
        QApplication::processEvents();
    }
};

void ConvertAtOnce(Watched& application, Bench& bench, const std::string& movie, int copies, bool pictures) {
    Dispatcher& dispatcher = bench.app.TheDispatcher();
    dispatcher.SetAtOnce(copies);
    application.watching = true;
    QElapsedTimer work;
    QObject::connect(&dispatcher, &Dispatcher::WorkEnded, &application, [&](const Totals& totals) {
        std::printf("%d of %d converted in %.3f s, %s of memory at most\n", totals.done, copies,
                    static_cast<double>(work.nsecsElapsed()) / 1e9, MemoryOf("VmHWM").c_str());
        QApplication::quit();
    });
    bench.app.TheQueue().Add(std::vector<std::string>(static_cast<size_t>(copies), movie));
    if (!pictures)
        bench.app.Window().showMinimized();
    work.start();
    dispatcher.Start();
    QApplication::exec();
    application.Print("converting");
}

/// Handles events until `done`.
void Run(const std::function<bool()>& done) {
    while (!done())
        QApplication::processEvents(QEventLoop::AllEvents | QEventLoop::WaitForMoreEvents);
}

void HandleMany(Watched& application, Bench& bench, const std::string& movie, int count) {
    Queue& queue = bench.app.TheQueue();
    auto* view = bench.app.Window().findChild<QueueView*>();
    const auto isAtRest = [&] {
        return !queue.IsSearching() && std::none_of(queue.Entries().begin(), queue.Entries().end(),
                                                    [](auto& entry) { return entry.IsBeingExamined(); });
    };
    const auto measure = [&](const char* what, const std::function<void()>& deed) {
        bool done = false;
        QTimer::singleShot(0, &application, [&] {
            deed();
            done = true;
        });
        Run([&] { return done && isAtRest(); });
        application.Print(what);
    };
    application.watching = true;
    std::vector<std::string> movies;
    for (int number = 0; number < count; ++number) {
        movies.push_back(bench.folder.filePath(QStringLiteral("movie %1.mkv").arg(number)).toStdString());
        std::filesystem::create_symlink(movie, movies.back());
    }
    measure("adding", [&] { queue.Add(movies); });
    for (int row = 0; row < queue.rowCount(); row += 20) {
        view->Select(queue.Entries()[static_cast<size_t>(row)].id);
        bool done = false;
        QTimer::singleShot(0, &application, [&] { done = true; });
        Run([&] { return done; });
    }
    application.Print("looking through");
    Wishes wishes;
    wishes.quality = 40;
    measure("settings for all", [&] { queue.SetWishesOfAll(wishes); });
    measure("names for all", [&] {
        queue.SetNaming({QStringLiteral("{name} new"), bench.folder.path().toStdString()});
    });
    view->Select(queue.Entries().front().id);
    measure("selecting all", [&] { view->selectAll(); });
    measure("moving half", [&] {
        QList<quint64> half;
        for (int row = count / 2; row < count; ++row)
            half.append(queue.Entries()[static_cast<size_t>(row)].id);
        queue.MoveBefore(half, 0);
    });
    measure("removing all", [&] { queue.Remove(view->SelectedIds()); });
}

} // namespace

int main(int argc, char** argv) {
    const bool many = argc > 1 && std::string(argv[1]) == "--many";
    if (argc < (many ? 3 : 2))
        return std::fputs("bench_window MOVIE [COPIES [PICTURES]] | --many MOVIE [COUNT]\n", stderr), 2;
    const std::string movie = std::filesystem::absolute(argv[many ? 2 : 1]).string();
    Watched application(argc, argv);
    App::BringStyle();
    Bench bench;
    std::printf("window there after %.0f ms, %s of memory, %s of it the process's own\n",
                SecondsSinceStart() * 1e3, MemoryOf("VmRSS").c_str(), MemoryOf("RssAnon").c_str());
    if (many)
        HandleMany(application, bench, movie, argc > 3 ? std::stoi(argv[3]) : 500);
    else
        ConvertAtOnce(application, bench, movie, argc > 2 ? std::stoi(argv[2]) : 8,
                      argc < 4 || std::stoi(argv[3]) != 0);
    return 0;
}
