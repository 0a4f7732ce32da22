// A movie whose conversion is over: what came out, what was left behind, what can be done now.
#ifndef MOVIECONV_HOST_WINDOW_WIDGETS_OVERPAGE_H
#define MOVIECONV_HOST_WINDOW_WIDGETS_OVERPAGE_H

#include "host/window/model/Entry.h"

#include <QWidget>

class QLabel;
class QPushButton;

namespace movieconv::window {

class LogPanel;
class OutcomeSign;

class OverPage : public QWidget {
    Q_OBJECT
public:
    explicit OverPage(QWidget* parent = nullptr);

    void Show(const Entry& entry);

Q_SIGNALS:
    void AgainWanted(quint64 id);
    void FileWanted(const std::string& path);
    void FolderWanted(const std::string& path);

private:
    quint64 shown_ = 0;
    std::string file_;
    OutcomeSign* sign_;
    QLabel* title_;
    QLabel* sentence_;
    QLabel* facts_;
    QLabel* notCarried_;
    QPushButton* open_;
    QPushButton* folder_;
    QPushButton* again_;
    LogPanel* log_;
};

} // namespace movieconv::window

#endif
