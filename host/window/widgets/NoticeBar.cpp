#include "host/window/widgets/NoticeBar.h"

#include "host/window/widgets/Icons.h"
#include "host/window/widgets/Look.h"

#include <QAccessible>
#include <QHBoxLayout>
#include <QLabel>
#include <QPainter>
#include <QPushButton>
#include <QToolButton>
#include <QVBoxLayout>

namespace movieconv::window {
namespace {

class Notice : public QWidget {
public:
    using QWidget::QWidget;

protected:
    void paintEvent(QPaintEvent*) override {
        QPainter painter(this);
        QColor colour = WarningColour(palette());
        colour.setAlpha(IsDark(palette()) ? 44 : 30);
        painter.fillRect(rect(), colour);
        PaintSign(painter, Sign::kWarning, QRectF(14, height() / 2.0 - 8, 16, 16), WarningColour(palette()));
    }
};

} // namespace

NoticeBar::NoticeBar(QWidget* parent) : QWidget(parent), rows_(new QVBoxLayout(this)) {
    rows_->setContentsMargins(0, 0, 0, 0);
    rows_->setSpacing(1);
}

void NoticeBar::Show(const QString& key, const QString& sentence, const std::vector<Choice>& choices) {
    Dismiss(key);
    while (rows_->count() >= kMost)
        Dismiss(rows_->itemAt(0)->widget()->objectName());
    auto* notice = new Notice(this);
    notice->setObjectName(key);
    auto* row = new QHBoxLayout(notice);
    row->setContentsMargins(42, 6, 8, 6);
    auto* text = new QLabel(sentence);
    text->setWordWrap(true);
    text->setTextFormat(Qt::PlainText);
    text->setTextInteractionFlags(Qt::TextSelectableByMouse | Qt::TextSelectableByKeyboard);
    text->setAccessibleName(sentence);
    row->addWidget(text, 1);
    for (const auto& [words, deed] : choices) {
        auto* button = new QPushButton(words);
        button->setAccessibleDescription(sentence);
        connect(button, &QPushButton::clicked, this, [this, key, deed = deed] {
            const auto chosen = deed; // goes with the notice
            Dismiss(key);
            chosen();
        });
        row->addWidget(button);
    }
    auto* close = new QToolButton;
    close->setIcon(IconOf(Sign::kRemove));
    close->setAutoRaise(true);
    close->setToolTip(tr("Dismiss"));
    close->setAccessibleName(tr("Dismiss the notice"));
    connect(close, &QToolButton::clicked, this, [this, key] { Dismiss(key); });
    row->addWidget(close);
    rows_->addWidget(notice);
    notice->show();
    QAccessibleEvent alert(text, QAccessible::Alert);
    QAccessible::updateAccessibility(&alert);
}

void NoticeBar::Dismiss(const QString& key) {
    for (int i = rows_->count(); i-- > 0;) {
        QWidget* notice = rows_->itemAt(i)->widget();
        if (notice->objectName() != key)
            continue;
        delete rows_->takeAt(i);
        notice->setObjectName({});
        notice->hide();
        notice->deleteLater();
    }
}

bool NoticeBar::Shows(const QString& key) const {
    for (int i = 0; i < rows_->count(); ++i)
        if (rows_->itemAt(i)->widget()->objectName() == key)
            return true;
    return false;
}

} // namespace movieconv::window
