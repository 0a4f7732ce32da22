#include "host/window/widgets/Look.h"

#include <QApplication>
#include <QEvent>
#include <QLabel>
#include <QPainter>
#include <QStyleOption>

#include <algorithm>

namespace movieconv::window {
namespace {

QColor Between(const QColor& one, const QColor& other, double share) {
    const auto mix = [&](int a, int b) { return static_cast<int>(a + (b - a) * share); };
    return {mix(one.red(), other.red()), mix(one.green(), other.green()), mix(one.blue(), other.blue())};
}

/// Follows the palette, which a style sheet or a set palette would not.
class Coloured : public QLabel {
public:
    explicit Coloured(QColor (*colour)(const QPalette&)) : colour_(colour) {
        setWordWrap(true);
        setTextFormat(Qt::PlainText);
    }

protected:
    void changeEvent(QEvent* event) override {
        if (event->type() == QEvent::PaletteChange)
            Colour();
        QLabel::changeEvent(event);
    }
    void showEvent(QShowEvent* event) override {
        Colour();
        QLabel::showEvent(event);
    }

private:
    /// The one colour alone: of a palette whose colours are all its own, a label hears of no change.
    void Colour() {
        const QColor colour = colour_(palette());
        if (colour == palette().color(QPalette::WindowText))
            return;
        QPalette own;
        own.setColor(QPalette::WindowText, colour);
        setPalette(own);
    }

