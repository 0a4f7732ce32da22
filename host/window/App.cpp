#include "host/window/App.h"

#include "host/window/widgets/Look.h"

#include <QApplication>
#include <QStyle>

#include <chrono>
#include <cstdlib>

namespace movieconv::window {

App::App(Runner& runner, Settings& settings, const std::string& journal)
    : settings_(settings),
      journal_(journal,
               [this](const QString& sentence) {
                   QMetaObject::invokeMethod(&teller_,
                                             [this, sentence] { Q_EMIT queue_.Complaint(sentence); });
               }),
      queue_(runner, journal_),
      dispatcher_(queue_, runner),
      window_(queue_, dispatcher_, runner, settings) {
    queue_.SetNaming(settings.LoadNaming());
    queue_.SetDefaults(settings.LoadWishes());
    dispatcher_.SetAtOnce(settings.LoadAtOnce());
    connect(&dispatcher_, &Dispatcher::WorkBegan, this, &App::OnWorkBegan);
    connect(&dispatcher_, &Dispatcher::WorkEnded, this, &App::OnWorkEnded);
    connect(&guard_, &SleepGuard::Refused, &window_, &MainWindow::Tell);
    connect(&notifier_, &Notifier::Chosen, this, &App::Raise);
    connect(&window_, &MainWindow::Closed, qApp, &QApplication::quit);
    connect(&window_, &MainWindow::LeaveWanted, this, &App::Leave);
    connect(&window_, &MainWindow::FolderWanted, &ShowInFolder);
    connect(&window_, &MainWindow::FileWanted, &OpenFile);
    // Where a desktop brings a style, it brings the palette as well.
    if (QApplication::style()->name() == QLatin1String("fusion")) {
        connect(&colours_, &ColourWish::Told, this,
                [](bool dark) { QApplication::setPalette(OwnPalette(dark)); });
        QApplication::setPalette(OwnPalette(false));
        colours_.Ask();
    }
}

void App::Begin(const std::vector<std::string>& movies) {
    if (const QString complaint = queue_.Restore(); !complaint.isEmpty())
        window_.Tell(complaint);
    window_.OfferInterrupted();
    if (!movies.empty())
        queue_.Add(movies);
    window_.show();
}

void App::Take(const std::vector<std::string>& movies) {
    if (!movies.empty())
        queue_.Add(movies);
    Raise();
}

void App::EndSoon() {
    window_.StopAndClose();
}

bool App::CanEnd() {
    constexpr std::chrono::seconds kPatience{2};
    return Worker::AwaitAll(kPatience);
}

void App::Leave() {
    journal_.Settle();
    settings_.Settle();
    std::_Exit(EXIT_SUCCESS);
}

void App::OnWorkBegan() {
    guard_.Hold();
}

void App::OnWorkEnded(const Totals& totals) {
    guard_.Release();
    if (window_.IsStopping() || totals.stopped || totals.done + totals.failed == 0)
        return; // who has just stopped it knows
    const AtEnd atEnd = settings_.LoadAtEnd();
    const QString text = totals.failed == 0
                             ? tr("%n movies were converted.", "", totals.done)
                             : tr("%n movies were converted.", "", totals.done) + QLatin1Char(' ') +
                                   tr("%n could not be converted.", "", totals.failed);
    notifier_.Notify(totals.failed == 0 ? tr("Conversion done") : tr("Conversion done, with failures"), text,
                     atEnd.sound);
    QApplication::alert(&window_);
    if (atEnd.sound)
        QApplication::beep();
    if (atEnd.then == AtEnd::Then::kSuspend)
        Suspend();
    else if (atEnd.then == AtEnd::Then::kQuit && totals.failed == 0)
        QMetaObject::invokeMethod(&window_, &QWidget::close, Qt::QueuedConnection);
}

void App::Raise() {
    window_.show();
    window_.raise();
    window_.activateWindow();
}

void App::BringStyle() {
    if (QApplication::style()->name() != QLatin1String("fusion"))
        return;
    QApplication::setStyle(new OwnStyle);
    QApplication::setPalette(OwnPalette(false));
}

} // namespace movieconv::window
