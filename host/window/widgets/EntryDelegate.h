// Draws an entry of the queue: its name, how it stands, how far it is.
#ifndef MOVIECONV_HOST_WINDOW_WIDGETS_ENTRYDELEGATE_H
#define MOVIECONV_HOST_WINDOW_WIDGETS_ENTRYDELEGATE_H

#include "host/window/model/Queue.h"

#include <QStyledItemDelegate>

namespace movieconv::window {

class EntryDelegate : public QStyledItemDelegate {
    Q_OBJECT
public:
    /// `queue` must outlive it.
    explicit EntryDelegate(const Queue& queue, QObject* parent = nullptr);

    void paint(QPainter* painter, const QStyleOptionViewItem& option,
               const QModelIndex& index) const override;
    QSize sizeHint(const QStyleOptionViewItem& option, const QModelIndex& index) const override;

private:
    const Queue& queue_;
};

} // namespace movieconv::window

#endif
