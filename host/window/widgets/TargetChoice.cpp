#include "host/window/widgets/TargetChoice.h"

#include "host/window/widgets/FormParts.h"
#include "host/window/widgets/Icons.h"
#include "host/window/widgets/Look.h"

#include <QCheckBox>
#include <QFileDialog>
#include <QHBoxLayout>
#include <QLineEdit>
#include <QPushButton>
#include <QToolButton>

namespace movieconv::window {

TargetChoice::TargetChoice(QWidget* parent)
    : QWidget(parent),
      path_(new QLineEdit),
      browse_(new QPushButton(IconOf(Sign::kFolder), tr("Choos&e…"))),
      warnings_(MakeRemark(&WarningColour)),
      notes_(MakeHint()),
      replace_(new QCheckBox(tr("Replace the file that e&xists"))) {
    path_->setAccessibleName(tr("File to save as"));
    path_->setPlaceholderText(tr("By the naming rules"));
    path_->setClearButtonEnabled(true);
    for (QToolButton* clear : path_->findChildren<QToolButton*>())
        clear->setAccessibleName(tr("Back to the naming rules"));
    browse_->setAccessibleName(tr("Choose the file to save as"));
    warnings_->setAccessibleName(tr("Warnings"));
    notes_->setAccessibleName(tr("Notes"));
    auto* row = new QHBoxLayout;
    row->addWidget(path_, 1);
    row->addWidget(browse_);
    QVBoxLayout* layout = MakeColumn(*this, 6);
    layout->addLayout(row);
    layout->addWidget(warnings_);
    layout->addWidget(notes_);
    layout->addWidget(replace_);
    connect(path_, &QLineEdit::editingFinished, this, &TargetChoice::Commit);
    // An empty field says that the rules hold, and so they have to.
    connect(path_, &QLineEdit::textEdited, this, [this](const QString& text) {
        if (text.isEmpty())
            Q_EMIT PathChosen(shown_, {});
    });
    connect(browse_, &QPushButton::clicked, this, &TargetChoice::Browse);
    connect(replace_, &QCheckBox::clicked, this, [this](bool on) { Q_EMIT ReplaceChosen(shown_, on); });
}

void TargetChoice::Show(const Entry& entry) {
    const bool isBeingEdited = entry.id == shown_ && path_->hasFocus() && path_->isModified();
    shown_ = entry.id;
    target_ = Readable(entry.target);
    if (!isBeingEdited) {
        path_->setText(target_);
        path_->setCursorPosition(static_cast<int>(target_.size()));
    }
    QStringList warnings = entry.findings.warnings;
    if (entry.targetShared)
        warnings.prepend(tr("Another movie in the queue goes there as well. Choose another name."));
    warnings_->setText(warnings.join(QLatin1Char('\n')));
    warnings_->setVisible(!warnings.isEmpty());
    notes_->setText(entry.findings.notes.join(QLatin1Char('\n')));
    notes_->setVisible(!entry.findings.notes.isEmpty());
    replace_->setChecked(entry.replace);
    replace_->setVisible(entry.findings.targetExists && (!entry.targetShared || entry.replace));
}

void TargetChoice::Commit() {
    if (!path_->isModified())
        return;
    path_->setModified(false); // what holds is shown from now on
    Q_EMIT PathChosen(shown_, path_->text().toStdString());
}

void TargetChoice::Browse() {
    auto* dialog = new QFileDialog(this, tr("Save as"));
    dialog->setAttribute(Qt::WA_DeleteOnClose);
    dialog->setAcceptMode(QFileDialog::AcceptSave);
    dialog->setOption(QFileDialog::DontConfirmOverwrite); // the page warns
    dialog->selectFile(target_);
    connect(dialog, &QFileDialog::fileSelected, this,
            [this, id = shown_](const QString& path) { Q_EMIT PathChosen(id, path.toStdString()); });
    dialog->show();
}

} // namespace movieconv::window
