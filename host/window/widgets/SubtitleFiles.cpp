#include "host/window/widgets/SubtitleFiles.h"

#include "host/window/model/Entry.h"
#include "host/window/model/Languages.h"
#include "host/window/model/Words.h"
#include "host/window/widgets/FormParts.h"
#include "host/window/widgets/Icons.h"

#include <QFileDialog>
#include <QHBoxLayout>
#include <QPushButton>
#include <QToolButton>

#include <utility>

namespace movieconv::window {

SubtitleFiles::SubtitleFiles(QWidget* parent)
    : QWidget(parent), layout_(MakeColumn(*this, 6)), add_(new QPushButton(tr("&Add a subtitle file…"))) {
    auto* row = new QHBoxLayout;
    row->addWidget(add_);
    row->addStretch();
    layout_->addLayout(row);
    connect(add_, &QPushButton::clicked, this, &SubtitleFiles::Browse);
}

void SubtitleFiles::Show(const std::vector<SubtitleFile>& files, const std::string& movie) {
    movie_ = movie;
    if (files == files_)
        return;
    files_ = files;
    if (rows_ != nullptr) {
        rows_->setParent(nullptr);
        rows_->deleteLater(); // one of its controls may have asked for this
    }
    rows_ = new QWidget;
    MakeColumn(*rows_, 4);
    for (size_t number = 0; number < files_.size(); ++number)
        AddRow(number);
    layout_->insertWidget(0, rows_);
    rows_->setVisible(!files_.empty());
}

void SubtitleFiles::AddRow(size_t number) {
    const SubtitleFile& file = files_[number];
    const QString name = NameOf(file.path);
    auto* label =
        new QLabel(fontMetrics().elidedText(name, Qt::ElideMiddle, fontMetrics().averageCharWidth() * 18));
    label->setTextFormat(Qt::PlainText);
    label->setToolTip(ForToolTip(Shown(file.path)));
    auto* language = new QComboBox;
    AllowNarrow(*language);
    LeaveWheelToPage(*language);
    language->setAccessibleName(tr("Language of %1").arg(name));
    language->addItem(tr("Language not told"), QString());
    for (const NamedLanguage& offered : OfferedLanguages())
        language->addItem(offered.name, offered.code);
    if (language->findData(file.language) < 0)
        language->addItem(LanguageName(file.language), file.language);
    ChooseItem(*language, file.language);
    auto* remove = new QToolButton;
    remove->setIcon(IconOf(Sign::kRemove));
    remove->setAutoRaise(true);
    remove->setToolTip(tr("Leave this file out"));
    remove->setAccessibleName(tr("Leave %1 out").arg(name));
    connect(language, &QComboBox::activated, this, [this, number, language] {
        Change([&](auto& files) { files[number].language = language->currentData().toString(); });
    });
    connect(remove, &QToolButton::clicked, this, [this, number] {
        Change([&](auto& files) { files.erase(files.begin() + static_cast<std::ptrdiff_t>(number)); });
    });
    auto* row = new QHBoxLayout;
    row->addWidget(label);
    row->addWidget(language);
    row->addWidget(remove);
    row->addStretch();
    static_cast<QVBoxLayout*>(rows_->layout())->addLayout(row);
}

void SubtitleFiles::Browse() {
    QFileDialog* dialog = OpenSubtitles(*this, tr("Add subtitles"), movie_);
    connect(dialog, &QFileDialog::filesSelected, this, [this](const QStringList& paths) {
        Change([&](auto& files) {
            for (const QString& path : paths)
                files.push_back({path.toStdString(), LanguageInName(path.toStdString())});
        });
    });
    dialog->show();
}

void SubtitleFiles::Change(const std::function<void(std::vector<SubtitleFile>&)>& change) {
    std::vector<SubtitleFile> changed = files_;
    change(changed);
    Q_EMIT Chosen(changed);
}

} // namespace movieconv::window
