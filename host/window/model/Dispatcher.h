// Runs the queue: what starts when, how far it is, what became of it.
#ifndef MOVIECONV_HOST_WINDOW_MODEL_DISPATCHER_H
#define MOVIECONV_HOST_WINDOW_MODEL_DISPATCHER_H

#include "host/window/model/Queue.h"

#include <QImage>
#include <QObject>
#include <QSize>

#include <atomic>
#include <map>
#include <memory>

namespace movieconv::window {

class Mailbox;

/// How the whole queue stands.
struct Totals {
    int waiting = 0; ///< Startable ones.
    int active = 0;
    int done = 0; ///< Since work began.
    int failed = 0;
    double fraction = -1; ///< Of all that is to be done since work began; negative when it cannot be told.
    std::optional<double> left; ///< Seconds.
    bool stopped = false;       ///< The user stopped the last one that ended.
};

/// Belongs to the window's thread.
class Dispatcher : public QObject {
    Q_OBJECT
public:
    static constexpr int kMostAtOnce = 8;

    /// `queue` and `runner` must outlive it.
    Dispatcher(Queue& queue, Runner& runner, QObject* parent = nullptr);
    /// Stops what is running and waits for it.
    ~Dispatcher() override;

    /// Converts what waits, in its order.
    void Start();
    /// Stops everything; what was converted is kept. The rest of the queue goes on waiting.
    void StopAll();
    void PauseAll();
    void ResumeAll();
    void Stop(quint64 id);
    void Pause(quint64 id);
    void Resume(quint64 id);

    /// Begins nothing new until the next Start.
    void SetStopAfterThis(bool stop);
    bool StopsAfterThis() const { return stopAfterThis_; }
    /// How many movies are converted at the same time, 1 to kMostAtOnce.
    void SetAtOnce(int count);
    int AtOnce() const { return atOnce_; }

    /// Whether movies are being converted or are about to be.
    bool IsWorking() const { return working_; }
    /// Whether all that runs is paused.
    bool IsPaused() const;
    Totals Now() const;

    /// Whose pictures PictureCame shows; 0 for nobody's.
    void ShowPicturesOf(quint64 id);
    /// Pictures come as large as they fit in there, in their own shape; an empty size: as they are.
    void SetPictureRoom(QSize pixels);

Q_SIGNALS:
    void WorkBegan();
    /// Nothing runs any more, and nothing will.
    void WorkEnded(const movieconv::window::Totals& totals);
    void Ended(quint64 id);
    void PictureCame(quint64 id, const QImage& picture);
    /// Totals, paused or "stop after this one" may have changed.
    void Progressed();

private:
    friend class Mailbox;
    /// Aligned as a whole: a compiler would otherwise take a lock to read it.
    struct alignas(sizeof(QSize)) PictureRoom {
        QSize pixels;
    };
    struct Active {
        std::shared_ptr<Mailbox> mailbox;
        std::unique_ptr<Run> run;
        bool paused = false;
    };

    void Fill();
    bool HasMore() const;
    void Begin(const Entry& entry);
    void Collect(quint64 id);
    void Conclude(quint64 id, const Outcome& outcome);

    Queue& queue_;
    Runner& runner_;
    Inbox inbox_; // of the runs' news
    std::map<quint64, Active> active_;
    int atOnce_ = 1;
    bool working_ = false;
    bool stopAfterThis_ = false;
    quint64 shown_ = 0;
    const std::shared_ptr<std::atomic<PictureRoom>> pictureRoom_ =
        std::make_shared<std::atomic<PictureRoom>>();
    int done_ = 0;
    int failed_ = 0;
    double secondsDone_ = 0;
    bool stopped_ = false;
};

} // namespace movieconv::window

#endif
