#include "host/window/widgets/OverPage.h"

#include "host/window/model/Words.h"
#include "host/window/widgets/Icons.h"
#include "host/window/widgets/LogPanel.h"
#include "host/window/widgets/Look.h"

#include <QLabel>
#include <QPainter>
#include <QPushButton>
#include <QVBoxLayout>

namespace movieconv::window {
namespace {

constexpr int kOutcomeSignSize = 44;

Sign OutcomeSignOf(State state) {
    return state == State::kDone      ? Sign::kDone
           : state == State::kStopped ? Sign::kStop
           : state == State::kFailed  ? Sign::kWarning
                                      : Sign::kAgain;
}

QColor ColourOf(State state, const QPalette& palette) {
    return state == State::kDone     ? GoodColour(palette)
           : state == State::kFailed ? BadColour(palette)
                                     : WarningColour(palette);
}

QString TitleOf(State state) {
    return state == State::kDone      ? OverPage::tr("Done")
           : state == State::kStopped ? OverPage::tr("Stopped")
           : state == State::kFailed  ? OverPage::tr("This did not work")
                                      : OverPage::tr("Interrupted");
}

QString FactsOf(const Entry& entry) {
    const Outcome& outcome = entry.outcome;
    QStringList parts;
    if (outcome.position > 0 && outcome.worked > 0) {
        parts += OverPage::tr("%1 converted in %2 (%3)")
                     .arg(ClockText(outcome.position), ClockText(outcome.worked),
                          SpeedText(outcome.position / outcome.worked));
    }
    if (outcome.bytes > 0)
        parts += BytesText(outcome.bytes);
    if (outcome.files.size() > 1)
        parts += OverPage::tr("%n files", "", static_cast<int>(outcome.files.size()));
    return parts.join(QStringLiteral(" · "));
}

} // namespace

/// Drawn anew with every change of the window's colours.
class OutcomeSign : public QWidget {
public:
    OutcomeSign() { setFixedSize(kOutcomeSignSize, kOutcomeSignSize); }
    void Show(State state) {
        state_ = state;
        update();
    }

protected:
    void paintEvent(QPaintEvent*) override {
        QPainter painter(this);
        painter.setRenderHint(QPainter::Antialiasing);
        QColor ground = ColourOf(state_, palette());
        ground.setAlpha(38);
        painter.setPen(Qt::NoPen);
        painter.setBrush(ground);
        painter.drawEllipse(rect());
        PaintSign(painter, OutcomeSignOf(state_), QRectF(rect()).adjusted(12, 12, -12, -12),
                  ColourOf(state_, palette()));
    }

private:
    State state_ = State::kDone;
};

OverPage::OverPage(QWidget* parent)
    : QWidget(parent),
      sign_(new OutcomeSign),
      title_(MakeTitle({}, 1.5, true)),
      sentence_(new QLabel),
      facts_(MakeHint()),
      notCarried_(new QLabel),
      open_(new QPushButton(IconOf(Sign::kStart), tr("&Play the movie"))),
      folder_(new QPushButton(IconOf(Sign::kFolder), tr("Show in &folder"))),
      again_(new QPushButton(IconOf(Sign::kAgain), tr("Convert &again"))),
      log_(new LogPanel) {
    for (QLabel* label : {sentence_, notCarried_}) {
        label->setWordWrap(true);
        label->setMinimumWidth(1); // a long path is cut and does not widen the page
        label->setTextFormat(Qt::PlainText);
        label->setTextInteractionFlags(Qt::TextSelectableByMouse | Qt::TextSelectableByKeyboard);
    }
    sentence_->setAccessibleName(tr("What became of the movie"));
    notCarried_->setAccessibleName(tr("What was not carried over"));
    again_->setToolTip(tr("Puts the movie back into the queue."));
    sign_->setAccessibleName(tr("State"));

    auto* layout = new QVBoxLayout(this);
    layout->setContentsMargins(24, 20, 24, 16);
    layout->setSpacing(12);
    layout->addWidget(sign_);
    layout->addWidget(title_);
    layout->addWidget(sentence_);
    layout->addWidget(facts_);
    layout->addWidget(notCarried_);
    auto* buttons = new QHBoxLayout;
    for (QPushButton* button : {open_, folder_, again_})
        buttons->addWidget(button);
    buttons->addStretch();
    layout->addSpacing(8);
    layout->addLayout(buttons);
    layout->addStretch(1);
    layout->addWidget(log_);
    connect(open_, &QPushButton::clicked, this, [this] { Q_EMIT FileWanted(file_); });
    connect(folder_, &QPushButton::clicked, this, [this] { Q_EMIT FolderWanted(file_); });
    connect(again_, &QPushButton::clicked, this, [this] { Q_EMIT AgainWanted(shown_); });
}

void OverPage::Show(const Entry& entry) {
    shown_ = entry.id;
    sign_->Show(entry.state);
    SetTitle(*title_, QStringLiteral("%1 – %2").arg(NameOf(entry.source), TitleOf(entry.state)));
    const bool hasFile = !entry.outcome.files.empty();
    file_ = hasFile ? entry.outcome.files.front() : std::string();
    QString sentence = entry.outcome.sentence;
    if (entry.state == State::kInterrupted)
        sentence = tr("The program ended while this movie was being converted. Convert it again?");
    else if (sentence.isEmpty() && hasFile)
        sentence = tr("The movie is in “%1”.").arg(Shown(file_));
    sentence_->setText(sentence);
    facts_->setText(FactsOf(entry));
    facts_->setVisible(!facts_->text().isEmpty());
    const QStringList& left = entry.outcome.notCarried;
    notCarried_->setText(left.isEmpty() ? QString()
                                        : tr("Not carried over:") + QStringLiteral("\n• ") +
                                              left.join(QStringLiteral("\n• ")));
    notCarried_->setVisible(!left.isEmpty());
    open_->setVisible(hasFile);
    folder_->setVisible(hasFile);
    log_->Show(entry.notes);
}

} // namespace movieconv::window
