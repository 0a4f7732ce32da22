#include "host/window/widgets/LogPanel.h"

#include <QPlainTextEdit>
#include <QToolButton>
#include <QVBoxLayout>

namespace movieconv::window {

LogPanel::LogPanel(QWidget* parent) : QWidget(parent), button_(new QToolButton), text_(new QPlainTextEdit) {
    setObjectName(QStringLiteral("log"));
    button_->setCheckable(true);
    button_->setAutoRaise(true);
    button_->setArrowType(Qt::RightArrow);
    button_->setToolButtonStyle(Qt::ToolButtonTextBesideIcon);
    button_->setAccessibleDescription(tr("Shows or hides what happened during the conversion"));
    text_->setReadOnly(true);
    text_->setAccessibleName(tr("Log of the conversion"));
    text_->setMinimumHeight(48);
    text_->setMaximumHeight(120);
    text_->setTabChangesFocus(true);
    text_->hide();
    auto* layout = new QVBoxLayout(this);
    layout->setContentsMargins(0, 0, 0, 0);
    layout->addWidget(button_);
    layout->addWidget(text_);
    connect(button_, &QToolButton::toggled, this, [this](bool open) {
        button_->setArrowType(open ? Qt::DownArrow : Qt::RightArrow);
        text_->setVisible(open);
    });
    hide();
}

void LogPanel::Show(const QStringList& lines) {
    if (lines == lines_)
        return;
    lines_ = lines;
    button_->setText(tr("&Log (%n lines)", "", static_cast<int>(lines.size())));
    text_->setPlainText(lines.join(QLatin1Char('\n')));
    setVisible(!lines.isEmpty());
}

bool LogPanel::IsOpen() const {
    return button_->isChecked();
}

} // namespace movieconv::window
