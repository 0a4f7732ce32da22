// The window's signs, drawn in the colours that the system has at the moment.
#ifndef MOVIECONV_HOST_WINDOW_WIDGETS_ICONS_H
#define MOVIECONV_HOST_WINDOW_WIDGETS_ICONS_H

#include <QColor>
#include <QIcon>
#include <QRectF>

class QPainter;

namespace movieconv::window {

enum class Sign {
    kAdd,
    kFolder,
    kStart,
    kPause,
    kStop,
    kRemove,
    kUp,
    kDown,
    kAgain,
    kDone,
    kWarning,
    kMovie,
    kClock
};

/// For buttons and actions.
QIcon IconOf(Sign sign);

void PaintSign(QPainter& painter, Sign sign, const QRectF& place, const QColor& colour);

} // namespace movieconv::window

#endif
