// The log of a conversion, one click away.
#ifndef MOVIECONV_HOST_WINDOW_WIDGETS_LOGPANEL_H
#define MOVIECONV_HOST_WINDOW_WIDGETS_LOGPANEL_H

#include <QStringList>
#include <QWidget>

class QPlainTextEdit;
class QToolButton;

namespace movieconv::window {

/// Hidden while there is nothing to read.
class LogPanel : public QWidget {
    Q_OBJECT
public:
    explicit LogPanel(QWidget* parent = nullptr);

    void Show(const QStringList& lines);
    bool IsOpen() const;

private:
    QStringList lines_;
    QToolButton* button_;
    QPlainTextEdit* text_;
};

} // namespace movieconv::window

#endif
