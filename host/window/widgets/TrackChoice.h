// Which tracks of a movie come into the new file: a box to tick for each, and for many a way to tick all or
// none.
#ifndef MOVIECONV_HOST_WINDOW_WIDGETS_TRACKCHOICE_H
#define MOVIECONV_HOST_WINDOW_WIDGETS_TRACKCHOICE_H

#include "host/window/model/Runner.h"

#include <QWidget>

class QCheckBox;
class QVBoxLayout;

namespace movieconv::window {

class TrackChoice : public QWidget {
    Q_OBJECT
public:
    static constexpr int kMargin = 3; ///< Pixels above the first box.

    /// `name`: of all of them together, for screen readers.
    explicit TrackChoice(const QString& name, QWidget* parent = nullptr);

    /// `chosen`: their numbers; nothing: all.
    void Show(const std::vector<TrackFacts>& tracks, const std::optional<QList<int>>& chosen);

Q_SIGNALS:
    void Chosen(const std::optional<QList<int>>& numbers);

private:
    void Fill(const std::vector<TrackFacts>& tracks);
    void TickAll(bool on);
    void Tell();

    QWidget* few_; // the way to tick all or none
    QVBoxLayout* layout_;
    QList<QCheckBox*> checks_;
    bool filling_ = false;
};

} // namespace movieconv::window

#endif
