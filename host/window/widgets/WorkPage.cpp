#include "host/window/widgets/WorkPage.h"

#include "host/window/model/Words.h"
#include "host/window/widgets/Icons.h"
#include "host/window/widgets/LogPanel.h"
#include "host/window/widgets/Look.h"

#include <QGridLayout>
#include <QLabel>
#include <QLocale>
#include <QPainter>
#include <QPainterPath>
#include <QPushButton>

#include <cmath>

namespace movieconv::window {
namespace {

void SetText(QLabel& label, const QString& text) {
    if (label.text() != text)
        label.setText(text);
}

} // namespace

PictureView::PictureView(QWidget* parent) : QWidget(parent) {
    setMinimumSize(160, 40); // notices above may need the room
    setSizePolicy(QSizePolicy::Expanding, QSizePolicy::Expanding);
    setAccessibleName(tr("The picture that is being converted"));
}

void PictureView::Show(const QImage& picture) {
    picture_ = picture;
    picture_.setDevicePixelRatio(devicePixelRatioF());
    update();
}

void PictureView::paintEvent(QPaintEvent*) {
    QPainter painter(this);
    painter.setRenderHints(QPainter::Antialiasing | QPainter::SmoothPixmapTransform);
    QPainterPath outline;
    outline.addRoundedRect(rect(), 8, 8);
    painter.fillPath(outline, QColor(0x12, 0x14, 0x17));
    if (picture_.isNull()) {
        PaintSign(painter, Sign::kMovie, QRectF(rect().center() - QPoint(24, 24), QSizeF(48, 48)),
                  QColor(0x5a, 0x60, 0x68));
        return;
    }
    painter.setClipPath(outline);
    const QSizeF size = picture_.deviceIndependentSize().scaled(QSizeF(this->size()), Qt::KeepAspectRatio);
    const QPointF corner((width() - size.width()) / 2, (height() - size.height()) / 2);
    // It has been made to fit, unless the room has changed since.
    if (picture_.deviceIndependentSize().toSize() == size.toSize())
        painter.drawImage(corner.toPoint(), picture_);
    else
        painter.drawImage(QRectF(corner, size), picture_);
}

void PictureView::resizeEvent(QResizeEvent* event) {
    QWidget::resizeEvent(event);
    Q_EMIT RoomChanged((QSizeF(size()) * devicePixelRatioF()).toSize());
}

WorkPage::WorkPage(QWidget* parent)
    : QWidget(parent),
      title_(MakeTitle({}, 1.5, true)),
      picture_(new PictureView),
      phase_(MakeHint()),
      percent_(MakeTitle({}, 2.0, true)),
      bar_(new SlimBar(8)),
      pause_(new QPushButton),
      stop_(new QPushButton(IconOf(Sign::kStop), tr("S&top"))),
      log_(new LogPanel) {
    connect(picture_, &PictureView::RoomChanged, this, &WorkPage::PictureRoomChanged);
    bar_->setAccessibleName(tr("Progress of the movie"));
    pause_->setObjectName(QStringLiteral("pauseThis"));
    stop_->setObjectName(QStringLiteral("stopThis"));
    pause_->setAccessibleDescription(tr("Pauses or resumes this movie"));
    stop_->setToolTip(tr("Stops this movie; what is converted is kept."));
    stop_->setAccessibleDescription(stop_->toolTip());
    percent_->setAccessibleName(tr("Progress in percent"));
    phase_->setWordWrap(false);
    phase_->setAccessibleName(tr("What happens now"));

    auto* layout = new QVBoxLayout(this);
    layout->setContentsMargins(24, 20, 24, 16);
    layout->setSpacing(12);
    layout->addWidget(title_);
    layout->addWidget(picture_, 1);
    auto* head = new QHBoxLayout;
    head->addWidget(percent_);
    head->addWidget(phase_, 1);
    head->addWidget(pause_);
    head->addWidget(stop_);
    layout->addLayout(head);
    layout->addWidget(bar_);
    layout->addWidget(MakeFigures());
    layout->addWidget(log_);
    connect(pause_, &QPushButton::clicked, this, [this] { Q_EMIT PauseWanted(shown_, !paused_); });
    connect(stop_, &QPushButton::clicked, this, [this] { Q_EMIT StopWanted(shown_); });
}

QWidget* WorkPage::MakeFigures() {
    auto* figures = new QWidget;
    figures_ = new QGridLayout(figures);
    figures_->setContentsMargins(0, 0, 0, 0);
    figures_->setHorizontalSpacing(28);
    figures_->setVerticalSpacing(2);
    left_ = MakeFigure(tr("Time left"));
    speed_ = MakeFigure(tr("Speed"));
    position_ = MakeFigure(tr("Converted"));
    bytes_ = MakeFigure(tr("Written"));
    return figures;
}

QLabel* WorkPage::MakeFigure(const QString& name) {
    QLabel* hint = MakeHint(name);
    hint->setWordWrap(false);
    auto* value = new QLabel;
    value->setAccessibleName(name);
    figuresIn_.emplaceBack(hint, value);
    return value;
}

/// All figures in a row, or in two where the page is narrow.
void WorkPage::Arrange(int columns) {
    if (columns == columns_)
        return;
    figures_->setColumnStretch(columns_, 0);
    columns_ = columns;
    for (int i = 0; i < figuresIn_.size(); ++i) {
        const auto& [hint, value] = figuresIn_[i];
        const int row = i / columns * 2;
        figures_->addWidget(hint, row, i % columns);
        figures_->addWidget(value, row + 1, i % columns);
    }
    figures_->setColumnStretch(columns, 1);
}

void WorkPage::resizeEvent(QResizeEvent* event) {
    constexpr int kNarrow = 680;
    Arrange(width() < kNarrow ? 2 : 4);
    QWidget::resizeEvent(event);
}

void WorkPage::Show(const Entry& entry) {
    if (entry.id != shown_) {
        shown_ = entry.id;
        picture_->Show({});
        SetTitle(*title_, NameOf(entry.source));
    }
    const Figures& figures = entry.figures;
    paused_ = figures.phase == Phase::kPaused;
    const bool known = figures.fraction >= 0;
    const QString unknown = QStringLiteral("–");
    SetText(*phase_, PhaseText(figures.phase));
    SetText(*percent_,
            known ? tr("%1 %").arg(QLocale().toString(figures.fraction * 100, 'f', 1)) : QString());
    percent_->setVisible(known);
    bar_->setVisible(known);
    if (known)
        bar_->setValue(static_cast<int>(std::lround(figures.fraction * bar_->maximum())));
    SetText(*left_, figures.left ? LeftText(*figures.left) : unknown);
    SetText(*speed_, figures.speed ? SpeedText(*figures.speed) : unknown);
    SetText(*position_, figures.length > 0
                            ? tr("%1 of %2").arg(ClockText(figures.position), ClockText(figures.length))
                            : ClockText(figures.position));
    SetText(*bytes_, figures.expected ? tr("%1 of %2 to %3")
                                            .arg(BytesText(figures.bytes), BytesText(figures.expected->least),
                                                 BytesText(figures.expected->most))
                                      : BytesText(figures.bytes));
    const QString words = paused_ ? tr("&Resume") : tr("&Pause");
    if (pause_->text() != words) {
        pause_->setText(words);
        pause_->setIcon(IconOf(paused_ ? Sign::kStart : Sign::kPause));
    }
    const bool ending = figures.phase == Phase::kStopping || figures.phase == Phase::kFinishing;
    pause_->setEnabled(!ending);
    stop_->setEnabled(!ending);
    log_->Show(entry.notes);
}

void WorkPage::ShowPicture(quint64 id, const QImage& picture) {
    if (id == shown_)
        picture_->Show(picture);
}

} // namespace movieconv::window
