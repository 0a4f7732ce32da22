#include "host/window/App.h"
#include "host/window/desktop/Instance.h"
#include "host/window/runner/ConvertRunner.h"

#include <QApplication>
#include <QIcon>
#include <QLibraryInfo>
#include <QLocale>
#include <QSocketNotifier>
#include <QTranslator>

#include <array>
#include <csignal>
#include <cstdio>
#include <cstring>
#include <filesystem>
#include <malloc.h>
#include <sys/socket.h>
#include <unistd.h>

namespace {

using namespace movieconv::window;

std::array<int, 2> signalSockets;

void OnSignal(int) {
    const char byte = 1;
    [[maybe_unused]] const ssize_t told = write(signalSockets[0], &byte, 1);
}

/// A session's end, or whoever wants the program to end, tells it by a signal.
void WatchSignals(App& app) {
    if (socketpair(AF_UNIX, SOCK_STREAM | SOCK_CLOEXEC | SOCK_NONBLOCK, 0, signalSockets.data()) != 0)
        return;
    auto* notifier = new QSocketNotifier(signalSockets[1], QSocketNotifier::Read, &app);
    QObject::connect(notifier, &QSocketNotifier::activated, &app, [&app, notifier] {
        notifier->setEnabled(false); // the next signal ends it at once
        for (const int number : {SIGTERM, SIGINT, SIGHUP})
            std::signal(number, SIG_DFL);
        app.EndSoon();
    });
    struct sigaction action {};
    action.sa_handler = OnSignal;
    action.sa_flags = SA_RESTART;
    for (const int number : {SIGTERM, SIGINT, SIGHUP})
        sigaction(number, &action, nullptr);
}

/// Names on the command line are bytes, whatever the locale says.
std::vector<std::string> MoviesOf(int argc, char** argv) {
    std::vector<std::string> movies;
    for (int i = 1; i < argc; ++i) {
        const std::string_view argument = argv[i];
        if (i == 1 && argument == "--")
            continue;
        std::error_code ignored;
        const std::filesystem::path path = std::filesystem::absolute(argument, ignored);
        movies.push_back(path.string());
    }
    return movies;
}

} // namespace

int main(int argc, char** argv) {
    if (argc == 2 && std::strcmp(argv[1], "--version") == 0) {
        std::puts("movieconv-gui " MOVIECONV_VERSION);
        return 0;
    }
    if (argc == 2 && std::strcmp(argv[1], "--help") == 0) {
        std::puts("Usage: movieconv-gui [MOVIE|FOLDER]...\nOpens the window with these movies in its queue.");
        return 0;
    }
    mallopt(M_ARENA_MAX, 2); // heaps of their own for dozens of threads cost memory and save no time
    QApplication application(argc, argv);
    QApplication::setApplicationName(QStringLiteral("movieconv"));
    QApplication::setApplicationVersion(QStringLiteral(MOVIECONV_VERSION));
    QApplication::setDesktopFileName(QStringLiteral("org.movieconv.MovieConv"));
    QApplication::setQuitOnLastWindowClosed(false); // the window tells when it is closed
    QApplication::setWindowIcon(
        QIcon::fromTheme(QStringLiteral("org.movieconv.MovieConv"), QIcon(QStringLiteral(":/icon.svg"))));
    const std::vector<std::string> movies = MoviesOf(argc, argv);
    Instance instance;
    if (instance.HandOver(movies))
        return 0;
    QTranslator own;
    QTranslator toolkit;
    if (toolkit.load(QLocale(), QStringLiteral("qtbase"), QStringLiteral("_"),
                     QLibraryInfo::path(QLibraryInfo::TranslationsPath)))
        QApplication::installTranslator(&toolkit);
    if (own.load(QLocale(), QStringLiteral("movieconv-gui"), QStringLiteral("_"), QStringLiteral(":/i18n")) ||
        own.load(QStringLiteral(":/i18n/movieconv-gui_en.qm")))
        QApplication::installTranslator(&own);
    App::BringStyle();
    Settings settings;
    ConvertRunner runner;
    App app(runner, settings, Journal::UsualPath());
    WatchSignals(app);
    QObject::connect(&instance, &Instance::Asked, &app, &App::Take);
    app.Begin(movies);
    const int result = QApplication::exec();
    if (!App::CanEnd())
        app.Leave();
    return result;
}
