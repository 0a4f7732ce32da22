#include "host/window/model/Inbox.h"

#include <QCoreApplication>
#include <QEvent>

#include <utility>

namespace movieconv::window {

void Inbox::Put(Task task) {
    const std::lock_guard turn(posting_);
    {
        const std::lock_guard lock(mutex_);
        tasks_.push_back(std::move(task));
    }
    // It wakes the window's thread, which must not find the tasks locked.
    QCoreApplication::postEvent(this, new QEvent(QEvent::User));
}

/// There is an event for each task.
bool Inbox::event(QEvent* event) {
    if (event->type() != QEvent::User)
        return QObject::event(event);
    Task task;
    {
        const std::lock_guard lock(mutex_);
        task = std::move(tasks_.front());
        tasks_.pop_front();
    }
    task();
    return true;
}

} // namespace movieconv::window
