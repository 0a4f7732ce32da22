// The settings of a movie that are seldom needed, behind a button that shows them.
#ifndef MOVIECONV_HOST_WINDOW_WIDGETS_MORESETTINGS_H
#define MOVIECONV_HOST_WINDOW_WIDGETS_MORESETTINGS_H

#include "host/window/model/Runner.h"

#include <QWidget>

#include <functional>

class QCheckBox;
class QComboBox;
class QFormLayout;
class QLineEdit;
class QToolButton;

namespace movieconv::window {

class MoreSettings : public QWidget {
    Q_OBJECT
public:
    explicit MoreSettings(QWidget* parent = nullptr);

    /// `facts`: null while they are not known. `copiesSound`: it stays as it is.
    void Show(const Wishes& wishes, const MovieFacts* facts, bool copiesSound);

Q_SIGNALS:
    void Chosen(const movieconv::window::Wishes& wishes);

private:
    QFormLayout* MakeForm();
    void FillChoices();
    void Connect();
    void Choose(const std::function<void(Wishes&)>& change);

    Wishes wishes_;
    bool filling_ = false;
    QToolButton* more_;
    QFormLayout* form_;
    QComboBox* rate_;
    QComboBox* channels_;
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
