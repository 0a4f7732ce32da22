#include "host/window/widgets/TrackChoice.h"

#include "host/window/model/Words.h"
#include "host/window/widgets/FormParts.h"

#include <QCheckBox>
#include <QHBoxLayout>
#include <QPushButton>
#include <QStyleOptionButton>
#include <QStylePainter>

namespace movieconv::window {
namespace {

constexpr qsizetype kMany = 4;

/// An "&" in a title marks no key.
QString WordsOf(const TrackFacts& track) {
    return TrackLine(track).replace(QLatin1Char('&'), QLatin1String("&&"));
}

/// A box for a track, whose title may be of any length: it is cut where there is no room, and whole in the
/// tool tip.
class TrackBox : public QCheckBox {
public:
    explicit TrackBox(const TrackFacts& track) : QCheckBox(WordsOf(track)) {
        setToolTip(ForToolTip(TrackLine(track)));
        setSizePolicy(QSizePolicy::Preferred, QSizePolicy::Fixed);
    }
    QSize minimumSizeHint() const override {
        constexpr int kNarrow = 120;
        return {kNarrow, QCheckBox::minimumSizeHint().height()};
    }

protected:
    void paintEvent(QPaintEvent*) override {
        QStyleOptionButton option;
        initStyleOption(&option);
        const int room = style()->subElementRect(QStyle::SE_CheckBoxContents, &option, this).width();
        option.text = fontMetrics().elidedText(text(), Qt::ElideRight, room, Qt::TextShowMnemonic);
        QStylePainter(this).drawControl(QStyle::CE_CheckBox, option);
    }
};

} // namespace

TrackChoice::TrackChoice(const QString& name, QWidget* parent)
    : QWidget(parent), few_(new QWidget), layout_(MakeColumn(*this, 4)) {
    setAccessibleName(name);
    layout_->setContentsMargins(0, kMargin, 0, 0);
    auto* row = new QHBoxLayout(few_);
    row->setContentsMargins(0, 0, 0, 0);
    for (const bool on : {true, false}) {
        auto* button = new QPushButton(on ? tr("All") : tr("None"));
        button->setAccessibleName(QStringLiteral("%1: %2").arg(name, button->text()));
        connect(button, &QPushButton::clicked, this, [this, on] { TickAll(on); });
        row->addWidget(button);
    }
    row->addStretch();
    layout_->addWidget(few_);
}

void TrackChoice::Show(const std::vector<TrackFacts>& tracks, const std::optional<QList<int>>& chosen,
                       const std::optional<int>& apart) {
    apart_ = apart;
    bool same = static_cast<size_t>(checks_.size()) == tracks.size();
    for (qsizetype i = 0; same && i < checks_.size(); ++i)
        same = checks_[i]->text() == WordsOf(tracks[static_cast<size_t>(i)]);
    if (!same)
        Fill(tracks);
    filling_ = true;
    for (qsizetype i = 0; i < checks_.size(); ++i) {
        const int number = tracks[static_cast<size_t>(i)].number;
        checks_[i]->setProperty("number", number);
        checks_[i]->setChecked(chosen ? chosen->contains(number) : number != apart);
    }
    filling_ = false;
}

void TrackChoice::Fill(const std::vector<TrackFacts>& tracks) {
    qDeleteAll(checks_);
    checks_.clear();
    for (const TrackFacts& track : tracks) {
        auto* check = new TrackBox(track);
        connect(check, &QCheckBox::toggled, this, [this] {
            if (!filling_)
                Tell();
        });
        layout_->insertWidget(static_cast<int>(checks_.size()), check);
        checks_.append(check);
    }
    few_->setVisible(checks_.size() >= kMany);
}

void TrackChoice::TickAll(bool on) {
    filling_ = true;
    for (QCheckBox* check : checks_)
        check->setChecked(on);
    filling_ = false;
    Tell();
}

void TrackChoice::Tell() {
    QList<int> ticked;
    QList<int> usual;
    for (const QCheckBox* check : checks_) {
        const int number = check->property("number").toInt();
        if (check->isChecked())
            ticked.append(number);
        if (number != apart_)
            usual.append(number);
    }
    Q_EMIT Chosen(ticked == usual ? std::nullopt : std::optional(ticked));
}

} // namespace movieconv::window
