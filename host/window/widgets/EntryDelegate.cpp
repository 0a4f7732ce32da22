#include "host/window/widgets/EntryDelegate.h"

#include "host/window/widgets/Icons.h"
#include "host/window/widgets/Look.h"

#include <QApplication>
#include <QPainter>

namespace movieconv::window {
namespace {

constexpr int kPadding = 12;
constexpr int kSignSize = 20;
constexpr int kBarHeight = 3;

Sign SignOf(const Entry& entry) {
    switch (entry.state) {
    case State::kWaiting:
        return !entry.unusable.isEmpty() || !entry.findings.warnings.isEmpty() ? Sign::kWarning
                                                                               : Sign::kMovie;
    case State::kActive:
        return entry.figures.phase == Phase::kPaused           ? Sign::kPause
               : entry.figures.phase == Phase::kWaitingForRoom ? Sign::kWarning
                                                               : Sign::kStart;
    case State::kDone:
        return Sign::kDone;
    case State::kStopped:
        return Sign::kStop;
    case State::kFailed:
        return Sign::kWarning;
    case State::kInterrupted:
        return Sign::kAgain;
    }
    return Sign::kMovie;
}

QColor SignColour(const Entry& entry, const QPalette& palette) {
    const bool bad =
        entry.state == State::kFailed || (entry.state == State::kWaiting && !entry.unusable.isEmpty());
    if (bad)
        return BadColour(palette);
    if (SignOf(entry) == Sign::kWarning || entry.state == State::kInterrupted)
        return WarningColour(palette);
    if (entry.state == State::kDone)
        return GoodColour(palette);
    return entry.state == State::kActive ? palette.color(QPalette::Highlight) : DimColour(palette);
}

void PaintBar(QPainter& painter, const QRect& place, const Entry& entry, const QPalette& palette) {
    painter.setPen(Qt::NoPen);
    painter.setBrush(LineColour(palette));
    painter.drawRoundedRect(place, kBarHeight / 2.0, kBarHeight / 2.0);
    QRectF done(place);
    done.setWidth(place.width() * std::clamp(entry.figures.fraction, 0.0, 1.0));
    painter.setBrush(palette.color(QPalette::Highlight));
    painter.drawRoundedRect(done, kBarHeight / 2.0, kBarHeight / 2.0);
}

} // namespace

EntryDelegate::EntryDelegate(const Queue& queue, QObject* parent)
    : QStyledItemDelegate(parent), queue_(queue) {}

void EntryDelegate::paint(QPainter* painter, const QStyleOptionViewItem& option,
                          const QModelIndex& index) const {
    const Entry& entry = queue_.Entries().at(static_cast<size_t>(index.row()));
    const QPalette& palette = option.palette;
    painter->save();
    painter->setRenderHint(QPainter::Antialiasing);

    const QRect card = option.rect.adjusted(6, 2, -6, -2);
    if (option.state & QStyle::State_Selected) {
        QColor colour = palette.color(QPalette::Highlight);
        colour.setAlpha(option.state & QStyle::State_HasFocus ? 56 : 36);
        painter->setPen(Qt::NoPen);
        painter->setBrush(colour);
        painter->drawRoundedRect(card, 8, 8);
    }
    if (option.state & QStyle::State_HasFocus) {
        painter->setPen(QPen(palette.color(QPalette::Highlight), 1.5));
        painter->setBrush(Qt::NoBrush);
        painter->drawRoundedRect(QRectF(card).adjusted(0.75, 0.75, -0.75, -0.75), 8, 8);
    }

    const QRect inner = card.adjusted(kPadding, 0, -kPadding, 0);
    const QRect sign(inner.left(), inner.center().y() - kSignSize / 2, kSignSize, kSignSize);
    PaintSign(*painter, SignOf(entry), sign, SignColour(entry, palette));

    QFont strong = option.font;
    strong.setWeight(QFont::DemiBold);
    const QFontMetrics strongMetrics(strong);
    const QFontMetrics metrics(option.font);
    const int left = sign.right() + kPadding;
    const int width = inner.right() - left;
    const int top = card.center().y() - (strongMetrics.height() + metrics.height() + 2) / 2;

    painter->setFont(strong);
    painter->setPen(palette.color(QPalette::Text));
    painter->drawText(QRect(left, top, width, strongMetrics.height()), Qt::AlignLeft | Qt::AlignVCenter,
                      strongMetrics.elidedText(index.data().toString(), Qt::ElideMiddle, width));
    painter->setFont(option.font);
    painter->setPen(entry.state == State::kFailed ? BadColour(palette) : DimColour(palette));
    painter->drawText(QRect(left, top + strongMetrics.height() + 2, width, metrics.height()),
                      Qt::AlignLeft | Qt::AlignVCenter,
                      metrics.elidedText(queue_.LineOf(entry).simplified(), Qt::ElideRight, width));
    if (entry.state == State::kActive)
        PaintBar(*painter, QRect(left, card.bottom() - kBarHeight - 4, width, kBarHeight), entry, palette);
    painter->restore();
}

QSize EntryDelegate::sizeHint(const QStyleOptionViewItem& option, const QModelIndex&) const {
    return {200, option.fontMetrics.height() * 2 + 32};
}

} // namespace movieconv::window
