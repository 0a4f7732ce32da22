// Files of subtitles that come into a movie, each with its language.
#ifndef MOVIECONV_HOST_WINDOW_WIDGETS_SUBTITLEFILES_H
#define MOVIECONV_HOST_WINDOW_WIDGETS_SUBTITLEFILES_H

#include "host/window/model/Wishes.h"

#include <QWidget>

#include <functional>

class QPushButton;
class QVBoxLayout;

namespace movieconv::window {

class SubtitleFiles : public QWidget {
    Q_OBJECT
public:
    explicit SubtitleFiles(QWidget* parent = nullptr);

    /// `movie`: beside which further files are looked for first.
    void Show(const std::vector<SubtitleFile>& files, const std::string& movie);

Q_SIGNALS:
    void Chosen(const std::vector<movieconv::window::SubtitleFile>& files);

private:
    void AddRow(size_t number);
    void Browse();
    void Change(const std::function<void(std::vector<SubtitleFile>&)>& change);

    QVBoxLayout* layout_;
    QPushButton* add_;
    QWidget* rows_ = nullptr;
    std::vector<SubtitleFile> files_;
    std::string movie_;
};

} // namespace movieconv::window

#endif
