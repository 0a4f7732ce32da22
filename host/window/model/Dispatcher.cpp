#include "host/window/model/Dispatcher.h"

#include <QCoreApplication>
#include <QTime>

#include <algorithm>
#include <atomic>
#include <mutex>
#include <utility>

namespace movieconv::window {

/// Carries a run's news to the window's thread: of figures and pictures only the newest, so that a busy
/// window gets no backlog.
class Mailbox : public RunListener, public std::enable_shared_from_this<Mailbox> {
public:
    struct News {
        std::optional<Figures> figures;
        QImage picture;
        QStringList notes;
        std::optional<Outcome> outcome;
    };

    Mailbox(Dispatcher& dispatcher, quint64 id)
        : dispatcher_(&dispatcher), id_(id), pictureRoom_(dispatcher.pictureRoom_) {}

    /// Nobody collects any more: a run may have news for longer than there is a dispatcher.
    void Close() {
        const std::lock_guard lock(posting_);
        dispatcher_ = nullptr;
    }

    void OnFigures(const Figures& figures) override {
        Put([&](News& news) { news.figures = figures; });
    }
    /// Brought to its size on the run's thread: when the window paints a picture in another size, it waits
    /// for threads that wait for a processor.
    void OnPicture(const QImage& picture) override {
        const QSize room = pictureRoom_->load().pixels;
        const QImage fitted = picture.isNull() || room.isEmpty()
                                  ? picture
                                  : picture.scaled(room, Qt::KeepAspectRatio, Qt::SmoothTransformation);
        Put([&](News& news) { news.picture = fitted; });
    }
    void OnNote(const QString& sentence) override {
        Put([&](News& news) { news.notes += sentence; });
    }
    void OnEnd(const Outcome& outcome) override {
        Put([&](News& news) { news.outcome = outcome; });
    }

    News Take() {
        const std::lock_guard lock(mutex_);
        posted_ = false;
        return std::exchange(news_, {});
    }

private:
    template <class Change>
    void Put(Change change) {
        {
            const std::lock_guard lock(mutex_);
            change(news_);
            if (std::exchange(posted_, true))
                return;
        }
        const std::lock_guard lock(posting_); // which the window's thread takes at the end only
        if (dispatcher_ != nullptr)
            dispatcher_->inbox_.Put([dispatcher = dispatcher_, id = id_] { dispatcher->Collect(id); });
    }

