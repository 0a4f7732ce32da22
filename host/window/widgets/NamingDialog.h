// Where new files go and what they are called.
#ifndef MOVIECONV_HOST_WINDOW_WIDGETS_NAMINGDIALOG_H
#define MOVIECONV_HOST_WINDOW_WIDGETS_NAMINGDIALOG_H

#include "host/window/model/Naming.h"

#include <QDialog>

class QLabel;
class QLineEdit;
class QRadioButton;

namespace movieconv::window {

class NamingDialog : public QDialog {
    Q_OBJECT
public:
    explicit NamingDialog(const Naming& naming, QWidget* parent = nullptr);

Q_SIGNALS:
    void Chosen(const movieconv::window::Naming& naming);

private:
    Naming Current() const;
    void ShowExample();
    void Browse();

    QLineEdit* pattern_;
    QLabel* example_;
    QRadioButton* beside_;
    QRadioButton* elsewhere_;
    QLineEdit* folder_;
};

} // namespace movieconv::window

#endif
