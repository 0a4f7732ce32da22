// A movie that is being converted: its picture, how far it is, how fast.
#ifndef MOVIECONV_HOST_WINDOW_WIDGETS_WORKPAGE_H
#define MOVIECONV_HOST_WINDOW_WIDGETS_WORKPAGE_H

#include "host/window/model/Entry.h"

#include <QImage>
#include <QList>
#include <QWidget>

#include <utility>

class QGridLayout;
class QLabel;
class QProgressBar;
class QPushButton;

namespace movieconv::window {

class LogPanel;

/// A picture as large as there is room, in its own shape.
class PictureView : public QWidget {
    Q_OBJECT
public:
    explicit PictureView(QWidget* parent = nullptr);
    /// A null picture: none yet.
    void Show(const QImage& picture);
    const QImage& Picture() const { return picture_; }

Q_SIGNALS:
    void RoomChanged(QSize pixels);

protected:
    void paintEvent(QPaintEvent* event) override;
    void resizeEvent(QResizeEvent* event) override;

private:
    QImage picture_;
};

class WorkPage : public QWidget {
    Q_OBJECT
public:
    explicit WorkPage(QWidget* parent = nullptr);

    void Show(const Entry& entry);
    void ShowPicture(quint64 id, const QImage& picture);

Q_SIGNALS:
    void PauseWanted(quint64 id, bool pause);
    void StopWanted(quint64 id);
    /// There is room for a picture of so many pixels.
    void PictureRoomChanged(QSize pixels);

protected:
    void resizeEvent(QResizeEvent* event) override;

private:
    QWidget* MakeFigures();
    QLabel* MakeFigure(const QString& name);
    void Arrange(int columns);

    quint64 shown_ = 0;
    bool paused_ = false;
    QLabel* title_;
    PictureView* picture_;
    QLabel* phase_;
    QLabel* percent_;
    QProgressBar* bar_;
    QGridLayout* figures_; // names above values
    QList<std::pair<QLabel*, QLabel*>> figuresIn_;
    int columns_ = 0;
    QLabel* speed_;
    QLabel* left_;
    QLabel* position_;
    QLabel* bytes_;
    QPushButton* pause_;
    QPushButton* stop_;
    LogPanel* log_;
};

} // namespace movieconv::window

#endif
