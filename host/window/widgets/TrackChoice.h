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

    /// `chosen`: their numbers; nothing: all but `apart`, which is used in another way.
    void Show(const std::vector<TrackFacts>& tracks, const std::optional<QList<int>>& chosen,
              const std::optional<int>& apart = std::nullopt);

Q_SIGNALS:
    void Chosen(const std::optional<QList<int>>& numbers);

private:
    void Fill(const std::vector<TrackFacts>& tracks);
    void TickAll(bool on);
    void Tell();

    QWidget* few_; // the way to tick all or none
    QVBoxLayout* layout_;
    QList<QCheckBox*> checks_;
    std::optional<int> apart_;
    bool filling_ = false;
};

} // namespace movieconv::window

#endif
