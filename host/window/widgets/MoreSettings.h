// The settings of a movie that are seldom needed, behind a button that shows them.
#ifndef MOVIECONV_HOST_WINDOW_WIDGETS_MORESETTINGS_H
#define MOVIECONV_HOST_WINDOW_WIDGETS_MORESETTINGS_H

#include "host/window/model/Runner.h"

#include <QWidget>

#include <array>
#include <functional>

class QCheckBox;
class QComboBox;
class QFormLayout;
class QLineEdit;
class QSpinBox;
class QToolButton;

namespace movieconv::window {

class MoreSettings : public QWidget {
    Q_OBJECT
public:
    explicit MoreSettings(const Abilities& abilities, QWidget* parent = nullptr);

    /// `facts`: null while they are not known.
    void Show(const Wishes& wishes, const MovieFacts* facts);

Q_SIGNALS:
    void Chosen(const movieconv::window::Wishes& wishes);

private:
    QFormLayout* MakeForm(const Abilities& abilities);
    QWidget* MakeCrop();
    void FillChoices();
    void Connect();
    void ShowCrop(const MovieFacts* facts);
    void ChooseCrop();
    void Choose(const std::function<void(Wishes&)>& change);

    Wishes wishes_;
    bool filling_ = false;
    QToolButton* more_;
    QFormLayout* form_;
    QComboBox* rate_;
    QComboBox* channels_;
    QComboBox* clip_;
    QComboBox* deinterlace_;
    QComboBox* crop_;
    QWidget* margins_;
    std::array<QSpinBox*, 4> sides_{}; // above, below, left, right
    QComboBox* hdr_;
    QComboBox* depth_;
    QCheckBox* pictures_;
    QCheckBox* sound_;
    QCheckBox* chapters_;
    QCheckBox* texts_;
    QLineEdit* title_;
    QComboBox* charset_;
};

} // namespace movieconv::window

#endif
