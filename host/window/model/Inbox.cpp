#include "host/window/model/Inbox.h"

#include <QCoreApplication>
#include <QEvent>

#include <memory>
#include <utility>

namespace movieconv::window {

/// The event is made, and read, under our lock: the thread sanitizer does not see the toolkit's.
void Inbox::Put(Task task) {
    const std::lock_guard turn(posting_);
    std::unique_ptr<QEvent> arrived;
    {
        const std::lock_guard lock(mutex_);
        arrived = std::make_unique<QEvent>(QEvent::User);
        tasks_.push_back(std::move(task));
    }
    // It wakes the window's thread, which must not find the tasks locked.
    QCoreApplication::postEvent(this, arrived.release());
}

bool Inbox::event(QEvent* event) {
    Task task = TakeFor(*event);
    if (!task)
        return QObject::event(event);
    task();
    return true;
}

/// There is an event for each task; for events of other kinds there is none.
Inbox::Task Inbox::TakeFor(const QEvent& event) {
    const std::lock_guard lock(mutex_);
    if (event.type() != QEvent::User)
        return nullptr;
    Task task = std::move(tasks_.front());
    tasks_.pop_front();
    return task;
}

} // namespace movieconv::window
