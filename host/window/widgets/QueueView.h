// The list of movies, with everything that can be done in it by mouse and keyboard.
#ifndef MOVIECONV_HOST_WINDOW_WIDGETS_QUEUEVIEW_H
#define MOVIECONV_HOST_WINDOW_WIDGETS_QUEUEVIEW_H

#include "host/window/model/Queue.h"

#include <QListView>

namespace movieconv::window {

/// Entries are dragged to other places within; files that are dropped go to the window.
class QueueView : public QListView {
    Q_OBJECT
public:
    /// `queue` must outlive it.
    explicit QueueView(Queue& queue, QWidget* parent = nullptr);

    /// In the queue's order; the current one where none is selected.
    QList<quint64> SelectedIds() const;
    /// 0 without one.
    quint64 CurrentId() const;
    void Select(quint64 id);
    /// Moves the selected entries by one place.
    void MoveSelected(int by);

Q_SIGNALS:
    void CurrentChanged(quint64 id);

protected:
    void dragEnterEvent(QDragEnterEvent* event) override;
    void dragMoveEvent(QDragMoveEvent* event) override;
    void dropEvent(QDropEvent* event) override;
    void currentChanged(const QModelIndex& current, const QModelIndex& previous) override;

private:
    Queue& queue_;
};

} // namespace movieconv::window

#endif
