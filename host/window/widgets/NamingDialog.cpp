#include "host/window/widgets/NamingDialog.h"

#include "host/window/widgets/Icons.h"
#include "host/window/widgets/Look.h"

#include <QDialogButtonBox>
#include <QFileDialog>
#include <QFormLayout>
#include <QLabel>
#include <QLineEdit>
#include <QPushButton>
#include <QRadioButton>

namespace movieconv::window {

NamingDialog::NamingDialog(const Naming& naming, QWidget* parent)
    : QDialog(parent),
      pattern_(new QLineEdit(naming.pattern)),
      example_(MakeHint()),
      beside_(new QRadioButton(tr("&Beside the source"))),
      elsewhere_(new QRadioButton(tr("In this &folder:"))),
      folder_(new QLineEdit(Readable(naming.folder))) {
    setObjectName(QStringLiteral("namingDialog"));
    setWindowTitle(tr("Names and folder of new files"));
    pattern_->setAccessibleName(tr("Pattern of the names"));
    pattern_->setToolTip(tr("{name}, {preset}, {height} and {date} are filled in."));
    pattern_->setAccessibleDescription(pattern_->toolTip());
    folder_->setAccessibleName(tr("Folder for new files"));
    beside_->setChecked(naming.folder.empty());
    elsewhere_->setChecked(!naming.folder.empty());
    auto* browse = new QPushButton(IconOf(Sign::kFolder), tr("C&hoose…"));
    browse->setAccessibleName(tr("Choose the folder for new files"));
    auto* buttons = new QDialogButtonBox(QDialogButtonBox::Ok | QDialogButtonBox::Cancel);
    auto* label = new QLabel(tr("&Name"));
    label->setBuddy(pattern_);
    auto* row = new QHBoxLayout;
    row->setSpacing(10);
    row->addWidget(folder_, 1);
    row->addWidget(browse);
    auto* form = new QFormLayout(this);
    form->setContentsMargins(20, 20, 20, 16);
    form->addRow(label, pattern_);
    form->addRow(QString(), MakeHint(pattern_->toolTip()));
    form->addRow(QString(), example_);
    form->addRow(tr("Folder"), beside_);
    form->addRow(QString(), elsewhere_);
    form->addRow(QString(), row);
    form->addRow(buttons);
    setMinimumWidth(520);

    connect(pattern_, &QLineEdit::textChanged, this, &NamingDialog::ShowExample);
    connect(folder_, &QLineEdit::textEdited, elsewhere_, &QRadioButton::click);
    connect(beside_, &QRadioButton::toggled, this, &NamingDialog::ShowExample);
    connect(browse, &QPushButton::clicked, this, &NamingDialog::Browse);
    connect(buttons, &QDialogButtonBox::rejected, this, &QDialog::reject);
    connect(buttons, &QDialogButtonBox::accepted, this, [this] {
        Q_EMIT Chosen(Current());
        accept();
    });
    ShowExample();
}

Naming NamingDialog::Current() const {
    return {pattern_->text(),
            elsewhere_->isChecked() ? folder_->text().trimmed().toStdString() : std::string()};
}

void NamingDialog::ShowExample() {
    Entry entry;
    entry.source = tr("/Holidays/beach.mov").toStdString();
    entry.wishes.height = 1080;
    example_->setText(
        tr("For example: %1")
            .arg(Readable(TargetFor(entry, Current(), QStringLiteral("mp4"), QDate::currentDate(),
                                    [](const std::string&) { return false; }))));
}

void NamingDialog::Browse() {
    auto* dialog = new QFileDialog(this, tr("Folder for new files"), folder_->text());
    dialog->setAttribute(Qt::WA_DeleteOnClose);
    dialog->setFileMode(QFileDialog::Directory);
    connect(dialog, &QFileDialog::fileSelected, this, [this](const QString& path) {
        folder_->setText(path);
        elsewhere_->setChecked(true);
        ShowExample();
    });
    dialog->show();
}

} // namespace movieconv::window
