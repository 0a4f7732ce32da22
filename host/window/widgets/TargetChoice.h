// Where a movie's file goes, and what stands in the way.
#ifndef MOVIECONV_HOST_WINDOW_WIDGETS_TARGETCHOICE_H
#define MOVIECONV_HOST_WINDOW_WIDGETS_TARGETCHOICE_H

#include "host/window/model/Entry.h"

#include <QWidget>

class QCheckBox;
class QLabel;
class QLineEdit;
class QPushButton;

namespace movieconv::window {

class TargetChoice : public QWidget {
    Q_OBJECT
public:
    explicit TargetChoice(QWidget* parent = nullptr);

    void Show(const Entry& entry);
    /// Takes what is typed and not yet told.
    void Commit();
    /// What is always shown of it, beside the path.
    QPushButton* Button() const { return browse_; }

Q_SIGNALS:
    /// An empty path: by the naming rules.
    void PathChosen(quint64 id, const std::string& path);
    void ReplaceChosen(quint64 id, bool replace);

private:
    void Browse();

    quint64 shown_ = 0;
    QString target_;
    QLineEdit* path_;
    QPushButton* browse_;
    QLabel* warnings_;
    QLabel* notes_;
    QCheckBox* replace_;
};

} // namespace movieconv::window

#endif
