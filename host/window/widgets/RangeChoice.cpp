#include "host/window/widgets/RangeChoice.h"

#include "host/window/model/Words.h"
#include "host/window/widgets/FormParts.h"
#include "host/window/widgets/RangeStrip.h"

#include <QHBoxLayout>
#include <QLineEdit>

#include <limits>
#include <stdexcept>

namespace movieconv::window {
namespace {

constexpr int kStripWidth = 160; // of one of its pictures, in pixels

QLabel* LabelOf(const QString& words, QWidget* field) {
    auto* label = new QLabel(words);
    label->setBuddy(field);
    return label;
}

} // namespace

RangeChoice::RangeChoice(Runner& runner, QWidget* parent)
    : QWidget(parent),
      runner_(runner),
      strip_(new RangeStrip),
      begin_(MakeTime(tr("Begin of the range"))),
      end_(MakeTime(tr("End of the range"))) {
    auto* times = new QHBoxLayout;
    times->addWidget(LabelOf(tr("f&rom"), begin_));
    times->addWidget(begin_);
    times->addWidget(LabelOf(tr("&to"), end_));
    times->addWidget(end_);
    times->addStretch();
    QVBoxLayout* layout = MakeColumn(*this, 6);
    layout->addWidget(strip_);
    layout->addLayout(times);
    connect(strip_, &RangeStrip::RangeChosen, this, &RangeChoice::Chosen);
    connect(begin_, &QLineEdit::editingFinished, this, &RangeChoice::Commit);
    connect(end_, &QLineEdit::editingFinished, this, &RangeChoice::Commit);
}

RangeChoice::~RangeChoice() = default;

QLineEdit* RangeChoice::MakeTime(const QString& name) {
    auto* edit = new QLineEdit;
    edit->setAccessibleName(name);
    edit->setMaximumWidth(fontMetrics().horizontalAdvance(QStringLiteral("00:00:00.000")) + 24);
    edit->setToolTip(tr("Hours, minutes and seconds, such as 1:02:03"));
    edit->setAccessibleDescription(edit->toolTip());
    return edit;
}

void RangeChoice::Show(const Entry& entry) {
    const bool other = entry.id != entry_.id;
    const bool found = entry.facts.has_value() && !entry_.facts;
    entry_ = entry;
    if (other || found) {
        strip_->SetLength(entry.facts ? entry.facts->seconds : 0);
        AskForPictures();
    }
    strip_->SetRange(entry.wishes.begin, entry.wishes.end);
    const bool isBeingEdited =
        (begin_->hasFocus() && begin_->isModified()) || (end_->hasFocus() && end_->isModified());
    if (other || !isBeingEdited)
        ShowTimes();
}

void RangeChoice::ShowTimes() {
    const Wishes& wishes = entry_.wishes;
    const double length = entry_.facts ? entry_.facts->seconds : 0;
    begin_->setText(ExactClockText(wishes.begin));
    end_->setText(wishes.end ? ExactClockText(*wishes.end) : length > 0 ? ClockText(length) : QString());
}

void RangeChoice::Commit() {
    Wishes wishes = entry_.wishes;
    const bool known = entry_.facts && entry_.facts->lengthKnown;
    const double length = known ? entry_.facts->seconds : std::numeric_limits<double>::infinity();
    if (const std::optional<double> begin = ParseClock(begin_->text()); begin && begin_->isModified())
        SetBegin(wishes, *begin, length);
    if (end_->isModified())
        SetEnd(wishes, ParseClock(end_->text()), length);
    ShowTimes(); // what made no sense goes back to what holds
    if (wishes != entry_.wishes)
        Q_EMIT Chosen(wishes.begin, wishes.end);
}

void RangeChoice::AskForPictures() {
    worker_.Forget();
    if (!entry_.facts || entry_.facts->width == 0)
        return;
    for (int i = 0; i < RangeStrip::kPictures; ++i) {
        worker_.Do(0, [this, i, id = entry_.id, path = entry_.source, seconds = strip_->TimeOf(i)] {
            QImage picture;
            try {
                picture = runner_.PictureAt(path, seconds, kStripWidth);
            } catch (const std::runtime_error&) {
                return; // the strip stays empty there
            }
            inbox_.Put([this, i, id, picture] {
                if (id == entry_.id)
                    strip_->SetPicture(i, picture);
            });
        });
    }
}

} // namespace movieconv::window
