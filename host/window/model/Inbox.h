// Tasks that other threads leave for the window's thread.
#ifndef MOVIECONV_HOST_WINDOW_MODEL_INBOX_H
#define MOVIECONV_HOST_WINDOW_MODEL_INBOX_H

#include <QObject>

#include <deque>
#include <functional>
#include <mutex>

namespace movieconv::window {

/// Belongs to the thread that made it. What is in it when it ends is dropped. The hand-over is guarded by a
/// lock of its own, which the thread sanitizer sees, unlike the toolkit's.
class Inbox : public QObject {
public:
    using Task = std::function<void()>;

    using QObject::QObject;

    /// From any thread. The tasks are done in their order, soon.
    void Put(Task task);

    bool event(QEvent* event) override;

private:
    Task TakeFor(const QEvent& event);

    std::mutex posting_; ///< Those who put take turns; the window's thread does without it.
    std::mutex mutex_;   ///< Of the tasks.
    std::deque<Task> tasks_;
};

} // namespace movieconv::window

#endif
