// What MainWindow is made of: menus, pages, the foot.
#include "host/window/widgets/EntryPage.h"
#include "host/window/widgets/Icons.h"
#include "host/window/widgets/Look.h"
#include "host/window/widgets/MainWindow.h"
#include "host/window/widgets/OverPage.h"
#include "host/window/widgets/QueueView.h"
#include "host/window/widgets/WorkPage.h"

#include <QAction>
#include <QActionGroup>
#include <QApplication>
#include <QLabel>
#include <QMenuBar>
#include <QMessageBox>
#include <QPainter>
#include <QPushButton>
#include <QSplitter>
#include <QStackedWidget>
#include <QVBoxLayout>

namespace movieconv::window {
namespace {

constexpr int kListWidth = 380;
constexpr int kLeastOfList = 240;
constexpr int kLeastOfPage = 510; // so that the list gives way first

class BigSign : public QWidget {
public:
    BigSign() { setFixedSize(112, 112); }

protected:
    void paintEvent(QPaintEvent*) override {
        QPainter painter(this);
        painter.setRenderHint(QPainter::Antialiasing);
        QColor ground = palette().color(QPalette::Highlight);
        ground.setAlpha(30);
        painter.setPen(Qt::NoPen);
        painter.setBrush(ground);
        painter.drawEllipse(rect());
        PaintSign(painter, Sign::kMovie, QRectF(rect()).adjusted(30, 30, -30, -30),
                  palette().color(QPalette::Highlight));
    }
};

/// A line between what scrolls and what stays.
class Foot : public QWidget {
protected:
    void paintEvent(QPaintEvent*) override {
        QPainter painter(this);
        painter.fillRect(rect(), palette().color(QPalette::Base));
        painter.fillRect(QRect(0, 0, width(), 1), LineColour(palette()));
    }
};

} // namespace

QAction* MainWindow::Add(QMenu* menu, const char* name, const QString& text, const QKeySequence& key,
                         const std::function<void()>& deed) {
    QAction* action = menu->addAction(text);
    action->setObjectName(QLatin1String(name));
    action->setShortcut(key);
    connect(action, &QAction::triggered, this, deed);
    return action;
}

void MainWindow::MakeMovieMenu() {
    QMenu* menu = menuBar()->addMenu(tr("&Movies"));
    Add(menu, "open", tr("&Open movies…"), QKeySequence::Open, [this] { OpenFiles(); });
    Add(menu, "openFolder", tr("Open a &folder…"), tr("Ctrl+Shift+O"), [this] { OpenFolder(); });
    menu->addSeparator();
    Add(menu, "naming", tr("&Names and folder of new files…"), tr("Ctrl+N"), [this] { ShowNaming(); });
    menu->addSeparator();
    Add(menu, "quit", tr("&Quit"), QKeySequence::Quit, [this] { close(); });
}

void MainWindow::MakeQueueMenu() {
    QMenu* menu = menuBar()->addMenu(tr("&Queue"));
    up_ = Add(menu, "up", tr("Move &up"), tr("Ctrl+Up"), [this] { view_->MoveSelected(-1); });
    down_ = Add(menu, "down", tr("Move &down"), tr("Ctrl+Down"), [this] { view_->MoveSelected(1); });
    menu->addSeparator();
    again_ = Add(menu, "again", tr("Convert &again"), tr("Ctrl+R"),
                 [this] { queue_.Retry(view_->SelectedIds()); });
    // The current movie's, or of those selected the first one's that has any.
    const auto chosenFile = [this] {
        for (const quint64 id : QList<quint64>{view_->CurrentId()} + view_->SelectedIds())
            if (const Entry* entry = queue_.Find(id); entry != nullptr && !entry->outcome.files.empty())
                return entry->outcome.files.front();
        return std::string();
    };
    play_ = Add(menu, "play", tr("&Play the converted movie"), tr("Ctrl+Shift+P"), [this, chosenFile] {
        if (const std::string file = chosenFile(); !file.empty())
            Q_EMIT FileWanted(file);
    });
    folder_ = Add(menu, "folder", tr("Show in &folder"), tr("Ctrl+Shift+F"), [this, chosenFile] {
        if (const std::string file = chosenFile(); !file.empty())
            Q_EMIT FolderWanted(file);
    });
    menu->addSeparator();
    remove_ = Add(menu, "remove", tr("&Remove"), QKeySequence::Delete,
                  [this] { queue_.Remove(view_->SelectedIds()); });
    removeOver_ = Add(menu, "removeOver", tr("Remove what is &over"), tr("Ctrl+Shift+Del"),
                      [this] { queue_.RemoveOver(); });
    remove_->setShortcutContext(Qt::WidgetShortcut); // the key belongs to text fields as well
    view_->addActions({up_, down_, again_, play_, folder_, remove_});
}

void MainWindow::MakeConversionMenu() {
    QMenu* menu = menuBar()->addMenu(tr("&Conversion"));
    start_ = Add(menu, "start", tr("&Convert"), tr("Ctrl+Return"), [this] { StartOrGoOn(); });
    pause_ = Add(menu, "pause", tr("&Pause"), tr("Ctrl+P"), [this] {
        if (dispatcher_.IsPaused())
            dispatcher_.ResumeAll();
        else
            dispatcher_.PauseAll();
    });
    stop_ = Add(menu, "stop", tr("&Stop everything"), tr("Ctrl+."), [this] { dispatcher_.StopAll(); });
    stopAfter_ = menu->addAction(tr("Stop &after this one"));
    stopAfter_->setObjectName(QStringLiteral("stopAfter"));
    stopAfter_->setCheckable(true);
    stopAfter_->setShortcut(tr("Ctrl+E"));
    connect(stopAfter_, &QAction::triggered, &dispatcher_, &Dispatcher::SetStopAfterThis);
    menu->addSeparator();
    MakeAtOnceMenu(menu->addMenu(tr("At the same &time")));
    MakeAtEndMenu(menu->addMenu(tr("When &everything is done")));
}

void MainWindow::MakeAtOnceMenu(QMenu* menu) {
    auto* group = new QActionGroup(this);
    for (int count = 1; count <= Dispatcher::kMostAtOnce; ++count) {
        QAction* action = menu->addAction(tr("%n movies", "", count));
        action->setObjectName(QStringLiteral("atOnce%1").arg(count));
        action->setCheckable(true);
        action->setChecked(count == settings_.LoadAtOnce());
        group->addAction(action);
        connect(action, &QAction::triggered, this, [this, count] {
            dispatcher_.SetAtOnce(count);
            settings_.SaveAtOnce(count);
        });
    }
}

void MainWindow::MakeAtEndMenu(QMenu* menu) {
    const AtEnd atEnd = settings_.LoadAtEnd();
    QAction* sound = menu->addAction(tr("Play a &sound"));
    sound->setObjectName(QStringLiteral("endSound"));
    sound->setCheckable(true);
    sound->setChecked(atEnd.sound);
    connect(sound, &QAction::toggled, this, [this](bool on) {
        AtEnd changed = settings_.LoadAtEnd();
        changed.sound = on;
        settings_.Save(changed);
    });
    menu->addSeparator();
    auto* group = new QActionGroup(this);
    const std::vector<std::pair<AtEnd::Then, QString>> choices = {
        {AtEnd::Then::kNothing, tr("Stay &open")},
        {AtEnd::Then::kQuit, tr("&Quit")},
        {AtEnd::Then::kSuspend, tr("S&uspend the machine")}};
    for (const auto& [then, text] : choices) {
        QAction* action = menu->addAction(text);
        action->setObjectName(QStringLiteral("end%1").arg(static_cast<int>(then)));
        action->setCheckable(true);
        action->setChecked(then == atEnd.then);
        group->addAction(action);
        connect(action, &QAction::triggered, this, [this, choice = then] {
            AtEnd changed = settings_.LoadAtEnd();
            changed.then = choice;
            settings_.Save(changed);
        });
    }
}

void MainWindow::MakeHelpMenu() {
    QMenu* menu = menuBar()->addMenu(tr("&Help"));
    Add(menu, "about", tr("&About MovieConv"), {}, [this] {
        auto* box =
            new QMessageBox(QMessageBox::NoIcon, tr("About MovieConv"),
                            tr("MovieConv %1 converts movies.").arg(QApplication::applicationVersion()),
                            QMessageBox::Close, this);
        box->setObjectName(QStringLiteral("aboutBox"));
        box->setAttribute(Qt::WA_DeleteOnClose);
        box->setModal(false);
        box->show();
    });
}

QWidget* MainWindow::MakeEmptyPage() {
    auto* page = new QWidget;
    auto* layout = new QVBoxLayout(page);
    layout->setSpacing(18);
    auto* title = MakeTitle(tr("Drop movies here"), 1.9, true);
    auto* sentence =
        MakeHint(tr("Drop movies or folders here, choose what they shall become, and press Convert."));
    sentence->setAlignment(Qt::AlignHCenter);
    sentence->setWordWrap(false);
    auto* open = new PrimaryButton(tr("&Open movies…"));
    open->setObjectName(QStringLiteral("openButton"));
    connect(open, &QPushButton::clicked, this, &MainWindow::OpenFiles);
    layout->addStretch(3);
    layout->addWidget(new BigSign, 0, Qt::AlignHCenter);
    layout->addWidget(title, 0, Qt::AlignHCenter);
    layout->addWidget(sentence, 0, Qt::AlignHCenter);
    layout->addWidget(open, 0, Qt::AlignHCenter);
    layout->addStretch(4);
    return page;
}

QWidget* MainWindow::MakeWorkspace() {
    for (QWidget* page : std::initializer_list<QWidget*>{entryPage_, workPage_, overPage_})
        details_->addWidget(page);
    splitter_ = new QSplitter(Qt::Horizontal);
    splitter_->addWidget(view_);
    splitter_->addWidget(details_);
    splitter_->setStretchFactor(0, 0);
    splitter_->setStretchFactor(1, 1);
    splitter_->setSizes({kListWidth, 1080 - kListWidth});
    splitter_->setHandleWidth(1);
    splitter_->setChildrenCollapsible(false);
    view_->setMinimumWidth(kLeastOfList);
    details_->setMinimumWidth(kLeastOfPage);
    return splitter_;
}

QWidget* MainWindow::MakeFoot() {
    totals_ = new QLabel;
    totals_->setAccessibleName(tr("How the queue stands"));
    bar_ = new SlimBar(5);
    bar_->setAccessibleName(tr("Progress of the queue"));
    auto* open = new QPushButton(IconOf(Sign::kAdd), tr("A&dd movies…"));
    open->setObjectName(QStringLiteral("addButton"));
    pauseButton_ = new QPushButton(IconOf(Sign::kPause), tr("Pause"));
    stopButton_ = new QPushButton(IconOf(Sign::kStop), tr("Stop"));
    startButton_ = new PrimaryButton(tr("Convert"));
    startButton_->setObjectName(QStringLiteral("startButton"));
    pauseButton_->setObjectName(QStringLiteral("pauseButton"));
    stopButton_->setObjectName(QStringLiteral("stopButton"));
    pauseButton_->setAccessibleDescription(tr("Pauses everything"));
    stopButton_->setAccessibleDescription(tr("Stops everything; what is converted is kept"));
    startButton_->setAccessibleDescription(tr("Converts all movies that wait"));
    connect(open, &QPushButton::clicked, this, &MainWindow::OpenFiles);
    connect(pauseButton_, &QPushButton::clicked, this, [this] { pause_->trigger(); });
    connect(stopButton_, &QPushButton::clicked, this, [this] { stop_->trigger(); });
    connect(startButton_, &QPushButton::clicked, this, [this] { start_->trigger(); });

    auto* foot = new Foot;
    auto* layout = new QHBoxLayout(foot);
    layout->setContentsMargins(16, 12, 16, 12);
    layout->setSpacing(10);
    layout->addWidget(open);
    auto* middle = new QVBoxLayout;
    middle->setSpacing(6);
    middle->addStretch();
    middle->addWidget(totals_);
    middle->addWidget(bar_);
    middle->addStretch();
    layout->addSpacing(8);
    layout->addLayout(middle, 1);
    layout->addSpacing(8);
    for (QPushButton* button : {pauseButton_, stopButton_, startButton_})
        layout->addWidget(button);
    return foot;
}

} // namespace movieconv::window
