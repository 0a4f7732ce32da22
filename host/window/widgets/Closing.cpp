#include "host/window/widgets/Closing.h"

#include "host/window/widgets/NoticeBar.h"

#include <utility>

namespace movieconv::window {
namespace {

const QString kClosing = QStringLiteral("closing");

} // namespace

Closing::Closing(Dispatcher& dispatcher, NoticeBar& notices, QObject* parent)
    : QObject(parent), dispatcher_(dispatcher), notices_(notices) {
    connect(&dispatcher_, &Dispatcher::WorkEnded, this, &Closing::OnWorkEnded);
}

bool Closing::MayClose() {
    if (!dispatcher_.IsWorking())
        return true;
    if (IsStopping() || notices_.Shows(kClosing)) // asked already: the second wish is an answer
        StopAndClose();
    else
        Ask();
    return false;
}

void Closing::Ask() {
    notices_.Show(kClosing, tr("Movies are being converted. What is converted so far can be kept as it is."),
                  {{tr("Stop and close"), [this] { StopAndClose(); }},
                   {tr("Close when done"), [this] { Choose(Way::kWhenDone); }},
                   {tr("Go on"), [this] { Choose(Way::kStayOpen); }}});
}

void Closing::StopAndClose() {
    const bool stopping = IsStopping();
    Choose(Way::kStop);
    if (!dispatcher_.IsWorking()) {
        Q_EMIT Ready();
        return;
    }
    notices_.Show(kClosing,
                  tr("Waiting until all is stopped. A disk or a network that does not answer holds this up."),
                  {{tr("Close at once"), [this] { Q_EMIT LeaveWanted(); }}});
    if (!stopping)
        dispatcher_.StopAll();
}

void Closing::Choose(Way way) {
    way_ = way;
    Q_EMIT Changed();
}

void Closing::OnWorkEnded() {
    notices_.Dismiss(kClosing);
    if (IsPending())
        Q_EMIT Ready();
}

} // namespace movieconv::window
