// A strip of pictures of a movie on which begin and end are chosen.
#ifndef MOVIECONV_HOST_WINDOW_WIDGETS_RANGESTRIP_H
#define MOVIECONV_HOST_WINDOW_WIDGETS_RANGESTRIP_H

#include <QImage>
#include <QWidget>

#include <optional>
#include <vector>

namespace movieconv::window {

/// Two handles, moved with the mouse or, once they have the focus, with the arrow keys: B and E choose the
/// handle, Page Up and Page Down move by a minute.
class RangeStrip : public QWidget {
    Q_OBJECT
public:
    static constexpr int kPictures = 8;

    explicit RangeStrip(QWidget* parent = nullptr);

    /// A movie of so many seconds; its pictures come by SetPicture.
    void SetLength(double seconds);
    void SetRange(double begin, std::optional<double> end);
    void SetPicture(int number, const QImage& picture);
    /// The time in the movie of a picture of the strip.
    double TimeOf(int number) const;

    /// Whether all its pictures have come.
    bool IsFilled() const;

    double Begin() const { return begin_; }
    /// Nothing: the movie's end.
    std::optional<double> End() const { return end_; }

    QSize sizeHint() const override { return {320, 62}; }
    QSize minimumSizeHint() const override { return {160, 62}; }

Q_SIGNALS:
    /// By the user.
    void RangeChosen(double begin, std::optional<double> end);

protected:
    void paintEvent(QPaintEvent* event) override;
    void mousePressEvent(QMouseEvent* event) override;
    void mouseMoveEvent(QMouseEvent* event) override;
    void keyPressEvent(QKeyEvent* event) override;

private:
    enum class Handle { kBegin, kEnd };

    QRectF Band() const;
    double XOf(double seconds) const;
    double TimeAt(double x) const;
    void MoveTo(double seconds);

    double length_ = 0;
    double begin_ = 0;
    std::optional<double> end_;
    Handle held_ = Handle::kBegin;
    std::vector<QImage> pictures_;
};

} // namespace movieconv::window

#endif
