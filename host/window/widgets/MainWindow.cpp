#include "host/window/widgets/MainWindow.h"

#include "host/window/model/Intake.h"
#include "host/window/model/Words.h"
#include "host/window/widgets/Closing.h"
#include "host/window/widgets/EntryPage.h"
#include "host/window/widgets/NoticeBar.h"
#include "host/window/widgets/OverPage.h"
#include "host/window/widgets/QueueView.h"
#include "host/window/widgets/WorkPage.h"

#include <QAction>
#include <QCloseEvent>
#include <QLabel>
#include <QLineEdit>
#include <QMimeData>
#include <QProgressBar>
#include <QPushButton>
#include <QSplitter>
#include <QStackedWidget>
#include <QVBoxLayout>

#include <algorithm>
#include <cmath>

namespace movieconv::window {
namespace {

const QString kUriList = QStringLiteral("text/uri-list");
const QString kInterrupted = QStringLiteral("interrupted");
const QString kFull = QStringLiteral("full");

QList<quint64> Interrupted(const Queue& queue) {
    QList<quint64> ids;
    for (const Entry& entry : queue.Entries())
        if (entry.state == State::kInterrupted)
            ids.append(entry.id);
    return ids;
}

/// The files stay where they are: after a move, who gave them would remove them.
void AcceptAsCopy(QDropEvent& event) {
    event.setDropAction(Qt::CopyAction);
    event.accept();
}

} // namespace

MainWindow::MainWindow(Queue& queue, Dispatcher& dispatcher, Runner& runner, Settings& settings)
    : queue_(queue),
      dispatcher_(dispatcher),
      runner_(runner),
      settings_(settings),
      notices_(new NoticeBar),
      closing_(new Closing(dispatcher, *notices_, this)),
      pages_(new QStackedWidget),
      view_(new QueueView(queue)),
      details_(new QStackedWidget),
      entryPage_(new EntryPage(runner)),
      workPage_(new WorkPage),
      overPage_(new OverPage) {
    setWindowTitle(tr("MovieConv"));
    setAcceptDrops(true);
    setMinimumSize(760, 440); // within half of 1920 x 1080
    resize(1080, 720);
    MakeMovieMenu();
    MakeQueueMenu();
    MakeConversionMenu();
    MakeHelpMenu();
    pages_->addWidget(MakeEmptyPage());
    pages_->addWidget(MakeWorkspace());
    auto* centre = new QWidget;
    auto* layout = new QVBoxLayout(centre);
    layout->setContentsMargins(0, 0, 0, 0);
    layout->setSpacing(0);
    layout->addWidget(notices_);
    layout->addWidget(pages_, 1);
    foot_ = MakeFoot();
    layout->addWidget(foot_);
    setCentralWidget(centre);
    for (QLineEdit* field : findChildren<QLineEdit*>())
        field->setAcceptDrops(false); // movies that are dropped on it are meant for the queue
    Connect();
    if (const QByteArray geometry = settings_.LoadGeometry(); !geometry.isEmpty())
        restoreGeometry(geometry);
    splitter_->restoreState(settings_.LoadSplitter());
    ShowAll();
}

void MainWindow::Connect() {
    connect(view_, &QueueView::CurrentChanged, this, [this] { ShowEntry(); });
    connect(view_->selectionModel(), &QItemSelectionModel::selectionChanged, this, &MainWindow::ShowActions);
    connect(&queue_, &Queue::Changed, this, &MainWindow::OnChanged);
    connect(&queue_, &Queue::Rearranged, this, &MainWindow::ShowAll);
    connect(&queue_, &Queue::Complaint, this, &MainWindow::Tell);
    connect(&dispatcher_, &Dispatcher::Progressed, this, &MainWindow::ShowTotals);
    connect(&dispatcher_, &Dispatcher::Ended, this, &MainWindow::OnEnded);
    connect(&dispatcher_, &Dispatcher::WorkEnded, this, &MainWindow::ShowAll);
    connect(closing_, &Closing::Changed, this, &MainWindow::ShowTotals);
    connect(closing_, &Closing::Ready, this, &MainWindow::close);
    connect(closing_, &Closing::LeaveWanted, this, [this] {
        KeepPlaces();
        Q_EMIT LeaveWanted();
    });
    connect(&dispatcher_, &Dispatcher::PictureCame, workPage_, &WorkPage::ShowPicture);
    connect(workPage_, &WorkPage::PictureRoomChanged, &dispatcher_, &Dispatcher::SetPictureRoom);
    connect(workPage_, &WorkPage::PauseWanted, this, [this](quint64 id, bool pause) {
        if (pause)
            dispatcher_.Pause(id);
        else
            dispatcher_.Resume(id);
    });
    connect(workPage_, &WorkPage::StopWanted, &dispatcher_, &Dispatcher::Stop);
    connect(overPage_, &OverPage::AgainWanted, this, [this](quint64 id) { queue_.Retry({id}); });
    connect(overPage_, &OverPage::FileWanted, this, &MainWindow::FileWanted);
    connect(overPage_, &OverPage::FolderWanted, this, &MainWindow::FolderWanted);
    connect(entryPage_, &EntryPage::WishesChosen, this, [this](quint64 id, const Wishes& wishes) {
        queue_.SetWishes(id, wishes);
        queue_.SetDefaults(ForAnyMovie(wishes));
        settings_.Save(wishes);
    });
    connect(entryPage_, &EntryPage::TargetChosen, &queue_, &Queue::SetTarget);
    connect(entryPage_, &EntryPage::ReplaceChosen, &queue_, &Queue::SetReplace);
    connect(entryPage_, &EntryPage::AllWanted, &queue_, &Queue::SetWishesOfAll);
    connect(entryPage_, &EntryPage::SavingWanted, this, &MainWindow::SavePreset);
    connect(entryPage_, &EntryPage::LoadingWanted, this, &MainWindow::LoadPreset);
    connect(entryPage_, &EntryPage::LookWanted, &queue_, &Queue::LookAgain);
}

void MainWindow::Tell(const QString& sentence) {
    notices_->Show(sentence, sentence);
}

void MainWindow::OfferInterrupted() {
    const QList<quint64> ids = Interrupted(queue_);
    if (ids.isEmpty())
        return;
    notices_->Show(
        kInterrupted,
        tr("%n movies were being converted when the program ended.", "", static_cast<int>(ids.size())),
        {{tr("Convert again"), [this] {
              queue_.Retry(Interrupted(queue_));
              dispatcher_.Start();
          }}});
}

void MainWindow::StartOrGoOn() {
    entryPage_->Commit();
    if (dispatcher_.IsPaused())
        dispatcher_.ResumeAll();
    else
        dispatcher_.Start();
}

/// On the disk at once: the program may be left without another chance.
void MainWindow::KeepPlaces() {
    settings_.SaveGeometry(saveGeometry());
    settings_.SaveSplitter(splitter_->saveState());
    settings_.Settle();
}

/// The page that the chosen movie's state asks for.
void MainWindow::ShowEntry() {
    if (!view_->currentIndex().isValid() && queue_.rowCount() > 0) {
        view_->Select(queue_.Entries().front().id); // comes back here
        return;
    }
    const Entry* entry = queue_.Find(view_->CurrentId());
    const bool active = entry != nullptr && entry->state == State::kActive;
    dispatcher_.ShowPicturesOf(active && !isMinimized() ? entry->id : 0);
    if (entry == nullptr)
        return;
    if (active) {
        workPage_->Show(*entry);
        details_->setCurrentWidget(workPage_);
    } else if (entry->state == State::kWaiting) {
        entryPage_->Show(*entry);
        details_->setCurrentWidget(entryPage_);
    } else {
        overPage_->Show(*entry);
        details_->setCurrentWidget(overPage_);
    }
}

void MainWindow::ShowTotals() {
    const Totals totals = dispatcher_.Now();
    QStringList parts;
    if (dispatcher_.IsWorking()) {
        parts += tr("%1 of %2 done")
                     .arg(totals.done)
                     .arg(totals.done + totals.failed + totals.active + totals.waiting);
        if (totals.failed > 0)
            parts += tr("%n failed", "", totals.failed);
        if (dispatcher_.IsPaused())
            parts += tr("paused");
        else if (totals.left)
            parts += tr("%1 left for all").arg(LeftText(*totals.left));
        if (dispatcher_.StopsAfterThis())
            parts += tr("stops after this one");
        if (closing_->IsPending())
            parts += tr("closes when done");
    } else if (totals.waiting > 0) {
        parts += tr("%n movies are ready", "", totals.waiting);
    }
    const QString text = parts.join(QStringLiteral(" · "));
    if (text != totals_->text())
        totals_->setText(text);
    bar_->setVisible(dispatcher_.IsWorking());
    bar_->setValue(static_cast<int>(std::lround(std::max(totals.fraction, 0.0) * bar_->maximum())));
    setWindowTitle(dispatcher_.IsWorking() && totals.fraction >= 0
                       ? tr("%1 % – MovieConv").arg(static_cast<int>(totals.fraction * 100))
                       : tr("MovieConv"));
    ShowActions();
}

void MainWindow::ShowActions() {
    const bool working = dispatcher_.IsWorking();
    const bool paused = dispatcher_.IsPaused();
    const Totals totals = dispatcher_.Now();
    const QList<quint64> selected = view_->SelectedIds();
    const auto any = [&](auto has) {
        return std::any_of(selected.begin(), selected.end(), [&](quint64 id) {
            const Entry* entry = queue_.Find(id);
            return entry != nullptr && has(*entry);
        });
    };
    const bool over = std::any_of(queue_.Entries().begin(), queue_.Entries().end(),
                                  [](const Entry& entry) { return entry.IsOver(); });
    start_->setEnabled(paused || (!working && totals.waiting > 0));
    pause_->setEnabled(totals.active > 0);
    pause_->setText(paused ? tr("&Resume") : tr("&Pause"));
    stop_->setEnabled(working);
    stopAfter_->setEnabled(working);
    stopAfter_->setChecked(dispatcher_.StopsAfterThis());
    remove_->setEnabled(any([](const Entry& entry) { return entry.state != State::kActive; }));
    removeOver_->setEnabled(over);
    up_->setEnabled(!selected.isEmpty());
    down_->setEnabled(!selected.isEmpty());
    again_->setEnabled(any([](const Entry& entry) { return entry.IsOver(); }));
    const bool hasFile = any([](const Entry& entry) { return !entry.outcome.files.empty(); });
    play_->setEnabled(hasFile);
    folder_->setEnabled(hasFile);
    startButton_->setVisible(!working || paused);
    startButton_->setEnabled(start_->isEnabled());
    startButton_->setText(paused ? tr("Resume") : tr("Convert"));
    pauseButton_->setVisible(working && !paused);
    pauseButton_->setEnabled(pause_->isEnabled());
    stopButton_->setVisible(working);
}

void MainWindow::ShowAll() {
    pages_->setCurrentIndex(queue_.rowCount() > 0 ? 1 : 0);
    foot_->setVisible(queue_.rowCount() > 0);
    ShowEntry();
    ShowTotals();
}

void MainWindow::OnChanged(quint64 id) {
    const Entry* entry = queue_.Find(id);
    if (id == view_->CurrentId())
        ShowEntry();
    if (entry->state == State::kActive && entry->figures.phase == Phase::kWaitingForRoom) {
        if (!notices_->Shows(kFull)) {
            notices_->Show(
                kFull,
                tr("The disk with “%1” is full. Make room, and the conversion goes on by itself; or stop "
                   "it and keep what is done.")
                    .arg(Shown(entry->target)));
        }
    } else if (notices_->Shows(kFull)) {
        const bool stillFull =
            std::any_of(queue_.Entries().begin(), queue_.Entries().end(), [](const Entry& other) {
                return other.state == State::kActive && other.figures.phase == Phase::kWaitingForRoom;
            });
        if (!stillFull)
            notices_->Dismiss(kFull);
    }
    if (entry->state != State::kActive)
        ShowTotals();
}

/// Goes on to the movie that is being converted now, if the user was watching this one.
void MainWindow::OnEnded(quint64 id) {
    if (view_->CurrentId() != id || details_->currentWidget() != overPage_ || view_->SelectedIds().size() > 1)
        return;
    const auto next = std::find_if(queue_.Entries().begin(), queue_.Entries().end(),
                                   [](const Entry& entry) { return entry.state == State::kActive; });
    if (next != queue_.Entries().end())
        view_->Select(next->id);
}

void MainWindow::StopAndClose() {
    closing_->StopAndClose();
}

bool MainWindow::IsStopping() const {
    return closing_->IsStopping();
}

void MainWindow::closeEvent(QCloseEvent* event) {
    entryPage_->Commit();
    if (!closing_->MayClose()) {
        event->ignore();
        return;
    }
    KeepPlaces();
    event->accept();
    Q_EMIT Closed();
}

void MainWindow::changeEvent(QEvent* event) {
    if (event->type() == QEvent::WindowStateChange)
        ShowEntry(); // no pictures while nobody can see them
    QMainWindow::changeEvent(event);
}

void MainWindow::dragEnterEvent(QDragEnterEvent* event) {
    if (event->mimeData()->hasFormat(kUriList))
        AcceptAsCopy(*event);
}

void MainWindow::dropEvent(QDropEvent* event) {
    QStringList others;
    queue_.Add(PathsOfUriList(event->mimeData()->data(kUriList), others));
    for (const QString& other : others)
        Tell(tr("“%1” is not a file on this machine.").arg(other));
    AcceptAsCopy(*event);
}

} // namespace movieconv::window
