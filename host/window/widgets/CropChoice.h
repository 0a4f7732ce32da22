// What is cut off the pictures: nothing, black borders, or so many pixels on each side.
#ifndef MOVIECONV_HOST_WINDOW_WIDGETS_CROPCHOICE_H
#define MOVIECONV_HOST_WINDOW_WIDGETS_CROPCHOICE_H

#include "host/window/model/Runner.h"

#include <QWidget>

#include <array>

class QComboBox;
class QSpinBox;

namespace movieconv::window {

class CropChoice : public QWidget {
    Q_OBJECT
public:
    explicit CropChoice(QWidget* parent = nullptr);

    /// `facts`: null while they are not known.
    void Show(const Wishes& wishes, const MovieFacts* facts);
    /// What is always shown of it.
    QComboBox* Box() const { return box_; }

Q_SIGNALS:
    void Chosen(bool borders, const std::optional<movieconv::window::Margins>& cut);

private:
    void Tell();

    bool filling_ = false;
    QComboBox* box_;
    QWidget* margins_;
    std::array<QSpinBox*, 4> sides_{}; // above, below, left, right
};

} // namespace movieconv::window

#endif
