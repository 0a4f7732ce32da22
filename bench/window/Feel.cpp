// How the window feels: bench_window MOVIE [COPIES [PICTURES]] converts COPIES (8) of the movie at once in a
// window and tells how long it took until the window was there, the longest tasks on the window's thread, the
// time that all conversions took, and the memory. PICTURES 0 minimises the window.
#include "host/window/App.h"
#include "host/window/runner/ConvertRunner.h"

#include <QApplication>
#include <QElapsedTimer>
#include <QTemporaryDir>
#include <QTimer>

#include <algorithm>
#include <cstdio>
#include <ctime>
#include <filesystem>
#include <fstream>
#include <string>
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
            tasks.push_back((ThreadSeconds() - begin) * 1e3);
            longestWall = std::max(longestWall, static_cast<double>(wall.nsecsElapsed()) / 1e6);
        }
        --depth_;
        return handled;
    }

    bool watching = false;
    std::vector<double> tasks; // milliseconds of the thread's own time
    double longestWall = 0;

private:
    int depth_ = 0;
};

std::string MemoryOf(const char* what) {
    std::ifstream status("/proc/self/status");
    for (std::string line; std::getline(status, line);)
        if (line.rfind(what, 0) == 0)
            return line.substr(line.find_first_of("0123456789"));
    return {};
}

} // namespace

int main(int argc, char** argv) {
    if (argc < 2)
        return std::fputs("bench_window MOVIE [COPIES [PICTURES]]\n", stderr), 2;
    const std::string movie = std::filesystem::absolute(argv[1]).string();
    const int copies = argc > 2 ? std::stoi(argv[2]) : 8;
    const bool pictures = argc < 4 || std::stoi(argv[3]) != 0;
    QElapsedTimer sinceStart;
    sinceStart.start();
    Watched application(argc, argv);
    App::BringStyle();
    const QTemporaryDir folder;
    Settings settings(folder.filePath(QStringLiteral("settings")));
    ConvertRunner runner;
    App app(runner, settings, folder.filePath(QStringLiteral("queue")).toStdString());
    app.TheQueue().SetNaming({QStringLiteral("{name}"), folder.path().toStdString()});
    app.TheDispatcher().SetAtOnce(copies);
    app.Begin({});
    QApplication::processEvents();
    std::printf("window there after %.0f ms, %s of memory, %s of it the process's own\n",
                static_cast<double>(sinceStart.nsecsElapsed()) / 1e6, MemoryOf("VmRSS").c_str(),
                MemoryOf("RssAnon").c_str());
    application.watching = true;
    QElapsedTimer work;
    QObject::connect(&app.TheDispatcher(), &Dispatcher::WorkEnded, &application, [&](const Totals& totals) {
        std::printf("%d of %d converted in %.2f s, %s of memory at most\n", totals.done, copies,
                    static_cast<double>(work.nsecsElapsed()) / 1e9, MemoryOf("VmHWM").c_str());
        QApplication::quit();
    });
    app.TheQueue().Add(std::vector<std::string>(static_cast<size_t>(copies), movie));
    if (!pictures)
        app.Window().showMinimized();
    work.start();
    app.TheDispatcher().Start();
    QApplication::exec();
    std::sort(application.tasks.rbegin(), application.tasks.rend());
    std::printf("%zu tasks on the window's thread; the longest, in ms of its own time:",
                application.tasks.size());
    for (size_t i = 0; i < std::min<size_t>(5, application.tasks.size()); ++i)
        std::printf(" %.2f", application.tasks[i]);
    std::printf("; by the clock, waits for a processor included: %.2f\n", application.longestWall);
    return 0;
}
