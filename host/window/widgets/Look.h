// Colours and fonts beyond the palette's.
#ifndef MOVIECONV_HOST_WINDOW_WIDGETS_LOOK_H
#define MOVIECONV_HOST_WINDOW_WIDGETS_LOOK_H

#include <QColor>
#include <QPalette>
#include <QString>

#include <QProgressBar>
#include <QProxyStyle>
#include <QPushButton>

class QLabel;

namespace movieconv::window {

bool IsDark(const QPalette& palette);
QColor DimColour(const QPalette& palette);
QColor LineColour(const QPalette& palette);
QColor GoodColour(const QPalette& palette);
QColor WarningColour(const QPalette& palette);
QColor BadColour(const QPalette& palette);

/// The window's own palettes, for systems that give none.
QPalette OwnPalette(bool dark);

/// A label in a larger, stronger font.
QLabel* MakeTitle(const QString& text, double scale, bool strong);
/// Shows a file's name, which may be longer than any line.
void SetTitle(QLabel& title, const QString& name);
/// A label of several lines in a colour that follows the palette; a long path in it is cut and widens
/// nothing.
QLabel* MakeRemark(QColor (*colour)(const QPalette& palette));
/// A label for what is said beside something.
QLabel* MakeHint(const QString& text = {});

/// The button that one is to press next.
class PrimaryButton : public QPushButton {
    Q_OBJECT
public:
    using QPushButton::QPushButton;
    QSize sizeHint() const override;

protected:
    void paintEvent(QPaintEvent* event) override;
};

/// A progress bar of 1000 steps, without text and frame.
class SlimBar : public QProgressBar {
    Q_OBJECT
public:
    explicit SlimBar(int height);

protected:
    void paintEvent(QPaintEvent* event) override;
};

/// The toolkit's own style with more air, for systems that bring none.
class OwnStyle : public QProxyStyle {
    Q_OBJECT
public:
    OwnStyle();
    QSize sizeFromContents(ContentsType type, const QStyleOption* option, const QSize& size,
                           const QWidget* widget) const override;
    void drawControl(ControlElement element, const QStyleOption* option, QPainter* painter,
                     const QWidget* widget) const override;
    int pixelMetric(PixelMetric metric, const QStyleOption* option, const QWidget* widget) const override;
};

} // namespace movieconv::window

#endif
