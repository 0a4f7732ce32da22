#include "host/window/widgets/QueueView.h"

#include "host/window/widgets/EntryDelegate.h"

#include <QDropEvent>

#include <algorithm>

namespace movieconv::window {

QueueView::QueueView(Queue& queue, QWidget* parent) : QListView(parent), queue_(queue) {
    setModel(&queue);
    setItemDelegate(new EntryDelegate(queue, this));
    setSelectionMode(QAbstractItemView::ExtendedSelection);
    setDragDropMode(QAbstractItemView::DragDrop);
    setDefaultDropAction(Qt::MoveAction);
    setUniformItemSizes(true);
    setVerticalScrollMode(QAbstractItemView::ScrollPerPixel);
    setFrameShape(QFrame::NoFrame);
    setAccessibleName(tr("Movies to convert"));
    setContextMenuPolicy(Qt::ActionsContextMenu);
}

QList<quint64> QueueView::SelectedIds() const {
    QModelIndexList indexes = selectionModel()->selectedIndexes();
    std::sort(indexes.begin(), indexes.end());
    QList<quint64> ids;
    for (const QModelIndex& index : indexes)
        ids.append(index.data(Queue::kIdRole).toULongLong());
    if (ids.isEmpty() && currentIndex().isValid())
        ids.append(CurrentId());
    return ids;
}

quint64 QueueView::CurrentId() const {
    return currentIndex().data(Queue::kIdRole).toULongLong();
}

void QueueView::Select(quint64 id) {
    if (const int row = queue_.RowOf(id); row >= 0)
        selectionModel()->setCurrentIndex(queue_.index(row), QItemSelectionModel::ClearAndSelect);
}

void QueueView::MoveSelected(int by) {
    queue_.MoveBy(SelectedIds(), by);
}

void QueueView::dragEnterEvent(QDragEnterEvent* event) {
    if (event->source() == this)
        event->acceptProposedAction();
    else
        event->ignore();
}

void QueueView::dragMoveEvent(QDragMoveEvent* event) {
    if (event->source() == this)
        event->acceptProposedAction();
    else
        event->ignore();
}

void QueueView::dropEvent(QDropEvent* event) {
    if (event->source() != this) {
        event->ignore();
        return;
    }
    const QPoint place = event->position().toPoint();
    const QModelIndex below = indexAt(place);
    int row = queue_.rowCount();
    if (below.isValid())
        row = below.row() + (place.y() > visualRect(below).center().y() ? 1 : 0);
    queue_.MoveBefore(SelectedIds(), row);
    event->setDropAction(Qt::CopyAction); // the rows were moved already: the view must not remove any
    event->accept();
}

void QueueView::currentChanged(const QModelIndex& current, const QModelIndex& previous) {
    QListView::currentChanged(current, previous);
    Q_EMIT CurrentChanged(current.data(Queue::kIdRole).toULongLong());
}

} // namespace movieconv::window
