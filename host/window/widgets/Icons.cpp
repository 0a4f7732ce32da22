#include "host/window/widgets/Icons.h"

#include <QGuiApplication>
#include <QIconEngine>
#include <QPainter>
#include <QPainterPath>
#include <QPalette>

namespace movieconv::window {
namespace {

constexpr qreal kGrid = 16; // signs are drawn on a square of so many units

struct Drawing {
    QPainterPath filled;
    QPainterPath lines;
};

QPainterPath Polygon(std::initializer_list<QPointF> points) {
    QPainterPath path;
    path.addPolygon(QPolygonF(QList<QPointF>(points)));
    path.closeSubpath();
    return path;
}

QPainterPath Polyline(std::initializer_list<QPointF> points) {
    QPainterPath path;
    path.addPolygon(QPolygonF(QList<QPointF>(points)));
    return path;
}

QPainterPath Rounded(const QRectF& rectangle, qreal radius) {
    QPainterPath path;
    path.addRoundedRect(rectangle, radius, radius);
    return path;
}

Drawing DrawMovie() {
    Drawing drawing;
    drawing.lines = Rounded({1.5, 3, 13, 10}, 1.5);
    drawing.filled = Polygon({{6.5, 5.5}, {11, 8}, {6.5, 10.5}});
    return drawing;
}

Drawing DrawAgain() {
    Drawing drawing;
    drawing.lines.arcMoveTo(QRectF(3, 3, 10, 10), 60);
    drawing.lines.arcTo(QRectF(3, 3, 10, 10), 60, 290);
    drawing.filled = Polygon({{10, 0.8}, {14.2, 3.8}, {9.4, 6}});
    return drawing;
}

Drawing DrawWarning() {
    Drawing drawing;
    drawing.lines = Polygon({{8, 2}, {14.5, 13.5}, {1.5, 13.5}});
    drawing.lines.addPath(Polyline({{8, 6.2}, {8, 9.4}}));
    drawing.filled.addEllipse(QPointF(8, 11.5), 0.9, 0.9);
    return drawing;
}

Drawing DrawClock() {
    Drawing drawing;
    drawing.lines.addEllipse(QPointF(8, 8), 6, 6);
    drawing.lines.addPath(Polyline({{8, 4.8}, {8, 8}, {10.4, 9.6}}));
    return drawing;
}

Drawing DrawingOf(Sign sign) {
    switch (sign) {
    case Sign::kAdd: {
        Drawing drawing{{}, Polyline({{8, 2.5}, {8, 13.5}})};
        drawing.lines.addPath(Polyline({{2.5, 8}, {13.5, 8}}));
        return drawing;
    }
    case Sign::kFolder:
        return {{}, Polygon({{1.5, 3.5}, {6, 3.5}, {7.5, 5.5}, {14.5, 5.5}, {14.5, 13}, {1.5, 13}})};
    case Sign::kStart:
        return {Polygon({{4, 2.5}, {13.5, 8}, {4, 13.5}}), {}};
    case Sign::kPause: {
        QPainterPath path = Rounded({3.5, 2.5, 3.2, 11}, 0.8);
        path.addPath(Rounded({9.3, 2.5, 3.2, 11}, 0.8));
        return {path, {}};
    }
    case Sign::kStop:
        return {Rounded({3, 3, 10, 10}, 1.2), {}};
    case Sign::kRemove: {
        Drawing drawing{{}, Polyline({{3.5, 3.5}, {12.5, 12.5}})};
        drawing.lines.addPath(Polyline({{12.5, 3.5}, {3.5, 12.5}}));
        return drawing;
    }
    case Sign::kUp:
        return {{}, Polyline({{3, 10.5}, {8, 5.5}, {13, 10.5}})};
    case Sign::kDown:
        return {{}, Polyline({{3, 5.5}, {8, 10.5}, {13, 5.5}})};
    case Sign::kAgain:
        return DrawAgain();
    case Sign::kDone:
        return {{}, Polyline({{2.5, 8.5}, {6.3, 12.3}, {13.5, 4}})};
    case Sign::kWarning:
        return DrawWarning();
    case Sign::kMovie:
        return DrawMovie();
    case Sign::kClock:
        return DrawClock();
    }
    return {};
}

class SignEngine : public QIconEngine {
public:
    explicit SignEngine(Sign sign) : sign_(sign) {}

    void paint(QPainter* painter, const QRect& place, QIcon::Mode mode, QIcon::State) override {
        const auto group = mode == QIcon::Disabled ? QPalette::Disabled : QPalette::Active;
        const auto role = mode == QIcon::Selected ? QPalette::HighlightedText : QPalette::ButtonText;
        PaintSign(*painter, sign_, place, QGuiApplication::palette().color(group, role));
    }

    QPixmap pixmap(const QSize& size, QIcon::Mode mode, QIcon::State state) override {
        QPixmap pixmap(size);
        if (pixmap.isNull())
            return pixmap;
        pixmap.fill(Qt::transparent);
        QPainter painter(&pixmap);
        paint(&painter, QRect(QPoint(0, 0), size), mode, state);
        return pixmap;
    }

    QIconEngine* clone() const override { return new SignEngine(sign_); }

private:
    const Sign sign_;
};

} // namespace

QIcon IconOf(Sign sign) {
    return QIcon(new SignEngine(sign));
}

void PaintSign(QPainter& painter, Sign sign, const QRectF& place, const QColor& colour) {
    const Drawing drawing = DrawingOf(sign);
    painter.save();
    painter.setRenderHint(QPainter::Antialiasing);
    painter.translate(place.topLeft());
    painter.scale(place.width() / kGrid, place.height() / kGrid);
    painter.fillPath(drawing.filled, colour);
    painter.strokePath(drawing.lines, QPen(colour, 1.5, Qt::SolidLine, Qt::RoundCap, Qt::RoundJoin));
    painter.restore();
}

} // namespace movieconv::window
