// The program's parts, and what they do to each other beyond the window.
#ifndef MOVIECONV_HOST_WINDOW_APP_H
#define MOVIECONV_HOST_WINDOW_APP_H

#include "host/window/desktop/Desktop.h"
#include "host/window/model/Dispatcher.h"
#include "host/window/model/Settings.h"
#include "host/window/widgets/MainWindow.h"

#include <QObject>

#include <string>
#include <vector>

namespace movieconv::window {

class App : public QObject {
    Q_OBJECT
public:
    /// The queue is kept in `journal`. `runner` and `settings` must outlive it.
    App(Runner& runner, Settings& settings, const std::string& journal);

    /// Gives the application a style and colours where the desktop brings none. Before the first App.
    static void BringStyle();

    /// Shows the window, with the queue as it was and these movies behind it.
    void Begin(const std::vector<std::string>& movies);
    /// Adds these movies, and shows the window above others.
    void Take(const std::vector<std::string>& movies);
    /// Keeps what is done, then ends the program: nobody can be asked.
    void EndSoon();
    /// Once nothing is handled any more: whether the program can end in order. It cannot while a movie or a
    /// disk does not answer; then only leaving is left.
    static bool CanEnd();
    /// Ends the program at once, waiting for no movie and no conversion: those that run are offered again the
    /// next time, with what they have written.
    [[noreturn]] void Leave();

    MainWindow& Window() { return window_; }
    Queue& TheQueue() { return queue_; }
    Dispatcher& TheDispatcher() { return dispatcher_; }

private:
    void OnWorkBegan();
    void OnWorkEnded(const Totals& totals);
    void Raise();

    Settings& settings_;
    QObject teller_; // by which the journal's thread tells, and which outlives it
    Journal journal_;
    Queue queue_;
    Dispatcher dispatcher_;
    SleepGuard guard_;
    Notifier notifier_;
    ColourWish colours_;
    MainWindow window_;
};

} // namespace movieconv::window

#endif
