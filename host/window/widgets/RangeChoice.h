// Which part of a movie is converted: on a strip of its pictures, or by times.
#ifndef MOVIECONV_HOST_WINDOW_WIDGETS_RANGECHOICE_H
#define MOVIECONV_HOST_WINDOW_WIDGETS_RANGECHOICE_H

#include "host/window/model/Entry.h"
#include "host/window/model/Inbox.h"
#include "host/window/model/Worker.h"

#include <QWidget>

class QLineEdit;

namespace movieconv::window {

class RangeStrip;

class RangeChoice : public QWidget {
    Q_OBJECT
public:
    /// `runner` must outlive it.
    explicit RangeChoice(Runner& runner, QWidget* parent = nullptr);
    ~RangeChoice() override;

    /// Asks for the movie's pictures when it is another one, or was not known before.
    void Show(const Entry& entry);
    /// Takes times that are typed and not yet told.
    void Commit();

Q_SIGNALS:
    void Chosen(double begin, std::optional<double> end);

private:
    QLineEdit* MakeTime(const QString& name);
    void ShowTimes();
    void AskForPictures();

    Runner& runner_;
    Entry entry_;
    RangeStrip* strip_;
    QLineEdit* begin_;
    QLineEdit* end_;
    Inbox inbox_;   // of the worker's pictures
    Worker worker_; // last: its tasks refer to the rest
};

} // namespace movieconv::window

#endif