    QColor (*const colour_)(const QPalette&);
};

} // namespace

bool IsDark(const QPalette& palette) {
    return palette.color(QPalette::Window).lightness() < 128;
}

QColor DimColour(const QPalette& palette) {
    return Between(palette.color(QPalette::Text), palette.color(QPalette::Window), 0.38);
}

QColor LineColour(const QPalette& palette) {
    return Between(palette.color(QPalette::Text), palette.color(QPalette::Window), 0.84);
}

QColor GoodColour(const QPalette& palette) {
    return IsDark(palette) ? QColor(0x5f, 0xc9, 0x8b) : QColor(0x1b, 0x84, 0x4c);
}

QColor WarningColour(const QPalette& palette) {
    return IsDark(palette) ? QColor(0xf0, 0xb4, 0x4a) : QColor(0xa6, 0x64, 0x00);
}

QColor BadColour(const QPalette& palette) {
    return IsDark(palette) ? QColor(0xff, 0x83, 0x7a) : QColor(0xc0, 0x2b, 0x22);
}

QPalette OwnPalette(bool dark) {
    const QColor window = dark ? QColor(0x20, 0x23, 0x28) : QColor(0xf5, 0xf6, 0xf8);
    const QColor base = dark ? QColor(0x29, 0x2d, 0x33) : QColor(0xff, 0xff, 0xff);
    const QColor text = dark ? QColor(0xe9, 0xeb, 0xee) : QColor(0x1c, 0x21, 0x28);
    const QColor button = dark ? QColor(0x33, 0x38, 0x40) : QColor(0xff, 0xff, 0xff);
    const QColor highlight = dark ? QColor(0x6a, 0x9d, 0xf8) : QColor(0x24, 0x63, 0xd1);
    QPalette palette(text, button, button.lighter(120), window.darker(160), window.darker(125), text, text,
                     base, window);
    palette.setColor(QPalette::AlternateBase, window);
    palette.setColor(QPalette::ToolTipBase, base);
    palette.setColor(QPalette::ToolTipText, text);
    palette.setColor(QPalette::PlaceholderText, Between(text, base, 0.45));
    palette.setColor(QPalette::Highlight, highlight);
    palette.setColor(QPalette::HighlightedText, dark ? QColor(0x10, 0x18, 0x26) : QColor(0xff, 0xff, 0xff));
    palette.setColor(QPalette::Link, highlight);
    const QColor faint = Between(text, window, 0.6);
    for (const auto role : {QPalette::Text, QPalette::WindowText, QPalette::ButtonText})
        palette.setColor(QPalette::Disabled, role, faint);
    palette.setColor(QPalette::Disabled, QPalette::Highlight, Between(highlight, window, 0.6));
    return palette;
}

QLabel* MakeTitle(const QString& text, double scale, bool strong) {
    auto* label = new QLabel(text);
    QFont font = QApplication::font();
    font.setPointSizeF(font.pointSizeF() * scale);
    if (strong)
        font.setWeight(QFont::DemiBold);
    label->setFont(font);
    label->setTextFormat(Qt::PlainText);
    return label;
}

/// Names seldom have spaces: a line may end behind any sign, and after so many letters.
void SetTitle(QLabel& title, const QString& name) {
    constexpr int kLongestWord = 24;
    const QChar kBreak(0x200B); // a space without width
    QString shown;
    int word = 0;
    for (const QChar letter : name) {
        shown += letter;
        word = letter.isLetterOrNumber() && !letter.isHighSurrogate() ? word + 1 : 0;
        if (!letter.isLetterOrNumber() && !letter.isSurrogate() && !letter.isMark())
            shown += kBreak;
        else if (word >= kLongestWord) {
            shown += kBreak;
            word = 0;
        }
    }
    title.setText(shown);
    title.setWordWrap(true);
    title.setAccessibleName(name);
}

QLabel* MakeRemark(QColor (*colour)(const QPalette& palette)) {
    auto* label = new Coloured(colour);
    label->setMinimumWidth(1);
    return label;
}

QLabel* MakeHint(const QString& text) {
    auto* label = new Coloured(&DimColour);
    label->setText(text);
    return label;
}

QSize PrimaryButton::sizeHint() const {
    QFont strong = font();
    strong.setWeight(QFont::DemiBold);
    const QFontMetrics metrics(strong);
    return {metrics.horizontalAdvance(QString(text()).remove(QLatin1Char('&'))) + 52, metrics.height() + 20};
}

void PrimaryButton::paintEvent(QPaintEvent*) {
    QPainter painter(this);
    painter.setRenderHint(QPainter::Antialiasing);
    const QPalette::ColorGroup group = isEnabled() ? QPalette::Active : QPalette::Disabled;
    QColor ground = palette().color(group, QPalette::Highlight);
    if (isDown())
        ground = ground.darker(118);
    else if (underMouse() && isEnabled())
        ground = ground.lighter(110);
    painter.setPen(Qt::NoPen);
    painter.setBrush(ground);
    painter.drawRoundedRect(rect(), 7, 7);
    if (hasFocus()) {
        painter.setPen(QPen(palette().color(QPalette::HighlightedText), 1.5));
        painter.setBrush(Qt::NoBrush);
        painter.drawRoundedRect(QRectF(rect()).adjusted(3, 3, -3, -3), 5, 5);
    }
    QFont strong = font();
    strong.setWeight(QFont::DemiBold);
    painter.setFont(strong);
    painter.setPen(palette().color(group, QPalette::HighlightedText));
    painter.drawText(rect(), Qt::AlignCenter | Qt::TextShowMnemonic, text());
}

SlimBar::SlimBar(int height) {
    setRange(0, 1000);
    setTextVisible(false);
    setFixedHeight(height);
}

void SlimBar::paintEvent(QPaintEvent*) {
    QPainter painter(this);
    painter.setRenderHint(QPainter::Antialiasing);
    painter.setPen(Qt::NoPen);
    painter.setBrush(LineColour(palette()));
    const double radius = height() / 2.0;
    painter.drawRoundedRect(rect(), radius, radius);
    if (maximum() <= minimum() || value() <= minimum())
        return;
    QRectF done(rect());
    done.setWidth(std::max<double>(height(), done.width() * (value() - minimum()) / (maximum() - minimum())));
    painter.setBrush(palette().color(QPalette::Active, QPalette::Highlight));
    painter.drawRoundedRect(done, radius, radius);
}

OwnStyle::OwnStyle() : QProxyStyle(QStringLiteral("fusion")) {}

QSize OwnStyle::sizeFromContents(ContentsType type, const QStyleOption* option, const QSize& size,
                                 const QWidget* widget) const {
    const QSize plain = QProxyStyle::sizeFromContents(type, option, size, widget);
    switch (type) {
    case CT_PushButton:
        return plain + QSize(14, 8);
    case CT_ComboBox:
    case CT_LineEdit:
        return plain + QSize(4, 8);
    case CT_MenuBarItem:
        return plain + QSize(4, 6);
    case CT_MenuItem:
        return plain + QSize(12, 5);
    default:
        return plain;
    }
}

/// The style's own leaves hardly any room between a button's sign and its words.
void OwnStyle::drawControl(ControlElement element, const QStyleOption* option, QPainter* painter,
                           const QWidget* widget) const {
    const auto* button = qstyleoption_cast<const QStyleOptionButton*>(option);
    if (element != CE_PushButtonLabel || button == nullptr || button->icon.isNull() ||
        button->text.isEmpty()) {
        QProxyStyle::drawControl(element, option, painter, widget);
        return;
    }
    constexpr int kGap = 8;
    const QSize icon = button->iconSize;
    const int flags = Qt::TextShowMnemonic | Qt::AlignVCenter;
    const int words = button->fontMetrics.size(Qt::TextShowMnemonic, button->text).width();
    const bool enabled = (button->state & State_Enabled) != 0;
    QRect place = button->rect;
    place.setLeft(place.left() + std::max(0, (place.width() - icon.width() - kGap - words) / 2));
    const QRect iconPlace(place.left(), place.center().y() - icon.height() / 2 + 1, icon.width(),
                          icon.height());
    place.setLeft(iconPlace.right() + 1 + kGap);
    button->icon.paint(painter, visualRect(button->direction, button->rect, iconPlace), Qt::AlignCenter,
                       enabled ? QIcon::Normal : QIcon::Disabled);
    drawItemText(painter, visualRect(button->direction, button->rect, place), flags, button->palette, enabled,
                 button->text, QPalette::ButtonText);
}

int OwnStyle::pixelMetric(PixelMetric metric, const QStyleOption* option, const QWidget* widget) const {
    return metric == PM_LayoutHorizontalSpacing ? 10 : QProxyStyle::pixelMetric(metric, option, widget);
}

} // namespace movieconv::window
