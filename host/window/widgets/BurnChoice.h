// Which subtitles are drawn into the pictures: a track of the movie's, or a file.
#ifndef MOVIECONV_HOST_WINDOW_WIDGETS_BURNCHOICE_H
#define MOVIECONV_HOST_WINDOW_WIDGETS_BURNCHOICE_H

#include "host/window/model/Runner.h"

#include <QWidget>

class QComboBox;
class QPushButton;

namespace movieconv::window {

class BurnChoice : public QWidget {
    Q_OBJECT
public:
    explicit BurnChoice(QWidget* parent = nullptr);

    /// `movie`: beside which a file is looked for first.
    void Show(const std::vector<TrackFacts>& tracks, const Burning& burning, const std::string& movie);

Q_SIGNALS:
    void Chosen(const movieconv::window::Burning& burning);

private:
    void Browse();

    QComboBox* box_;
    std::string movie_;
    std::string file_; // that is offered
};

} // namespace movieconv::window

#endif
