// What becomes of the wish to close the window while movies are being converted.
#ifndef MOVIECONV_HOST_WINDOW_WIDGETS_CLOSING_H
#define MOVIECONV_HOST_WINDOW_WIDGETS_CLOSING_H

#include "host/window/model/Dispatcher.h"

#include <QObject>

namespace movieconv::window {

class NoticeBar;

/// Asks once, and forgets the question when nothing is left to be decided.
class Closing : public QObject {
    Q_OBJECT
public:
    /// Both must outlive it.
    Closing(Dispatcher& dispatcher, NoticeBar& notices, QObject* parent);

    /// The user wants to close. Whether that can be done at once; where it cannot, the user is asked, and who
    /// is asked already wants everything to be stopped.
    bool MayClose();
    /// Stops everything, then wants the window closed.
    void StopAndClose();

    /// Whether the window closes once the work has ended.
    bool IsPending() const { return way_ != Way::kStayOpen; }
    bool IsStopping() const { return way_ == Way::kStop; }

Q_SIGNALS:
    /// Nothing stands in the way any more.
    void Ready();
    /// The user does not want to wait for a conversion that does not answer.
    void LeaveWanted();
    /// IsPending may be another.
    void Changed();

private:
    enum class Way { kStayOpen, kWhenDone, kStop };

    void Ask();
    void Choose(Way way);
    void OnWorkEnded();

    Dispatcher& dispatcher_;
    NoticeBar& notices_;
    Way way_ = Way::kStayOpen;
};

} // namespace movieconv::window

#endif