    std::mutex posting_;
    Dispatcher* dispatcher_; // as long as that is not null, it stays while `posting_` is held
    const quint64 id_;
    const std::shared_ptr<const std::atomic<Dispatcher::PictureRoom>> pictureRoom_;
    std::mutex mutex_; // of what follows
    News news_;
    bool posted_ = false;
};

Dispatcher::Dispatcher(Queue& queue, Runner& runner, QObject* parent)
    : QObject(parent), queue_(queue), runner_(runner) {
    connect(&queue_, &Queue::Rearranged, this, &Dispatcher::Progressed);
    // What was just added or edited can be started once it was looked at.
    connect(&queue_, &Queue::Rearranged, this, &Dispatcher::Fill);
    connect(&queue_, &Queue::Changed, this, &Dispatcher::Fill);
}

Dispatcher::~Dispatcher() {
    for (auto& [id, active] : active_) {
        active.mailbox->Close();
        active.run->Stop(); // all of them before the first is waited for
    }
}

void Dispatcher::Start() {
    stopAfterThis_ = false;
    if (!working_) {
        if (!HasMore())
            return;
        working_ = true;
        done_ = failed_ = 0;
        secondsDone_ = 0;
        stopped_ = false;
        Q_EMIT WorkBegan();
    }
    Fill();
    Q_EMIT Progressed();
}

void Dispatcher::StopAll() {
    stopAfterThis_ = true;
    for (auto& [id, active] : active_)
        active.run->Stop();
    Fill(); // where nothing runs, that is the end
    Q_EMIT Progressed();
}

void Dispatcher::PauseAll() {
    for (auto& [id, active] : active_) {
        active.paused = true;
        active.run->Pause();
    }
    Q_EMIT Progressed();
}

void Dispatcher::ResumeAll() {
    for (auto& [id, active] : active_) {
        active.paused = false;
        active.run->Resume();
    }
    Fill();
    Q_EMIT Progressed();
}

void Dispatcher::Stop(quint64 id) {
    if (const auto found = active_.find(id); found != active_.end())
        found->second.run->Stop();
}

void Dispatcher::Pause(quint64 id) {
    if (const auto found = active_.find(id); found != active_.end()) {
        found->second.paused = true;
        found->second.run->Pause();
        Q_EMIT Progressed();
    }
}

void Dispatcher::Resume(quint64 id) {
    if (const auto found = active_.find(id); found != active_.end()) {
        found->second.paused = false;
        found->second.run->Resume();
        Fill();
        Q_EMIT Progressed();
    }
}

void Dispatcher::SetStopAfterThis(bool stop) {
    stopAfterThis_ = stop;
    Fill();
    Q_EMIT Progressed();
}

void Dispatcher::SetAtOnce(int count) {
    atOnce_ = std::clamp(count, 1, kMostAtOnce);
    Fill();
}

bool Dispatcher::IsPaused() const {
    return !active_.empty() &&
           std::all_of(active_.begin(), active_.end(), [](const auto& one) { return one.second.paused; });
}

Totals Dispatcher::Now() const {
    Totals totals;
    totals.done = done_;
    totals.failed = failed_;
    totals.stopped = stopped_;
    bool known = true;
    double rest = 0;
    double reached = secondsDone_;
    double speed = 0;
    for (const Entry& entry : queue_.Entries()) {
        if (entry.state != State::kActive && !entry.IsStartable())
            continue;
        const std::optional<double> seconds = entry.SecondsWanted();
        known = known && seconds;
        rest += seconds.value_or(0);
        if (entry.state == State::kActive) {
            ++totals.active;
            const double position = std::min(entry.figures.position, seconds.value_or(0));
            rest -= position;
            reached += position;
            speed += entry.figures.speed.value_or(0);
        } else {
            ++totals.waiting;
        }
    }
    if (known && rest + reached > 0)
        totals.fraction = reached / (rest + reached);
    if (known && speed > 0)
        totals.left = rest / speed;
    return totals;
}

void Dispatcher::ShowPicturesOf(quint64 id) {
    if (id == shown_)
        return;
    for (const quint64 one : {shown_, id})
        if (const auto found = active_.find(one); found != active_.end())
            found->second.run->ShowPictures(one == id);
    shown_ = id;
}

void Dispatcher::SetPictureRoom(QSize pixels) {
    *pictureRoom_ = {pixels};
}

/// Starts what there is room for, unless all that runs is paused; ends the work when nothing is left.
void Dispatcher::Fill() {
    while (working_ && !stopAfterThis_ && !IsPaused() && static_cast<int>(active_.size()) < atOnce_) {
        // What is still looked at keeps its turn.
        const auto next =
            std::find_if(queue_.Entries().begin(), queue_.Entries().end(),
                         [](const Entry& entry) { return entry.IsStartable() || entry.IsBeingExamined(); });
        if (next == queue_.Entries().end() || !next->IsStartable())
            break;
        Begin(*next);
    }
    if (working_ && active_.empty() && (stopAfterThis_ || !HasMore())) {
        working_ = false;
        stopAfterThis_ = false;
        Q_EMIT WorkEnded(Now());
    }
}

/// Whether something can be started, now or as soon as it was looked at.
bool Dispatcher::HasMore() const {
    return queue_.IsSearching() ||
           std::any_of(queue_.Entries().begin(), queue_.Entries().end(),
                       [](const Entry& entry) { return entry.IsStartable() || entry.IsBeingExamined(); });
}

void Dispatcher::Begin(const Entry& entry) {
    const quint64 id = entry.id;
    const Order order{entry.source, entry.target, entry.wishes, queue_.MayReplace(entry),
                      entry.facts.value_or(MovieFacts{})};
    Active& active = active_[id];
    active.mailbox = std::make_shared<Mailbox>(*this, id);
    active.run = runner_.Start(order, active.mailbox);
    if (id == shown_)
        active.run->ShowPictures(true);
    queue_.Change(
        id,
        [](Entry& begun) {
            begun.state = State::kActive;
            begun.figures = {};
            begun.notes.clear();
        },
        true);
}

void Dispatcher::Collect(quint64 id) {
    const auto found = active_.find(id);
    if (found == active_.end())
        return;
    const Mailbox::News news = found->second.mailbox->Take();
    if (news.figures || !news.notes.isEmpty()) {
        queue_.Change(
            id,
            [&](Entry& entry) {
                entry.figures = news.figures.value_or(entry.figures);
                for (const QString& note : news.notes)
                    entry.notes += QTime::currentTime().toString(QStringLiteral("HH:mm:ss  ")) + note;
            },
            false);
    }
    if (!news.picture.isNull())
        Q_EMIT PictureCame(id, news.picture);
    if (news.outcome)
        Conclude(id, *news.outcome);
    Q_EMIT Progressed();
}

void Dispatcher::Conclude(quint64 id, const Outcome& outcome) {
    active_.erase(id);
    done_ += outcome.ending == Ending::kDone ? 1 : 0;
    failed_ += outcome.ending == Ending::kFailed ? 1 : 0;
    stopped_ = outcome.ending == Ending::kStopped;
    queue_.Change(
        id,
        [&](Entry& entry) {
            secondsDone_ += entry.SecondsWanted().value_or(0);
            entry.outcome = outcome;
            entry.state = outcome.ending == Ending::kDone      ? State::kDone
                          : outcome.ending == Ending::kStopped ? State::kStopped
                                                               : State::kFailed;
        },
        true);
    Q_EMIT Ended(id);
    Fill();
}

} // namespace movieconv::window
