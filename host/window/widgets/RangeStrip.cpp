#include "host/window/widgets/RangeStrip.h"

#include "host/window/model/Words.h"
#include "host/window/widgets/Look.h"

#include <QKeyEvent>
#include <QMouseEvent>
#include <QPainter>
#include <QPainterPath>

#include <algorithm>
#include <cmath>

namespace movieconv::window {
namespace {

constexpr double kHandleWidth = 9;
constexpr double kShortest = 0.1; // seconds that are left between the handles

/// The part of a picture that fills a place without distortion.
QRectF Filling(const QImage& picture, const QRectF& place) {
    const double scale = std::min(picture.width() / place.width(), picture.height() / place.height());
    const QSizeF size = place.size() * scale;
    return {QPointF((picture.width() - size.width()) / 2, (picture.height() - size.height()) / 2), size};
}

} // namespace

RangeStrip::RangeStrip(QWidget* parent) : QWidget(parent), pictures_(kPictures) {
    setFocusPolicy(Qt::StrongFocus);
    setSizePolicy(QSizePolicy::Expanding, QSizePolicy::Fixed);
    setAccessibleName(tr("Range"));
    setAccessibleDescription(tr("B and E choose the begin or the end, the arrow keys move it by a second."));
    setToolTip(tr("Drag the ends to convert a part of the movie."));
}

void RangeStrip::SetLength(double seconds) {
    length_ = std::max(0.0, seconds);
    std::fill(pictures_.begin(), pictures_.end(), QImage());
    setEnabled(length_ > kShortest);
    update();
}

void RangeStrip::SetRange(double begin, std::optional<double> end) {
    begin_ = begin;
    end_ = end;
    update();
}

void RangeStrip::SetPicture(int number, const QImage& picture) {
    pictures_.at(static_cast<size_t>(number)) = picture;
    update();
}

double RangeStrip::TimeOf(int number) const {
    return length_ * (number + 0.5) / kPictures;
}

bool RangeStrip::IsFilled() const {
    return std::none_of(pictures_.begin(), pictures_.end(),
                        [](const QImage& picture) { return picture.isNull(); });
}

QRectF RangeStrip::Band() const {
    return QRectF(rect()).adjusted(kHandleWidth, 3, -kHandleWidth, -3);
}

double RangeStrip::XOf(double seconds) const {
    const QRectF band = Band();
    return band.left() + (length_ > 0 ? std::clamp(seconds / length_, 0.0, 1.0) : 0) * band.width();
}

double RangeStrip::TimeAt(double x) const {
    const QRectF band = Band();
    const double seconds = std::clamp((x - band.left()) / band.width(), 0.0, 1.0) * length_;
    return std::round(seconds * 1000) / 1000; // as the fields beside it show it
}

void RangeStrip::paintEvent(QPaintEvent*) {
    QPainter painter(this);
    painter.setRenderHints(QPainter::Antialiasing | QPainter::SmoothPixmapTransform);
    const QRectF band = Band();
    QPainterPath outline;
    outline.addRoundedRect(band, 5, 5);
    painter.setClipPath(outline);
    painter.fillRect(band, LineColour(palette()));
    const double width = band.width() / kPictures;
    for (int i = 0; i < kPictures; ++i) {
        const QImage& picture = pictures_[static_cast<size_t>(i)];
        const QRectF place(band.left() + i * width, band.top(), width, band.height());
        if (!picture.isNull())
            painter.drawImage(place, picture, Filling(picture, place));
    }
    const double left = XOf(begin_);
    const double right = XOf(end_.value_or(length_));
    QColor veil = palette().color(QPalette::Window);
    veil.setAlpha(190);
    painter.fillRect(QRectF(band.topLeft(), QPointF(left, band.bottom())), veil);
    painter.fillRect(QRectF(QPointF(right, band.top()), band.bottomRight()), veil);
    painter.setClipping(false);

    const QColor colour =
        palette().color(isEnabled() ? QPalette::Active : QPalette::Disabled, QPalette::Highlight);
    painter.setPen(QPen(colour, 2));
    painter.drawRect(QRectF(QPointF(left, 2), QPointF(right, height() - 2.0)));
    for (const Handle handle : {Handle::kBegin, Handle::kEnd}) {
        const double x = handle == Handle::kBegin ? left - kHandleWidth : right;
        const QRectF place(x, 1, kHandleWidth, height() - 2.0);
        painter.setPen(Qt::NoPen);
        painter.setBrush(colour);
        painter.drawRoundedRect(place, 3, 3);
        painter.setPen(
            QPen(palette().color(QPalette::HighlightedText), hasFocus() && handle == held_ ? 3 : 1.5));
        painter.drawLine(QPointF(place.center().x(), place.center().y() - 7),
                         QPointF(place.center().x(), place.center().y() + 7));
    }
}

void RangeStrip::mousePressEvent(QMouseEvent* event) {
    if (event->button() != Qt::LeftButton)
        return QWidget::mousePressEvent(event);
    const double x = event->position().x();
    held_ = std::abs(x - XOf(begin_)) <= std::abs(x - XOf(end_.value_or(length_))) ? Handle::kBegin
                                                                                   : Handle::kEnd;
    MoveTo(TimeAt(x));
}

void RangeStrip::mouseMoveEvent(QMouseEvent* event) {
    if (event->buttons() & Qt::LeftButton)
        MoveTo(TimeAt(event->position().x()));
}

void RangeStrip::keyPressEvent(QKeyEvent* event) {
    const double now = held_ == Handle::kBegin ? begin_ : end_.value_or(length_);
    switch (event->key()) {
    case Qt::Key_B:
        held_ = Handle::kBegin;
        update();
        return;
    case Qt::Key_E:
        held_ = Handle::kEnd;
        update();
        return;
    case Qt::Key_Left:
        return MoveTo(now - 1);
    case Qt::Key_Right:
        return MoveTo(now + 1);
    case Qt::Key_PageUp:
        return MoveTo(now - 60);
    case Qt::Key_PageDown:
        return MoveTo(now + 60);
    case Qt::Key_Home:
        return MoveTo(0);
    case Qt::Key_End:
        return MoveTo(length_);
    default:
        QWidget::keyPressEvent(event);
    }
}

void RangeStrip::MoveTo(double seconds) {
    if (held_ == Handle::kBegin) {
        begin_ = std::clamp(seconds, 0.0, std::max(0.0, end_.value_or(length_) - kShortest));
    } else {
        const double end = std::clamp(seconds, std::min(begin_ + kShortest, length_), length_);
        end_ = end < length_ ? std::optional(end) : std::nullopt;
    }
    update();
    Q_EMIT RangeChosen(begin_, end_);
}

} // namespace movieconv::window
