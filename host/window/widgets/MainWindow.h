// The window: the queue on the left, what concerns the chosen movie on the right, what concerns everything
// below.
#ifndef MOVIECONV_HOST_WINDOW_WIDGETS_MAINWINDOW_H
#define MOVIECONV_HOST_WINDOW_WIDGETS_MAINWINDOW_H

#include "host/window/model/Dispatcher.h"
#include "host/window/model/Settings.h"

#include <QMainWindow>

class QAction;
class QLabel;
class QMenu;
class QProgressBar;
class QPushButton;
class QSplitter;
class QStackedWidget;

namespace movieconv::window {

class Closing;
class EntryPage;
class NoticeBar;
class OverPage;
class QueueView;
class WorkPage;

class MainWindow : public QMainWindow {
    Q_OBJECT
public:
    /// All of them must outlive it.
    MainWindow(Queue& queue, Dispatcher& dispatcher, Runner& runner, Settings& settings);

    /// Tells about something that needs no answer at once.
    void Tell(const QString& sentence);
    /// Offers what was interrupted once more.
    void OfferInterrupted();
    /// Stops everything, then closes, without asking.
    void StopAndClose();
    /// Whether it closes as soon as everything is stopped.
    bool IsStopping() const;

Q_SIGNALS:
    /// The user wants the program to end, and nothing stands in the way.
    void Closed();
    /// The user wants the program to end while a conversion does not answer.
    void LeaveWanted();
    void FileWanted(const std::string& path);
    void FolderWanted(const std::string& path);

protected:
    void closeEvent(QCloseEvent* event) override;
    void changeEvent(QEvent* event) override;
    void dragEnterEvent(QDragEnterEvent* event) override;
    void dropEvent(QDropEvent* event) override;

private:
    QAction* Add(QMenu* menu, const char* name, const QString& text, const QKeySequence& key,
                 const std::function<void()>& deed);
    void MakeMovieMenu();
    void MakeQueueMenu();
    void MakeConversionMenu();
    void MakeAtOnceMenu(QMenu* menu);
    void MakeAtEndMenu(QMenu* menu);
    void MakeHelpMenu();
    QWidget* MakeEmptyPage();
    QWidget* MakeWorkspace();
    QWidget* MakeFoot();
    void Connect();

    void OpenFiles();
    void OpenFolder();
    void StartOrGoOn();
    void KeepPlaces();
    void ShowNaming();
    void SavePreset(const Wishes& wishes);
    void LoadPreset(quint64 id);
    void ShowEntry();
    void ShowTotals();
    void ShowActions();
    void ShowAll();
    void OnChanged(quint64 id);
    void OnEnded(quint64 id);

    Queue& queue_;
    Dispatcher& dispatcher_;
    Runner& runner_;
    Settings& settings_;

    QAction* start_ = nullptr;
    QAction* pause_ = nullptr;
    QAction* stop_ = nullptr;
    QAction* stopAfter_ = nullptr;
    QAction* remove_ = nullptr;
    QAction* removeOver_ = nullptr;
    QAction* up_ = nullptr;
    QAction* down_ = nullptr;
    QAction* again_ = nullptr;
    QAction* play_ = nullptr;
    QAction* folder_ = nullptr;

    NoticeBar* notices_;
    Closing* closing_;
    QStackedWidget* pages_; // empty or the workspace
    QueueView* view_;
    QSplitter* splitter_ = nullptr; // between these two
    QStackedWidget* details_;
    EntryPage* entryPage_;
    WorkPage* workPage_;
    OverPage* overPage_;
    QWidget* foot_ = nullptr;
    QLabel* totals_ = nullptr;
    QProgressBar* bar_ = nullptr;
    QPushButton* pauseButton_ = nullptr;
    QPushButton* stopButton_ = nullptr;
    QPushButton* startButton_ = nullptr;
};

} // namespace movieconv::window

#endif
